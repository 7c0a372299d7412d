// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/HexText.h"

#include <cstring>

namespace {

// A character of an unvalidated text: a digit's value, and any other
// character read as a lower-case letter.
int lenientDigitValue(char c) {
  const int value = hexDigitValue(c);
  return value >= 0 ? value : static_cast<unsigned char>(c) - 87;
}

}  // namespace

int hexDigitValue(char c) {
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

bool isHex(const char* text) {
  if (text == nullptr) {
    return false;
  }
  if (std::strcmp(text, "none") == 0) {
    return true;
  }
  const std::size_t length = std::strlen(text);
  if (length % 2 != 0) {
    return false;
  }
  for (std::size_t i = 0; i < length; ++i) {
    if (hexDigitValue(text[i]) < 0) {
      return false;
    }
  }
  return true;
}

std::string fromHex(const std::string& text) {
  std::string bytes;
  if (text == "none") {
    return bytes;
  }
  bytes.reserve(text.size() / 2);
  for (std::size_t i = 0; i + 1 < text.size(); i += 2) {
    // Reduced modulo 256, so unvalidated characters still give a defined byte.
    const int value = (lenientDigitValue(text[i]) * 16 + lenientDigitValue(text[i + 1])) % 256;
    bytes.push_back(static_cast<char>(static_cast<unsigned char>(value < 0 ? value + 256 : value)));
  }
  return bytes;
}
