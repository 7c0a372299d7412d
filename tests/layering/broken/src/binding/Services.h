// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// Breaks: the bottom layer reaches up into the configuration.
#include "config/Store.h"
