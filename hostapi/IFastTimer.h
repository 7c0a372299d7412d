// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's fast timer service ("IFastTimer", optional). The plug-in binds it
// in IProtModule::Init and gives it back in Close, and calls nothing else.
class IFastTimer : public IInterface {
 public:
  // The implementation's name and version.
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;

 protected:
  IFastTimer() = default;
  IFastTimer(const IFastTimer&) = default;
  IFastTimer& operator=(const IFastTimer&) = default;
  IFastTimer(IFastTimer&&) = default;
  IFastTimer& operator=(IFastTimer&&) = default;
  ~IFastTimer() = default;
};
