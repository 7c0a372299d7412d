// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"
#include "IProtocol.h"

// Creates protocol instances by protocol name.
// Slots: two destructor slots, ConvertTo, GetImpName, GetImpVersion,
// CreateProtocol, DeleteProtocol.
class IProtocolFactory : public IInterface {
 public:
  virtual ~IProtocolFactory() = default;
  virtual IInterface* ConvertTo(const char* name) = 0;
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;
  // A new instance, owned by the caller until DeleteProtocol; null for an
  // unknown name.
  virtual IProtocol* CreateProtocol(const char* name) = 0;
  virtual void DeleteProtocol(IProtocol* protocol) = 0;

 protected:
  IProtocolFactory() = default;
  IProtocolFactory(const IProtocolFactory&) = default;
  IProtocolFactory& operator=(const IProtocolFactory&) = default;
  IProtocolFactory(IProtocolFactory&&) = default;
  IProtocolFactory& operator=(IProtocolFactory&&) = default;
};
