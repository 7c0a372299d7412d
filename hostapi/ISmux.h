// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's serial multiplexer service ("ISmux", optional). The plug-in binds
// it in IProtModule::Init and gives it back in Close, and calls nothing else.
class ISmux : public IInterface {
 public:
  // The implementation's name and version.
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
