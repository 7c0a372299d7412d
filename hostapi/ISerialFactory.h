// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's serial-port service ("ISerialFactory", mandatory). The plug-in
// binds it in IProtModule::Init and gives it back in Close; it reads nothing
// but its identity, which a protocol's information text shows.
class ISerialFactory : public IInterface {
 public:
  // The implementation's name and version, shown in a protocol's
  // information text (any thread).
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
