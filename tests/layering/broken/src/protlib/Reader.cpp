// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/Text.h"

// Breaks: a relative path does not hide an upward include.
#include "../factory/Module.h"
