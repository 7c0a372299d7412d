// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

namespace veltpeer {

// Byte strings as they appear on the command line and in the output: markers
// and payloads given as hexadecimal text, frames printed as upper-case hex or
// as escaped text.
class HexText {
 public:
  // Decodes pairs of hex digits (either case), high digit first. "none" and
  // the empty text give no bytes, as in the driver's configuration. False for
  // an odd length or any other character; bytes is then left unchanged.
  static bool Decode(const std::string& text, std::string& bytes);
  // Two upper-case hex digits per byte, high digit first, no separators.
  static std::string Encode(const std::string& bytes);
  // The bytes as one line of text: printable ASCII as is, a backslash as two
  // backslashes, every other byte as \xHH with upper-case digits.
  static std::string Printable(const std::string& bytes);
};

}  // namespace veltpeer
