// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "FaultCase.h"

// velt-host given inputs without bounds: tags of a billion bytes, a 50 MB
// line, a line of 1 MiB and one byte at a terminal, storage paths that are
// devices or a FIFO. Each is refused at once with little memory.
void RunInputBounds(FaultCase& fault, const FaultPrograms& programs);
