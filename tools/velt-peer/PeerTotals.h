// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>

namespace veltpeer {

// The simulator's counters. Bytes are counted on the wire: every byte
// received (also bytes skipped while looking for a prefix) and every byte
// sent. A frame is counted when it was cut out whole (received) or sent whole.
struct PeerTotals {
  std::uint64_t framesReceived = 0;
  std::uint64_t bytesReceived = 0;
  std::uint64_t framesSent = 0;
  std::uint64_t bytesSent = 0;
  std::uint64_t connections = 0;  // TCP clients accepted
};

}  // namespace veltpeer
