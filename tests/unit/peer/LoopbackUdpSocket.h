// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>

#include "velt-peer/FileDescriptor.h"

// A UDP socket bound to a free port on 127.0.0.1, for exchanging datagrams
// with the simulator in tests.
class LoopbackUdpSocket {
 public:
  LoopbackUdpSocket();

  bool Bound() const { return port_ != 0; }
  std::uint16_t Port() const { return port_; }
  bool SendTo(std::uint16_t port, const std::string& bytes);
  // The next datagram, or nothing after the time-out.
  std::optional<std::string> Receive(std::chrono::milliseconds timeout);

 private:
  veltpeer::FileDescriptor socket_;
  std::uint16_t port_ = 0;
};
