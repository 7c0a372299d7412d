// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "PluginLoader.h"

#include <dlfcn.h>

#include <stdexcept>

namespace {

using EntryPoint = IInterfaceFactory* (*)();

std::string LastDlError() {
  const char* const text = ::dlerror();
  return text == nullptr ? std::string("unknown error") : std::string(text);
}

// The interface that the plug-in hands out under name, or null.
template <typename Interface>
Interface* CreateByName(IInterfaceFactory& factory, const char* name) {
  // A false positive: the name fixes the type, as the host interfaces are
  // converted by name; IInterface declares no virtual function, so no checked
  // cast could be used instead.
  // NOLINTNEXTLINE(cppcoreguidelines-pro-type-static-cast-downcast)
  return static_cast<Interface*>(factory.CreateInterface(name));
}

}  // namespace

void PluginLoader::LibraryCloser::operator()(void* handle) const { ::dlclose(handle); }

PluginLoader::PluginLoader(const std::string& path, IInterfaceFactory& host) : path_(path) {
  const std::string name = "plug-in " + path;
  library_.reset(::dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL));
  if (library_ == nullptr) {
    throw std::runtime_error("cannot load " + name + ": " + LastDlError());
  }
  ::dlerror();
  void* const symbol = ::dlsym(library_.get(), "GetInterfaceFactory");
  if (symbol == nullptr) {
    throw std::runtime_error(name + " has no GetInterfaceFactory: " + LastDlError());
  }
  entry_ = reinterpret_cast<EntryPoint>(symbol)();
  if (entry_ == nullptr) {
    throw std::runtime_error(name + ": GetInterfaceFactory returned null");
  }
  module_ = CreateByName<IProtModule>(*entry_, "IProtModule");
  if (module_ == nullptr) {
    throw std::runtime_error(name + " offers no IProtModule");
  }
  protocols_ = CreateByName<IProtocolFactory>(*entry_, "IProtocolFactory");
  if (protocols_ == nullptr) {
    entry_->ReleaseInterface(module_);
    throw std::runtime_error(name + " offers no IProtocolFactory");
  }
  if (module_->Init(&host) == 0) {
    const std::string reason = module_->GetLastError();
    entry_->ReleaseInterface(protocols_);
    entry_->ReleaseInterface(module_);
    throw std::runtime_error(name + " failed to initialise: " + reason);
  }
}

PluginLoader::~PluginLoader() {
  module_->Close();
  entry_->ReleaseInterface(protocols_);
  entry_->ReleaseInterface(module_);
  // library_ unloads last, once nothing of the plug-in is called any more.
}
