// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's serial multiplexer service ("ISmux"). This driver binds and releases it
// and reads nothing but its identity.
class ISmux : public IInterface {
 public:
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;

 protected:
  ISmux() = default;
  ISmux(const ISmux&) = default;
  ISmux& operator=(const ISmux&) = default;
  ISmux(ISmux&&) = default;
  ISmux& operator=(ISmux&&) = default;
  ~ISmux() = default;
};
