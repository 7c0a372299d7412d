// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <array>

// Reads a dotted-quad IPv4 address. Each of the four pieces is empty (read as
// 0, so "1..2.3" is 1.0.2.3 and "1.2.3." is 1.2.3.0) or decimal digits only,
// converted as strtol does with base 0 (a leading 0 makes it octal: "010" is
// 8) and below 256. Exactly three dots.
class IPParser {
 public:
  // True when text is a dotted quad; then octets holds its numbers, the first
  // being the leftmost. On false octets is unchanged. Null is not an address.
  bool Parse(const char* text);

  std::array<unsigned char, 4> octets{0, 0, 0, 0};
};

// The address of a dotted quad as a 32-bit number, first octet most
// significant. On false address is untouched.
bool parseIpAddress(const char* text, unsigned int& address);

// Writes the address as "%d.%d.%d.%d", first octet from the most significant
// byte. out needs room for 16 characters; null is ignored.
void ipToString(unsigned int address, char* out);
