// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// Exact, case-sensitive equality of two interface names: 1 when a and b hold
// the same bytes up to their terminators, 0 otherwise (also when either is
// null). No trimming, no case folding, no prefix match: "IProtocol" never
// matches "IProtocol2". Every name-based interface conversion of the library
// uses it, from the module down to the protocol base, so it lives at the
// bottom of the library.
int CompareInterface(const char* a, const char* b);
