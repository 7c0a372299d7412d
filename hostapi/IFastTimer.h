// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's fast timer service ("IFastTimer"). This driver binds and releases it
// and reads nothing but its identity.
class IFastTimer : public IInterface {
 public:
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
