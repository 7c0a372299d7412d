// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "memory/MemoryType.h"

#include <gtest/gtest.h>

TEST(MemoryType, FreshMemoryTypeHasDefaults) {
  const MemoryType m;
  EXPECT_EQ(m.getName(), "");
  EXPECT_EQ(m.getNaturalType(), ICU_BOOLEAN);
  EXPECT_EQ(m.getTavuTypes(), 0x3fffff);
  EXPECT_FALSE(m.isSwap2());
  EXPECT_FALSE(m.isSwap4());
  EXPECT_FALSE(m.isSwap8());
  EXPECT_FALSE(m.canBitWrite());
  EXPECT_FALSE(m.canBitArrayWrite());
  EXPECT_FALSE(m.isReadOnly());
  EXPECT_FALSE(m.isWriteOnly());
  EXPECT_FALSE(m.useInDatagram());
  EXPECT_FALSE(m.hasInternalConversion());
  EXPECT_FALSE(m.mustBitRead());
  EXPECT_EQ(m.getBlockReadCount(), 0);
  EXPECT_EQ(m.getBlockWriteCount(), 0);
  EXPECT_EQ(m.getMinIndex(), 0);
  EXPECT_EQ(m.getMaxIndex(), 0);
}

TEST(MemoryType, SettersStoreEveryField) {
  MemoryType m;
  m.setName("rx_token");
  m.setNaturalType(ICU_STRING);
  m.setTavuTypes(0x200);
  m.setSwap2(true);
  m.setSwap4(true);
  m.setSwap8(true);
  m.setBitWrite(true);
  m.setBitArrayWrite(true);
  m.setReadOnly(true);
  m.setInDatagram(true);
  m.setInternalConversion(true);
  m.setBlockReadCount(3);
  m.setBlockWriteCount(4);
  m.setMinIndex(5);
  m.setMaxIndex(6);
  m.setBitRead(true);
  EXPECT_EQ(m.getName(), "rx_token");
  EXPECT_EQ(m.getNaturalType(), ICU_STRING);
  EXPECT_EQ(m.getTavuTypes(), 0x200);
  EXPECT_TRUE(m.isSwap2());
  EXPECT_TRUE(m.isSwap4());
  EXPECT_TRUE(m.isSwap8());
  EXPECT_TRUE(m.canBitWrite());
  EXPECT_TRUE(m.canBitArrayWrite());
  EXPECT_TRUE(m.isReadOnly());
  EXPECT_FALSE(m.isWriteOnly());
  EXPECT_TRUE(m.useInDatagram());
  EXPECT_TRUE(m.hasInternalConversion());
  EXPECT_EQ(m.getBlockReadCount(), 3);
  EXPECT_EQ(m.getBlockWriteCount(), 4);
  EXPECT_EQ(m.getMinIndex(), 5);
  EXPECT_EQ(m.getMaxIndex(), 6);
  EXPECT_TRUE(m.mustBitRead());
}

TEST(MemoryType, ContradictoryValuesAreStoredAsGiven) {
  MemoryType m;
  m.setMinIndex(10);
  m.setMaxIndex(2);
  m.setReadOnly(true);
  m.setWriteOnly(true);
  m.setBlockReadCount(-1);
  EXPECT_EQ(m.getMinIndex(), 10);
  EXPECT_EQ(m.getMaxIndex(), 2);
  EXPECT_TRUE(m.isReadOnly());
  EXPECT_TRUE(m.isWriteOnly());
  EXPECT_EQ(m.getBlockReadCount(), -1);
}

TEST(MemoryType, CopyAndAssignmentCopyEveryField) {
  MemoryType original;
  original.setName("conn_stat");
  original.setTavuTypes(0x1);
  original.setReadOnly(true);
  original.setMaxIndex(9);
  const MemoryType copy(original);
  MemoryType assigned;
  assigned = original;
  for (const MemoryType* m : {&copy, static_cast<const MemoryType*>(&assigned)}) {
    EXPECT_EQ(m->getName(), "conn_stat");
    EXPECT_EQ(m->getTavuTypes(), 0x1);
    EXPECT_TRUE(m->isReadOnly());
    EXPECT_EQ(m->getMaxIndex(), 9);
  }
  original.setName("changed");
  EXPECT_EQ(copy.getName(), "conn_stat");
}

TEST(MemoryType, NameComparisonIsExact) {
  MemoryType m;
  m.setName("rx_token");
  EXPECT_TRUE(m.hasName("rx_token"));
  EXPECT_FALSE(m.hasName("RX_TOKEN"));
  EXPECT_FALSE(m.hasName("rx_token "));
  EXPECT_FALSE(m.hasName("rx_toke"));
}
