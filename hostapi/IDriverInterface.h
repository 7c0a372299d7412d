// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's driver interface service ("IDriverInterface"). This driver binds and releases it
// and reads nothing but its identity.
class IDriverInterface : public IInterface {
 public:
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
