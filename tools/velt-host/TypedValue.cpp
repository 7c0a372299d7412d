// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/TypedValue.h"

#include <array>
#include <cerrno>
#include <cfloat>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string_view>

namespace velthost {

namespace {

// The host's data-type texts, indexed by ICU_Type; a text ending in "-"
// takes a count.
constexpr std::array<const char*, ICU_OBJECT + 1> kTypeNames = {
    "",       "boolean",       "byte",           "short",
    "int",    "unsignedByte",  "unsignedShort",  "unsignedInt",
    "float",  "double",        "string-",        "binary-",
    "time",   "boolean-",      "byte-",          "short-",
    "int-",   "unsignedByte-", "unsignedShort-", "unsignedInt-",
    "float-", "double-",       "time-",          "uint64",
    "int64",  "uint64-",       "int64-",         "object"};
constexpr int kTypeCount = static_cast<int>(kTypeNames.size());

// Bytes of one item of a scalar type; 0 for texts, arrays and unknown types.
int ScalarBytes(ICU_Type type) {
  switch (type) {
    case ICU_BOOLEAN:
    case ICU_BYTE:
    case ICU_UNSIGNED_BYTE:
      return 1;
    case ICU_SHORT:
    case ICU_UNSIGNED_SHORT:
      return 2;
    case ICU_INT:
    case ICU_UNSIGNED_INT:
    case ICU_FLOAT:
      return 4;
    case ICU_DOUBLE:
    case ICU_UINT64:
    case ICU_INT64:
      return 8;
    case ICU_TIME:
      return 10;
    default:
      return 0;
  }
}

bool IsArray(ICU_Type type) {
  return (type >= ICU_BOOLEAN_ARRAY && type <= ICU_TIME_ARRAY) || type == ICU_UINT64_ARRAY ||
         type == ICU_INT64_ARRAY;
}

bool IsSigned(ICU_Type type) {
  return type == ICU_BYTE || type == ICU_SHORT || type == ICU_INT || type == ICU_INT64;
}

bool IsInteger(ICU_Type type) {
  return IsSigned(type) || type == ICU_UNSIGNED_BYTE || type == ICU_UNSIGNED_SHORT ||
         type == ICU_UNSIGNED_INT || type == ICU_UINT64;
}

// The item type of an array type, from the shape or else from the array type.
ICU_Type ItemType(const ValueShape& shape) {
  if (shape.itemType != ICU_NONE) {
    return shape.itemType;
  }
  switch (shape.type) {
    case ICU_UINT64_ARRAY:
      return ICU_UINT64;
    case ICU_INT64_ARRAY:
      return ICU_INT64;
    case ICU_TIME_ARRAY:
      return ICU_TIME;
    default:
      // boolean- .. double- hold the scalar types boolean .. double in order.
      return IsArray(shape.type) ? static_cast<ICU_Type>(shape.type - ICU_TIME) : ICU_NONE;
  }
}

std::string Hex(const unsigned char* bytes, int count) {
  constexpr std::string_view kDigits = "0123456789abcdef";
  std::string text;
  for (int i = 0; i < count; ++i) {
    text += kDigits[bytes[i] >> 4U];
    text += kDigits[bytes[i] & 0x0FU];
  }
  return text;
}

int HexDigit(char c) {
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

bool ParseHex(const std::string& text, unsigned char* bytes, int room) {
  if (text.size() % 2 != 0 || text.size() / 2 > static_cast<std::size_t>(room)) {
    return false;
  }
  for (std::size_t i = 0; i < text.size(); i += 2) {
    const int high = HexDigit(text[i]);
    const int low = HexDigit(text[i + 1]);
    if (high < 0 || low < 0) {
      return false;
    }
    bytes[i / 2] = static_cast<unsigned char>((high << 4) | low);
  }
  return true;
}

template <typename T>
T Load(const unsigned char* bytes) {
  T value{};
  std::memcpy(&value, bytes, sizeof value);
  return value;
}

template <typename T>
void Store(unsigned char* bytes, T value) {
  std::memcpy(bytes, &value, sizeof value);
}

std::string Decimal(double value) {
  std::array<char, 64> text{};
  // %g of any double fits, so the length is not needed.
  (void)std::snprintf(text.data(), text.size(), "%g", value);
  return text.data();
}

std::string FormatScalar(ICU_Type type, const unsigned char* bytes) {
  switch (type) {
    case ICU_BOOLEAN:
      return bytes[0] != 0 ? "1" : "0";
    case ICU_BYTE:
      return std::to_string(Load<std::int8_t>(bytes));
    case ICU_SHORT:
      return std::to_string(Load<std::int16_t>(bytes));
    case ICU_INT:
      return std::to_string(Load<std::int32_t>(bytes));
    case ICU_UNSIGNED_BYTE:
      return std::to_string(Load<std::uint8_t>(bytes));
    case ICU_UNSIGNED_SHORT:
      return std::to_string(Load<std::uint16_t>(bytes));
    case ICU_UNSIGNED_INT:
      return std::to_string(Load<std::uint32_t>(bytes));
    case ICU_INT64:
      return std::to_string(Load<std::int64_t>(bytes));
    case ICU_UINT64:
      return std::to_string(Load<std::uint64_t>(bytes));
    case ICU_FLOAT:
      return Decimal(static_cast<double>(Load<float>(bytes)));
    case ICU_DOUBLE:
      return Decimal(Load<double>(bytes));
    default:
      return Hex(bytes, ScalarBytes(type));
  }
}

// The largest magnitude of a positive and of a negative value of an integer
// type.
void IntegerRange(ICU_Type type, std::uint64_t& positive, std::uint64_t& negative) {
  const int bits = 8 * ScalarBytes(type);
  if (IsSigned(type)) {
    positive = (std::uint64_t{1} << static_cast<unsigned>(bits - 1)) - 1;
    negative = positive + 1;
  } else {
    positive = bits == 64 ? UINT64_MAX : (std::uint64_t{1} << static_cast<unsigned>(bits)) - 1;
    negative = 0;
  }
}

std::string Expectation(ICU_Type type) {
  if (type == ICU_BOOLEAN) {
    return "0, 1, true or false";
  }
  if (IsInteger(type)) {
    std::uint64_t positive = 0;
    std::uint64_t negative = 0;
    IntegerRange(type, positive, negative);
    const std::string lowest = negative == 0 ? "0" : "-" + std::to_string(negative);
    return "a decimal or 0x hex number from " + lowest + " to " + std::to_string(positive);
  }
  if (type == ICU_FLOAT || type == ICU_DOUBLE) {
    return "a number";
  }
  return "at most " + std::to_string(ScalarBytes(type)) + " pairs of hex digits";
}

// Decimal or 0x hex digits with an optional minus sign; the magnitude must
// fit 64 bits.
bool ParseMagnitude(const std::string& text, bool& negative, std::uint64_t& magnitude) {
  std::size_t position = 0;
  negative = !text.empty() && text[0] == '-';
  if (negative) {
    ++position;
  }
  unsigned base = 10;
  if (text.compare(position, 2, "0x") == 0 || text.compare(position, 2, "0X") == 0) {
    base = 16;
    position += 2;
  }
  if (position == text.size()) {
    return false;
  }
  magnitude = 0;
  for (; position < text.size(); ++position) {
    const int digit = HexDigit(text[position]);
    if (digit < 0 || static_cast<unsigned>(digit) >= base) {
      return false;
    }
    if (magnitude > (UINT64_MAX - static_cast<unsigned>(digit)) / base) {
      return false;
    }
    magnitude = magnitude * base + static_cast<unsigned>(digit);
  }
  return true;
}

bool ParseInteger(ICU_Type type, const std::string& text, unsigned char* bytes) {
  bool negative = false;
  std::uint64_t magnitude = 0;
  if (!ParseMagnitude(text, negative, magnitude)) {
    return false;
  }
  std::uint64_t positiveMax = 0;
  std::uint64_t negativeMax = 0;
  IntegerRange(type, positiveMax, negativeMax);
  if (magnitude > (negative ? negativeMax : positiveMax)) {
    return false;
  }
  // Two's complement, cut to the type's width below.
  const std::uint64_t bits = negative ? ~magnitude + 1 : magnitude;
  switch (ScalarBytes(type)) {
    case 1:
      Store(bytes, static_cast<std::uint8_t>(bits));
      break;
    case 2:
      Store(bytes, static_cast<std::uint16_t>(bits));
      break;
    case 4:
      Store(bytes, static_cast<std::uint32_t>(bits));
      break;
    default:
      Store(bytes, bits);
      break;
  }
  return true;
}

bool ParseReal(ICU_Type type, const std::string& text, unsigned char* bytes) {
  if (text.empty() || text[0] == ' ' || text[0] == '\t') {
    return false;
  }
  errno = 0;
  char* end = nullptr;
  const double value = std::strtod(text.c_str(), &end);
  if (end != text.c_str() + text.size() || (errno == ERANGE && std::isinf(value))) {
    return false;
  }
  if (type == ICU_DOUBLE) {
    Store(bytes, value);
    return true;
  }
  if (std::isfinite(value) && std::fabs(value) > FLT_MAX) {
    return false;
  }
  Store(bytes, static_cast<float>(value));
  return true;
}

bool ParseScalar(ICU_Type type, const std::string& text, unsigned char* bytes) {
  if (type == ICU_BOOLEAN) {
    if (text == "0" || text == "false") {
      bytes[0] = 0;
      return true;
    }
    if (text == "1" || text == "true") {
      bytes[0] = 1;
      return true;
    }
    return false;
  }
  if (IsInteger(type)) {
    return ParseInteger(type, text, bytes);
  }
  if (type == ICU_FLOAT || type == ICU_DOUBLE) {
    return ParseReal(type, text, bytes);
  }
  return ParseHex(text, bytes, ScalarBytes(type));
}

std::vector<std::string> Words(const std::string& text) {
  std::vector<std::string> words;
  std::size_t position = 0;
  while (position < text.size()) {
    const std::size_t begin = text.find_first_not_of(" \t", position);
    if (begin == std::string::npos) {
      break;
    }
    std::size_t end = text.find_first_of(" \t", begin);
    if (end == std::string::npos) {
      end = text.size();
    }
    words.push_back(text.substr(begin, end - begin));
    position = end;
  }
  return words;
}

std::string FormatArray(const ValueShape& shape, const unsigned char* bytes) {
  const ICU_Type item = ItemType(shape);
  const int itemBytes = ScalarBytes(item);
  if (itemBytes == 0) {
    return Hex(bytes, shape.length);
  }
  std::string text;
  for (int i = 0; i + itemBytes <= shape.length; i += itemBytes) {
    if (!text.empty()) {
      text += ' ';
    }
    text += FormatScalar(item, bytes + i);
  }
  return text;
}

}  // namespace

std::string TypedValue::TypeName(const ValueShape& shape) {
  if (shape.type <= ICU_NONE || shape.type >= kTypeCount) {
    return "type " + std::to_string(static_cast<int>(shape.type));
  }
  std::string name = kTypeNames[shape.type];
  if (name.back() != '-') {
    return name;
  }
  if (shape.type == ICU_STRING || shape.type == ICU_BINARY) {
    return name + std::to_string(shape.length);
  }
  const int itemBytes = ScalarBytes(ItemType(shape));
  return name + std::to_string(itemBytes == 0 ? shape.length : shape.length / itemBytes);
}

std::string TypedValue::Format(const ValueShape& shape, const unsigned char* bytes) {
  if (shape.length <= 0) {
    return {};
  }
  if (shape.type == ICU_STRING) {
    const void* const zero = std::memchr(bytes, 0, static_cast<std::size_t>(shape.length));
    const auto* const end =
        zero == nullptr ? bytes + shape.length : static_cast<const unsigned char*>(zero);
    return {reinterpret_cast<const char*>(bytes), reinterpret_cast<const char*>(end)};
  }
  if (IsArray(shape.type)) {
    return FormatArray(shape, bytes);
  }
  const int scalarBytes = ScalarBytes(shape.type);
  if (scalarBytes == 0 || shape.length < scalarBytes) {
    return Hex(bytes, shape.length);
  }
  return FormatScalar(shape.type, bytes);
}

bool TypedValue::Parse(const ValueShape& shape, const std::string& text,
                       std::vector<unsigned char>& bytes, std::string& error) {
  const int length = shape.length < 0 ? 0 : shape.length;
  bytes.assign(static_cast<std::size_t>(length), 0);
  std::string expected;
  bool ok = false;
  if (shape.type == ICU_STRING) {
    ok = text.size() <= static_cast<std::size_t>(length);
    if (ok && !text.empty()) {
      std::memcpy(bytes.data(), text.data(), text.size());
    }
    expected = "at most " + std::to_string(length) + " bytes expected";
  } else if (IsArray(shape.type)) {
    const ICU_Type item = ItemType(shape);
    const int itemBytes = ScalarBytes(item);
    const int items = itemBytes == 0 ? 0 : length / itemBytes;
    const std::vector<std::string> words = Words(text);
    ok = itemBytes != 0 && words.size() == static_cast<std::size_t>(items);
    for (int i = 0; ok && i < items; ++i) {
      ok = ParseScalar(item, words[static_cast<std::size_t>(i)],
                       bytes.data() + static_cast<std::ptrdiff_t>(i) * itemBytes);
    }
    expected = std::to_string(items) + (items == 1 ? " item" : " items") + " expected, " +
               (items == 1 ? "" : "each ") + Expectation(item);
  } else if (ScalarBytes(shape.type) != 0 && length >= ScalarBytes(shape.type)) {
    ok = ParseScalar(shape.type, text, bytes.data());
    expected = Expectation(shape.type) + " expected";
  } else {
    ok = ParseHex(text, bytes.data(), length);
    expected = "at most " + std::to_string(length) + " pairs of hex digits expected";
  }
  if (!ok) {
    bytes.assign(static_cast<std::size_t>(length), 0);
    error = "bad " + TypeName(shape) + " value '" + text + "' (" + expected + ")";
  }
  return ok;
}

}  // namespace velthost
