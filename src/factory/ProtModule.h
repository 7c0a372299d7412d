// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <string>

#include "IProtModule.h"

// The module object: binds the host's services into the module-wide pointers
// on Init and gives them back on Close, in fixed orders. Init calls nest.
class ProtModule final : public IProtModule {
 public:
  ProtModule() = default;
  ProtModule(const ProtModule&) = delete;
  ProtModule& operator=(const ProtModule&) = delete;
  ProtModule(ProtModule&&) = delete;
  ProtModule& operator=(ProtModule&&) = delete;
  // Performs the steps of Close, so a host that unloads the library without
  // calling Close still gets its services back.
  ~ProtModule() override;

  // Itself for "ProtModule" or "IProtModule", else null.
  IInterface* ConvertTo(const char* name) override;
  // "ProtModule".
  const char* GetImpName() const override;
  // 100.
  int GetImpVersion() const override;
  int Init(IInterfaceFactory* host) override;
  void Close() override;
  // The text of the last failed Init; empty if none failed.
  const char* GetLastError() const override;

 private:
  std::string lastError;
  IInterfaceFactory* hostFactory = nullptr;
  std::uint32_t initCount = 0;
};
