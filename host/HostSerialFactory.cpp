// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostSerialFactory.h"

const char* HostSerialFactory::GetImpName() const { return "HostSerialFactory"; }

int HostSerialFactory::GetImpVersion() const { return 100; }
