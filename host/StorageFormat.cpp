// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "StorageFormat.h"

#include <charconv>
#include <cstddef>
#include <cstdint>
#include <string_view>
#include <utility>

#include "StorageError.h"

namespace {

constexpr const char* kHeader =
    "# Velt Conduit permanent storage. Each [\"section\"] holds lines\n"
    "# \"name\" = TYPE VALUE with TYPE text (a quoted text), bool (true or false)\n"
    "# or int (a signed 32-bit decimal number). In quoted texts \\\\ \\\" \\n \\r \\t\n"
    "# and \\xHH stand for a backslash, a quote and the other control bytes.\n";

const char* const kHexDigits = "0123456789ABCDEF";

bool IsSpace(char c) { return c == ' ' || c == '\t' || c == '\r'; }

void SkipSpace(std::string_view line, std::size_t& pos) {
  while (pos < line.size() && IsSpace(line[pos])) {
    ++pos;
  }
}

int HexValue(char c) {
  if (c >= '0' && c <= '9') {
    return c - '0';
  }
  if (c >= 'a' && c <= 'f') {
    return c - 'a' + 10;
  }
  if (c >= 'A' && c <= 'F') {
    return c - 'A' + 10;
  }
  return -1;
}

// The escape after a backslash at pos; pos ends after it.
bool ParseEscape(std::string_view line, std::size_t& pos, std::string& out, std::string& reason) {
  if (pos >= line.size()) {
    reason = "unterminated quoted text";
    return false;
  }
  const char c = line[pos++];
  switch (c) {
    case '\\':
    case '"':
      out += c;
      return true;
    case 'n':
      out += '\n';
      return true;
    case 'r':
      out += '\r';
      return true;
    case 't':
      out += '\t';
      return true;
    case 'x': {
      const int high = pos < line.size() ? HexValue(line[pos]) : -1;
      const int low = pos + 1 < line.size() ? HexValue(line[pos + 1]) : -1;
      if (high < 0 || low < 0) {
        reason = "\\x must be followed by two hexadecimal digits";
        return false;
      }
      pos += 2;
      out += static_cast<char>(high * 16 + low);
      return true;
    }
    default:
      reason = std::string("unknown escape \\") + c;
      return false;
  }
}

// A quoted text starting at pos; pos ends after the closing quote.
bool ParseQuoted(std::string_view line, std::size_t& pos, std::string& out, std::string& reason) {
  if (pos >= line.size() || line[pos] != '"') {
    reason = "expected a quoted text";
    return false;
  }
  ++pos;
  out.clear();
  while (pos < line.size()) {
    const char c = line[pos++];
    if (c == '"') {
      return true;
    }
    if (c != '\\') {
      out += c;
    } else if (!ParseEscape(line, pos, out, reason)) {
      return false;
    }
  }
  reason = "unterminated quoted text";
  return false;
}

std::string_view ParseWord(std::string_view line, std::size_t& pos) {
  const std::size_t start = pos;
  while (pos < line.size() && !IsSpace(line[pos])) {
    ++pos;
  }
  return line.substr(start, pos - start);
}

bool ParseInteger(std::string_view word, StoredValue& value, std::string& reason) {
  std::int32_t number = 0;
  const char* const end = word.data() + word.size();
  const auto result = std::from_chars(word.data(), end, number);
  if (result.ec == std::errc::result_out_of_range && result.ptr == end) {
    reason = "integer value out of range: " + std::string(word);
    return false;
  }
  if (word.empty() || result.ec != std::errc() || result.ptr != end) {
    reason = "bad integer value: '" + std::string(word) + "'";
    return false;
  }
  value = StoredValue::OfInteger(number);
  return true;
}

bool ParseBoolean(std::string_view word, StoredValue& value, std::string& reason) {
  if (word != "true" && word != "false") {
    reason = "bad boolean value: '" + std::string(word) + "' (expected true or false)";
    return false;
  }
  value = StoredValue::OfBoolean(word == "true");
  return true;
}

bool ParseValue(std::string_view line, std::size_t& pos, StoredValue& value, std::string& reason) {
  const std::string_view type = ParseWord(line, pos);
  SkipSpace(line, pos);
  if (type == "text") {
    std::string text;
    if (!ParseQuoted(line, pos, text, reason)) {
      return false;
    }
    value = StoredValue::OfText(std::move(text));
    return true;
  }
  if (type == "bool") {
    return ParseBoolean(ParseWord(line, pos), value, reason);
  }
  if (type == "int") {
    return ParseInteger(ParseWord(line, pos), value, reason);
  }
  reason = "unknown value type '" + std::string(type) + "' (expected text, bool or int)";
  return false;
}

bool ExpectEnd(std::string_view line, std::size_t& pos, std::string& reason) {
  SkipSpace(line, pos);
  if (pos < line.size()) {
    reason = "unexpected text at the end of the line";
    return false;
  }
  return true;
}

bool ParseHeader(std::string_view line, std::size_t pos, std::string& section,
                 std::string& reason) {
  ++pos;  // '['
  SkipSpace(line, pos);
  if (!ParseQuoted(line, pos, section, reason)) {
    return false;
  }
  SkipSpace(line, pos);
  if (pos >= line.size() || line[pos] != ']') {
    reason = "expected ']' after the section name";
    return false;
  }
  ++pos;
  return ExpectEnd(line, pos, reason);
}

bool ParseEntry(std::string_view line, std::size_t pos, std::string& name, StoredValue& value,
                std::string& reason) {
  if (!ParseQuoted(line, pos, name, reason)) {
    return false;
  }
  SkipSpace(line, pos);
  if (pos >= line.size() || line[pos] != '=') {
    reason = "expected '=' after the name";
    return false;
  }
  ++pos;
  SkipSpace(line, pos);
  return ParseValue(line, pos, value, reason) && ExpectEnd(line, pos, reason);
}

// Parses one line into sections; `current` is the section entries go to.
bool ParseLine(std::string_view line, StoredSections& sections, StoredEntries*& current,
               std::string& reason) {
  std::size_t pos = 0;
  SkipSpace(line, pos);
  if (pos == line.size() || line[pos] == '#') {
    return true;
  }
  if (line[pos] == '[') {
    std::string section;
    if (!ParseHeader(line, pos, section, reason)) {
      return false;
    }
    current = &sections[section];
    return true;
  }
  if (line[pos] != '"') {
    reason = R"(expected a ["section"] header or a "name" = TYPE VALUE entry)";
    return false;
  }
  std::string name;
  StoredValue value;
  if (!ParseEntry(line, pos, name, value, reason)) {
    return false;
  }
  if (current == nullptr) {
    reason = "entry before the first [\"section\"] header";
    return false;
  }
  if (!current->emplace(name, value).second) {
    reason = "name " + StorageFormat::Quote(name) + " given twice in one section";
    return false;
  }
  return true;
}

std::string ValueText(const StoredValue& value) {
  switch (value.GetType()) {
    case StoredValue::Type::Boolean:
      return "bool " + value.AsText();
    case StoredValue::Type::Integer:
      return "int " + value.AsText();
    case StoredValue::Type::Text:
      break;
  }
  return "text " + StorageFormat::Quote(value.AsText());
}

}  // namespace

