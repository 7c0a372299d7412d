// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <benchmark/benchmark.h>

#include "AllocationCounter.h"

// Counts the heap allocations that the calling thread makes during a
// benchmark's timed loop and reports them as the counter "allocs/iter".
// Create it right before the loop and call Report right after it.
class AllocationMeter {
 public:
  void Report(benchmark::State& state) const;

 private:
  AllocationCounter counter_;
};
