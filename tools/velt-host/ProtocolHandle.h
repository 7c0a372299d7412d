// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol.h"
#include "IProtocolFactory.h"

namespace velthost {

// One protocol instance created by name through the plug-in's factory and
// given back to it (DeleteProtocol) when the object goes.
class ProtocolHandle {
 public:
  // The protocol every instance of this host creates.
  static constexpr const char* kProtocolName = "VELT";

  // Throws std::runtime_error when the factory offers no such protocol.
  explicit ProtocolHandle(IProtocolFactory& factory, const char* name = kProtocolName);
  ProtocolHandle(const ProtocolHandle&) = delete;
  ProtocolHandle& operator=(const ProtocolHandle&) = delete;
  ProtocolHandle(ProtocolHandle&&) = delete;
  ProtocolHandle& operator=(ProtocolHandle&&) = delete;
  ~ProtocolHandle();

  IProtocol& Get() const { return *protocol_; }

 private:
  IProtocolFactory& factory_;
  IProtocol* protocol_;
};

}  // namespace velthost
