// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// Allowed: the middle layers include each other, the bottom and the
// standard library.
#include <string>

#include "IThing.h"
#include "binding/Services.h"
#include "protlib/Text.h"
