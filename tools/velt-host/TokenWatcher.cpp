// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/TokenWatcher.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <vector>

#include "velt-host/TypedValue.h"

namespace velthost {

namespace {

// A full queue drops its oldest token when one more arrives, so the token
// sized by rx_token_len may have been replaced by a longer one before
// rx_token is read; it is sized again this many times.
constexpr int kSizingAttempts = 4;

}  // namespace

std::string TokenWatcher::TokenUri(unsigned long length) {
  return "?rx_token?string-" + std::to_string(length + 1);
}

bool TokenWatcher::ReadCount(const char* uri, unsigned long& count, std::string& error) {
  ValueShape shape;
  std::vector<unsigned char> value;
  if (!instance_.Read(uri, shape, value, error)) {
    return false;
  }
  std::uint32_t number = 0;
  std::memcpy(&number, value.data(), std::min(value.size(), sizeof number));
  count = number;
  return true;
}

TokenWatcher::Result TokenWatcher::Take(std::string& token, std::string& error) {
  unsigned long available = 0;
  if (!ReadCount(kTokensAvailable, available, error)) {
    return Result::kError;
  }
  if (available == 0) {
    return Result::kEmpty;
  }
  for (int attempt = 1;; ++attempt) {
    unsigned long length = 0;
    if (!ReadCount(kTokenLength, length, error)) {
      return Result::kError;
    }
    const std::string uri = TokenUri(length);
    ValueShape shape;
    std::vector<unsigned char> value;
    if (instance_.Read(uri, shape, value, error)) {
      token = TypedValue::Format(shape, value.data());
      break;
    }
    if (attempt == kSizingAttempts) {
      return Result::kError;
    }
  }
  if (!instance_.Write(kTokenAck, "1", error)) {
    return Result::kError;
  }
  return Result::kToken;
}

}  // namespace velthost
