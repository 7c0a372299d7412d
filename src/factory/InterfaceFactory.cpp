// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "factory/InterfaceFactory.h"

#include "binding/CompareInterface.h"
#include "factory/ProtFactory.h"

IInterface* InterfaceFactory::CreateInterface(const char* name) {
  if (CompareInterface(name, "IProtocolFactory") != 0 ||
      CompareInterface(name, "ProtocolFactory") != 0) {
    return &Factory.protocolFactory;
  }
  if (CompareInterface(name, "IProtModule") != 0 || CompareInterface(name, "ProtModule") != 0) {
    return &Factory.protModule;
  }
  return nullptr;
}

void InterfaceFactory::ReleaseInterface(IInterface* /*itf*/) {}
