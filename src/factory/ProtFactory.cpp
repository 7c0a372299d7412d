// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "factory/ProtFactory.h"

// The module object is, with the module-wide service pointers, the
// library's one prescribed global state.
// NOLINTNEXTLINE(cppcoreguidelines-avoid-non-const-global-variables)
ModuleFactory Factory;

extern "C" __attribute__((visibility("default"))) IInterfaceFactory* GetInterfaceFactory() {
  return &Factory.interfaceFactory;
}
