// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

#include "FaultCase.h"

// A TCP peer that vanishes without a FIN or a reset: its network namespace
// is dropped, route and all, while the channel sends to it; later it comes
// back at the same address. The channel (in a network namespace of its own)
// must stay responsive and idle while the peer is gone, and talk to the peer
// again once it is back.
void RunVanishedPeer(FaultCase& fault, const FaultPrograms& programs);

// The part of the case that runs inside the channel's network namespace
// (the suite runs itself there with "--inside vanished-peer ..."). Prints
// "figure TEXT" and "fail TEXT" lines; returns the exit status.
int RunVanishedPeerInside(const std::vector<std::string>& arguments);
