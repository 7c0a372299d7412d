// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "memory/Model.h"

#include <gtest/gtest.h>

namespace {

MemoryType Named(const std::string& name, int maxIndex) {
  MemoryType m;
  m.setName(name);
  m.setMaxIndex(maxIndex);
  return m;
}

}  // namespace

TEST(Model, NewModelHasNameAndZeroLimits) {
  const Model model("1");
  EXPECT_EQ(model.getName(), "1");
  EXPECT_EQ(model.getMaxDatagramItems(), 0);
  EXPECT_EQ(model.getMaxDatagramLength(), 0);
  EXPECT_TRUE(model.getMemoryTypes().empty());
}

TEST(Model, SettersStoreDatagramLimits) {
  Model model("1");
  model.setMaxDatagramItems(16);
  model.setMaxDatagramLength(512);
  EXPECT_EQ(model.getMaxDatagramItems(), 16);
  EXPECT_EQ(model.getMaxDatagramLength(), 512);
}

TEST(Model, SecondMemoryTypeOfOneNameIsDroppedAndFirstKept) {
  Model model("1");
  EXPECT_TRUE(model.addMemoryType(Named("tx_token", 0)));
  EXPECT_FALSE(model.addMemoryType(Named("tx_token", 5)));
  ASSERT_EQ(model.getMemoryTypes().size(), 1U);
  EXPECT_EQ(model.getMemoryTypes()[0].getMaxIndex(), 0);
}

TEST(Model, MemoryTypesKeepOrderOfAddition) {
  Model model("1");
  EXPECT_TRUE(model.addMemoryType(Named("tx_token", 0)));
  EXPECT_TRUE(model.addMemoryType(Named("rx_token", 1)));
  EXPECT_TRUE(model.addMemoryType(Named("TX_TOKEN", 2)));
  ASSERT_EQ(model.getMemoryTypes().size(), 3U);
  EXPECT_EQ(model.getMemoryTypes()[0].getName(), "tx_token");
  EXPECT_EQ(model.getMemoryTypes()[1].getName(), "rx_token");
  EXPECT_EQ(model.getMemoryTypes()[2].getName(), "TX_TOKEN");
}

TEST(Model, AddedMemoryTypeIsACopy) {
  Model model("1");
  MemoryType m = Named("gap", 3);
  EXPECT_TRUE(model.addMemoryType(m));
  m.setMaxIndex(99);
  EXPECT_EQ(model.getMemoryTypes()[0].getMaxIndex(), 3);
}

TEST(Model, FindMemoryTypeIsExact) {
  Model model("1");
  model.addMemoryType(Named("rx_token", 4));
  const MemoryType* const found = model.findMemoryType("rx_token");
  ASSERT_NE(found, nullptr);
  EXPECT_EQ(found->getMaxIndex(), 4);
  EXPECT_EQ(model.findMemoryType("RX_TOKEN"), nullptr);
  EXPECT_EQ(model.findMemoryType(""), nullptr);
}
