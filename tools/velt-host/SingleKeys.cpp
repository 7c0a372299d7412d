// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/SingleKeys.h"

namespace velthost {

SingleKeys::SingleKeys(int fd) : fd_(fd) {
  if (::tcgetattr(fd_, &saved_) != 0) {
    return;
  }
  termios keys = saved_;
  keys.c_lflag &= ~static_cast<tcflag_t>(ICANON | ECHO);
  keys.c_cc[VMIN] = 1;
  keys.c_cc[VTIME] = 0;
  restore_ = ::tcsetattr(fd_, TCSANOW, &keys) == 0;
}

SingleKeys::~SingleKeys() {
  if (restore_) {
    ::tcsetattr(fd_, TCSANOW, &saved_);
  }
}

}  // namespace velthost
