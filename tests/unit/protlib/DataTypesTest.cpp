// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/DataTypes.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "TestTagBase.h"

using ProtUtilsN::DataTypes;
using ProtUtilsN::GetDataLength;
using ProtUtilsN::GetTAVUName;
using ProtUtilsN::GetTAVUType;

namespace {

struct Parsed {
  bool ok = false;
  ICU_Type type = ICU_NONE;
  ICU_Type itemType = ICU_NONE;
  int length = -7;
  std::vector<std::string> parameters;
};

Parsed Parse(const std::string& text) {
  Parsed p;
  p.ok = GetTAVUType(text, p.type, p.itemType, p.length, p.parameters);
  return p;
}

}  // namespace

TEST(DataTypesTable, RowsAreInTypeOrderWithTheirTexts) {
  const char* const texts[27] = {
      "boolean",      "byte",   "short",   "int",     "unsignedByte",  "unsignedShort",
      "unsignedInt",  "float",  "double",  "string-", "binary-",       "time",
      "boolean-",     "byte-",  "short-",  "int-",    "unsignedByte-", "unsignedShort-",
      "unsignedInt-", "float-", "double-", "time-",   "uint64",        "int64",
      "uint64-",      "int64-", "object"};
  for (int row = 0; row < 27; ++row) {
    SCOPED_TRACE(row);
    EXPECT_STREQ(DataTypes[row].text, texts[row]);
    EXPECT_EQ(DataTypes[row].type, static_cast<ICU_Type>(row + 1));
    EXPECT_EQ(DataTypes[row].flag, 1 << row);
  }
}

TEST(DataTypesTable, ItemTypesAndFixedLengths) {
  const int itemTypes[27] = {0, 0, 0, 0, 0, 0, 0, 0,  0, 2, 5,  0,  1, 2,
                             3, 4, 5, 6, 7, 8, 9, 12, 0, 0, 23, 24, 0};
  const int lengths[27] = {1, 1, 2, 4, 1, 2, 4, 4, 8, 0, 0, 10, 0, 0,
                           0, 0, 0, 0, 0, 0, 0, 0, 8, 8, 0, 0,  0};
  for (int row = 0; row < 27; ++row) {
    SCOPED_TRACE(row);
    EXPECT_EQ(DataTypes[row].itemType, static_cast<ICU_Type>(itemTypes[row]));
    EXPECT_EQ(DataTypes[row].length, lengths[row]);
  }
}

TEST(GetDataLength, ItemLengthsOfTypesOneToTwentyFour) {
  const int expected[24] = {1, 1, 2, 4, 1, 2, 4, 4, 8, 0, 0, 10,
                            0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 8, 8};
  for (int type = 1; type <= 24; ++type) {
    SCOPED_TRACE(type);
    EXPECT_EQ(GetDataLength(static_cast<ICU_Type>(type)), expected[type - 1]);
  }
}

TEST(GetDataLength, CountedTypesObjectAndOutOfRangeAreZero) {
  EXPECT_EQ(GetDataLength(ICU_NONE), 0);
  EXPECT_EQ(GetDataLength(ICU_BOOLEAN_ARRAY), 0);
  EXPECT_EQ(GetDataLength(ICU_OBJECT), 0);
  EXPECT_EQ(GetDataLength(ICU_UINT64_ARRAY), 0);
  EXPECT_EQ(GetDataLength(ICU_INT64_ARRAY), 0);
  EXPECT_EQ(GetDataLength(static_cast<ICU_Type>(28)), 0);
  EXPECT_EQ(GetDataLength(static_cast<ICU_Type>(-1)), 0);
}

TEST(GetTAVUType, ScalarAndArrayOfOneDiffer) {
  const Parsed scalar = Parse("int");
  ASSERT_TRUE(scalar.ok);
  EXPECT_EQ(scalar.type, ICU_INT);
  EXPECT_EQ(scalar.itemType, ICU_NONE);
  EXPECT_EQ(scalar.length, 4);
  const Parsed array = Parse("int-1");
  ASSERT_TRUE(array.ok);
  EXPECT_EQ(array.type, ICU_INT_ARRAY);
  EXPECT_EQ(array.itemType, ICU_INT);
  EXPECT_EQ(array.length, 4);
}

