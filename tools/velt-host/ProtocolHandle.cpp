// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/ProtocolHandle.h"

#include <stdexcept>
#include <string>

namespace velthost {

ProtocolHandle::ProtocolHandle(IProtocolFactory& factory, const char* name)
    : factory_(factory), protocol_(factory.CreateProtocol(name)) {
  if (protocol_ == nullptr) {
    throw std::runtime_error(std::string("the plug-in offers no protocol ") + name);
  }
}

ProtocolHandle::~ProtocolHandle() { factory_.DeleteProtocol(protocol_); }

}  // namespace velthost
