// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/SettingsStore.h"

ChannelSettings SettingsStore::Get() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return settings_;
}

SettingsStore::QueueRules SettingsStore::GetQueueRules() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return {settings_.tokenQueueSize, settings_.hexTokens};
}

void SettingsStore::Update(const std::function<void(ChannelSettings&)>& change) {
  const std::lock_guard<std::mutex> guard(lock_);
  change(settings_);
  version_.fetch_add(1);
}

bool SettingsStore::Refresh(ChannelSettings& copy, unsigned int& copyVersion) const {
  if (version_.load() == copyVersion) {
    return false;
  }
  const std::lock_guard<std::mutex> guard(lock_);
  copy = settings_;
  copyVersion = version_.load();
  return true;
}
