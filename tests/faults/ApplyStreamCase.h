// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "FaultCase.h"

// 1000 applies of a new gap while a peer sends 5000 tokens a second: each
// apply is one replacement of the storage file, the connection is kept and,
// after each apply has emptied the queue, tokens come again at once.
void RunAppliesUnderStream(FaultCase& fault, const FaultPrograms& programs);
