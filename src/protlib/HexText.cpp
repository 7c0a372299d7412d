#include "protlib/HexText.h"

#include <cstring>

namespace {

bool isHexDigit(char c) {
  return (c >= '0' && c <= '9') || (c >= 'A' && c <= 'F') || (c >= 'a' && c <= 'f');
}

int digitValue(char c) {
  if (c >= '0' && c <= '9') {
    return c - '0';
  }
  if (c >= 'A' && c <= 'F') {
    return c - 'A' + 10;
  }
  return static_cast<unsigned char>(c) - 87;
}

}  // namespace

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
    if (!isHexDigit(text[i])) {
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
    const int value = (digitValue(text[i]) * 16 + digitValue(text[i + 1])) % 256;
    bytes.push_back(static_cast<char>(static_cast<unsigned char>(value < 0 ? value + 256 : value)));
  }
  return bytes;
}
