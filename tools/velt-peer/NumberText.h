// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <string>

namespace veltpeer {

// Strict reading of the numbers given on the command line: no sign, no
// blanks, no trailing characters, no silent wrap-around.
class NumberText {
 public:
  // Decimal digits only, value at most max. False leaves value unchanged.
  static bool ParseUnsigned(const std::string& text, std::uint64_t max, std::uint64_t& value);
  // Digits with at most one decimal point ("2", "0.5", "12.25"), value at
  // most max. False leaves value unchanged.
  static bool ParseDecimal(const std::string& text, double max, double& value);
};

}  // namespace veltpeer
