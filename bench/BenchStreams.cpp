// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "BenchStreams.h"

#include <algorithm>

namespace BenchStreams {

std::string Payload(std::size_t index, std::size_t size) {
  std::string payload(size, 'p');
  const std::string number = std::to_string(index);
  payload.replace(0, std::min(number.size(), size), number.substr(0, size));
  return payload;
}

std::vector<std::string> Payloads(std::size_t count, std::size_t size, std::size_t first) {
  std::vector<std::string> payloads;
  payloads.reserve(count);
  for (std::size_t i = 0; i < count; ++i) {
    payloads.push_back(Payload(first + i, size));
  }
  return payloads;
}

LoopbackIo::Bytes Framed(const std::vector<std::string>& payloads, const std::string& prefix,
                         const std::string& suffix) {
  LoopbackIo::Bytes frames;
  for (const std::string& payload : payloads) {
    frames.insert(frames.end(), prefix.begin(), prefix.end());
    frames.insert(frames.end(), payload.begin(), payload.end());
    frames.insert(frames.end(), suffix.begin(), suffix.end());
  }
  return frames;
}

}  // namespace BenchStreams
