// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's driver interface service ("IDriverInterface", optional). The
// plug-in binds it in IProtModule::Init and gives it back in Close, and calls
// nothing else.
class IDriverInterface : public IInterface {
 public:
  // The implementation's name and version.
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;

 protected:
  IDriverInterface() = default;
  IDriverInterface(const IDriverInterface&) = default;
  IDriverInterface& operator=(const IDriverInterface&) = default;
  IDriverInterface(IDriverInterface&&) = default;
  IDriverInterface& operator=(IDriverInterface&&) = default;
  ~IDriverInterface() = default;
};
