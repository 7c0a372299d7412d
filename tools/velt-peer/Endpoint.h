// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <sys/socket.h>

#include <cstdint>
#include <string>

namespace veltpeer {

// One IPv4 or IPv6 socket address (address and port), resolved from text or
// read back from a socket, printed as 127.0.0.1:5555 or [::1]:5555.
class Endpoint {
 public:
  Endpoint() = default;
  Endpoint(const sockaddr* address, socklen_t length);

  // Resolves a host (a numeric address or a name) and a port for a socket of
  // the given type (SOCK_STREAM or SOCK_DGRAM); the first answer wins.
  static bool Resolve(const std::string& host, std::uint16_t port, int socketType, Endpoint& out,
                      std::string& error);
  // Parses "HOST:PORT", "[IPV6]:PORT" or "IPV6:PORT" (the port follows the
  // last colon) and resolves it as Resolve does.
  static bool ParseHostPort(const std::string& text, int socketType, Endpoint& out,
                            std::string& error);
  // The local address a socket is bound to; empty when it cannot be read.
  static Endpoint LocalOf(int fd);

  bool Empty() const { return length_ == 0; }
  const sockaddr* Address() const { return reinterpret_cast<const sockaddr*>(&storage_); }
  socklen_t Length() const { return length_; }
  int Family() const { return storage_.ss_family; }
  std::uint16_t Port() const;
  std::string ToString() const;

 private:
  sockaddr_storage storage_{};
  socklen_t length_ = 0;
};

}  // namespace veltpeer
