// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"
#include "IProtocol.h"

// Creates protocol instances by protocol name; the plug-in's is reached
// through its interface factory as "IProtocolFactory" and lives as long as
// the library. CreateProtocol and DeleteProtocol run on the control thread,
// while the module is initialised; the identity operations on any thread.
// Slots: two destructor slots, ConvertTo, GetImpName, GetImpVersion,
// CreateProtocol, DeleteProtocol.
class IProtocolFactory : public IInterface {
 public:
  // The host never deletes the factory.
  virtual ~IProtocolFactory() = default;
  // This object for "ProtocolFactory" or "IProtocolFactory", else null.
  virtual IInterface* ConvertTo(const char* name) = 0;
  // "ProtFactoryInDLL".
  virtual const char* GetImpName() const = 0;
  // 100.
  virtual int GetImpVersion() const = 0;
  // A new, independent instance for name ("VELT"), owned by the caller until
  // DeleteProtocol; null for any other name. Allocation failure throws
  // std::bad_alloc.
  virtual IProtocol* CreateProtocol(const char* name) = 0;
  // Deletes a protocol made by CreateProtocol, with the tags it still owns;
  // null is ignored. Stop it first, and let no other thread use it meanwhile.
  virtual void DeleteProtocol(IProtocol* protocol) = 0;

 protected:
  IProtocolFactory() = default;
  IProtocolFactory(const IProtocolFactory&) = default;
  IProtocolFactory& operator=(const IProtocolFactory&) = default;
  IProtocolFactory(IProtocolFactory&&) = default;
  IProtocolFactory& operator=(IProtocolFactory&&) = default;
};