TEST(GetTAVUType, CountedTypesMultiplyItemLength) {
  Parsed p = Parse("string-20");
  EXPECT_TRUE(p.ok);
  EXPECT_EQ(p.type, ICU_STRING);
  EXPECT_EQ(p.itemType, ICU_BYTE);
  EXPECT_EQ(p.length, 20);
  p = Parse("unsignedInt-4");
  EXPECT_TRUE(p.ok);
  EXPECT_EQ(p.type, ICU_UNSIGNED_INT_ARRAY);
  EXPECT_EQ(p.itemType, ICU_UNSIGNED_INT);
  EXPECT_EQ(p.length, 16);
  p = Parse("time-3");
  EXPECT_TRUE(p.ok);
  EXPECT_EQ(p.type, ICU_TIME_ARRAY);
  EXPECT_EQ(p.itemType, ICU_TIME);
  EXPECT_EQ(p.length, 30);
  p = Parse("int64-2");
  EXPECT_TRUE(p.ok);
  EXPECT_EQ(p.type, ICU_INT64_ARRAY);
  EXPECT_EQ(p.itemType, ICU_INT64);
  EXPECT_EQ(p.length, 16);
}

TEST(GetTAVUType, FixedTypesTakeRowLength) {
  Parsed p = Parse("float");
  EXPECT_TRUE(p.ok);
  EXPECT_EQ(p.type, ICU_FLOAT);
  EXPECT_EQ(p.itemType, ICU_NONE);
  EXPECT_EQ(p.length, 4);
  p = Parse("object");
  EXPECT_TRUE(p.ok);
  EXPECT_EQ(p.type, ICU_OBJECT);
  EXPECT_EQ(p.itemType, ICU_NONE);
  EXPECT_EQ(p.length, 0);
  p = Parse("time");
  EXPECT_TRUE(p.ok);
  EXPECT_EQ(p.type, ICU_TIME);
  EXPECT_EQ(p.itemType, ICU_NONE);
  EXPECT_EQ(p.length, 10);
}

TEST(GetTAVUType, DashWithoutDigitsCountsZero) {
  const Parsed p = Parse("unsignedInt-");
  ASSERT_TRUE(p.ok);
  EXPECT_EQ(p.type, ICU_UNSIGNED_INT_ARRAY);
  EXPECT_EQ(p.length, 0);
}

TEST(GetTAVUType, NamesAreCaseSensitiveAndCountedNeedTheDash) {
  const Parsed upper = Parse("Int");
  EXPECT_FALSE(upper.ok);
  EXPECT_EQ(upper.type, ICU_NONE);
  EXPECT_EQ(upper.length, -7);
  EXPECT_FALSE(Parse("string").ok);
  EXPECT_FALSE(Parse("").ok);
  EXPECT_FALSE(Parse("-5").ok);
}

TEST(GetTAVUType, CountIsDecimalWithTrailingCharactersIgnored) {
  Parsed p = Parse("string-010");
  EXPECT_TRUE(p.ok);
  EXPECT_EQ(p.length, 10);
  p = Parse("string-0x10");
  EXPECT_TRUE(p.ok);
  EXPECT_EQ(p.length, 0);
  p = Parse("string-12abc");
  EXPECT_TRUE(p.ok);
  EXPECT_EQ(p.length, 12);
  p = Parse("short-x");
  EXPECT_TRUE(p.ok);
  EXPECT_EQ(p.length, 0);
}

TEST(GetTAVUType, NegativeOrOversizedCountFails) {
  EXPECT_FALSE(Parse("string--1").ok);
  EXPECT_FALSE(Parse("double-268435456").ok);
  EXPECT_FALSE(Parse("string-99999999999999999999").ok);
  const Parsed largest = Parse("double-268435455");
  EXPECT_TRUE(largest.ok);
  EXPECT_EQ(largest.length, 268435455 * 8);
}

TEST(GetTAVUType, SurroundingBlanksAndTabsAreIgnored) {
  const Parsed p = Parse(" \tshort-3 \t");
  ASSERT_TRUE(p.ok);
  EXPECT_EQ(p.type, ICU_SHORT_ARRAY);
  EXPECT_EQ(p.length, 6);
}

