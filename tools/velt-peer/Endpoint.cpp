// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/Endpoint.h"

#include <arpa/inet.h>
#include <netdb.h>
#include <netinet/in.h>

#include <array>
#include <cctype>
#include <cstring>
#include <memory>

#include "velt-peer/NumberText.h"

namespace veltpeer {

namespace {

// A host name has a letter and no colon (IPv6 addresses have colons; dotted
// IPv4 addresses have no letters).
bool LooksLikeName(const std::string& host) {
  bool letter = false;
  for (const char c : host) {
    if (c == ':') {
      return false;
    }
    letter = letter || std::isalpha(static_cast<unsigned char>(c)) != 0;
  }
  return letter;
}

}  // namespace

Endpoint::Endpoint(const sockaddr* address, socklen_t length) {
  if (address != nullptr && length > 0 && length <= sizeof storage_) {
    std::memcpy(&storage_, address, length);
    length_ = length;
  }
}

bool Endpoint::Resolve(const std::string& host, std::uint16_t port, int socketType, Endpoint& out,
                       std::string& error) {
  addrinfo hints{};
  hints.ai_family = AF_UNSPEC;
  hints.ai_socktype = socketType;
  hints.ai_flags = AI_NUMERICSERV | AI_NUMERICHOST;
  addrinfo* found = nullptr;
  const std::string service = std::to_string(port);
  int rc = ::getaddrinfo(host.c_str(), service.c_str(), &hints, &found);
  if (rc == EAI_NONAME && LooksLikeName(host)) {
    // Only what cannot be an address is looked up as a name, so that a
    // mistyped address (256.1.1.1) fails at once instead of going to DNS.
    hints.ai_flags = AI_NUMERICSERV;
    rc = ::getaddrinfo(host.c_str(), service.c_str(), &hints, &found);
  }
  if (rc != 0) {
    error = "cannot resolve '" + host + "': " + ::gai_strerror(rc);
    return false;
  }
  const std::unique_ptr<addrinfo, void (*)(addrinfo*)> owner(found, ::freeaddrinfo);
  for (const addrinfo* item = found; item != nullptr; item = item->ai_next) {
    if (item->ai_family == AF_INET || item->ai_family == AF_INET6) {
      out = Endpoint(item->ai_addr, item->ai_addrlen);
      return true;
    }
  }
  error = "cannot resolve '" + host + "': no IPv4 or IPv6 address";
  return false;
}

bool Endpoint::ParseHostPort(const std::string& text, int socketType, Endpoint& out,
                             std::string& error) {
  std::string host;
  std::string port;
  if (!text.empty() && text.front() == '[') {
    const std::size_t close = text.find(']');
    if (close == std::string::npos || close + 1 >= text.size() || text[close + 1] != ':') {
      error = "bad address '" + text + "' (HOST:PORT expected)";
      return false;
    }
    host = text.substr(1, close - 1);
    port = text.substr(close + 2);
  } else {
    const std::size_t colon = text.rfind(':');
    if (colon == std::string::npos) {
      error = "bad address '" + text + "' (HOST:PORT expected)";
      return false;
    }
    host = text.substr(0, colon);
    port = text.substr(colon + 1);
  }
  if (host.empty()) {
    error = "bad address '" + text + "' (HOST:PORT expected)";
    return false;
  }
  std::uint64_t number = 0;
  if (!NumberText::ParseUnsigned(port, 65535, number)) {
    error = "bad port '" + port + "' in '" + text + "' (0..65535 expected)";
    return false;
  }
  return Resolve(host, static_cast<std::uint16_t>(number), socketType, out, error);
}

Endpoint Endpoint::LocalOf(int fd) {
  sockaddr_storage address{};
  socklen_t length = sizeof address;
  if (::getsockname(fd, reinterpret_cast<sockaddr*>(&address), &length) != 0) {
    return {};
  }
  return {reinterpret_cast<const sockaddr*>(&address), length};
}

// The family-specific views are copied out rather than cast, so that no
// object is read through a pointer to another type.
std::uint16_t Endpoint::Port() const {
  if (Family() == AF_INET) {
    sockaddr_in v4{};
    std::memcpy(&v4, &storage_, sizeof v4);
    return ntohs(v4.sin_port);
  }
  if (Family() == AF_INET6) {
    sockaddr_in6 v6{};
    std::memcpy(&v6, &storage_, sizeof v6);
    return ntohs(v6.sin6_port);
  }
  return 0;
}

std::string Endpoint::ToString() const {
  std::array<char, INET6_ADDRSTRLEN> text{};
  if (Family() == AF_INET) {
    sockaddr_in v4{};
    std::memcpy(&v4, &storage_, sizeof v4);
    ::inet_ntop(AF_INET, &v4.sin_addr, text.data(), text.size());
    return std::string(text.data()) + ":" + std::to_string(Port());
  }
  if (Family() == AF_INET6) {
    sockaddr_in6 v6{};
    std::memcpy(&v6, &storage_, sizeof v6);
    ::inet_ntop(AF_INET6, &v6.sin6_addr, text.data(), text.size());
    return "[" + std::string(text.data()) + "]:" + std::to_string(Port());
  }
  return "?";
}

}  // namespace veltpeer
