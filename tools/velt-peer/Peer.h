// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <thread>

#include "velt-peer/Endpoint.h"
#include "velt-peer/FileDescriptor.h"
#include "velt-peer/PeerActivity.h"
#include "velt-peer/PeerOptions.h"
#include "velt-peer/PeerTotals.h"
#include "velt-peer/StopSignal.h"

namespace veltpeer {

// A device simulator on one TCP listening socket or one UDP socket, served
// by one worker thread. Typical use:
//
//   PeerOptions options;
//   options.transport = Transport::kTcp;
//   options.echo = true;
//   Peer peer(options);
//   const Peer::Started started = peer.Start();
//   if (!started.Ok()) { report started.error; }
//   ... point the driver at 127.0.0.1:started.port ...
//   peer.Stop();
//
// Start, Stop and the destructor belong to one controlling thread; Totals,
// NextFrame, Finished, WaitFinished and Failure may be called from any thread.
class Peer {
 public:
  struct Started {
    std::uint16_t port = 0;  // the bound port (the one picked when 0 was asked)
    std::string address;     // the bound address, e.g. "127.0.0.1:40123"
    std::string error;       // why Start failed; empty on success
    bool Ok() const { return error.empty(); }
  };

  explicit Peer(PeerOptions options);
  Peer(const Peer&) = delete;
  Peer& operator=(const Peer&) = delete;
  Peer(Peer&&) = delete;
  Peer& operator=(Peer&&) = delete;
  // Stops the simulator if it still runs.
  ~Peer();

  // Checks the options, binds (and listens, for TCP), reports kListening and
  // starts the worker. Only the first call can succeed.
  Started Start();
  // Wakes the worker out of any wait, lets it close its connection and joins
  // it. Idempotent; returns within milliseconds whatever the worker was doing
  // (unless the event callback itself is blocked).
  void Stop();
  // Asks the worker to end as Stop does, without waiting for it; Stop (or the
  // destructor) still joins it. Thread-safe.
  void RequestStop() noexcept { stop_.Raise(); }

  // True once the worker has ended: by Stop, the time limit, the exit limit
  // or a fatal error.
  bool Finished() const;
  // Waits up to timeout for Finished.
  bool WaitFinished(std::chrono::milliseconds timeout) const;
  // Why the worker ended on its own because of an error; empty otherwise.
  std::string Failure() const;

  PeerTotals Totals() const { return activity_.Totals(); }
  // Takes the oldest kept received frame (see PeerOptions::keepFrames),
  // waiting up to timeout for one.
  bool NextFrame(std::string& frame, std::chrono::milliseconds timeout) {
    return activity_.NextFrame(frame, timeout);
  }

 private:
  std::string CheckOptions() const;
  std::string Bind();
  void Work(Endpoint fixedDestination);

  const PeerOptions options_;
  PeerActivity activity_;
  StopSignal stop_;
  FileDescriptor socket_;
  std::thread worker_;
  bool started_ = false;

  mutable std::mutex stateLock_;
  mutable std::condition_variable finishedChanged_;
  bool finished_ = false;
  std::string failure_;
};

}  // namespace veltpeer
