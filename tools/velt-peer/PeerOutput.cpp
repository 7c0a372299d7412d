// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/PeerOutput.h"

#include "velt-peer/HexText.h"

namespace veltpeer {

PeerOutput::PeerOutput(Transport transport, bool text, bool countOnly)
    : transport_(transport), text_(text), countOnly_(countOnly) {}

std::string PeerOutput::Line(const PeerEvent& event) const {
  if (event.kind == PeerEvent::Kind::kListening) {
    return transport_ == Transport::kTcp ? "velt-peer: listening tcp " + event.address
                                         : "velt-peer: bound udp " + event.address;
  }
  if (countOnly_) {
    return {};
  }
  switch (event.kind) {
    case PeerEvent::Kind::kConnected:
      return "connected " + event.address;
    case PeerEvent::Kind::kReceived:
      return Frame("rx", event.bytes);
    case PeerEvent::Kind::kSent:
      return Frame("tx", event.bytes);
    case PeerEvent::Kind::kClosed:
      return "closed";
    case PeerEvent::Kind::kReset:
      return "reset";
    case PeerEvent::Kind::kListening:
      break;
  }
  return {};
}

std::string PeerOutput::TotalsLine(const PeerTotals& totals) {
  return "totals rx_frames=" + std::to_string(totals.framesReceived) +
         " rx_bytes=" + std::to_string(totals.bytesReceived) +
         " tx_frames=" + std::to_string(totals.framesSent) +
         " tx_bytes=" + std::to_string(totals.bytesSent) +
         " connections=" + std::to_string(totals.connections);
}

std::string PeerOutput::Frame(const char* tag, const std::string& bytes) const {
  const std::string shown = text_ ? HexText::Printable(bytes) : HexText::Encode(bytes);
  // An empty frame (an empty datagram) prints as the bare tag, with no
  // trailing blank.
  return shown.empty() ? std::string(tag) : std::string(tag) + " " + shown;
}

}  // namespace veltpeer
