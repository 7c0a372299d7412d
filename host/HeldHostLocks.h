// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <functional>

// How many host mutexes (HostMutex) the calling thread holds, and work that
// waits until the thread holds none again.
//
// The permanent storage uses it to find the end of an apply: a plug-in
// persists the values of one apply while it holds its lock (the token
// driver applies under its queue lock), so the values a thread sets during
// one hold of host mutexes belong together and are written to the file in
// one replacement when the thread releases the last of them.
//
// The count is kept per thread and never goes below 0; a mutex released on
// another thread than the one that locked it (a caller error for a plain
// mutex) cannot make it negative.
class HeldHostLocks {
 public:
  // Called by HostMutex right after it was locked.
  static void Entered() { ++Depth(); }
  // Called by HostMutex right after it was unlocked. When the thread holds
  // no host mutex any more, the actions queued with AtLastUnlock run here,
  // in the order they were queued.
  static void Left() {
    int& depth = Depth();
    if (depth > 0) {
      --depth;
    }
    if (depth == 0 && Pending()) {
      RunQueued();
    }
  }
  // True while the calling thread holds at least one host mutex.
  static bool Any() { return Depth() > 0; }
  // Queues action to run on the calling thread right after it releases its
  // last host mutex. Only while Any(); otherwise the action runs at once.
  static void AtLastUnlock(std::function<void()> action);

 private:
  static void RunQueued();

  // What a thread holds is a property of that thread alone, so no other
  // thread ever reads these. Plain values, constant initialised and inline,
  // so that a lock and an unlock on the worker's hot path cost an increment,
  // a decrement and a test; the queue itself is touched only when not empty.
  static int& Depth() {
    thread_local int depth = 0;
    return depth;
  }
  static bool& Pending() {
    thread_local bool pending = false;
    return pending;
  }
};
