// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The dotted-quad address parser (IPParser, parseIpAddress) and its printer.
//
// Input: the address text up to the first zero byte; its first four bytes
// are also printed as an address.

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>

#include "Require.h"
#include "config/IPParser.h"

namespace {

constexpr unsigned int kUntouched = 0xDEADBEEFU;

void CheckPrinted(unsigned int address) {
  char out[32];
  std::memset(out, 0x5A, sizeof out);
  ipToString(address, out);
  Require(std::memchr(out, '\0', 16) != nullptr, "a printed address fits 16 characters");
  unsigned int again = kUntouched;
  Require(parseIpAddress(out, again) && again == address, "a printed address parses back");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);
  const char* const address = text.c_str();
  IPParser parser;
  const bool parsed = parser.Parse(address);
  unsigned int value = kUntouched;
  Require(parseIpAddress(address, value) == parsed, "both parsers agree");
  if (parsed) {
    const std::size_t length = std::strlen(address);
    Require(std::count(address, address + length, '.') == 3, "an address has three dots");
    const unsigned int packed = static_cast<unsigned int>(parser.octets[0]) << 24 |
                                static_cast<unsigned int>(parser.octets[1]) << 16 |
                                static_cast<unsigned int>(parser.octets[2]) << 8 | parser.octets[3];
    Require(value == packed, "the first octet is the most significant byte");
    CheckPrinted(value);
  } else {
    Require(value == kUntouched, "a failed parse leaves the address alone");
    Require(parser.octets[0] == 0 && parser.octets[1] == 0 && parser.octets[2] == 0 &&
                parser.octets[3] == 0,
            "a failed parse leaves the octets alone");
  }
  unsigned int raw = 0;
  std::memcpy(&raw, text.data(), std::min(text.size(), sizeof raw));
  CheckPrinted(raw);
  return 0;
}
