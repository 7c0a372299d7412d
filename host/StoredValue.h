// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <map>
#include <string>

// One typed value of the permanent storage. Only the member of its type is
// meaningful. A value read as another type is converted (AsText, AsBoolean,
// AsInteger), so a getter of the wrong type still answers sensibly.
class StoredValue {
 public:
  enum class Type { Text, Boolean, Integer };

  static StoredValue OfText(std::string text);
  static StoredValue OfBoolean(bool flag);
  static StoredValue OfInteger(std::int32_t number);

  Type GetType() const { return type_; }
  // Text as is; booleans as "true" or "false"; integers in decimal.
  std::string AsText() const;
  // Integers: non-zero; texts: "true", or a decimal number other than 0.
  bool AsBoolean() const;
  // Booleans: 1 or 0; texts: their decimal value when the whole text is a
  // 32-bit decimal number, else 0.
  std::int32_t AsInteger() const;

  // Same type and same value of that type.
  bool operator==(const StoredValue& other) const;
  bool operator!=(const StoredValue& other) const { return !(*this == other); }

 private:
  Type type_ = Type::Text;
  std::string text_;
  bool boolean_ = false;
  std::int32_t integer_ = 0;
};

// Values by name, and names by section; both ordered bytewise, which is also
// the order of the storage file.
using StoredEntries = std::map<std::string, StoredValue>;
using StoredSections = std::map<std::string, StoredEntries>;
