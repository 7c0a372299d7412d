// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>

// Counts the calls of the global allocation functions (every form of
// operator new and operator new[]) made by the calling thread since the
// counter was created. Linking the velt_allocation_counter library replaces
// those functions for the whole test program, with plain malloc-backed ones
// that count; other threads' allocations never show up in this thread's
// count.
//
//   const AllocationCounter counter;
//   CodeUnderTest();
//   EXPECT_EQ(counter.count(), 0U);
class AllocationCounter {
 public:
  AllocationCounter();

  // Allocations made on this thread since construction.
  std::uint64_t count() const;
  // Allocations made by every thread of the program since it started, a
  // loaded plug-in's included (the replacement functions stand in for the
  // library's everywhere).
  static std::uint64_t processCount();

 private:
  std::uint64_t start;
};
