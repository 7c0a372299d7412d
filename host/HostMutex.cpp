// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostMutex.h"

#include "HeldHostLocks.h"

void HostMutex::Lock() {
  mutex_.lock();
  HeldHostLocks::Entered();
}

void HostMutex::Unlock() {
  mutex_.unlock();
  HeldHostLocks::Left();
}
