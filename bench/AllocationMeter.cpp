// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "AllocationMeter.h"

void AllocationMeter::Report(benchmark::State& state) const {
  state.counters["allocs/iter"] =
      benchmark::Counter(static_cast<double>(counter_.count()), benchmark::Counter::kAvgIterations);
}
