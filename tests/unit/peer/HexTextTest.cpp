// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/HexText.h"

#include <gtest/gtest.h>

using veltpeer::HexText;

TEST(HexText, DecodesPairsInEitherCase) {
  std::string bytes;
  ASSERT_TRUE(HexText::Decode("0a1B", bytes));
  EXPECT_EQ(bytes, std::string("\x0A\x1B"));
  ASSERT_TRUE(HexText::Decode("00FFff7e", bytes));
  EXPECT_EQ(bytes, std::string("\x00\xFF\xFF\x7E", 4));
}

TEST(HexText, NoneAndEmptyGiveNoBytes) {
  std::string bytes = "old";
  ASSERT_TRUE(HexText::Decode("none", bytes));
  EXPECT_EQ(bytes, "");
  bytes = "old";
  ASSERT_TRUE(HexText::Decode("", bytes));
  EXPECT_EQ(bytes, "");
}

TEST(HexText, RejectsOddLengthAndForeignCharactersLeavingOutputAlone) {
  std::string bytes = "old";
  EXPECT_FALSE(HexText::Decode("ABC", bytes));
  EXPECT_FALSE(HexText::Decode("0G", bytes));
  EXPECT_FALSE(HexText::Decode("0x41", bytes));
  EXPECT_FALSE(HexText::Decode("02 03", bytes));
  EXPECT_FALSE(HexText::Decode("NONE", bytes));
  EXPECT_EQ(bytes, "old");
}

TEST(HexText, EncodesUpperCaseHighNibbleFirst) {
  EXPECT_EQ(HexText::Encode(std::string("\x02\x41\x42\x03", 4)), "02414203");
  EXPECT_EQ(HexText::Encode(std::string("\x0A\xFF\x00", 3)), "0AFF00");
  EXPECT_EQ(HexText::Encode(""), "");
}

TEST(HexText, PrintableEscapesControlBytesAndBackslash) {
  EXPECT_EQ(HexText::Printable("token 1"), "token 1");
  EXPECT_EQ(HexText::Printable(std::string("\x02"
                                           "AB\\\x03\x7F\x80",
                                           7)),
            "\\x02AB\\\\\\x03\\x7F\\x80");
  EXPECT_EQ(HexText::Printable("~ !"), "~ !");
}
