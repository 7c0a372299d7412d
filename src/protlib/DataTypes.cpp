// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/DataTypes.h"

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <iterator>

#include "protlib/TextUtils.h"

namespace ProtUtilsN {

const std::array<DataTypeEntry, 27> DataTypes = {{
    {"boolean", ICU_BOOLEAN, ICU_NONE, 1, 0x1},
    {"byte", ICU_BYTE, ICU_NONE, 1, 0x2},
    {"short", ICU_SHORT, ICU_NONE, 2, 0x4},
    {"int", ICU_INT, ICU_NONE, 4, 0x8},
    {"unsignedByte", ICU_UNSIGNED_BYTE, ICU_NONE, 1, 0x10},
    {"unsignedShort", ICU_UNSIGNED_SHORT, ICU_NONE, 2, 0x20},
    {"unsignedInt", ICU_UNSIGNED_INT, ICU_NONE, 4, 0x40},
    {"float", ICU_FLOAT, ICU_NONE, 4, 0x80},
    {"double", ICU_DOUBLE, ICU_NONE, 8, 0x100},
    {"string-", ICU_STRING, ICU_BYTE, 0, 0x200},
    {"binary-", ICU_BINARY, ICU_UNSIGNED_BYTE, 0, 0x400},
    {"time", ICU_TIME, ICU_NONE, 10, 0x800},
    {"boolean-", ICU_BOOLEAN_ARRAY, ICU_BOOLEAN, 0, 0x1000},
    {"byte-", ICU_BYTE_ARRAY, ICU_BYTE, 0, 0x2000},
    {"short-", ICU_SHORT_ARRAY, ICU_SHORT, 0, 0x4000},
    {"int-", ICU_INT_ARRAY, ICU_INT, 0, 0x8000},
    {"unsignedByte-", ICU_UNSIGNED_BYTE_ARRAY, ICU_UNSIGNED_BYTE, 0, 0x10000},
    {"unsignedShort-", ICU_UNSIGNED_SHORT_ARRAY, ICU_UNSIGNED_SHORT, 0, 0x20000},
    {"unsignedInt-", ICU_UNSIGNED_INT_ARRAY, ICU_UNSIGNED_INT, 0, 0x40000},
    {"float-", ICU_FLOAT_ARRAY, ICU_FLOAT, 0, 0x80000},
    {"double-", ICU_DOUBLE_ARRAY, ICU_DOUBLE, 0, 0x100000},
    {"time-", ICU_TIME_ARRAY, ICU_TIME, 0, 0x200000},
    {"uint64", ICU_UINT64, ICU_NONE, 8, 0x400000},
    {"int64", ICU_INT64, ICU_NONE, 8, 0x800000},
    {"uint64-", ICU_UINT64_ARRAY, ICU_UINT64, 0, 0x1000000},
    {"int64-", ICU_INT64_ARRAY, ICU_INT64, 0, 0x2000000},
    {"object", ICU_OBJECT, ICU_NONE, 0, 0x4000000},
}};

namespace {

// Item lengths of types 1..24, indexed by type minus 1.
// The counted types have no item length of their own; theirs comes from
// their item type.
const std::array<int, 24> kItemLengths = {1, 1, 2, 4, 1, 2, 4, 4, 8, 0, 0, 10,
                                          0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 8, 8};

const DataTypeEntry* FindByText(const std::string& text) {
  for (const DataTypeEntry& row : DataTypes) {
    if (text == row.text) {
      return &row;
    }
  }
  return nullptr;
}

const DataTypeEntry* FindByType(ICU_Type type) {
  for (const DataTypeEntry& row : DataTypes) {
    if (row.type == type) {
      return &row;
    }
  }
  return nullptr;
}

// Splits "name(p1, p2)..." into the trimmed name and the parameter list.
// False when "(" has no ")" after it.
bool SplitParameters(std::string& typeText, std::vector<std::string>& parameters) {
  const std::string::size_type open = typeText.find('(');
  if (open == std::string::npos) {
    return true;
  }
  const std::string::size_type close = typeText.find(')', open);
  if (close == std::string::npos) {
    return false;
  }
  ParseSubstrings(typeText.substr(open + 1, close - open - 1), parameters, ',');
  typeText = GetTrim(typeText.substr(0, open));
  return true;
}

}  // namespace

int GetDataLength(ICU_Type type) {
  const int index = static_cast<int>(type) - 1;
  if (index < 0 || index >= static_cast<int>(std::size(kItemLengths))) {
    return 0;
  }
  return kItemLengths[index];
}

bool GetTAVUType(const std::string& text, ICU_Type& type, ICU_Type& itemType, int& length,
                 std::vector<std::string>& parameters) {
  std::string typeText = GetTrim(text);
  if (!SplitParameters(typeText, parameters)) {
    return false;
  }
  std::string name = typeText;
  long count = 1;
  const std::string::size_type dash = typeText.find('-');
  if (dash != std::string::npos) {
    name = typeText.substr(0, dash + 1);
    errno = 0;
    count = std::strtol(typeText.c_str() + dash + 1, nullptr, 10);
    if (errno == ERANGE || count < 0) {
      return false;
    }
  }
  const DataTypeEntry* const row = FindByText(name);
  if (row == nullptr) {
    return false;
  }
  long bytes = row->length;
  if (bytes == 0) {
    const long itemLength = GetDataLength(row->itemType);
    if (itemLength != 0 && count > INT_MAX / itemLength) {
      return false;
    }
    bytes = itemLength * count;
  }
  type = row->type;
  itemType = row->itemType;
  length = static_cast<int>(bytes);
  return true;
}

std::string GetTAVUName(ICU_Type type, int length) {
  const DataTypeEntry* const row = FindByType(type);
  if (row == nullptr) {
    return "??";
  }
  std::string name = row->text;
  if (row->length == 0) {
    const int itemLength = GetDataLength(row->itemType);
    name += std::to_string(itemLength == 0 ? length : length / itemLength);
  }
  return name;
}

int GetItemCount(const ITag* tag) {
  if (tag == nullptr) {
    return 0;
  }
  return GetItemCount(tag->GetVarLength(), tag->GetItemType());
}

int GetItemCount(int length, ICU_Type itemType) {
  const int itemLength = GetDataLength(itemType);
  if (itemType == ICU_NONE || itemLength == 0) {
    return 1;
  }
  return length / itemLength;
}

ICU_Type GetBasicType(const ITag* tag) {
  if (tag == nullptr) {
    return ICU_NONE;
  }
  const ICU_Type itemType = tag->GetItemType();
  return itemType != ICU_NONE ? itemType : tag->GetVarType();
}

int GetBasicLength(const ITag* tag) { return GetDataLength(GetBasicType(tag)); }

bool IsBitType(ICU_Type type) { return type == ICU_BOOLEAN || type == ICU_BOOLEAN_ARRAY; }

bool IsBitType(const ITag* tag) { return tag != nullptr && IsBitType(tag->GetVarType()); }

int GetTypeFlag(ICU_Type type) {
  const DataTypeEntry* const row = FindByType(type);
  return row == nullptr ? 0 : row->flag;
}

int GetVersion() { return 200; }

}  // namespace ProtUtilsN
