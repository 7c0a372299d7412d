// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

#include "velt-peer/PeerEvent.h"
#include "velt-peer/PeerOptions.h"
#include "velt-peer/PeerTotals.h"

namespace veltpeer {

// The lines velt-peer prints on stdout, one per event:
//   velt-peer: listening tcp ADDR:PORT  |  velt-peer: bound udp ADDR:PORT
//   connected ADDR:PORT
//   rx HEX  |  rx TEXT        tx HEX  |  tx TEXT
//   closed  |  reset
//   totals rx_frames=N rx_bytes=N tx_frames=N tx_bytes=N connections=N
class PeerOutput {
 public:
  PeerOutput(Transport transport, bool text, bool countOnly);

  // The line for an event, without its newline; empty when this mode prints
  // nothing for it (with countOnly, only the first line is printed).
  std::string Line(const PeerEvent& event) const;
  static std::string TotalsLine(const PeerTotals& totals);

 private:
  std::string Frame(const char* tag, const std::string& bytes) const;

  const Transport transport_;
  const bool text_;
  const bool countOnly_;
};

}  // namespace veltpeer
