// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// Hands out interfaces by name. The host gives one to the plug-in module's
// Init; the plug-in returns one from GetInterfaceFactory.
// Slots: CreateInterface, ReleaseInterface (no destructor slots).
class IInterfaceFactory : public IInterface {
 public:
  // Returns the interface registered under name, or null when there is none.
  virtual IInterface* CreateInterface(const char* name) = 0;
  // Gives back an interface obtained from CreateInterface.
  virtual void ReleaseInterface(IInterface* itf) = 0;

 protected:
  IInterfaceFactory() = default;
  IInterfaceFactory(const IInterfaceFactory&) = default;
  IInterfaceFactory& operator=(const IInterfaceFactory&) = default;
  IInterfaceFactory(IInterfaceFactory&&) = default;
  IInterfaceFactory& operator=(IInterfaceFactory&&) = default;
  ~IInterfaceFactory() = default;
};
