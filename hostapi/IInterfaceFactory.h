// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// Hands out interfaces by name. Two sides implement it:
// - the host, whose factory it gives to the plug-in module's Init. The
//   plug-in calls it only inside IProtModule::Init and Close, on the loading
//   thread.
// - the plug-in, whose factory GetInterfaceFactory returns. It hands out
//   "IProtModule" and "IProtocolFactory" (also "ProtModule" and
//   "ProtocolFactory"), the same object on every call, and may be called on
//   any thread.
// Slots: CreateInterface, ReleaseInterface (no destructor slots).
class IInterfaceFactory : public IInterface {
 public:
  // The interface registered under name, or null when there is none (a null
  // name included). The pointer must be the named interface itself, since
  // the caller converts it with static_cast: for a class with several bases,
  // return static_cast<IInterface*>(static_cast<INamed*>(object)).
  virtual IInterface* CreateInterface(const char* name) = 0;
  // Gives back an interface obtained from CreateInterface; each hand-out is
  // given back once. Null is ignored. The plug-in's own factory frees nothing
  // (its interfaces are parts of one static object).
  virtual void ReleaseInterface(IInterface* itf) = 0;

 protected:
  IInterfaceFactory() = default;
  IInterfaceFactory(const IInterfaceFactory&) = default;
  IInterfaceFactory& operator=(const IInterfaceFactory&) = default;
  IInterfaceFactory(IInterfaceFactory&&) = default;
  IInterfaceFactory& operator=(IInterfaceFactory&&) = default;
  ~IInterfaceFactory() = default;
};
