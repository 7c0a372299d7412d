// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/DatagramFraming.h"

#include <cstring>

namespace {

std::string UpToZero(const std::string& marker) { return marker.substr(0, marker.find('\0')); }

}  // namespace

DatagramFraming::DatagramFraming(const std::string& prefix, const std::string& suffix)
    : prefix_(UpToZero(prefix)), suffix_(UpToZero(suffix)) {}

std::size_t DatagramFraming::Find(const std::string& marker, const unsigned char* data,
                                  std::size_t from, std::size_t limit) {
  const auto first = static_cast<unsigned char>(marker[0]);
  for (std::size_t at = from; at + marker.size() <= limit; ++at) {
    const void* const hit = std::memchr(data + at, first, limit + 1 - marker.size() - at);
    if (hit == nullptr) {
      return limit;
    }
    at = static_cast<std::size_t>(static_cast<const unsigned char*>(hit) - data);
    if (std::memcmp(data + at, marker.data(), marker.size()) == 0) {
      return at;
    }
  }
  return limit;
}

void DatagramFraming::Feed(const unsigned char* data, std::size_t length, TokenSink& sink) const {
  // A search from p sees the bytes before the first zero byte at or after
  // p. Every search starts at or before the datagram's first zero byte (a
  // match never reaches past it, and a token without a suffix ends the
  // datagram), so that byte limits them all.
  const void* const zero = std::memchr(data, 0, length);
  const std::size_t limit =
      zero == nullptr ? length
                      : static_cast<std::size_t>(static_cast<const unsigned char*>(zero) - data);
  std::size_t p = 0;
  do {
    if (!prefix_.empty()) {
      const std::size_t q = Find(prefix_, data, p, limit);
      if (q == limit) {
        return;
      }
      p = q + prefix_.size();
    }
    std::size_t e = length;
    if (!suffix_.empty()) {
      e = Find(suffix_, data, p, limit);
      if (e == limit) {
        return;
      }
    }
    if (p < e) {
      sink.Token(reinterpret_cast<const char*>(data + p), e - p);
    }
    p = e + suffix_.size();
  } while (p + prefix_.size() + suffix_.size() < length);
}
