// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <termios.h>

namespace velthost {

// For its life, the terminal at fd delivers every key at once and does not
// echo it (signal keys such as Ctrl-C still raise their signals); the
// previous settings come back when it goes. Nothing happens when fd is no
// terminal.
class SingleKeys {
 public:
  explicit SingleKeys(int fd);
  SingleKeys(const SingleKeys&) = delete;
  SingleKeys& operator=(const SingleKeys&) = delete;
  SingleKeys(SingleKeys&&) = delete;
  SingleKeys& operator=(SingleKeys&&) = delete;
  ~SingleKeys();

 private:
  int fd_;
  termios saved_{};
  bool restore_ = false;
};

}  // namespace velthost
