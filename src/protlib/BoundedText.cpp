// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/BoundedText.h"

#include <array>
#include <cstdio>
#include <cstring>

BoundedText::BoundedText(char* outBuffer, int outSize)
    : out(outBuffer), size(outBuffer == nullptr || outSize < 0 ? 0 : outSize) {}

BoundedText& BoundedText::operator<<(const char* text) {
  if (text == nullptr) {
    bad = true;
    return *this;
  }
  put(text, static_cast<int>(std::strlen(text)));
  return *this;
}

BoundedText& BoundedText::operator<<(int value) {
  std::array<char, 16> digits{};
  const int length = std::snprintf(digits.data(), digits.size(), "%d", value);
  put(digits.data(), length);
  return *this;
}

void BoundedText::put(const char* text, int length) {
  if (bad) {
    return;
  }
  const int room = size - written;
  const int copied = length < room ? length : room;
  if (copied > 0) {
    std::memcpy(out + written, text, static_cast<std::size_t>(copied));
    written += copied;
  }
}
