// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/CreateProtocol_VELT.h"

#include "driver/Protocol_VELT.h"

IProtocol* CreateProtocol_VELT() { return new Protocol_VELT(); }
