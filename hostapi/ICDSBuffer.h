// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's shared data-buffer service ("ICDSBuffer"). This driver binds and releases it
// and reads nothing but its identity.
class ICDSBuffer : public IInterface {
 public:
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
