// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "factory/ProtocolFactory.h"

#include "binding/CompareInterface.h"
#include "driver/CreateProtocol_VELT.h"

IInterface* ProtocolFactory::ConvertTo(const char* name) {
  if (CompareInterface(name, "ProtocolFactory") != 0 ||
      CompareInterface(name, "IProtocolFactory") != 0) {
    return this;
  }
  return nullptr;
}

const char* ProtocolFactory::GetImpName() const { return "ProtFactoryInDLL"; }

int ProtocolFactory::GetImpVersion() const { return 100; }

IProtocol* ProtocolFactory::CreateProtocol(const char* name) {
  // The library makes one protocol: the token channel.
  if (CompareInterface(name, "VELT") != 0) {
    return CreateProtocol_VELT();
  }
  return nullptr;
}

void ProtocolFactory::DeleteProtocol(IProtocol* protocol) { delete protocol; }
