// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/DatagramFraming.h"

#include <algorithm>
#include <cstring>

namespace {

std::string UpToZero(const std::string& marker) { return marker.substr(0, marker.find('\0')); }

}  // namespace

DatagramFraming::DatagramFraming(const std::string& prefix, const std::string& suffix)
    : prefix_(UpToZero(prefix)), suffix_(UpToZero(suffix)) {}

std::size_t DatagramFraming::Find(const std::string& marker, const unsigned char* data,
                                  std::size_t from, std::size_t end) {
  const auto* const zero =
      static_cast<const unsigned char*>(std::memchr(data + from, 0, end - from));
  const std::size_t limit = zero == nullptr ? end : static_cast<std::size_t>(zero - data);
  const auto* const first = data + from;
  const auto* const last = data + limit;
  const auto* const match =
      std::search(first, last, marker.begin(), marker.end(),
                  [](unsigned char a, char b) { return a == static_cast<unsigned char>(b); });
  return match == last ? end : static_cast<std::size_t>(match - data);
}

void DatagramFraming::Split(const unsigned char* data, std::size_t length,
                            const std::function<void(std::string)>& emit) const {
  std::size_t p = 0;
  do {
    if (!prefix_.empty()) {
      const std::size_t q = Find(prefix_, data, p, length);
      if (q == length) {
        return;
      }
      p = q + prefix_.size();
    }
    std::size_t e = length;
    if (!suffix_.empty()) {
      e = Find(suffix_, data, p, length);
      if (e == length) {
        return;
      }
    }
    if (p < e) {
      emit(std::string(reinterpret_cast<const char*>(data + p), e - p));
    }
    p = e + suffix_.size();
  } while (p + prefix_.size() + suffix_.size() < length);
}
