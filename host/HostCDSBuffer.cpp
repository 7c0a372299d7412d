// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostCDSBuffer.h"

const char* HostCDSBuffer::GetImpName() const { return "HostCDSBuffer"; }

int HostCDSBuffer::GetImpVersion() const { return 100; }
