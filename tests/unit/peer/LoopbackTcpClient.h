// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <cstdint>
#include <string>

#include "velt-peer/FileDescriptor.h"

// A TCP client on loopback for driving the simulator in tests. Every read
// takes a time-out, so a test never hangs on a silent peer.
class LoopbackTcpClient {
 public:
  // How a read to the end stopped.
  enum class End { kEof, kReset, kTimeout, kError };

  // Connects to 127.0.0.1 (or the given address) on port.
  bool Connect(std::uint16_t port, const char* address = "127.0.0.1");
  bool Send(const std::string& bytes);
  // Reads until count bytes have arrived, the time-out passes or the
  // connection ends; returns what arrived. reads counts the recv calls that
  // delivered data.
  std::string Read(std::size_t count, std::chrono::milliseconds timeout, int* reads = nullptr);
  // Reads until the connection ends or the time-out passes.
  std::string ReadToEnd(std::chrono::milliseconds timeout, End& end);
  void ShutdownWrite();
  void Close() { socket_.Reset(); }
  // The client's own port.
  std::uint16_t LocalPort() const;

 private:
  veltpeer::FileDescriptor socket_;
};
