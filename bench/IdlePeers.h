// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>
#include <mutex>
#include <thread>
#include <vector>

#include "FileDescriptor.h"

// The far ends of idle channels, on loopback.
namespace IdlePeers {

// A loopback TCP port on which nothing listens, so a connect to 127.x.y.z
// at this port is refused at once, as by a device whose service is down.
// Listen makes it listen, Refuse ends that again.
class RefusingPort {
 public:
  RefusingPort();
  std::uint16_t Port() const { return port_; }
  // Starts listening on 127.0.0.1; false on failure.
  bool Listen();
  // The next connection, or an invalid descriptor after limit.
  FileDescriptor Accept(std::chrono::milliseconds limit);
  // Stops listening.
  void Refuse();

 private:
  FileDescriptor listener_;
  std::uint16_t port_ = 0;
};

// A listener on 127.0.0.1 that accepts every connection in a thread of its
// own and keeps it open, silent.
class SilentAcceptor {
 public:
  SilentAcceptor();
  SilentAcceptor(const SilentAcceptor&) = delete;
  SilentAcceptor& operator=(const SilentAcceptor&) = delete;
  SilentAcceptor(SilentAcceptor&&) = delete;
  SilentAcceptor& operator=(SilentAcceptor&&) = delete;
  ~SilentAcceptor();

  std::uint16_t Port() const { return port_; }
  // Waits until count connections were accepted; false after limit.
  bool WaitFor(std::size_t count, std::chrono::milliseconds limit) const;
  std::size_t Accepted() const;

 private:
  void Run();

  std::uint16_t port_ = 0;
  FileDescriptor listener_;
  std::atomic<bool> stop_{false};
  mutable std::mutex mutex_;
  std::vector<FileDescriptor> accepted_;
  std::thread thread_;
};

// A bound UDP socket on 127.0.0.1 that never sends.
class SilentUdp {
 public:
  SilentUdp();
  std::uint16_t Port() const { return port_; }

 private:
  std::uint16_t port_ = 0;
  FileDescriptor fd_;
};

}  // namespace IdlePeers
