// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "StorageError.h"

namespace {

std::string Describe(const std::string& path, int line, const std::string& reason) {
  return path + (line > 0 ? ":" + std::to_string(line) : std::string()) + ": " + reason;
}

}  // namespace

StorageError::StorageError(const std::string& path, int line, const std::string& reason)
    : std::runtime_error(Describe(path, line, reason)), path_(path), line_(line), reason_(reason) {}
