// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's shared data-buffer service ("ICDSBuffer", mandatory). The plug-in
// binds it in IProtModule::Init and gives it back in Close, and calls nothing
// else.
class ICDSBuffer : public IInterface {
 public:
  // The implementation's name and version.
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;

 protected:
  ICDSBuffer() = default;
  ICDSBuffer(const ICDSBuffer&) = default;
  ICDSBuffer& operator=(const ICDSBuffer&) = default;
  ICDSBuffer(ICDSBuffer&&) = default;
  ICDSBuffer& operator=(ICDSBuffer&&) = default;
  ~ICDSBuffer() = default;
};
