// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/PluginSession.h"

#include <stdexcept>
#include <utility>

#include "StorageError.h"

namespace velthost {

PluginSession::PluginSession(const std::string& pluginPath, const std::string& storagePath,
                             HostSocket::Timeouts socketTimeouts,
                             HostPermanentStorage::FailureHook onStorageFailure) {
  try {
    host_ = std::make_unique<HostInterfaceFactory>(storagePath, socketTimeouts);
  } catch (const StorageError& e) {
    throw std::runtime_error(std::string("cannot read the storage file ") + e.what());
  }
  if (host_->Storage() != nullptr) {
    host_->Storage()->SetFailureHook(std::move(onStorageFailure));
  }
  plugin_ = std::make_unique<PluginLoader>(pluginPath, *host_);
}

PluginSession::~PluginSession() {
  // Each instance is stopped and deleted in the order of creation before the
  // module that made them is closed.
  for (std::unique_ptr<Instance>& instance : instances_) {
    instance.reset();
  }
  instances_.clear();
  plugin_.reset();
  host_.reset();
}

Instance& PluginSession::AddInstance(const std::string& name, const std::string& config) {
  instances_.push_back(std::make_unique<Instance>(plugin_->Protocols(), name, config));
  return *instances_.back();
}

}  // namespace velthost
