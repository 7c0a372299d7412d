// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// Wall-clock time stamps as the framework hands them to the host.
namespace ProtUtilsN {

// Milliseconds since 1970-01-01 00:00 UTC: whole seconds times 1000 plus the
// microseconds of the current second divided by 1000.
unsigned long long currentTimeStamp();

}  // namespace ProtUtilsN