std::string StorageFormat::Serialize(const StoredSections& sections) {
  std::string out = kHeader;
  for (const auto& [section, entries] : sections) {
    if (entries.empty()) {
      continue;
    }
    out += "\n[" + Quote(section) + "]\n";
    for (const auto& [name, value] : entries) {
      out += Quote(name) + " = " + ValueText(value) + "\n";
    }
  }
  return out;
}

StoredSections StorageFormat::Parse(const std::string& content, const std::string& path) {
  StoredSections sections;
  StoredEntries* current = nullptr;
  const std::string_view text(content);
  std::size_t start = 0;
  int lineNumber = 0;
  while (start < text.size()) {
    const std::size_t newline = text.find('\n', start);
    const std::size_t end = newline == std::string_view::npos ? text.size() : newline;
    ++lineNumber;
    std::string reason;
    if (!ParseLine(text.substr(start, end - start), sections, current, reason)) {
      throw StorageError(path, lineNumber, reason);
    }
    start = end + 1;
  }
  return sections;
}

std::string StorageFormat::Quote(const std::string& raw) {
  std::string out = "\"";
  for (const char c : raw) {
    const auto byte = static_cast<unsigned char>(c);
    switch (c) {
      case '\\':
        out += "\\\\";
        break;
      case '"':
        out += "\\\"";
        break;
      case '\n':
        out += "\\n";
        break;
      case '\r':
        out += "\\r";
        break;
      case '\t':
        out += "\\t";
        break;
      default:
        if (byte < 0x20 || byte == 0x7F) {
          out += "\\x";
          out += kHexDigits[byte >> 4];
          out += kHexDigits[byte & 0x0F];
        } else {
          out += c;
        }
    }
  }
  return out + "\"";
}
