// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <stdexcept>
#include <string>

// A storage file that cannot be read or does not parse. what() is
// "PATH:LINE: REASON", or "PATH: REASON" when no line is concerned.
class StorageError : public std::runtime_error {
 public:
  StorageError(const std::string& path, int line, const std::string& reason);

  const std::string& Path() const { return path_; }
  // The 1-based line of the fault; 0 when it concerns the whole file.
  int Line() const { return line_; }
  const std::string& Reason() const { return reason_; }

 private:
  std::string path_;
  int line_;
  std::string reason_;
};
