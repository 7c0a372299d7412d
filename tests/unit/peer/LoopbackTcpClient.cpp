// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "LoopbackTcpClient.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

#include "velt-peer/Endpoint.h"

namespace {

using Clock = std::chrono::steady_clock;

int MillisecondsLeft(Clock::time_point deadline) {
  const auto left = std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now());
  return left.count() < 0 ? 0 : static_cast<int>(left.count());
}

// Waits for input until the deadline; false on time-out.
bool WaitReadable(int fd, Clock::time_point deadline) {
  for (;;) {
    pollfd entry{fd, POLLIN, 0};
    const int ready = ::poll(&entry, 1, MillisecondsLeft(deadline));
    if (ready > 0) {
      return true;
    }
    if (ready == 0 || errno != EINTR) {
      return false;
    }
  }
}

}  // namespace

bool LoopbackTcpClient::Connect(std::uint16_t port, const char* address) {
  veltpeer::Endpoint remote;
  std::string error;
  if (!veltpeer::Endpoint::Resolve(address, port, SOCK_STREAM, remote, error)) {
    return false;
  }
  socket_.Reset(::socket(remote.Family(), SOCK_STREAM | SOCK_CLOEXEC, 0));
  return socket_.Valid() && ::connect(socket_.Get(), remote.Address(), remote.Length()) == 0;
}

bool LoopbackTcpClient::Send(const std::string& bytes) {
  std::size_t offset = 0;
  while (offset < bytes.size()) {
    const ssize_t sent =
        ::send(socket_.Get(), bytes.data() + offset, bytes.size() - offset, MSG_NOSIGNAL);
    if (sent < 0) {
      if (errno == EINTR) {
        continue;
      }
      return false;
    }
    offset += static_cast<std::size_t>(sent);
  }
  return true;
}

std::string LoopbackTcpClient::Read(std::size_t count, std::chrono::milliseconds timeout,
                                    int* reads) {
  const Clock::time_point deadline = Clock::now() + timeout;
  std::string data;
  char buffer[4096];
  while (data.size() < count && WaitReadable(socket_.Get(), deadline)) {
    const std::size_t want = std::min(sizeof buffer, count - data.size());
    const ssize_t received = ::recv(socket_.Get(), buffer, want, 0);
    if (received <= 0) {
      break;
    }
    data.append(buffer, static_cast<std::size_t>(received));
    if (reads != nullptr) {
      ++*reads;
    }
  }
  return data;
}

std::string LoopbackTcpClient::ReadToEnd(std::chrono::milliseconds timeout, End& end) {
  const Clock::time_point deadline = Clock::now() + timeout;
  std::string data;
  char buffer[4096];
  for (;;) {
    if (!WaitReadable(socket_.Get(), deadline)) {
      end = End::kTimeout;
      return data;
    }
    const ssize_t received = ::recv(socket_.Get(), buffer, sizeof buffer, 0);
    if (received > 0) {
      data.append(buffer, static_cast<std::size_t>(received));
      continue;
    }
    if (received == 0) {
      end = End::kEof;
    } else if (errno == EINTR) {
      continue;
    } else {
      end = errno == ECONNRESET ? End::kReset : End::kError;
    }
    return data;
  }
}

void LoopbackTcpClient::ShutdownWrite() { ::shutdown(socket_.Get(), SHUT_WR); }

std::uint16_t LoopbackTcpClient::LocalPort() const {
  return veltpeer::Endpoint::LocalOf(socket_.Get()).Port();
}
