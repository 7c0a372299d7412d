// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/TypedValue.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

using velthost::TypedValue;
using velthost::ValueShape;

namespace {

using Bytes = std::vector<unsigned char>;

ValueShape Shape(ICU_Type type, int length, ICU_Type item = ICU_NONE) {
  ValueShape shape;
  shape.type = type;
  shape.length = length;
  shape.itemType = item;
  return shape;
}

template <typename T>
Bytes BytesOf(T value) {
  Bytes bytes(sizeof value);
  std::memcpy(bytes.data(), &value, sizeof value);
  return bytes;
}

Bytes Parsed(const ValueShape& shape, const std::string& text) {
  Bytes bytes;
  std::string error;
  EXPECT_TRUE(TypedValue::Parse(shape, text, bytes, error)) << error;
  EXPECT_EQ(error, "");
  return bytes;
}

std::string ParseError(const ValueShape& shape, const std::string& text) {
  Bytes bytes = {0xAA};
  std::string error;
  EXPECT_FALSE(TypedValue::Parse(shape, text, bytes, error));
  EXPECT_EQ(bytes, Bytes(static_cast<std::size_t>(shape.length), 0));
  return error;
}

}  // namespace

TEST(TypedValue, TypeNames) {
  EXPECT_EQ(TypedValue::TypeName(Shape(ICU_UNSIGNED_INT, 4)), "unsignedInt");
  EXPECT_EQ(TypedValue::TypeName(Shape(ICU_STRING, 20, ICU_BYTE)), "string-20");
  EXPECT_EQ(TypedValue::TypeName(Shape(ICU_BINARY, 6, ICU_UNSIGNED_BYTE)), "binary-6");
  EXPECT_EQ(TypedValue::TypeName(Shape(ICU_UNSIGNED_INT_ARRAY, 16, ICU_UNSIGNED_INT)),
            "unsignedInt-4");
  EXPECT_EQ(TypedValue::TypeName(Shape(ICU_TIME_ARRAY, 30, ICU_TIME)), "time-3");
  EXPECT_EQ(TypedValue::TypeName(Shape(ICU_BOOLEAN_ARRAY, 8, ICU_BOOLEAN)), "boolean-8");
  EXPECT_EQ(TypedValue::TypeName(Shape(ICU_OBJECT, 0)), "object");
  EXPECT_EQ(TypedValue::TypeName(Shape(static_cast<ICU_Type>(99), 4)), "type 99");
}

TEST(TypedValue, StringIsTheTextUpToItsZeroByte) {
  const Bytes bytes = {'h', 'i', ' ', 'x', 0, 'y', 0, 0};
  EXPECT_EQ(TypedValue::Format(Shape(ICU_STRING, 8, ICU_BYTE), bytes.data()), "hi x");
  const Bytes full = {'a', 'b', 'c'};
  EXPECT_EQ(TypedValue::Format(Shape(ICU_STRING, 3, ICU_BYTE), full.data()), "abc");
}

TEST(TypedValue, IntegersAreDecimal) {
  EXPECT_EQ(
      TypedValue::Format(Shape(ICU_UNSIGNED_INT, 4), BytesOf<std::uint32_t>(4294967295U).data()),
      "4294967295");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_INT, 4), BytesOf<std::int32_t>(-7).data()), "-7");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_BYTE, 1), BytesOf<std::int8_t>(-128).data()), "-128");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_UNSIGNED_BYTE, 1), BytesOf<std::uint8_t>(200).data()),
            "200");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_SHORT, 2), BytesOf<std::int16_t>(-300).data()), "-300");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_UNSIGNED_SHORT, 2), BytesOf<std::uint16_t>(5000).data()),
            "5000");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_INT64, 8), BytesOf<std::int64_t>(-5000000000).data()),
            "-5000000000");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_UINT64, 8),
                               BytesOf<std::uint64_t>(18446744073709551615U).data()),
            "18446744073709551615");
}

TEST(TypedValue, BooleanIsZeroOrOne) {
  const Bytes zero = {0};
  const Bytes set = {7};
  EXPECT_EQ(TypedValue::Format(Shape(ICU_BOOLEAN, 1), zero.data()), "0");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_BOOLEAN, 1), set.data()), "1");
}

TEST(TypedValue, RealsArePrintfG) {
  EXPECT_EQ(TypedValue::Format(Shape(ICU_FLOAT, 4), BytesOf<float>(1.5F).data()), "1.5");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_DOUBLE, 8), BytesOf<double>(1e-7).data()), "1e-07");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_DOUBLE, 8), BytesOf<double>(123456789.0).data()),
            "1.23457e+08");
}

TEST(TypedValue, BinaryTimeAndObjectAreLowerCaseHex) {
  const Bytes bytes = {0x0A, 0xFF, 0x00, 0x7B};
  EXPECT_EQ(TypedValue::Format(Shape(ICU_BINARY, 4, ICU_UNSIGNED_BYTE), bytes.data()), "0aff007b");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_OBJECT, 2), bytes.data()), "0aff");
  const Bytes time = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10};
  EXPECT_EQ(TypedValue::Format(Shape(ICU_TIME, 10), time.data()), "0102030405060708090a");
}

