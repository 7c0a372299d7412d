// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostInterfaceFactory.h"

namespace {

std::unique_ptr<HostPermanentStorage> OpenStorage(const std::string& path) {
  if (path.empty()) {
    return nullptr;
  }
  return std::make_unique<HostPermanentStorage>(path);
}

}  // namespace

HostInterfaceFactory::HostInterfaceFactory(const std::string& storagePath,
                                           HostSocket::Timeouts socketTimeouts)
    : storage_(OpenStorage(storagePath)), socketFactory_(socketTimeouts) {
  // Each service is handed out as the interface the plug-in casts it to.
  offered_ = {
      {"IMultiTask2", static_cast<IMultiTask2*>(&multiTask_)},
      {"ISerialFactory", static_cast<ISerialFactory*>(&serialFactory_)},
      {"ISocketFactory", static_cast<ISocketFactory2*>(&socketFactory_)},
      {"ICDSBuffer", static_cast<ICDSBuffer*>(&cdsBuffer_)},
  };
  if (storage_ != nullptr) {
    offered_.emplace_back("IPermanentStorage", static_cast<IPermanentStorage*>(storage_.get()));
  }
}

IInterface* HostInterfaceFactory::Find(const char* name) const {
  if (name == nullptr) {
    return nullptr;
  }
  for (const auto& [offeredName, service] : offered_) {
    if (offeredName == name) {
      return service;
    }
  }
  return nullptr;
}

IInterface* HostInterfaceFactory::CreateInterface(const char* name) {
  IInterface* const service = Find(name);
  if (service != nullptr) {
    const std::lock_guard<std::mutex> lock(countMutex_);
    ++held_[name];
  }
  return service;
}

void HostInterfaceFactory::ReleaseInterface(IInterface* itf) {
  if (itf == nullptr) {
    return;
  }
  const std::lock_guard<std::mutex> lock(countMutex_);
  for (const auto& [name, service] : offered_) {
    if (service != itf) {
      continue;
    }
    const auto count = held_.find(name);
    if (count != held_.end() && count->second > 0) {
      --count->second;
      return;
    }
    break;
  }
  ++unmatchedReleases_;
}

int HostInterfaceFactory::Held(const std::string& name) const {
  const std::lock_guard<std::mutex> lock(countMutex_);
  const auto count = held_.find(name);
  return count == held_.end() ? 0 : count->second;
}

int HostInterfaceFactory::HeldTotal() const {
  const std::lock_guard<std::mutex> lock(countMutex_);
  int total = 0;
  for (const auto& entry : held_) {
    total += entry.second;
  }
  return total;
}

std::map<std::string, int> HostInterfaceFactory::HeldInterfaces() const {
  const std::lock_guard<std::mutex> lock(countMutex_);
  std::map<std::string, int> stillHeld;
  for (const auto& [name, count] : held_) {
    if (count != 0) {
      stillHeld.emplace(name, count);
    }
  }
  return stillHeld;
}

int HostInterfaceFactory::UnmatchedReleases() const {
  const std::lock_guard<std::mutex> lock(countMutex_);
  return unmatchedReleases_;
}
