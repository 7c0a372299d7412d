// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "StorageFailure.h"

std::string StorageFailure::Text() const {
  const std::string what = values == 1
                               ? "the value just applied holds"
                               : "the " + std::to_string(values) + " values just applied hold";
  return "the storage file " + path + " was not updated (" + reason + "); " + what +
         " until restart";
}
