// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "ISerialFactory.h"

// The serial-port service ("ISerialFactory"). This host has no serial
// ports to offer; the plug-in binds the service and shows its identity in
// its information text.
class HostSerialFactory final : public ISerialFactory {
 public:
  HostSerialFactory() = default;
  HostSerialFactory(const HostSerialFactory&) = delete;
  HostSerialFactory& operator=(const HostSerialFactory&) = delete;
  HostSerialFactory(HostSerialFactory&&) = delete;
  HostSerialFactory& operator=(HostSerialFactory&&) = delete;
  virtual ~HostSerialFactory() = default;

  // "HostSerialFactory".
  const char* GetImpName() const override;
  // 100.
  int GetImpVersion() const override;
};
