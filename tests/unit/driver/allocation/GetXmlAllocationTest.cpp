// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include "AllocationCounter.h"
#include "driver/XmlDescription.h"

// These tests count every allocation of the program, so they live in a
// program of their own.

TEST(XmlBlock, AllocationCounterSeesAnAllocation) {
  // Guards the next test against a counter that never counts.
  const AllocationCounter counter;
  void* volatile memory = ::operator new(64);
  ::operator delete(memory);
  EXPECT_EQ(counter.count(), 1U);
}

TEST(XmlBlock, GetXmlNeverAllocates) {
  const AllocationCounter counter;
  const char* volatile pointer = nullptr;
  for (int call = 0; call < 100; ++call) {
    pointer = GetXml_VELT();
  }
  EXPECT_EQ(counter.count(), 0U);
  EXPECT_EQ(pointer, GetXml_VELT());
}
