// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/NumberText.h"

#include <limits>

namespace veltpeer {

namespace {

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

}  // namespace

bool NumberText::ParseUnsigned(const std::string& text, std::uint64_t max, std::uint64_t& value) {
  if (text.empty()) {
    return false;
  }
  std::uint64_t result = 0;
  for (const char c : text) {
    if (!IsDigit(c)) {
      return false;
    }
    const auto digit = static_cast<std::uint64_t>(c - '0');
    if (result > (std::numeric_limits<std::uint64_t>::max() - digit) / 10) {
      return false;
    }
    result = result * 10 + digit;
  }
  if (result > max) {
    return false;
  }
  value = result;
  return true;
}

bool NumberText::ParseDecimal(const std::string& text, double max, double& value) {
  double whole = 0;
  double fraction = 0;
  double scale = 1;
  bool point = false;
  bool digits = false;
  for (const char c : text) {
    if (c == '.' && !point) {
      point = true;
      continue;
    }
    if (!IsDigit(c)) {
      return false;
    }
    digits = true;
    if (point) {
      scale /= 10;
      fraction += (c - '0') * scale;
    } else {
      whole = whole * 10 + (c - '0');
      if (whole > max) {
        return false;
      }
    }
  }
  const double result = whole + fraction;
  if (!digits || result > max) {
    return false;
  }
  value = result;
  return true;
}

}  // namespace veltpeer
