// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The data-type text of tag addresses (ProtUtilsN::GetTAVUType) and the type
// queries built on the type table.
//
// Input: the data-type text.

#include <cstdint>
#include <string>
#include <vector>

#include "Require.h"
#include "protlib/DataTypes.h"

namespace {

constexpr auto kUnsetType = static_cast<ICU_Type>(0x5A);
constexpr int kUnsetLength = -12345;

void CheckParsed(ICU_Type type, ICU_Type itemType, int length) {
  Require(type >= 1 && type <= 27, "a parsed type is one of the table's");
  Require(length >= 0, "a parsed length is not negative");
  Require(ProtUtilsN::GetTypeFlag(type) != 0, "a parsed type has a flag");
  Require(ProtUtilsN::GetItemCount(length, itemType) >= 0, "an item count is not negative");
  const std::string name = ProtUtilsN::GetTAVUName(type, length);
  Require(name != "??", "a parsed type has a name");
  // "object" is named with its length appended, which does not parse back;
  // every other type does.
  if (type == 27) {
    return;
  }
  ICU_Type again = kUnsetType;
  ICU_Type itemAgain = kUnsetType;
  int lengthAgain = kUnsetLength;
  std::vector<std::string> parameters;
  Require(ProtUtilsN::GetTAVUType(name, again, itemAgain, lengthAgain, parameters),
          "a type's name parses");
  Require(again == type && itemAgain == itemType && lengthAgain == length,
          "a type's name parses back to the same type and length");
  Require(parameters.empty(), "a type's name has no conversions");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);
  ICU_Type type = kUnsetType;
  ICU_Type itemType = kUnsetType;
  int length = kUnsetLength;
  std::vector<std::string> parameters{"kept"};
  const bool parsed = ProtUtilsN::GetTAVUType(text, type, itemType, length, parameters);
  Require(parameters.front() == "kept", "the parameter list is appended to");
  if (parsed) {
    CheckParsed(type, itemType, length);
  } else {
    Require(type == kUnsetType && itemType == kUnsetType && length == kUnsetLength,
            "a failed parse leaves type, item type and length alone");
  }
  // The queries take any type number.
  const auto anyType = static_cast<ICU_Type>(size == 0 ? 0 : data[0]);
  ProtUtilsN::GetDataLength(anyType);
  ProtUtilsN::GetTypeFlag(anyType);
  ProtUtilsN::GetTAVUName(anyType, static_cast<int>(size));
  ProtUtilsN::GetItemCount(static_cast<int>(size), anyType);
  return 0;
}
