// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

// The environment of a child process: this process's own, with changes.
// "NAME=VALUE" sets a variable, "-NAME" removes it.
class ChildEnvironment {
 public:
  explicit ChildEnvironment(const std::vector<std::string>& changes);

  // NUL-terminated entries and a null pointer, as execve and posix_spawn take
  // them; valid while the object lives.
  char* const* Get();

 private:
  std::vector<std::string> entries_;
  std::vector<char*> pointers_;
};
