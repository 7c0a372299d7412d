// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/BoundedText.h"

#include <gtest/gtest.h>

#include <string>

TEST(BoundedText, AppendsTextAndNumbersWithoutTerminator) {
  std::string out(16, '#');
  BoundedText text(out.data(), 16);
  text << "v." << 200 << " " << -7;
  EXPECT_EQ(text.count(), 8);
  EXPECT_FALSE(text.failed());
  EXPECT_EQ(out, "v.200 -7########");
}

TEST(BoundedText, CutsOffWhatDoesNotFit) {
  std::string out(8, '#');
  BoundedText text(out.data(), 5);
  text << "abc" << 12345 << "z";
  EXPECT_EQ(text.count(), 5);
  EXPECT_EQ(out, "abc12###");
}

TEST(BoundedText, NullTextFailsTheStream) {
  std::string out(8, '#');
  BoundedText text(out.data(), 8);
  text << "ab" << static_cast<const char*>(nullptr) << "cd" << 5;
  EXPECT_TRUE(text.failed());
  EXPECT_EQ(text.count(), 2);
  EXPECT_EQ(out, "ab######");
}

TEST(BoundedText, NoRoomWritesNothing) {
  char one = '#';
  BoundedText zero(&one, 0);
  zero << "abc";
  EXPECT_EQ(zero.count(), 0);
  BoundedText negative(&one, -4);
  negative << "abc" << 1;
  EXPECT_EQ(negative.count(), 0);
  BoundedText none(nullptr, 10);
  none << "abc";
  EXPECT_EQ(none.count(), 0);
  EXPECT_EQ(one, '#');
}
