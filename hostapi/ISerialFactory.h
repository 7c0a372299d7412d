// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's serial-port service ("ISerialFactory"). This driver binds and releases it
// and reads nothing but its identity.
class ISerialFactory : public IInterface {
 public:
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;

 protected:
  ISerialFactory() = default;
  ISerialFactory(const ISerialFactory&) = default;
  ISerialFactory& operator=(const ISerialFactory&) = default;
  ISerialFactory(ISerialFactory&&) = default;
  ISerialFactory& operator=(ISerialFactory&&) = default;
  ~ISerialFactory() = default;
};
