// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/HexText.h"

#include <string_view>
#include <utility>

namespace veltpeer {

namespace {

constexpr std::string_view kDigits = "0123456789ABCDEF";

// The value of one hex digit, or -1.
int DigitValue(char c) {
  if (c >= '0' && c <= '9') {
    return c - '0';
  }
  if (c >= 'A' && c <= 'F') {
    return c - 'A' + 10;
  }
  if (c >= 'a' && c <= 'f') {
    return c - 'a' + 10;
  }
  return -1;
}

void AppendHexByte(std::string& out, unsigned char byte) {
  out += kDigits[byte >> 4];
  out += kDigits[byte & 0x0F];
}

}  // namespace

bool HexText::Decode(const std::string& text, std::string& bytes) {
  if (text == "none") {
    bytes.clear();
    return true;
  }
  if (text.size() % 2 != 0) {
    return false;
  }
  std::string decoded;
  decoded.reserve(text.size() / 2);
  for (std::size_t i = 0; i < text.size(); i += 2) {
    const int high = DigitValue(text[i]);
    const int low = DigitValue(text[i + 1]);
    if (high < 0 || low < 0) {
      return false;
    }
    decoded += static_cast<char>(high * 16 + low);
  }
  bytes = std::move(decoded);
  return true;
}

std::string HexText::Encode(const std::string& bytes) {
  std::string out;
  out.reserve(bytes.size() * 2);
  for (const char c : bytes) {
    AppendHexByte(out, static_cast<unsigned char>(c));
  }
  return out;
}

std::string HexText::Printable(const std::string& bytes) {
  std::string out;
  out.reserve(bytes.size());
  for (const char c : bytes) {
    const auto byte = static_cast<unsigned char>(c);
    if (c == '\\') {
      out += "\\\\";
    } else if (byte >= 0x20 && byte <= 0x7E) {
      out += c;
    } else {
      out += "\\x";
      AppendHexByte(out, byte);
    }
  }
  return out;
}

}  // namespace veltpeer
