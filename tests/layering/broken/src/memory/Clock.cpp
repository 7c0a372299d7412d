// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Breaks: a platform header in the plug-in.
#include <sys/time.h>

#include <ctime>
