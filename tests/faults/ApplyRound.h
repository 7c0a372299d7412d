// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

#include "HostPermanentStorage.h"
#include "StoredValue.h"

// The applies of the storage kill test. Round k stages 3 or 13 runtime
// parameters, each with a value that tells k (wholly, or its parity where
// the parameter has only two values), and applies them with SP_Done. A
// storage file that holds values of two rounds is therefore told from one
// that holds a whole round.
namespace ApplyRound {

// One staged value of a round: the tag it is written through, the name it
// is stored under, and the stored value.
struct Staged {
  std::string uri;
  std::string name;
  StoredValue stored;
};

// The values of round k, for an apply of count (3 or 13) values.
std::vector<Staged> ValuesOf(int round, int count);

// What the section "VELT" of storage holds: the round whose every value is
// there (round set, true), nothing of any round (round -1, true), or a mix
// (false, with what differs in mix).
bool Whole(HostPermanentStorage& storage, int count, int& round, std::string& mix);

}  // namespace ApplyRound
