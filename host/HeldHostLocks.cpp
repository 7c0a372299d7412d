#include "HeldHostLocks.h"

#include <utility>
#include <vector>

namespace {

struct ThreadHolds {
  int depth = 0;
  std::vector<std::function<void()>> atLastUnlock;
};

// One record per thread: which locks a thread holds is a property of that
// thread alone, so no other thread ever reads it.
ThreadHolds& Holds() {
  thread_local ThreadHolds holds;
  return holds;
}

}  // namespace

void HeldHostLocks::Entered() { ++Holds().depth; }

void HeldHostLocks::Left() {
  ThreadHolds& holds = Holds();
  if (holds.depth > 0) {
    --holds.depth;
  }
  if (holds.depth != 0 || holds.atLastUnlock.empty()) {
    return;
  }
  // An action may lock and unlock host mutexes itself; it then finds an
  // empty queue instead of re-running the actions that are running.
  const std::vector<std::function<void()>> actions = std::exchange(holds.atLastUnlock, {});
  for (const std::function<void()>& action : actions) {
    action();
  }
}

bool HeldHostLocks::Any() { return Holds().depth > 0; }

void HeldHostLocks::AtLastUnlock(std::function<void()> action) {
  ThreadHolds& holds = Holds();
  if (holds.depth == 0) {
    action();
    return;
  }
  holds.atLastUnlock.push_back(std::move(action));
}
