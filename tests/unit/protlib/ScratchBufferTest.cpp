// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/ScratchBuffer.h"

#include <gtest/gtest.h>

TEST(ScratchBuffer, FitsInsideUpToItsFixedSize) {
  ScratchBuffer<64> buffer(64);
  EXPECT_FALSE(buffer.onHeap());
  EXPECT_EQ(buffer.size(), 64);
  for (int i = 0; i < 64; ++i) {
    EXPECT_EQ(buffer.data()[i], 0) << i;
  }
}

TEST(ScratchBuffer, AllocatesBeyondItsFixedSize) {
  ScratchBuffer<64> buffer(65);
  EXPECT_TRUE(buffer.onHeap());
  EXPECT_EQ(buffer.size(), 65);
  for (int i = 0; i < 65; ++i) {
    EXPECT_EQ(buffer.data()[i], 0) << i;
  }
  buffer.data()[64] = 7;
  EXPECT_EQ(buffer.data()[64], 7);
}

TEST(ScratchBuffer, EmptyAndNegativeSizesHoldNothing) {
  ScratchBuffer<256> empty(0);
  EXPECT_EQ(empty.size(), 0);
  EXPECT_FALSE(empty.onHeap());
  EXPECT_NE(empty.data(), nullptr);
  const ScratchBuffer<256> negative(-3);
  EXPECT_EQ(negative.size(), 0);
  EXPECT_FALSE(negative.onHeap());
}
