// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "LoopbackIo.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <stdexcept>
#include <string>

namespace LoopbackIo {
namespace {

sockaddr_in Address(std::uint32_t host, std::uint16_t port) {
  sockaddr_in address{};
  address.sin_family = AF_INET;
  address.sin_addr.s_addr = htonl(host);
  address.sin_port = htons(port);
  return address;
}

const sockaddr* Raw(const sockaddr_in& address) {
  return reinterpret_cast<const sockaddr*>(&address);
}

FileDescriptor BoundTcp(std::uint16_t& port) {
  FileDescriptor fd(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
  const sockaddr_in local = Address(INADDR_LOOPBACK, 0);
  if (!fd.Valid() || ::bind(fd.Get(), Raw(local), sizeof local) != 0) {
    throw std::runtime_error("cannot bind a loopback TCP socket");
  }
  port = LocalPort(fd.Get());
  return fd;
}

bool WaitReadable(int fd, std::chrono::steady_clock::time_point deadline) {
  const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(
      deadline - std::chrono::steady_clock::now());
  if (left.count() <= 0) {
    return false;
  }
  pollfd entry{fd, POLLIN, 0};
  return ::poll(&entry, 1, static_cast<int>(left.count())) > 0;
}

}  // namespace

FileDescriptor Listen(int backlog, std::uint16_t& port) {
  FileDescriptor fd = BoundTcp(port);
  if (::listen(fd.Get(), backlog) != 0) {
    throw std::runtime_error("cannot listen on loopback");
  }
  return fd;
}

FileDescriptor ListenOn(int backlog, std::uint16_t port) {
  FileDescriptor fd(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
  const int on = 1;
  const sockaddr_in local = Address(INADDR_LOOPBACK, port);
  if (!fd.Valid() || ::setsockopt(fd.Get(), SOL_SOCKET, SO_REUSEADDR, &on, sizeof on) != 0 ||
      ::bind(fd.Get(), Raw(local), sizeof local) != 0 || ::listen(fd.Get(), backlog) != 0) {
    throw std::runtime_error("cannot listen on loopback port " + std::to_string(port));
  }
  return fd;
}

FileDescriptor ListenBelowEphemeral(int backlog, std::uint16_t& port) {
  // Ports below the kernel's ephemeral range are never handed to a socket
  // bound to port 0, so a listener there can go away and come back without
  // another socket taking its port in between.
  const auto start = static_cast<std::uint16_t>(20000 + ::getpid() % 10000);
  for (std::uint16_t candidate = start; candidate < 32000; ++candidate) {
    try {
      FileDescriptor fd = ListenOn(backlog, candidate);
      port = candidate;
      return fd;
    } catch (const std::runtime_error&) {
    }
  }
  throw std::runtime_error("no free loopback port below the ephemeral range");
}

FileDescriptor Accept(int listener, std::chrono::milliseconds timeout) {
  if (!WaitReadable(listener, std::chrono::steady_clock::now() + timeout)) {
    return FileDescriptor();
  }
  return FileDescriptor(::accept4(listener, nullptr, nullptr, SOCK_CLOEXEC));
}

FileDescriptor ConnectTo(std::uint16_t port) {
  FileDescriptor fd(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
  const sockaddr_in peer = Address(INADDR_LOOPBACK, port);
  if (!fd.Valid() || ::connect(fd.Get(), Raw(peer), sizeof peer) != 0) {
    return FileDescriptor();
  }
  return fd;
}

FileDescriptor BindUdp(std::uint32_t address, std::uint16_t& port) {
  FileDescriptor fd(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0));
  const sockaddr_in local = Address(address, 0);
  if (!fd.Valid() || ::bind(fd.Get(), Raw(local), sizeof local) != 0) {
    throw std::runtime_error("cannot bind a UDP socket");
  }
  port = LocalPort(fd.Get());
  return fd;
}

FileDescriptor ClosedTcpPort(std::uint16_t& port) { return BoundTcp(port); }

std::uint16_t FreeUdpPort() {
  std::uint16_t port = 0;
  BindUdp(INADDR_LOOPBACK, port);
  return port;
}

bool SendDatagram(std::uint16_t port, const std::string& bytes) {
  const FileDescriptor sender(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0));
  const sockaddr_in peer = Address(INADDR_LOOPBACK, port);
  return sender.Valid() && ::sendto(sender.Get(), bytes.data(), bytes.size(), 0, Raw(peer),
                                    sizeof peer) == static_cast<ssize_t>(bytes.size());
}

std::uint16_t LocalPort(int fd) {
  sockaddr_in local{};
  socklen_t length = sizeof local;
  ::getsockname(fd, reinterpret_cast<sockaddr*>(&local), &length);
  return ntohs(local.sin_port);
}

std::uint16_t PeerPort(int fd) {
  sockaddr_in peer{};
  socklen_t length = sizeof peer;
  ::getpeername(fd, reinterpret_cast<sockaddr*>(&peer), &length);
  return ntohs(peer.sin_port);
}

void SendAll(int fd, const Bytes& data) {
  std::size_t done = 0;
  while (done < data.size()) {
    const ssize_t n = ::send(fd, data.data() + done, data.size() - done, MSG_NOSIGNAL);
    if (n < 0 && errno == EINTR) {
      continue;
    }
    if (n <= 0) {
      throw std::runtime_error("send failed in a test peer");
    }
    done += static_cast<std::size_t>(n);
  }
}

void SendTo(int fd, std::uint16_t port, const Bytes& data) {
  const sockaddr_in peer = Address(INADDR_LOOPBACK, port);
  if (::sendto(fd, data.data(), data.size(), 0, Raw(peer), sizeof peer) !=
      static_cast<ssize_t>(data.size())) {
    throw std::runtime_error("sendto failed in a test peer");
  }
}

Bytes ReceiveUpTo(int fd, std::size_t count, std::chrono::milliseconds timeout) {
  const auto deadline = std::chrono::steady_clock::now() + timeout;
  Bytes received;
  unsigned char chunk[65536];
  while (received.size() < count && WaitReadable(fd, deadline)) {
    const ssize_t n = ::recv(fd, chunk, std::min(sizeof chunk, count - received.size()), 0);
    if (n <= 0) {
      break;
    }
    received.insert(received.end(), chunk, chunk + n);
  }
  return received;
}

Bytes ReceiveDatagram(int fd, std::chrono::milliseconds timeout, std::uint16_t* senderPort) {
  if (senderPort != nullptr) {
    *senderPort = 0;
  }
  if (!WaitReadable(fd, std::chrono::steady_clock::now() + timeout)) {
    return Bytes();
  }
  Bytes datagram(65536);
  sockaddr_in sender{};
  socklen_t length = sizeof sender;
  const ssize_t n = ::recvfrom(fd, datagram.data(), datagram.size(), 0,
                               reinterpret_cast<sockaddr*>(&sender), &length);
  datagram.resize(n < 0 ? 0 : static_cast<std::size_t>(n));
  if (senderPort != nullptr && n >= 0) {
    *senderPort = ntohs(sender.sin_port);
  }
  return datagram;
}

void Reset(FileDescriptor& fd) {
  const linger abort{1, 0};
  ::setsockopt(fd.Get(), SOL_SOCKET, SO_LINGER, &abort, sizeof abort);
  fd.Close();
}

Bytes Pattern(std::size_t count, unsigned seed) {
  Bytes bytes(count);
  for (std::size_t i = 0; i < count; ++i) {
    bytes[i] = static_cast<unsigned char>((i * 131U + seed * 17U + (i >> 8)) & 0xFFU);
  }
  return bytes;
}

Bytes FromText(const std::string& text) { return Bytes(text.begin(), text.end()); }

}  // namespace LoopbackIo
