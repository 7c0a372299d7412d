// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

// The byte as two lower-case hexadecimal digits, "0a" for 10.
inline std::string HexByte(unsigned char byte) {
  constexpr const char* kDigits = "0123456789abcdef";
  return {kDigits[byte >> 4U], kDigits[byte & 0x0FU]};
}
