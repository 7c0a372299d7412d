// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// Breaks: the host interfaces reach into the plug-in.
#include "binding/Services.h"
