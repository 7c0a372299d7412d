// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HeldHostLocks.h"

#include <utility>
#include <vector>

namespace {

std::vector<std::function<void()>>& Queued() {
  thread_local std::vector<std::function<void()>> queued;
  return queued;
}

}  // namespace

void HeldHostLocks::RunQueued() {
  Pending() = false;
  // An action may lock and unlock host mutexes itself; it then finds an
  // empty queue instead of re-running the actions that are running.
  const std::vector<std::function<void()>> actions = std::exchange(Queued(), {});
  for (const std::function<void()>& action : actions) {
    action();
  }
}

void HeldHostLocks::AtLastUnlock(std::function<void()> action) {
  if (Depth() == 0) {
    action();
    return;
  }
  Queued().push_back(std::move(action));
  Pending() = true;
}
