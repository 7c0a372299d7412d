// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

namespace velthost {

// A fresh folder under $TMPDIR (or /tmp), removed with everything in it when
// the object goes.
class TempFolder {
 public:
  // Throws std::runtime_error when the folder cannot be made.
  explicit TempFolder(const std::string& prefix);
  TempFolder(const TempFolder&) = delete;
  TempFolder& operator=(const TempFolder&) = delete;
  TempFolder(TempFolder&&) = delete;
  TempFolder& operator=(TempFolder&&) = delete;
  ~TempFolder();

  const std::string& Path() const { return path_; }
  std::string File(const std::string& name) const { return path_ + "/" + name; }

 private:
  std::string path_;
};

}  // namespace velthost
