// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "PeerDrain.h"

#include <poll.h>
#include <sys/socket.h>

#include <cerrno>
#include <vector>

namespace {

// How often the thread looks at the stop flag while nothing arrives.
constexpr int kPollMilliseconds = 20;

}  // namespace

PeerDrain::PeerDrain(int fd) : fd_(fd), thread_([this] { Run(); }) {}

PeerDrain::~PeerDrain() {
  stop_ = true;
  thread_.join();
}

void PeerDrain::Run() {
  std::vector<unsigned char> buffer(65536);
  while (!stop_.load()) {
    pollfd entry{fd_, POLLIN, 0};
    if (::poll(&entry, 1, kPollMilliseconds) <= 0) {
      continue;
    }
    const ssize_t received = ::recv(fd_, buffer.data(), buffer.size(), 0);
    if (received > 0) {
      bytes_ += static_cast<std::uint64_t>(received);
      ++receives_;
    } else if (received == 0 || errno != EINTR) {
      // The peer closed, or the socket failed: nothing more will come.
      return;
    }
  }
}
