// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/TextUtils.h"

#include <array>
#include <cctype>
#include <cstring>

namespace ProtUtilsN {

namespace {

const char* const kBlanks = " \t";

}  // namespace

void Trim(std::string& s) {
  const std::string::size_type first = s.find_first_not_of(kBlanks);
  if (first == std::string::npos) {
    s.clear();
    return;
  }
  const std::string::size_type last = s.find_last_not_of(kBlanks);
  s = s.substr(first, last - first + 1);
}

std::string GetTrim(const std::string& s) {
  std::string copy = s;
  Trim(copy);
  return copy;
}

void ParseSubstrings(const std::string& s, std::vector<std::string>& out, char separator) {
  std::string::size_type start = 0;
  for (std::string::size_type sep = s.find(separator); sep != std::string::npos;
       sep = s.find(separator, start)) {
    out.push_back(GetTrim(s.substr(start, sep - start)));
    start = sep + 1;
  }
  out.push_back(GetTrim(s.substr(start)));
}

bool GetConfigValue(const char* text, const char* name, std::string& value) {
  if (text == nullptr || name == nullptr) {
    return false;
  }
  const std::string source(text);
  const std::string pattern = std::string(name) + "=";
  const std::string::size_type found = source.find(pattern);
  if (found == std::string::npos) {
    return false;
  }
  const std::string::size_type begin = found + pattern.size();
  std::string::size_type end = begin;
  while (end < source.size() && std::isalnum(static_cast<unsigned char>(source[end])) != 0) {
    ++end;
  }
  value = source.substr(begin, end - begin);
  return true;
}

char* itoa(int value, char* buffer, int base) {
  if (buffer == nullptr) {
    return buffer;
  }
  if (base < 2) {
    buffer[0] = '\0';
    return buffer;
  }
  // Unsigned arithmetic so that the magnitude of INT_MIN is representable.
  unsigned int rest =
      value < 0 ? 0U - static_cast<unsigned int>(value) : static_cast<unsigned int>(value);
  const auto radix = static_cast<unsigned int>(base);
  std::array<char, sizeof(unsigned int) * 8> reversed{};
  std::size_t count = 0;
  do {
    const unsigned int digit = rest % radix;
    if (base == 16 && digit >= 10) {
      reversed[count] = static_cast<char>('a' + (digit - 10));
    } else {
      reversed[count] = static_cast<char>('0' + digit);
    }
    ++count;
    rest /= radix;
  } while (rest != 0);
  for (std::size_t i = 0; i < count; ++i) {
    buffer[i] = reversed[count - 1 - i];
  }
  buffer[count] = '\0';
  return buffer;
}

}  // namespace ProtUtilsN
