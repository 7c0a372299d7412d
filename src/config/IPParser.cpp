// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/IPParser.h"

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <string>

namespace {

// One piece of the quad; empty reads as 0.
bool parseOctet(const std::string& piece, unsigned char& octet) {
  const bool digitsOnly = std::all_of(piece.begin(), piece.end(), [](char c) {
    return std::isdigit(static_cast<unsigned char>(c)) != 0;
  });
  if (!digitsOnly) {
    return false;
  }
  const long number = std::strtol(piece.c_str(), nullptr, 0);
  if (number < 0 || number >= 256) {
    return false;
  }
  octet = static_cast<unsigned char>(number);
  return true;
}

}  // namespace

bool IPParser::Parse(const char* text) {
  if (text == nullptr) {
    return false;
  }
  const std::string address(text);
  std::array<unsigned char, 4> parsed{};
  std::string::size_type start = 0;
  for (int index = 0; index < 3; ++index) {
    const std::string::size_type dot = address.find('.', start);
    if (dot == std::string::npos ||
        !parseOctet(address.substr(start, dot - start), parsed[index])) {
      return false;
    }
    start = dot + 1;
  }
  // A fourth dot stays in the last piece and fails its digit check.
  if (!parseOctet(address.substr(start), parsed[3])) {
    return false;
  }
  octets = parsed;
  return true;
}

bool parseIpAddress(const char* text, unsigned int& address) {
  IPParser parser;
  if (!parser.Parse(text)) {
    return false;
  }
  address = (static_cast<unsigned int>(parser.octets[0]) << 24U) |
            (static_cast<unsigned int>(parser.octets[1]) << 16U) |
            (static_cast<unsigned int>(parser.octets[2]) << 8U) |
            static_cast<unsigned int>(parser.octets[3]);
  return true;
}

void ipToString(unsigned int address, char* out) {
  if (out == nullptr) {
    return;
  }
  (void)std::snprintf(out, 16, "%d.%d.%d.%d", static_cast<int>((address >> 24U) & 0xFFU),
                      static_cast<int>((address >> 16U) & 0xFFU),
                      static_cast<int>((address >> 8U) & 0xFFU), static_cast<int>(address & 0xFFU));
}
