// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/TextUtils.h"

#include <gtest/gtest.h>

#include <climits>
#include <string>
#include <vector>

using ProtUtilsN::GetConfigValue;
using ProtUtilsN::GetTrim;
using ProtUtilsN::ParseSubstrings;
using ProtUtilsN::Trim;

TEST(Trim, RemovesBlanksAndTabsFromBothEnds) {
  std::string s = " \t a b\t \t";
  Trim(s);
  EXPECT_EQ(s, "a b");
}

TEST(Trim, KeepsOtherWhiteSpace) {
  std::string s = "\n x \r";
  Trim(s);
  EXPECT_EQ(s, "\n x \r");
}

TEST(Trim, OnlyBlanksAndTabsBecomesEmpty) {
  std::string s = " \t\t  ";
  Trim(s);
  EXPECT_EQ(s, "");
  std::string empty;
  Trim(empty);
  EXPECT_EQ(empty, "");
}

TEST(GetTrim, ReturnsTrimmedCopyAndLeavesSource) {
  const std::string source = "  value\t";
  EXPECT_EQ(GetTrim(source), "value");
  EXPECT_EQ(source, "  value\t");
  EXPECT_EQ(GetTrim("inner  blanks stay"), "inner  blanks stay");
}

TEST(ParseSubstrings, TrimsPiecesAndKeepsTrailingEmptyPiece) {
  std::vector<std::string> out;
  ParseSubstrings(" a , b ,", out, ',');
  EXPECT_EQ(out, (std::vector<std::string>{"a", "b", ""}));
}

TEST(ParseSubstrings, AppendsWithoutClearing) {
  std::vector<std::string> out{"kept"};
  ParseSubstrings("x;y", out, ';');
  EXPECT_EQ(out, (std::vector<std::string>{"kept", "x", "y"}));
}

TEST(ParseSubstrings, EmptyTextGivesOneEmptyPiece) {
  std::vector<std::string> out;
  ParseSubstrings("", out, ',');
  EXPECT_EQ(out, (std::vector<std::string>{""}));
}

TEST(ParseSubstrings, EmptyPiecesBetweenSeparatorsAreKept) {
  std::vector<std::string> out;
  ParseSubstrings(",,a,", out, ',');
  EXPECT_EQ(out, (std::vector<std::string>{"", "", "a", ""}));
}

TEST(ParseSubstrings, TextWithoutSeparatorIsOnePiece) {
  std::vector<std::string> out;
  ParseSubstrings("\tnode?memorytype ", out, ',');
  EXPECT_EQ(out, (std::vector<std::string>{"node?memorytype"}));
}

TEST(GetConfigValue, TakesAlphanumericRunAfterEquals) {
  std::string value = "old";
  EXPECT_TRUE(GetConfigValue("a=1 speed=9600,8 b=2", "speed", value));
  EXPECT_EQ(value, "9600");
}

TEST(GetConfigValue, MatchesInsideLongerWord) {
  std::string value;
  EXPECT_TRUE(GetConfigValue("xspeed=12 speed=34", "speed", value));
  EXPECT_EQ(value, "12");
}

TEST(GetConfigValue, EmptyRunIsFoundAndEmpty) {
  std::string value = "old";
  EXPECT_TRUE(GetConfigValue("mode=-3", "mode", value));
  EXPECT_EQ(value, "");
  value = "old";
  EXPECT_TRUE(GetConfigValue("mode=", "mode", value));
  EXPECT_EQ(value, "");
}

TEST(GetConfigValue, AbsentNameLeavesValueUntouched) {
  std::string value = "old";
  EXPECT_FALSE(GetConfigValue("mode 5", "mode", value));
  EXPECT_EQ(value, "old");
  EXPECT_FALSE(GetConfigValue(nullptr, "mode", value));
  EXPECT_FALSE(GetConfigValue("mode=1", nullptr, value));
  EXPECT_EQ(value, "old");
}

TEST(Itoa, WritesDecimalDigits) {
  char buffer[12] = {};
  EXPECT_EQ(ProtUtilsN::itoa(1234, buffer, 10), buffer);
  EXPECT_STREQ(buffer, "1234");
}

TEST(Itoa, ZeroWritesOneDigit) {
  char buffer[12] = {'x', 'x', 'x'};
  ProtUtilsN::itoa(0, buffer, 10);
  EXPECT_STREQ(buffer, "0");
}

TEST(Itoa, Base16UsesLowerCaseLetters) {
  char buffer[12] = {};
  ProtUtilsN::itoa(0xBEEF, buffer, 16);
  EXPECT_STREQ(buffer, "beef");
  ProtUtilsN::itoa(INT_MAX, buffer, 16);
  EXPECT_STREQ(buffer, "7fffffff");
}

TEST(Itoa, OtherBasesWriteDigitsAfterZeroCharacter) {
  char buffer[33] = {};
  ProtUtilsN::itoa(5, buffer, 2);
  EXPECT_STREQ(buffer, "101");
  ProtUtilsN::itoa(8, buffer, 8);
  EXPECT_STREQ(buffer, "10");
  // Digit 11 of base 12 is '0' + 11.
  ProtUtilsN::itoa(11, buffer, 12);
  EXPECT_STREQ(buffer, ";");
  ProtUtilsN::itoa(INT_MAX, buffer, 2);
  EXPECT_STREQ(buffer, "1111111111111111111111111111111");
}

TEST(Itoa, NegativeValueWritesMagnitudeWithoutSign) {
  char buffer[12] = {};
  ProtUtilsN::itoa(-42, buffer, 10);
  EXPECT_STREQ(buffer, "42");
  ProtUtilsN::itoa(INT_MIN, buffer, 10);
  EXPECT_STREQ(buffer, "2147483648");
}

TEST(Itoa, BaseBelowTwoWritesEmptyText) {
  char buffer[4] = {'x', 'x', 'x', '\0'};
  ProtUtilsN::itoa(7, buffer, 1);
  EXPECT_STREQ(buffer, "");
  ProtUtilsN::itoa(7, buffer, 0);
  EXPECT_STREQ(buffer, "");
  EXPECT_EQ(ProtUtilsN::itoa(7, nullptr, 10), nullptr);
}
