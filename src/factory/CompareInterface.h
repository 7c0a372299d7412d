// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// Exact, case-sensitive equality of two interface names: 1 when a and b hold
// the same bytes up to their terminators, 0 otherwise. Every name-based
// interface conversion of the library uses it.
int CompareInterface(const char* a, const char* b);
