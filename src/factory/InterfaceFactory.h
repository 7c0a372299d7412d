// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterfaceFactory.h"

// The interface factory that GetInterfaceFactory returns. It hands out the
// static parts of the module-wide Factory by name and creates nothing.
class InterfaceFactory final : public IInterfaceFactory {
 public:
  InterfaceFactory() = default;
  InterfaceFactory(const InterfaceFactory&) = delete;
  InterfaceFactory& operator=(const InterfaceFactory&) = delete;
  InterfaceFactory(InterfaceFactory&&) = delete;
  InterfaceFactory& operator=(InterfaceFactory&&) = delete;
  virtual ~InterfaceFactory() = default;

  // "IProtocolFactory"/"ProtocolFactory": the protocol factory;
  // "IProtModule"/"ProtModule": the module; anything else: null.
  IInterface* CreateInterface(const char* name) override;
  // Nothing to give back: the interfaces are parts of a static object.
  void ReleaseInterface(IInterface* itf) override;
};
