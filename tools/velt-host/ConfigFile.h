// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

namespace velthost {

// A file that holds one configuration string, written over as many lines as
// its author likes: every line break (LF or CR) counts as a blank.
class ConfigFile {
 public:
  // The file's configuration string; false with error set when the file
  // cannot be read.
  static bool Read(const std::string& path, std::string& text, std::string& error);
};

}  // namespace velthost
