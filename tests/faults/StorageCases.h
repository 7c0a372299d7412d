// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "FaultCase.h"

// Writers applying 3 and 13 values killed at 250 random instants each: the
// storage file holds every value of an apply or none.
void RunWholeApplies(FaultCase& fault, const FaultPrograms& programs);
// velt-host on a full 64 KiB tmpfs: the failed apply is reported once, the
// applied value holds, the file keeps the old one.
void RunFullDisk(FaultCase& fault, const FaultPrograms& programs);
// velt-host on a read-only storage file: the same.
void RunReadOnlyStorage(FaultCase& fault, const FaultPrograms& programs);
