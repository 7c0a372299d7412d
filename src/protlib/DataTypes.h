// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <array>
#include <cstdint>
#include <string>
#include <vector>

#include "HostTypes.h"
#include "ITag.h"

// The host data types that the framework knows, their type texts as they
// stand in tag addresses, and the type queries on tags.
namespace ProtUtilsN {

// One row of the type table: the type text ("string-" for a counted type),
// the type, the item type (ICU_NONE for a scalar), the fixed length in bytes
// (0 when the length follows from a count) and the type's flag bit.
struct DataTypeEntry {
  const char* text;
  ICU_Type type;
  ICU_Type itemType;
  std::int32_t length;
  std::int32_t flag;
};

// The 27 known types. The order is fixed: the flag of a row is 1 shifted left
// by its row index, and searches take the first matching row.
extern const std::array<DataTypeEntry, 27> DataTypes;

// The length of one item of the type; 0 for counted types, "object" and any
// value outside 1..24.
int GetDataLength(ICU_Type type);

// Parses a data-type text such as "unsignedInt-4(swap4, neg)". On success
// sets type, item type and length and appends the trimmed parenthesised
// parameters to parameters (which is not cleared). On failure type, item type
// and length are unchanged, though parameters may already have been appended.
// Fails for an unknown type name, a "(" without a following ")", and a count
// that is negative or whose length does not fit an int.
bool GetTAVUType(const std::string& text, ICU_Type& type, ICU_Type& itemType, int& length,
                 std::vector<std::string>& parameters);

// The data-type text for a type and byte length: the row's text, with the
// item count appended for a counted type ("string-20", "unsignedInt-4"), the
// length itself appended for "object" ("object12"), "??" for an unknown type.
std::string GetTAVUName(ICU_Type type, int length);

// The number of items of the tag: 1 for a scalar (item type ICU_NONE or an
// item type without a length), else its length divided by the item length.
// 0 for a null tag.
int GetItemCount(const ITag* tag);
int GetItemCount(int length, ICU_Type itemType);

// The item type of an array tag, else the tag's type. ICU_NONE for null.
ICU_Type GetBasicType(const ITag* tag);
// GetDataLength of GetBasicType. 0 for null.
int GetBasicLength(const ITag* tag);

// True for "boolean" and "boolean-" only.
bool IsBitType(ICU_Type type);
// IsBitType of the tag's type; false for null.
bool IsBitType(const ITag* tag);

// The flag of the first row of that type, 0 when the type has no row.
int GetTypeFlag(ICU_Type type);

// The framework version, 200.
int GetVersion();

}  // namespace ProtUtilsN
