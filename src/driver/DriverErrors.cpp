// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/DriverErrors.h"

#include "protlib/ProtocolBase.h"

bool Fail(ProtocolBase& protocol, const DriverError& error) {
  protocol.SetError(error.code, error.text);
  return false;
}
