// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "LoopbackUdpSocket.h"

#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>

#include <cerrno>
#include <vector>

#include "velt-peer/Endpoint.h"

LoopbackUdpSocket::LoopbackUdpSocket() {
  veltpeer::Endpoint local;
  std::string error;
  if (!veltpeer::Endpoint::Resolve("127.0.0.1", 0, SOCK_DGRAM, local, error)) {
    return;
  }
  socket_.Reset(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0));
  if (socket_.Valid() && ::bind(socket_.Get(), local.Address(), local.Length()) == 0) {
    port_ = veltpeer::Endpoint::LocalOf(socket_.Get()).Port();
  }
}

bool LoopbackUdpSocket::SendTo(std::uint16_t port, const std::string& bytes) {
  veltpeer::Endpoint remote;
  std::string error;
  if (!veltpeer::Endpoint::Resolve("127.0.0.1", port, SOCK_DGRAM, remote, error)) {
    return false;
  }
  const ssize_t sent =
      ::sendto(socket_.Get(), bytes.data(), bytes.size(), 0, remote.Address(), remote.Length());
  return sent == static_cast<ssize_t>(bytes.size());
}

std::optional<std::string> LoopbackUdpSocket::Receive(std::chrono::milliseconds timeout) {
  pollfd entry{socket_.Get(), POLLIN, 0};
  int ready = 0;
  do {
    ready = ::poll(&entry, 1, static_cast<int>(timeout.count()));
  } while (ready < 0 && errno == EINTR);
  if (ready <= 0) {
    return std::nullopt;
  }
  std::vector<char> buffer(65536);
  const ssize_t received = ::recv(socket_.Get(), buffer.data(), buffer.size(), 0);
  if (received < 0) {
    return std::nullopt;
  }
  return std::string(buffer.data(), static_cast<std::size_t>(received));
}
