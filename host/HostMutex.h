// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <mutex>

#include "IMultiTask2.h"

// A plain, non-recursive mutex handed to the plug-in. Locking it twice on one
// thread, or unlocking it on a thread that does not hold it, is a caller
// error, as for any plain mutex. Each lock and unlock is counted for the
// calling thread (HeldHostLocks), so that the permanent storage can write
// the values set under one hold together.
class HostMutex final : public IMutex {
 public:
  HostMutex() = default;
  HostMutex(const HostMutex&) = delete;
  HostMutex& operator=(const HostMutex&) = delete;
  HostMutex(HostMutex&&) = delete;
  HostMutex& operator=(HostMutex&&) = delete;
  virtual ~HostMutex() = default;

  void Lock() override;
  void Unlock() override;

 private:
  std::mutex mutex_;
};
