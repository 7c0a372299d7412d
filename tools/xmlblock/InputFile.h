// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

// Reads a whole file into memory.
class InputFile {
 public:
  // The file's bytes. Throws std::runtime_error "cannot read 'PATH': REASON"
  // when the file cannot be opened or read (a directory included).
  static std::string Read(const std::string& path);
};
