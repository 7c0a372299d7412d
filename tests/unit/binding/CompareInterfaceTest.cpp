// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "binding/CompareInterface.h"

#include <gtest/gtest.h>

TEST(CompareInterface, EqualNamesMatch) {
  EXPECT_EQ(CompareInterface("IProtocol", "IProtocol"), 1);
  EXPECT_EQ(CompareInterface("", ""), 1);
}

TEST(CompareInterface, PrefixNeverMatches) {
  EXPECT_EQ(CompareInterface("IProtocol", "IProtocol2"), 0);
  EXPECT_EQ(CompareInterface("IProtocol2", "IProtocol"), 0);
  EXPECT_EQ(CompareInterface("", "I"), 0);
}

TEST(CompareInterface, CaseAndBlanksCount) {
  EXPECT_EQ(CompareInterface("iprotocol", "IProtocol"), 0);
  EXPECT_EQ(CompareInterface("IProtocol ", "IProtocol"), 0);
  EXPECT_EQ(CompareInterface(" IProtocol", "IProtocol"), 0);
}

TEST(CompareInterface, NullNameNeverMatches) {
  EXPECT_EQ(CompareInterface(nullptr, "IProtocol"), 0);
  EXPECT_EQ(CompareInterface("IProtocol", nullptr), 0);
}
