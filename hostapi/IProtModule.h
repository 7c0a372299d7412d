// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"
#include "IInterfaceFactory.h"

// The plug-in's module object: binds the host's services. There is one per
// loaded library, reached through the plug-in's interface factory as
// "IProtModule". Init and Close run on the loading thread, before the first
// protocol is created and after the last one is deleted; protocols may only
// be used while the module is initialised.
// Slots: two destructor slots, ConvertTo, GetImpName, GetImpVersion, Init,
// Close, GetLastError.
class IProtModule : public IInterface {
 public:
  // The host never deletes the module; unloading the library destroys it and
  // gives back any services still bound.
  virtual ~IProtModule() = default;
  // This object for "ProtModule" or "IProtModule", else null.
  virtual IInterface* ConvertTo(const char* name) = 0;
  // "ProtModule".
  virtual const char* GetImpName() const = 0;
  // 100.
  virtual int GetImpVersion() const = 0;
  // Binds the host's services, asked from host by name in a fixed order:
  // "IMultiTask2", "ISerialFactory", "ISocketFactory", "ICDSBuffer" (each
  // mandatory), then "IDiag", "IPermanentStorage", "IDriverInterface",
  // "ISmux", "IFastTimer" (each optional). 1 on success. 0 when a mandatory
  // one is missing (or host is null): what was taken is given back and
  // GetLastError tells why. Calls nest: while bound, Init only counts and
  // ignores host.
  virtual int Init(IInterfaceFactory* host) = 0;
  // Undoes one Init; the one that matches the first gives every service back,
  // in this order: IFastTimer, ISmux, IDriverInterface, IDiag,
  // IPermanentStorage (those held), IMultiTask2, ISerialFactory,
  // ISocketFactory, ICDSBuffer. Does nothing on a module that is not bound.
  virtual void Close() = 0;
  // Why the last Init failed, one of "IMultiTask2 not created",
  // "ISerialFactory not created", "ISocketFactory not created" and
  // "piCDSBuffer not created"; empty if none failed. Valid until the next
  // Init.
  virtual const char* GetLastError() const = 0;

 protected:
  IProtModule() = default;
  IProtModule(const IProtModule&) = default;
  IProtModule& operator=(const IProtModule&) = default;
  IProtModule(IProtModule&&) = default;
  IProtModule& operator=(IProtModule&&) = default;
};
