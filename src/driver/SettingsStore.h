// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>
#include <functional>
#include <mutex>

#include "driver/ChannelSettings.h"

// The channel's working settings, shared by the host's threads (which change
// them) and the worker (which reads them on every pass). Changes are made
// under a lock and bump a version number; the worker keeps its own copy and
// refreshes it only when the version moved, so a pass never reads a setting
// while another thread writes it and an idle pass copies nothing.
class SettingsStore {
 public:
  // The two settings that decide how a received token is queued.
  struct QueueRules {
    int tokenQueueSize;
    bool hexTokens;
  };

  // A consistent copy of the settings.
  ChannelSettings Get() const;
  // The queue rules alone, without copying the texts (taken for every token).
  QueueRules GetQueueRules() const;
  // Applies change to the settings under the lock.
  void Update(const std::function<void(ChannelSettings&)>& change);
  // Refreshes copy when the settings changed since it was taken; returns true
  // when it did.
  bool Refresh(ChannelSettings& copy, unsigned int& copyVersion) const;

 private:
  mutable std::mutex lock_;
  ChannelSettings settings_;
  std::atomic<unsigned int> version_{1};
};
