// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostSocket.h"

#include <arpa/inet.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <limits>
#include <system_error>
#include <utility>

#include "AdapterLookup.h"
#include "HostTask.h"

namespace {

std::string SystemError(const char* what, int error) {
  return std::string(what) + ": " + std::generic_category().message(error);
}

bool SetOption(int fd, int level, int option) {
  const int on = 1;
  return ::setsockopt(fd, level, option, &on, sizeof on) == 0;
}

}  // namespace

std::unique_ptr<HostSocket> HostSocket::Create(bool tcp, unsigned short localPort,
                                               Timeouts timeouts, Shared& shared,
                                               std::string& error) {
  FileDescriptor fd = Open(tcp, error);
  if (!fd.Valid() || !Bind(fd.Get(), localPort, error)) {
    return nullptr;
  }
  return std::unique_ptr<HostSocket>(
      new HostSocket(std::move(fd), tcp, localPort, timeouts, shared));
}

HostSocket::HostSocket(FileDescriptor fd, bool tcp, unsigned short configuredPort,
                       Timeouts timeouts, Shared& shared)
    : fd_(std::move(fd)),
      tcp_(tcp),
      configuredPort_(configuredPort),
      timeouts_(timeouts),
      shared_(shared),
      rxBuffer_(tcp ? kReceiveBufferSize : 0) {
  RecordLocalPort();
}

FileDescriptor HostSocket::Open(bool tcp, std::string& error) {
  const int type = (tcp ? SOCK_STREAM : SOCK_DGRAM) | SOCK_NONBLOCK | SOCK_CLOEXEC;
  FileDescriptor fd(::socket(AF_INET, type, 0));
  if (!fd.Valid()) {
    error = SystemError("socket", errno);
    return fd;
  }
  // Reuse lets a re-created socket bind its port again at once; broadcast
  // lets a UDP channel send to 255.255.255.255 and subnet broadcasts; no
  // delay keeps small token frames from waiting for more data.
  bool ok = SetOption(fd.Get(), SOL_SOCKET, SO_REUSEADDR);
  ok = ok && (tcp ? SetOption(fd.Get(), IPPROTO_TCP, TCP_NODELAY)
                  : SetOption(fd.Get(), SOL_SOCKET, SO_BROADCAST));
  if (!ok) {
    error = SystemError("setsockopt", errno);
    return {};
  }
  return fd;
}

bool HostSocket::Bind(int fd, unsigned short port, std::string& error) {
  sockaddr_in local{};
  local.sin_family = AF_INET;
  local.sin_addr.s_addr = htonl(INADDR_ANY);
  local.sin_port = htons(port);
  if (::bind(fd, reinterpret_cast<const sockaddr*>(&local), sizeof local) != 0) {
    error = SystemError(("bind to port " + std::to_string(port)).c_str(), errno);
    return false;
  }
  return true;
}

bool HostSocket::ParseAddress(const char* ip, unsigned short port, sockaddr_in& address) {
  address = sockaddr_in{};
  address.sin_family = AF_INET;
  address.sin_port = htons(port);
  return ip != nullptr && ::inet_pton(AF_INET, ip, &address.sin_addr) == 1;
}

HostSocket::WaitResult HostSocket::WaitFor(int fd, short events, Clock::time_point deadline) {
  const int stopFd = HostTask::CurrentStopDescriptor();
  std::array<pollfd, 2> fds = {{{fd, events, 0}, {stopFd, POLLIN, 0}}};
  const nfds_t count = stopFd >= 0 ? 2 : 1;
  const bool unlimited = deadline == Clock::time_point::max();
  for (;;) {
    const auto left = std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now());
    const int timeout = unlimited ? -1
                                  : static_cast<int>(std::clamp<std::chrono::milliseconds::rep>(
                                        left.count(), 0, std::numeric_limits<int>::max()));
    const int rc = ::poll(fds.data(), count, timeout);
    if (rc < 0) {
      if (errno == EINTR) {
        continue;
      }
      return WaitResult::Failed;
    }
    // A stop wins over data: the task is ending and must not be held up.
    if (count == 2 && fds[1].revents != 0) {
      return WaitResult::Stopped;
    }
    if (fds[0].revents != 0) {
      return WaitResult::Ready;
    }
    // poll ran out its whole time-out, which was rounded up to reach the
    // deadline: no second poll (and no clock read) is needed to tell.
    if (rc == 0) {
      return WaitResult::TimedOut;
    }
  }
}

