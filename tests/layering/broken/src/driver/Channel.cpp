// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/Channel.h"

// Breaks: the driver reaches up into the factory.
#include "factory/Module.h"
