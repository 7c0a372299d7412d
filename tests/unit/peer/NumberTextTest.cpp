// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/NumberText.h"

#include <gtest/gtest.h>

using veltpeer::NumberText;

TEST(NumberText, UnsignedAcceptsDigitsUpToTheLimit) {
  std::uint64_t value = 7;
  ASSERT_TRUE(NumberText::ParseUnsigned("0", 65535, value));
  EXPECT_EQ(value, 0U);
  ASSERT_TRUE(NumberText::ParseUnsigned("65535", 65535, value));
  EXPECT_EQ(value, 65535U);
  ASSERT_TRUE(NumberText::ParseUnsigned("18446744073709551615", UINT64_MAX, value));
  EXPECT_EQ(value, UINT64_MAX);
}

TEST(NumberText, UnsignedRejectsSignsBlanksTrailersOverflowAndExcess) {
  std::uint64_t value = 7;
  for (const char* text : {"", "-1", "+1", " 1", "1 ", "1x", "0x10", "1.0", "65536"}) {
    EXPECT_FALSE(NumberText::ParseUnsigned(text, 65535, value)) << text;
  }
  EXPECT_FALSE(NumberText::ParseUnsigned("18446744073709551616", UINT64_MAX, value));
  EXPECT_EQ(value, 7U);
}

TEST(NumberText, DecimalAcceptsOnePoint) {
  double value = -1;
  ASSERT_TRUE(NumberText::ParseDecimal("2", 100, value));
  EXPECT_DOUBLE_EQ(value, 2.0);
  ASSERT_TRUE(NumberText::ParseDecimal("0.5", 100, value));
  EXPECT_DOUBLE_EQ(value, 0.5);
  ASSERT_TRUE(NumberText::ParseDecimal("12.25", 100, value));
  EXPECT_DOUBLE_EQ(value, 12.25);
  ASSERT_TRUE(NumberText::ParseDecimal(".5", 100, value));
  EXPECT_DOUBLE_EQ(value, 0.5);
  ASSERT_TRUE(NumberText::ParseDecimal("100", 100, value));
  EXPECT_DOUBLE_EQ(value, 100.0);
}

TEST(NumberText, DecimalRejectsOtherForms) {
  double value = -1;
  for (const char* text : {"", ".", "1.2.3", "-1", "1e3", "1,5", "100.5", "nan", "inf"}) {
    EXPECT_FALSE(NumberText::ParseDecimal(text, 100, value)) << text;
  }
  EXPECT_DOUBLE_EQ(value, -1.0);
}
