// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "RecordingHostFactory.h"

RecordingHostFactory::RecordingHostFactory()
    : offered_{{"IMultiTask2", &multiTask_},
               {"ISerialFactory", &serialFactory_},
               {"ISocketFactory", &socketFactory_},
               {"ICDSBuffer", &cdsBuffer_},
               {"IDiag", &diag_},
               {"IPermanentStorage", &storage_},
               {"IDriverInterface", &driverInterface_},
               {"ISmux", &smux_},
               {"IFastTimer", &fastTimer_}} {}

IInterface* RecordingHostFactory::CreateInterface(const char* name) {
  const std::string key = name == nullptr ? std::string() : std::string(name);
  const auto found = offered_.find(key);
  IInterface* const result = found == offered_.end() ? nullptr : found->second;
  log_.push_back("create " + key + (result == nullptr ? " -> null" : ""));
  if (result != nullptr) {
    ++held_;
  }
  return result;
}

void RecordingHostFactory::ReleaseInterface(IInterface* itf) {
  for (const auto& [name, service] : offered_) {
    if (service == itf && itf != nullptr) {
      log_.push_back("release " + name);
      --held_;
      return;
    }
  }
  log_.push_back("release ?");
}

void RecordingHostFactory::Offer(const std::string& name, IInterface* service) {
  offered_[name] = service;
}

void RecordingHostFactory::Refuse(const std::string& name) { offered_[name] = nullptr; }

namespace {

std::vector<std::string> EntriesStartingWith(const std::vector<std::string>& log,
                                             const std::string& prefix) {
  std::vector<std::string> names;
  for (const auto& entry : log) {
    if (entry.compare(0, prefix.size(), prefix) == 0) {
      names.push_back(entry.substr(prefix.size()));
    }
  }
  return names;
}

}  // namespace

std::vector<std::string> RecordingHostFactory::Released() const {
  return EntriesStartingWith(log_, "release ");
}

std::vector<std::string> RecordingHostFactory::Requested() const {
  return EntriesStartingWith(log_, "create ");
}
