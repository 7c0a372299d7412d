// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's diagnostics service ("IDiag", optional). The plug-in binds it in
// IProtModule::Init and gives it back in Close, and calls nothing else.
class IDiag : public IInterface {
 public:
  // The implementation's name and version.
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;

 protected:
  IDiag() = default;
  IDiag(const IDiag&) = default;
  IDiag& operator=(const IDiag&) = default;
  IDiag(IDiag&&) = default;
  IDiag& operator=(IDiag&&) = default;
  ~IDiag() = default;
};
