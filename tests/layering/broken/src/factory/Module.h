// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// Allowed: the top layer includes the driver.
#include "driver/Channel.h"
