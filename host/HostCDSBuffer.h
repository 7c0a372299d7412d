// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "ICDSBuffer.h"

// The shared data-buffer service ("ICDSBuffer"). The plug-in binds it and
// reads nothing but its identity.
class HostCDSBuffer final : public ICDSBuffer {
 public:
  HostCDSBuffer() = default;
  HostCDSBuffer(const HostCDSBuffer&) = delete;
  HostCDSBuffer& operator=(const HostCDSBuffer&) = delete;
  HostCDSBuffer(HostCDSBuffer&&) = delete;
  HostCDSBuffer& operator=(HostCDSBuffer&&) = delete;
  virtual ~HostCDSBuffer() = default;

  // "HostCDSBuffer".
  const char* GetImpName() const override;
  // 100.
  int GetImpVersion() const override;
};
