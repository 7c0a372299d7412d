// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterfaceFactory.h"
#include "factory/InterfaceFactory.h"
#include "factory/ProtModule.h"
#include "factory/ProtocolFactory.h"

// The plug-in's entry point and the one module-wide object behind it.

// The library's one module-wide object, in this order: the interface factory
// that GetInterfaceFactory hands out, the protocol factory and the module.
// It is built by the library's static initialiser when the library is loaded
// and torn down when it is unloaded; tearing down the module part gives back
// any host services still bound.
struct ModuleFactory {
  InterfaceFactory interfaceFactory;
  ProtocolFactory protocolFactory;
  ProtModule protModule;
};

// The module object is, with the module-wide service pointers, the
// library's one prescribed global state.
// NOLINTNEXTLINE(cppcoreguidelines-avoid-non-const-global-variables)
extern ModuleFactory Factory;

// The plug-in's one exported symbol: the library's interface factory, from
// which the host reaches the protocol factory and the module by name. It
// never fails and always returns the same object.
extern "C" IInterfaceFactory* GetInterfaceFactory();
