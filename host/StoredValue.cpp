// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "StoredValue.h"

#include <charconv>
#include <utility>

namespace {

bool ParseDecimal(const std::string& text, std::int32_t& value) {
  const char* const end = text.data() + text.size();
  const auto result = std::from_chars(text.data(), end, value);
  return !text.empty() && result.ec == std::errc() && result.ptr == end;
}

}  // namespace

StoredValue StoredValue::OfText(std::string text) {
  StoredValue value;
  value.type_ = Type::Text;
  value.text_ = std::move(text);
  return value;
}

StoredValue StoredValue::OfBoolean(bool flag) {
  StoredValue value;
  value.type_ = Type::Boolean;
  value.boolean_ = flag;
  return value;
}

StoredValue StoredValue::OfInteger(std::int32_t number) {
  StoredValue value;
  value.type_ = Type::Integer;
  value.integer_ = number;
  return value;
}

std::string StoredValue::AsText() const {
  switch (type_) {
    case Type::Boolean:
      return boolean_ ? "true" : "false";
    case Type::Integer:
      return std::to_string(integer_);
    case Type::Text:
      break;
  }
  return text_;
}

bool StoredValue::AsBoolean() const {
  switch (type_) {
    case Type::Boolean:
      return boolean_;
    case Type::Integer:
      return integer_ != 0;
    case Type::Text:
      break;
  }
  std::int32_t number = 0;
  return text_ == "true" || (ParseDecimal(text_, number) && number != 0);
}

std::int32_t StoredValue::AsInteger() const {
  switch (type_) {
    case Type::Boolean:
      return boolean_ ? 1 : 0;
    case Type::Integer:
      return integer_;
    case Type::Text:
      break;
  }
  std::int32_t number = 0;
  return ParseDecimal(text_, number) ? number : 0;
}

bool StoredValue::operator==(const StoredValue& other) const {
  if (type_ != other.type_) {
    return false;
  }
  switch (type_) {
    case Type::Boolean:
      return boolean_ == other.boolean_;
    case Type::Integer:
      return integer_ == other.integer_;
    case Type::Text:
      break;
  }
  return text_ == other.text_;
}
