// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <memory>
#include <string>

#include "IInterfaceFactory.h"
#include "IProtModule.h"
#include "IProtocolFactory.h"

// Loads a plug-in as a panel runtime does: dlopen (RTLD_NOW | RTLD_LOCAL),
// GetInterfaceFactory, the module ("IProtModule") and the protocol factory
// ("IProtocolFactory") by name, and the module's Init with the host's
// interface factory. Destruction closes the module, gives the two
// interfaces back and unloads the library; protocols created through it
// must be deleted first, and the host factory must outlive the loader.
//
// One loader per plug-in file per process: the library is loaded once per
// process, so a second loader would share the first one's module.
class PluginLoader {
 public:
  // Throws std::runtime_error naming the plug-in path and the reason:
  // dlerror's text when the library or its entry point cannot be found, a
  // missing interface, or the module's GetLastError text when Init fails.
  PluginLoader(const std::string& path, IInterfaceFactory& host);
  PluginLoader(const PluginLoader&) = delete;
  PluginLoader& operator=(const PluginLoader&) = delete;
  PluginLoader(PluginLoader&&) = delete;
  PluginLoader& operator=(PluginLoader&&) = delete;
  ~PluginLoader();

  const std::string& Path() const { return path_; }
  // The plug-in's own interface factory.
  IInterfaceFactory& Entry() const { return *entry_; }
  IProtModule& Module() const { return *module_; }
  IProtocolFactory& Protocols() const { return *protocols_; }

 private:
  struct LibraryCloser {
    void operator()(void* handle) const;
  };

  std::string path_;
  std::unique_ptr<void, LibraryCloser> library_;
  IInterfaceFactory* entry_ = nullptr;
  IProtModule* module_ = nullptr;
  IProtocolFactory* protocols_ = nullptr;
};
