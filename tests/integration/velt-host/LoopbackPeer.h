// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <string>
#include <vector>

#include "velt-peer/Peer.h"

// velt-peer in this test program, on a free loopback port: frames cut by
// 02 ... 03 and echoed whole, and optionally tokens of its own sent once a
// TCP client connects. It records what happens so that a test can wait for
// it.
class LoopbackPeer {
 public:
  struct Setup {
    veltpeer::Transport transport = veltpeer::Transport::kTcp;
    bool echo = true;
    std::uint64_t emit = 0;  // tokens of its own, sent as fast as possible
    std::string payload = "tok {n}";
    bool numbered = true;  // replace {n} in the payload
  };

  static constexpr std::chrono::milliseconds kTimeout{10000};

  explicit LoopbackPeer(const Setup& setup);
  LoopbackPeer(const LoopbackPeer&) = delete;
  LoopbackPeer& operator=(const LoopbackPeer&) = delete;
  LoopbackPeer(LoopbackPeer&&) = delete;
  LoopbackPeer& operator=(LoopbackPeer&&) = delete;
  ~LoopbackPeer();

  bool Ok() const { return port_ != 0; }
  const std::string& StartError() const { return error_; }
  std::uint16_t Port() const { return port_; }
  // A configuration string for a driver instance aimed at this peer, with
  // the same markers.
  std::string Config() const;
  // Waits until a frame with these bytes (markers included) was received.
  bool WaitReceived(const std::string& frame, std::chrono::milliseconds timeout = kTimeout);
  // Waits until a TCP client's connection ended.
  bool WaitClosed(std::chrono::milliseconds timeout = kTimeout);

 private:
  void Record(const veltpeer::PeerEvent& event);

  veltpeer::Transport transport_;
  std::mutex lock_;
  std::condition_variable changed_;
  std::vector<std::string> received_;
  int closed_ = 0;
  std::string error_;
  std::uint16_t port_ = 0;
  veltpeer::Peer peer_;
};
