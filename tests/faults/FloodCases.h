// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "FaultCase.h"

// 1 GiB of random bytes into a TCP channel and into a UDP channel: resident
// memory stays bounded and the queue never holds more than its bound.
void RunTcpFlood(FaultCase& fault, const FaultPrograms& programs);
void RunUdpFlood(FaultCase& fault, const FaultPrograms& programs);
// 1000 frames into a queue of 10 without a reader: the newest 10 are kept.
void RunQueueOverflow(FaultCase& fault, const FaultPrograms& programs);