TEST(TypedValue, ArraysAreItemsSeparatedByBlanks) {
  Bytes ints;
  for (const std::uint32_t value : {1U, 20U, 300U}) {
    const Bytes item = BytesOf(value);
    ints.insert(ints.end(), item.begin(), item.end());
  }
  EXPECT_EQ(TypedValue::Format(Shape(ICU_UNSIGNED_INT_ARRAY, 12, ICU_UNSIGNED_INT), ints.data()),
            "1 20 300");
  const Bytes bits = {1, 0, 0, 1};
  EXPECT_EQ(TypedValue::Format(Shape(ICU_BOOLEAN_ARRAY, 4, ICU_BOOLEAN), bits.data()), "1 0 0 1");
  EXPECT_EQ(TypedValue::Format(Shape(ICU_BYTE_ARRAY, 2), Bytes{0xFF, 0x01}.data()), "-1 1");
}

TEST(TypedValue, ParsesStringsWithBlanksAndZeroFillsTheRest) {
  EXPECT_EQ(Parsed(Shape(ICU_STRING, 8, ICU_BYTE), "a b  c"),
            (Bytes{'a', ' ', 'b', ' ', ' ', 'c', 0, 0}));
  EXPECT_EQ(Parsed(Shape(ICU_STRING, 3, ICU_BYTE), "abc"), (Bytes{'a', 'b', 'c'}));
  EXPECT_EQ(Parsed(Shape(ICU_STRING, 2, ICU_BYTE), ""), (Bytes{0, 0}));
  EXPECT_EQ(ParseError(Shape(ICU_STRING, 3, ICU_BYTE), "abcd"),
            "bad string-3 value 'abcd' (at most 3 bytes expected)");
}

TEST(TypedValue, ParsesIntegersInDecimalAndHexWithinTheirRange) {
  EXPECT_EQ(Parsed(Shape(ICU_UNSIGNED_INT, 4), "4294967295"), BytesOf<std::uint32_t>(4294967295U));
  EXPECT_EQ(Parsed(Shape(ICU_UNSIGNED_INT, 4), "0x1F"), BytesOf<std::uint32_t>(31));
  EXPECT_EQ(Parsed(Shape(ICU_UNSIGNED_SHORT, 2), "0XffFF"), BytesOf<std::uint16_t>(65535));
  EXPECT_EQ(Parsed(Shape(ICU_SHORT, 2), "-32768"), BytesOf<std::int16_t>(-32768));
  EXPECT_EQ(Parsed(Shape(ICU_BYTE, 1), "-0x80"), BytesOf<std::int8_t>(-128));
  EXPECT_EQ(Parsed(Shape(ICU_INT64, 8), "-9223372036854775808"), BytesOf<std::int64_t>(INT64_MIN));
  EXPECT_EQ(Parsed(Shape(ICU_UINT64, 8), "18446744073709551615"),
            BytesOf<std::uint64_t>(UINT64_MAX));
  EXPECT_EQ(Parsed(Shape(ICU_INT, 4), "007"), BytesOf<std::int32_t>(7));
}

TEST(TypedValue, RefusesIntegersOutOfRangeOrMalformed) {
  const std::string unsignedInt = " (a decimal or 0x hex number from 0 to 4294967295 expected)";
  EXPECT_EQ(ParseError(Shape(ICU_UNSIGNED_INT, 4), "4294967296"),
            "bad unsignedInt value '4294967296'" + unsignedInt);
  EXPECT_EQ(ParseError(Shape(ICU_UNSIGNED_INT, 4), "-1"),
            "bad unsignedInt value '-1'" + unsignedInt);
  EXPECT_EQ(ParseError(Shape(ICU_UNSIGNED_INT, 4), "12abc"),
            "bad unsignedInt value '12abc'" + unsignedInt);
  EXPECT_EQ(ParseError(Shape(ICU_UNSIGNED_INT, 4), "0x"),
            "bad unsignedInt value '0x'" + unsignedInt);
  EXPECT_EQ(ParseError(Shape(ICU_UNSIGNED_INT, 4), " 5"),
            "bad unsignedInt value ' 5'" + unsignedInt);
  EXPECT_EQ(ParseError(Shape(ICU_UNSIGNED_INT, 4), ""), "bad unsignedInt value ''" + unsignedInt);
  EXPECT_EQ(ParseError(Shape(ICU_BYTE, 1), "128"),
            "bad byte value '128' (a decimal or 0x hex number from -128 to 127 expected)");
  EXPECT_EQ(ParseError(Shape(ICU_UINT64, 8), "18446744073709551616"),
            "bad uint64 value '18446744073709551616' (a decimal or 0x hex number from 0 to "
            "18446744073709551615 expected)");
}