void HostSocket::RecordLocalPort() {
  sockaddr_in local{};
  socklen_t length = sizeof local;
  if (::getsockname(fd_.Get(), reinterpret_cast<sockaddr*>(&local), &length) == 0) {
    localPort_.store(ntohs(local.sin_port));
  }
}

int HostSocket::Connect(const char* ip, unsigned short port) {
  sockaddr_in peer{};
  if (!ParseAddress(ip, port, peer)) {
    return -1;
  }
  return tcp_ ? ConnectTcp(peer) : ConnectUdp(peer);
}

int HostSocket::ConnectUdp(const sockaddr_in& peer) {
  // No kernel connect: a connected UDP socket would drop datagrams from any
  // other sender, and a broadcast request must accept the answer of
  // whichever device replies.
  const std::lock_guard<std::mutex> lock(sendMutex_);
  peer_ = peer;
  hasPeer_ = true;
  return 0;
}

int HostSocket::Receive(unsigned char* buffer, int maxLength, int timeoutMilliseconds) {
  if (buffer == nullptr || maxLength <= 0) {
    return -1;
  }
  // A negative time-out waits without limit (a stop request still ends the
  // wait), so a channel whose gap is negative idles instead of spinning.
  const Clock::time_point deadline =
      timeoutMilliseconds < 0 ? Clock::time_point::max()
                              : Clock::now() + std::chrono::milliseconds(timeoutMilliseconds);
  const std::lock_guard<std::mutex> lock(receiveMutex_);
  return tcp_ ? ReceiveTcp(buffer, maxLength, deadline)
              : WaitAndTake(&HostSocket::TakeDatagram, buffer, maxLength, deadline);
}

int HostSocket::ServeBuffered(unsigned char* buffer, int maxLength) {
  const std::size_t count = std::min(rxEnd_ - rxBegin_, static_cast<std::size_t>(maxLength));
  std::memcpy(buffer, rxBuffer_.data() + rxBegin_, count);
  rxBegin_ += count;
  return static_cast<int>(count);
}

// Waits until the descriptor is readable, then takes what is there: 0 when
// the time-out elapsed or the task was asked to stop, -1 when the wait
// failed, otherwise take's answer. A readable descriptor that held nothing
// after all is waited for again.
int HostSocket::WaitAndTake(Take take, unsigned char* buffer, int maxLength,
                            Clock::time_point deadline) {
  for (;;) {
    const WaitResult wait = WaitFor(fd_.Get(), POLLIN, deadline);
    if (wait == WaitResult::TimedOut || wait == WaitResult::Stopped) {
      return 0;
    }
    if (wait == WaitResult::Failed) {
      return -1;
    }
    const int taken = (this->*take)(buffer, maxLength);
    if (taken != kNothingYet) {
      return taken;
    }
  }
}

// One datagram per call; the kernel truncates it to the buffer and drops the
// rest.
int HostSocket::TakeDatagram(unsigned char* buffer, int maxLength) {
  const ssize_t n = ::recv(fd_.Get(), buffer, static_cast<std::size_t>(maxLength), MSG_DONTWAIT);
  if (n >= 0) {
    return static_cast<int>(n);
  }
  return WouldBlock(errno) || errno == EINTR ? kNothingYet : -1;
}

int HostSocket::GetAdapterInfo(unsigned int ip, unsigned int* address, unsigned int* mask,
                               unsigned int* index) {
  return AdapterLookup::FindInto(ip, address, mask, index);
}

int HostSocket::Send(const unsigned char* data, int length) {
  if (length < 0 || (data == nullptr && length > 0)) {
    return -1;
  }
  const std::lock_guard<std::mutex> lock(sendMutex_);
  const auto size = static_cast<std::size_t>(length);
  return tcp_ ? SendTcp(data, size) : SendUdp(data, size);
}

int HostSocket::SendUdp(const unsigned char* data, std::size_t length) {
  if (!hasPeer_) {
    return -1;
  }
  const Clock::time_point deadline = Clock::now() + timeouts_.send;
  for (;;) {
    const ssize_t n = ::sendto(fd_.Get(), data, length, MSG_NOSIGNAL | MSG_DONTWAIT,
                               reinterpret_cast<const sockaddr*>(&peer_), sizeof peer_);
    if (n >= 0) {
      return static_cast<std::size_t>(n) == length ? static_cast<int>(length) : -1;
    }
    if (errno == EINTR || (WouldBlock(errno) && WaitWritable(deadline))) {
      continue;
    }
    return -1;
  }
}

bool HostSocket::WaitWritable(Clock::time_point deadline) {
  return WaitFor(fd_.Get(), POLLOUT, deadline) == WaitResult::Ready;
}
