// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"
#include "IInterfaceFactory.h"

// The plug-in's module object: binds the host's services.
// Slots: two destructor slots, ConvertTo, GetImpName, GetImpVersion, Init,
// Close, GetLastError.
class IProtModule : public IInterface {
 public:
  virtual ~IProtModule() = default;
  virtual IInterface* ConvertTo(const char* name) = 0;
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;
  // 1 on success, 0 on failure (GetLastError tells why).
  virtual int Init(IInterfaceFactory* host) = 0;
  virtual void Close() = 0;
  virtual const char* GetLastError() const = 0;

 protected:
  IProtModule() = default;
  IProtModule(const IProtModule&) = default;
  IProtModule& operator=(const IProtModule&) = default;
  IProtModule(IProtModule&&) = default;
  IProtModule& operator=(IProtModule&&) = default;
};