TEST(GetTAVUType, ParenthesisedParametersAreTrimmedAndAppended) {
  Parsed p;
  p.parameters.push_back("earlier");
  p.ok = GetTAVUType("string-10( swap2 , neg)", p.type, p.itemType, p.length, p.parameters);
  ASSERT_TRUE(p.ok);
  EXPECT_EQ(p.type, ICU_STRING);
  EXPECT_EQ(p.length, 10);
  EXPECT_EQ(p.parameters, (std::vector<std::string>{"earlier", "swap2", "neg"}));
}

TEST(GetTAVUType, TypeTextBeforeParenthesisIsTrimmed) {
  const Parsed p = Parse("unsignedInt-4 (swap4,neg) trailing");
  ASSERT_TRUE(p.ok);
  EXPECT_EQ(p.type, ICU_UNSIGNED_INT_ARRAY);
  EXPECT_EQ(p.length, 16);
  EXPECT_EQ(p.parameters, (std::vector<std::string>{"swap4", "neg"}));
}

TEST(GetTAVUType, EmptyParenthesesAppendOneEmptyParameter) {
  const Parsed p = Parse("int()");
  ASSERT_TRUE(p.ok);
  EXPECT_EQ(p.parameters, (std::vector<std::string>{""}));
}

TEST(GetTAVUType, OpenParenthesisWithoutCloseFails) {
  const Parsed p = Parse("string-10(swap2");
  EXPECT_FALSE(p.ok);
  EXPECT_EQ(p.type, ICU_NONE);
  EXPECT_EQ(p.length, -7);
  EXPECT_TRUE(p.parameters.empty());
  EXPECT_FALSE(Parse("(").ok);
  EXPECT_FALSE(Parse("int)(").ok);
}

TEST(GetTAVUType, UnknownNameStillAppendsParameters) {
  const Parsed p = Parse("word(a,b)");
  EXPECT_FALSE(p.ok);
  EXPECT_EQ(p.parameters, (std::vector<std::string>{"a", "b"}));
}

TEST(GetTAVUType, TextWithoutParenthesisLeavesParametersUntouched) {
  Parsed p;
  p.parameters.push_back("kept");
  EXPECT_TRUE(GetTAVUType("byte", p.type, p.itemType, p.length, p.parameters));
  EXPECT_EQ(p.parameters, (std::vector<std::string>{"kept"}));
}

TEST(GetTAVUName, NamesCountedAndFixedTypes) {
  EXPECT_EQ(GetTAVUName(ICU_STRING, 20), "string-20");
  EXPECT_EQ(GetTAVUName(ICU_UNSIGNED_INT_ARRAY, 16), "unsignedInt-4");
  EXPECT_EQ(GetTAVUName(ICU_UNSIGNED_INT, 4), "unsignedInt");
  EXPECT_EQ(GetTAVUName(ICU_BOOLEAN, 1), "boolean");
  EXPECT_EQ(GetTAVUName(ICU_TIME_ARRAY, 30), "time-3");
}

TEST(GetTAVUName, UnknownTypeIsQuestionMarks) {
  EXPECT_EQ(GetTAVUName(static_cast<ICU_Type>(99), 4), "??");
  EXPECT_EQ(GetTAVUName(ICU_NONE, 4), "??");
}

TEST(GetTAVUName, ObjectAppendsTheLengthItself) {
  EXPECT_EQ(GetTAVUName(ICU_OBJECT, 12), "object12");
}

TEST(GetTAVUName, RoundTripsEveryCountedAndFixedType) {
  for (const ProtUtilsN::DataTypeEntry& row : DataTypes) {
    if (row.type == ICU_OBJECT) {
      continue;
    }
    for (const int count : {0, 1, 2, 7, 100}) {
      std::string text = row.text;
      if (row.length == 0) {
        text += std::to_string(count);
      }
      SCOPED_TRACE(text);
      const Parsed p = Parse(text);
      ASSERT_TRUE(p.ok);
      EXPECT_EQ(p.type, row.type);
      EXPECT_EQ(GetTAVUName(p.type, p.length), text);
    }
  }
}

