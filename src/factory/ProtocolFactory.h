// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocolFactory.h"

// Creates the driver's protocol instances by protocol name.
class ProtocolFactory final : public IProtocolFactory {
 public:
  ProtocolFactory() = default;
  ProtocolFactory(const ProtocolFactory&) = delete;
  ProtocolFactory& operator=(const ProtocolFactory&) = delete;
  ProtocolFactory(ProtocolFactory&&) = delete;
  ProtocolFactory& operator=(ProtocolFactory&&) = delete;
  ~ProtocolFactory() override = default;

  // Itself for "ProtocolFactory" or "IProtocolFactory", else null.
  IInterface* ConvertTo(const char* name) override;
  // "ProtFactoryInDLL".
  const char* GetImpName() const override;
  // 100.
  int GetImpVersion() const override;
  IProtocol* CreateProtocol(const char* name) override;
  // Deletes a protocol made by CreateProtocol; null is ignored.
  void DeleteProtocol(IProtocol* protocol) override;
};
