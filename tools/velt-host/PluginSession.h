// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <memory>
#include <string>
#include <vector>

#include "HostInterfaceFactory.h"
#include "PluginLoader.h"
#include "velt-host/Instance.h"

namespace velthost {

// The plug-in running inside the reference host: the host's services (with
// permanent storage in one file), the loaded and initialised plug-in, and the
// console's driver instances. Destruction stops and deletes each instance,
// then closes the module and unloads the library, in that order.
class PluginSession {
 public:
  // Throws std::runtime_error naming what failed: the storage file, the
  // loader's text, or the module's. An empty storage path gives a host
  // without permanent storage. onStorageFailure is told of every write of
  // the storage file that fails, from before the plug-in is loaded until
  // the session is gone.
  PluginSession(const std::string& pluginPath, const std::string& storagePath,
                HostSocket::Timeouts socketTimeouts = HostSocket::Timeouts(),
                HostPermanentStorage::FailureHook onStorageFailure = {});
  PluginSession(const PluginSession&) = delete;
  PluginSession& operator=(const PluginSession&) = delete;
  PluginSession(PluginSession&&) = delete;
  PluginSession& operator=(PluginSession&&) = delete;
  ~PluginSession();

  // Creates, names, configures and starts one more instance. Throws
  // std::runtime_error naming what failed and the protocol's last error.
  Instance& AddInstance(const std::string& name, const std::string& config);
  const std::vector<std::unique_ptr<Instance>>& Instances() const { return instances_; }

  HostInterfaceFactory& Host() { return *host_; }
  PluginLoader& Plugin() { return *plugin_; }

 private:
  // Declared in start-up order: members go in reverse, instances first.
  std::unique_ptr<HostInterfaceFactory> host_;
  std::unique_ptr<PluginLoader> plugin_;
  std::vector<std::unique_ptr<Instance>> instances_;
};

}  // namespace velthost
