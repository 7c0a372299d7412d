// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "FaultCase.h"

// A peer that accepts, sends three frames in separate writes and cuts the
// connection, with a FIN and a reset in turn, 100 times: every complete
// token must reach the queue, in order.
void RunReconnect(FaultCase& fault, const FaultPrograms& programs);
