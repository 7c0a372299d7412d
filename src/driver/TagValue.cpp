// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/TagValue.h"

#include <algorithm>
#include <cstring>

void PutInteger(unsigned char* data, int room, int naturalLength, std::int64_t value) {
  if (naturalLength >= 4 && room >= 4) {
    const auto word = static_cast<std::uint32_t>(value);
    std::memcpy(data, &word, sizeof word);
  } else if (naturalLength == 2 && room >= 2) {
    const auto half = static_cast<std::uint16_t>(value);
    std::memcpy(data, &half, sizeof half);
  } else if (room >= 1) {
    data[0] = static_cast<unsigned char>(value);
  }
}

std::int32_t GetInteger(const unsigned char* data, int room, int naturalLength) {
  if (naturalLength >= 4 && room >= 4) {
    std::int32_t word = 0;
    std::memcpy(&word, data, sizeof word);
    return word;
  }
  if (naturalLength == 2 && room >= 2) {
    std::uint16_t half = 0;
    std::memcpy(&half, data, sizeof half);
    return half;
  }
  return room >= 1 ? data[0] : 0;
}

bool PutText(unsigned char* data, int room, int varLength, const std::string& text) {
  const std::size_t length = std::strlen(text.c_str());
  if (text.size() >= static_cast<std::size_t>(std::max(varLength, 0)) ||
      length >= static_cast<std::size_t>(std::max(room, 0))) {
    return false;
  }
  std::memcpy(data, text.data(), length);
  data[length] = 0;
  return true;
}

std::string GetText(const unsigned char* data, int room) {
  const auto* const text = reinterpret_cast<const char*>(data);
  const auto* const zero =
      static_cast<const char*>(std::memchr(text, 0, static_cast<std::size_t>(std::max(room, 0))));
  return {text, zero == nullptr ? static_cast<std::size_t>(std::max(room, 0))
                                : static_cast<std::size_t>(zero - text)};
}
