// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>

#include "velt-peer/FrameWriter.h"
#include "velt-peer/PeerActivity.h"
#include "velt-peer/PeerOptions.h"
#include "velt-peer/StopSignal.h"
#include "velt-peer/TokenEmitter.h"

namespace veltpeer {

// What the TCP and UDP services share over the simulator's life: the
// options, the stop signal, the activity record, the writer, the token
// emitter (its numbering runs on across connections) and the count of frames
// handled so far for the exit limit.
struct ServiceContext {
  ServiceContext(const PeerOptions& peerOptions, const StopSignal& stopSignal, PeerActivity& record)
      : options(peerOptions),
        stop(stopSignal),
        activity(record),
        writer(peerOptions, stopSignal),
        emitter(peerOptions) {}

  // Counts one frame handled (received or emitted); true once the exit
  // limit is reached.
  bool CountHandled() {
    ++handledFrames;
    return ExitReached();
  }
  bool ExitReached() const {
    return options.exitAfterFrames != 0 && handledFrames >= options.exitAfterFrames;
  }

  const PeerOptions& options;
  const StopSignal& stop;
  PeerActivity& activity;
  FrameWriter writer;
  TokenEmitter emitter;
  std::uint64_t handledFrames = 0;
};

}  // namespace veltpeer
