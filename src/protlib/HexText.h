// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

// Hexadecimal text as the driver keeps its framing markers and, in hex mode,
// its tokens: two digits per byte, high digit first.

// The value of one hexadecimal digit ('0'-'9', 'A'-'F', 'a'-'f'), -1 for any
// other character.
int hexDigitValue(char c);

// True for "none", the empty text and any text of even length made only of
// the digits 0-9 and the letters A-F in either case; false for everything
// else (an odd length first of all) and for null.
bool isHex(const char* text);

// The bytes that a hexadecimal text stands for; "none" and the empty text give
// no bytes. Each pair of characters becomes one byte, high digit first: '0'..'9'
// are 0..9, 'A'..'F' are 10..15 and any other character is taken as a lower-case
// letter (its code minus 87). The text is not validated here (isHex does that
// where texts enter the driver); a lone last character of an odd-length text
// is dropped.
std::string fromHex(const std::string& text);
