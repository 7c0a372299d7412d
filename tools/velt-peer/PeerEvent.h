// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

namespace veltpeer {

// One thing the simulator did, as handed to PeerOptions::onEvent.
struct PeerEvent {
  enum class Kind {
    kListening,  // the socket is bound (and listening, for TCP); address = local address
    kConnected,  // TCP: a client was accepted; address = the client's address
    kReceived,   // a whole frame arrived; bytes = the frame
    kSent,       // a whole frame (echo or emitted token) went out; bytes = the frame
    kClosed,     // TCP: the connection ended (closed by either side, or failed)
    kReset,      // TCP: the simulator aborted the connection with a reset
  };

  Kind kind = Kind::kListening;
  std::string address;
  std::string bytes;
};

}  // namespace veltpeer
