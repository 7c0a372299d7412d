// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/TimeStamp.h"

#include <chrono>

namespace ProtUtilsN {

unsigned long long currentTimeStamp() {
  using std::chrono::duration_cast;
  const auto sinceEpoch = std::chrono::system_clock::now().time_since_epoch();
  const auto seconds = duration_cast<std::chrono::seconds>(sinceEpoch);
  const auto micros = duration_cast<std::chrono::microseconds>(sinceEpoch - seconds);
  return static_cast<unsigned long long>(seconds.count()) * 1000ULL +
         static_cast<unsigned long long>(micros.count()) / 1000ULL;
}

}  // namespace ProtUtilsN
