// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

// Small text helpers shared by the framework: trimming, splitting lists,
// picking a value out of a "name=value" text and writing integers.
namespace ProtUtilsN {

// Removes blanks and tab characters (and only those) from both ends of s.
void Trim(std::string& s);

// A copy of s with blanks and tabs removed from both ends.
std::string GetTrim(const std::string& s);

// Appends the trimmed pieces of s between separators to out, which is not
// cleared first. Empty pieces are kept: an empty s gives one empty piece and
// a trailing separator a final empty one.
void ParseSubstrings(const std::string& s, std::vector<std::string>& out, char separator);

// Finds the first "name=" anywhere in text (inside a longer word too) and sets
// value to the run of letters and digits that follows it, possibly empty.
// Returns false and leaves value untouched when "name=" does not occur or an
// argument is null.
bool GetConfigValue(const char* text, const char* name, std::string& value);

// Writes the digits of value in base into buffer, terminated, and returns
// buffer. Base 16 uses "0".."9" and "a".."f"; any other base writes each digit
// as '0' plus the digit. No sign is written: a negative value is written as
// its magnitude. A base below 2 writes the empty text. The caller provides
// room for every digit plus the terminator: 12 bytes cover base 10, 33 bytes
// any base. A null buffer is returned as is.
char* itoa(int value, char* buffer, int base);

}  // namespace ProtUtilsN
