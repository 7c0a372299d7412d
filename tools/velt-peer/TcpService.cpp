// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/TcpService.h"

#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/socket.h>

#include <cerrno>
#include <chrono>
#include <system_error>
#include <utility>

#include "velt-peer/Endpoint.h"
#include "velt-peer/FileDescriptor.h"
#include "velt-peer/TcpConnection.h"

namespace veltpeer {

namespace {

// Errors after which accept can simply be called again: an interrupted call,
// or a connection that failed before it was taken (Linux reports pending
// network errors of the new connection through accept).
bool RetryAtOnce(int error) {
  switch (error) {
    case EAGAIN:
    case EINTR:
    case ECONNABORTED:
    case EPROTO:
    case ENETDOWN:
    case ENOPROTOOPT:
    case EHOSTDOWN:
    case ENONET:
    case EHOSTUNREACH:
    case EOPNOTSUPP:
    case ENETUNREACH:
      return true;
    default:
      return false;
  }
}

// Out of descriptors or memory: the pending client stays queued, so wait a
// little instead of spinning on it.
bool RetryLater(int error) {
  return error == EMFILE || error == ENFILE || error == ENOBUFS || error == ENOMEM;
}

constexpr std::chrono::milliseconds kResourcePause{100};

}  // namespace

TcpService::TcpService(ServiceContext& context, int listener)
    : context_(context), listener_(listener) {}

std::string TcpService::Run() {
  for (;;) {
    if (context_.stop.Wait(listener_, POLLIN, StopSignal::Clock::time_point::max()) ==
        WaitResult::kStopped) {
      return {};
    }
    sockaddr_storage client{};
    socklen_t length = sizeof client;
    const int fd = ::accept4(listener_, reinterpret_cast<sockaddr*>(&client), &length,
                             SOCK_NONBLOCK | SOCK_CLOEXEC);
    if (fd < 0) {
      const int error = errno;
      if (RetryAtOnce(error)) {
        continue;
      }
      if (RetryLater(error)) {
        context_.stop.SleepFor(kResourcePause);
        continue;
      }
      return std::string("accept failed: ") + std::generic_category().message(error);
    }
    FileDescriptor socket(fd);
    // Every write, and every piece of a chunked write, goes out at once.
    const int on = 1;
    ::setsockopt(fd, IPPROTO_TCP, TCP_NODELAY, &on, sizeof on);
    context_.activity.Announce(
        PeerEvent::Kind::kConnected,
        Endpoint(reinterpret_cast<const sockaddr*>(&client), length).ToString());
    TcpConnection connection(context_, std::move(socket));
    const TcpConnection::Outcome outcome = connection.Serve();
    context_.emitter.Pause();
    if (outcome == TcpConnection::Outcome::kEnd) {
      return {};
    }
  }
}

}  // namespace veltpeer
