// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/HexText.h"

#include <gtest/gtest.h>

#include <string>

TEST(HexDigitValue, DigitsInEitherCaseAndMinusOneForAnythingElse) {
  const std::string digits = "0123456789abcdef";
  for (int value = 0; value < 16; ++value) {
    const char lower = digits[static_cast<std::size_t>(value)];
    EXPECT_EQ(hexDigitValue(lower), value) << lower;
    const char upper = static_cast<char>(lower >= 'a' ? lower - 'a' + 'A' : lower);
    EXPECT_EQ(hexDigitValue(upper), value) << upper;
  }
  for (const char other : {'g', 'G', '/', ':', '@', '`', ' ', '-', '\0', '\xff'}) {
    EXPECT_EQ(hexDigitValue(other), -1) << static_cast<int>(other);
  }
}

TEST(FromHex, NoneAndEmptyGiveNoBytes) {
  EXPECT_EQ(fromHex("none"), "");
  EXPECT_EQ(fromHex(""), "");
}

TEST(FromHex, PairsAreHighDigitFirstInEitherCase) {
  EXPECT_EQ(fromHex("0a1B"), std::string("\x0a\x1b", 2));
  EXPECT_EQ(fromHex("FFfe00"), std::string("\xff\xfe\x00", 3));
}

TEST(FromHex, OtherCharactersCountAsLowerCaseLetters) {
  // 'g' is 103 - 87 = 16, 'G' is 71 - 87 = -16: 0x1 * 16 + 16 and 0x1 * 16 - 16.
  EXPECT_EQ(fromHex("1g"), std::string("\x20", 1));
  EXPECT_EQ(fromHex("1G"), std::string("\x00", 1));
  // "NONE" is not the marker; each letter is decoded.
  EXPECT_EQ(fromHex("NONE"), std::string("\x68\x7e", 2));
}

TEST(FromHex, LoneLastCharacterIsDropped) {
  EXPECT_EQ(fromHex("0A0"), std::string("\x0a", 1));
  EXPECT_EQ(fromHex("7"), "");
}

TEST(IsHex, AcceptsNoneEmptyAndEvenDigitRuns) {
  EXPECT_TRUE(isHex("none"));
  EXPECT_TRUE(isHex(""));
  EXPECT_TRUE(isHex("0d0A"));
  EXPECT_TRUE(isHex("0123456789abcdefABCDEF"));
}

TEST(IsHex, RejectsOddLengthAndOtherCharacters) {
  EXPECT_FALSE(isHex("ABC"));
  EXPECT_FALSE(isHex("0"));
  EXPECT_FALSE(isHex("0G"));
  EXPECT_FALSE(isHex("0 "));
  EXPECT_FALSE(isHex("NONE"));
  EXPECT_FALSE(isHex("none0"));
  EXPECT_FALSE(isHex(nullptr));
}
