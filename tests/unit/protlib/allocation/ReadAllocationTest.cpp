// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include <vector>

#include "AllocationCounter.h"
#include "MemoryProtocol.h"
#include "TestTagBase.h"

// These tests count every allocation of the program, so they live in a
// program of their own.

namespace {

class ReadAllocation : public ::testing::Test {
 protected:
  ITag* Tag(const char* uri) {
    ITag* const tag = protocol.CreateTag(uri);
    EXPECT_NE(tag, nullptr) << uri << ": " << protocol.GetLastErrorString();
    return tag;
  }

  MemoryProtocol protocol;
};

TEST_F(ReadAllocation, CounterSeesAnAllocation) {
  // Guards the tests below against a counter that never counts.
  const AllocationCounter counter;
  void* volatile memory = ::operator new(8);
  ::operator delete(memory);
  EXPECT_EQ(counter.count(), 1U);
}

TEST_F(ReadAllocation, ReadOfSixtyFourDeviceBytesAllocatesNothing) {
  ITag* const tag = Tag("0?binary-64");
  std::vector<unsigned char> value(64);
  const AllocationCounter counter;
  EXPECT_TRUE(protocol.Read(tag, value.data()));
  EXPECT_EQ(counter.count(), 0U);
}

TEST_F(ReadAllocation, ReadOfSixtyFiveDeviceBytesAllocatesItsDeviceBufferOnce) {
  ITag* const tag = Tag("0?binary-65");
  std::vector<unsigned char> value(65);
  const AllocationCounter counter;
  EXPECT_TRUE(protocol.Read(tag, value.data()));
  EXPECT_EQ(counter.count(), 1U);
}

TEST_F(ReadAllocation, ItemOfASixtyFourByteArrayAllocatesNothing) {
  ITag* const tag = Tag("0?unsignedByte-64");
  unsigned char item = 7;
  const AllocationCounter counter;
  EXPECT_TRUE(protocol.writeArrayItem(tag, 63, &item));
  EXPECT_TRUE(protocol.readArrayItem(tag, 63, &item));
  EXPECT_EQ(counter.count(), 0U);
  EXPECT_EQ(item, 7);
}

// An array item is taken from a whole read of the array, made through Read,
// whose device buffer lives on the stack only up to 64 bytes. So an item of a
// 256-byte array costs that one buffer: the host-side array buffer itself
// needs no allocation up to 256 bytes.
TEST_F(ReadAllocation, ItemOfATwoHundredFiftySixByteArrayAllocatesOnlyTheReadsDeviceBuffer) {
  ITag* const tag = Tag("0?unsignedByte-256");
  unsigned char item = 0;
  const AllocationCounter counter;
  EXPECT_TRUE(protocol.readArrayItem(tag, 255, &item));
  EXPECT_EQ(counter.count(), 1U);
}

TEST(ConversionAllocation, ValuesUpToTwoHundredFiftySixBytesAllocateNothing) {
  TestTagBase tag(ICU_UNSIGNED_SHORT_ARRAY, 256, ICU_UNSIGNED_SHORT);
  tag.setConversions({"swap2", "inv"});
  std::vector<unsigned char> host(256, 0x12);
  std::vector<unsigned char> device(256);
  const AllocationCounter counter;
  EXPECT_TRUE(tag.Convert(host.data(), device.data(), true));
  EXPECT_TRUE(tag.Convert(device.data(), host.data(), false));
  EXPECT_EQ(counter.count(), 0U);
}

TEST(ConversionAllocation, LongerValuesAllocateOncePerConversion) {
  TestTagBase tag(ICU_UNSIGNED_SHORT_ARRAY, 258, ICU_UNSIGNED_SHORT);
  tag.setConversions({"swap2"});
  std::vector<unsigned char> host(258, 0x12);
  std::vector<unsigned char> device(258);
  const AllocationCounter counter;
  EXPECT_TRUE(tag.Convert(host.data(), device.data(), true));
  EXPECT_EQ(counter.count(), 1U);
}

}  // namespace
