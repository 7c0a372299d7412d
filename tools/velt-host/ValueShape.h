// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "HostTypes.h"

namespace velthost {

// How a tag's value lies in the host's buffer: its data type, its length in
// bytes (one byte per bit for bit types) and, for arrays and texts, the type
// of one item (ICU_NONE for a scalar).
struct ValueShape {
  ICU_Type type = ICU_NONE;
  int length = 0;
  ICU_Type itemType = ICU_NONE;
};

}  // namespace velthost
