// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "IdlePeers.h"

#include <netinet/in.h>

#include <utility>

#include "LoopbackIo.h"

namespace IdlePeers {

// The port lies below the kernel's ephemeral range, so no channel's socket
// (bound to port 0) can take it while nothing listens there, nor connect to
// itself through it.
RefusingPort::RefusingPort() { LoopbackIo::ListenBelowEphemeral(1, port_); }

bool RefusingPort::Listen() {
  try {
    listener_ = LoopbackIo::ListenOn(64, port_);
  } catch (const std::runtime_error&) {
    return false;
  }
  return true;
}

FileDescriptor RefusingPort::Accept(std::chrono::milliseconds limit) {
  return LoopbackIo::Accept(listener_.Get(), limit);
}

void RefusingPort::Refuse() { listener_.Close(); }

SilentAcceptor::SilentAcceptor()
    : listener_(LoopbackIo::Listen(256, port_)), thread_(&SilentAcceptor::Run, this) {}

SilentAcceptor::~SilentAcceptor() {
  stop_ = true;
  thread_.join();
}

void SilentAcceptor::Run() {
  while (!stop_.load()) {
    FileDescriptor peer = LoopbackIo::Accept(listener_.Get(), std::chrono::milliseconds(50));
    if (peer.Valid()) {
      const std::lock_guard<std::mutex> lock(mutex_);
      accepted_.push_back(std::move(peer));
    }
  }
}

std::size_t SilentAcceptor::Accepted() const {
  const std::lock_guard<std::mutex> lock(mutex_);
  return accepted_.size();
}

bool SilentAcceptor::WaitFor(std::size_t count, std::chrono::milliseconds limit) const {
  const auto deadline = std::chrono::steady_clock::now() + limit;
  while (Accepted() < count) {
    if (std::chrono::steady_clock::now() >= deadline) {
      return false;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
  }
  return true;
}

SilentUdp::SilentUdp() : fd_(LoopbackIo::BindUdp(INADDR_LOOPBACK, port_)) {}

}  // namespace IdlePeers