TEST(TypedValue, ParsesBooleans) {
  EXPECT_EQ(Parsed(Shape(ICU_BOOLEAN, 1), "1"), (Bytes{1}));
  EXPECT_EQ(Parsed(Shape(ICU_BOOLEAN, 1), "true"), (Bytes{1}));
  EXPECT_EQ(Parsed(Shape(ICU_BOOLEAN, 1), "0"), (Bytes{0}));
  EXPECT_EQ(Parsed(Shape(ICU_BOOLEAN, 1), "false"), (Bytes{0}));
  EXPECT_EQ(ParseError(Shape(ICU_BOOLEAN, 1), "TRUE"),
            "bad boolean value 'TRUE' (0, 1, true or false expected)");
  EXPECT_EQ(ParseError(Shape(ICU_BOOLEAN, 1), "2"),
            "bad boolean value '2' (0, 1, true or false expected)");
}

TEST(TypedValue, ParsesReals) {
  EXPECT_EQ(Parsed(Shape(ICU_FLOAT, 4), "1.5"), BytesOf<float>(1.5F));
  EXPECT_EQ(Parsed(Shape(ICU_DOUBLE, 8), "-2e3"), BytesOf<double>(-2000.0));
  EXPECT_EQ(ParseError(Shape(ICU_FLOAT, 4), "1e39"), "bad float value '1e39' (a number expected)");
  EXPECT_EQ(ParseError(Shape(ICU_DOUBLE, 8), "1e999"),
            "bad double value '1e999' (a number expected)");
  EXPECT_EQ(ParseError(Shape(ICU_DOUBLE, 8), "1.5x"),
            "bad double value '1.5x' (a number expected)");
}

TEST(TypedValue, ParsesHexBytesUpToTheLength) {
  EXPECT_EQ(Parsed(Shape(ICU_BINARY, 4, ICU_UNSIGNED_BYTE), "0aFF"), (Bytes{0x0A, 0xFF, 0, 0}));
  EXPECT_EQ(Parsed(Shape(ICU_BINARY, 2, ICU_UNSIGNED_BYTE), "0102"), (Bytes{1, 2}));
  EXPECT_EQ(ParseError(Shape(ICU_BINARY, 2, ICU_UNSIGNED_BYTE), "010203"),
            "bad binary-2 value '010203' (at most 2 pairs of hex digits expected)");
  EXPECT_EQ(ParseError(Shape(ICU_BINARY, 2, ICU_UNSIGNED_BYTE), "0g"),
            "bad binary-2 value '0g' (at most 2 pairs of hex digits expected)");
  EXPECT_EQ(ParseError(Shape(ICU_BINARY, 2, ICU_UNSIGNED_BYTE), "012"),
            "bad binary-2 value '012' (at most 2 pairs of hex digits expected)");
}

TEST(TypedValue, ParsesArraysItemByItem) {
  Bytes expected;
  for (const std::uint16_t value : {1, 0xFFFF, 3}) {
    const Bytes item = BytesOf(value);
    expected.insert(expected.end(), item.begin(), item.end());
  }
  const ValueShape shorts = Shape(ICU_UNSIGNED_SHORT_ARRAY, 6, ICU_UNSIGNED_SHORT);
  EXPECT_EQ(Parsed(shorts, " 1  0xffff\t3 "), expected);
  EXPECT_EQ(ParseError(shorts, "1 2"),
            "bad unsignedShort-3 value '1 2' (3 items expected, each a decimal or 0x hex number "
            "from 0 to 65535)");
  EXPECT_EQ(ParseError(shorts, "1 2 70000"),
            "bad unsignedShort-3 value '1 2 70000' (3 items expected, each a decimal or 0x hex "
            "number from 0 to 65535)");
  EXPECT_EQ(Parsed(Shape(ICU_BOOLEAN_ARRAY, 3, ICU_BOOLEAN), "1 false true"), (Bytes{1, 0, 1}));
  EXPECT_EQ(ParseError(Shape(ICU_INT_ARRAY, 4, ICU_INT), ""),
            "bad int-1 value '' (1 item expected, a decimal or 0x hex number from -2147483648 to "
            "2147483647)");
}

TEST(TypedValue, FormatThenParseGivesTheBytesBack) {
  const ValueShape shape = Shape(ICU_INT_ARRAY, 8, ICU_INT);
  Bytes bytes = BytesOf<std::int32_t>(-5);
  const Bytes second = BytesOf<std::int32_t>(123456);
  bytes.insert(bytes.end(), second.begin(), second.end());
  EXPECT_EQ(Parsed(shape, TypedValue::Format(shape, bytes.data())), bytes);
}

TEST(TypedValue, AnEmptyTextFitsATextOfNoBytes) {
  Bytes bytes{1, 2};
  std::string error;
  EXPECT_TRUE(TypedValue::Parse(Shape(ICU_STRING, 0), "", bytes, error));
  EXPECT_EQ(bytes, Bytes());
  EXPECT_FALSE(TypedValue::Parse(Shape(ICU_STRING, 0), "x", bytes, error));
  EXPECT_EQ(error, "bad string-0 value 'x' (at most 0 bytes expected)");
}
