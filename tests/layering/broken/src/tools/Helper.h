// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// Breaks: a folder that belongs to no layer.
#include <vector>
