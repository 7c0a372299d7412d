// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol.h"

// A new token channel, owned by the caller until the protocol factory's
// DeleteProtocol. An allocation failure passes on as the allocator's
// exception.
IProtocol* CreateProtocol_VELT();
