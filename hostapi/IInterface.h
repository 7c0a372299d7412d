// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// Root of every interface handed across the plug-in boundary. It declares no
// virtual operation, so an interface that derives from it starts its own slot
// table with its own first operation (IInterfaceFactory has no destructor
// slots in front of CreateInterface). Interfaces are found by ASCII name and
// converted with static_cast; nothing is ever deleted through IInterface.
class IInterface {
 protected:
  IInterface() = default;
  IInterface(const IInterface&) = default;
  IInterface& operator=(const IInterface&) = default;
  IInterface(IInterface&&) = default;
  IInterface& operator=(IInterface&&) = default;
  ~IInterface() = default;
};
