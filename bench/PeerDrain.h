// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>
#include <cstdint>
#include <thread>

// Reads everything that arrives on a socket (the peer's end of a UDP or TCP
// conversation) on a thread of its own and counts it, so a sender is never
// held up by a full receive buffer. The thread ends with the object.
class PeerDrain {
 public:
  // fd is borrowed and must outlive the drain.
  explicit PeerDrain(int fd);
  PeerDrain(const PeerDrain&) = delete;
  PeerDrain& operator=(const PeerDrain&) = delete;
  PeerDrain(PeerDrain&&) = delete;
  PeerDrain& operator=(PeerDrain&&) = delete;
  ~PeerDrain();

  std::uint64_t Bytes() const { return bytes_.load(); }
  // Successful receive calls: datagrams for UDP.
  std::uint64_t Receives() const { return receives_.load(); }

 private:
  void Run();

  int fd_;
  std::atomic<bool> stop_{false};
  std::atomic<std::uint64_t> bytes_{0};
  std::atomic<std::uint64_t> receives_{0};
  std::thread thread_;
};
