// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <string>

namespace _VELT {

// The configuration of one node: its number and its device model (a model
// registered with the driver's memory manager).
struct NodeParams {
  // -1 in the record answered for nodes without a section of their own.
  std::int32_t nodeId = -1;
  std::string model;
};

}  // namespace _VELT
