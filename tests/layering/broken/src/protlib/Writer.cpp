// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Breaks: a name that resolves to no file.
#include "Missing.h"