TEST(GetItemCount, ScalarTagCountsOne) {
  const TestTagBase tag(ICU_INT, 4);
  EXPECT_EQ(ProtUtilsN::GetItemCount(&tag), 1);
  const TestTagBase object(ICU_OBJECT, 12);
  EXPECT_EQ(ProtUtilsN::GetItemCount(&object), 1);
}

TEST(GetItemCount, ArrayTagDividesByItemLength) {
  const TestTagBase tag(ICU_SHORT_ARRAY, 10, ICU_SHORT);
  EXPECT_EQ(ProtUtilsN::GetItemCount(&tag), 5);
  const TestTagBase strings(ICU_STRING, 20, ICU_BYTE);
  EXPECT_EQ(ProtUtilsN::GetItemCount(&strings), 20);
}

TEST(GetItemCount, FromLengthAndItemType) {
  EXPECT_EQ(ProtUtilsN::GetItemCount(16, ICU_UNSIGNED_INT), 4);
  EXPECT_EQ(ProtUtilsN::GetItemCount(16, ICU_NONE), 1);
  EXPECT_EQ(ProtUtilsN::GetItemCount(16, ICU_STRING), 1);
  EXPECT_EQ(ProtUtilsN::GetItemCount(30, ICU_TIME), 3);
  EXPECT_EQ(ProtUtilsN::GetItemCount(nullptr), 0);
}

TEST(GetBasicType, ItemTypeWinsOverTagType) {
  const TestTagBase array(ICU_DOUBLE_ARRAY, 16, ICU_DOUBLE);
  EXPECT_EQ(ProtUtilsN::GetBasicType(&array), ICU_DOUBLE);
  EXPECT_EQ(ProtUtilsN::GetBasicLength(&array), 8);
  const TestTagBase scalar(ICU_UNSIGNED_SHORT, 2);
  EXPECT_EQ(ProtUtilsN::GetBasicType(&scalar), ICU_UNSIGNED_SHORT);
  EXPECT_EQ(ProtUtilsN::GetBasicLength(&scalar), 2);
  EXPECT_EQ(ProtUtilsN::GetBasicType(nullptr), ICU_NONE);
  EXPECT_EQ(ProtUtilsN::GetBasicLength(nullptr), 0);
}

TEST(IsBitType, OnlyBooleanAndBooleanArray) {
  for (int type = 0; type <= 28; ++type) {
    SCOPED_TRACE(type);
    EXPECT_EQ(ProtUtilsN::IsBitType(static_cast<ICU_Type>(type)), type == 1 || type == 13);
  }
  const TestTagBase bits(ICU_BOOLEAN_ARRAY, 3, ICU_BOOLEAN);
  EXPECT_TRUE(ProtUtilsN::IsBitType(&bits));
  const TestTagBase bytes(ICU_BYTE_ARRAY, 3, ICU_BYTE);
  EXPECT_FALSE(ProtUtilsN::IsBitType(&bytes));
  EXPECT_FALSE(ProtUtilsN::IsBitType(static_cast<const ITag*>(nullptr)));
}

TEST(GetTypeFlag, FlagOfTheTypesRow) {
  EXPECT_EQ(ProtUtilsN::GetTypeFlag(ICU_BOOLEAN), 0x1);
  EXPECT_EQ(ProtUtilsN::GetTypeFlag(ICU_UNSIGNED_SHORT), 0x20);
  EXPECT_EQ(ProtUtilsN::GetTypeFlag(ICU_UNSIGNED_INT), 0x40);
  EXPECT_EQ(ProtUtilsN::GetTypeFlag(ICU_STRING), 0x200);
  EXPECT_EQ(ProtUtilsN::GetTypeFlag(ICU_OBJECT), 0x4000000);
  EXPECT_EQ(ProtUtilsN::GetTypeFlag(ICU_NONE), 0);
  EXPECT_EQ(ProtUtilsN::GetTypeFlag(static_cast<ICU_Type>(28)), 0);
}

TEST(GetVersion, FrameworkVersionIs200) { EXPECT_EQ(ProtUtilsN::GetVersion(), 200); }
