// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The plug-in's applies reach the storage file whole or not at all: writers
// applying rounds of 3 and of 13 runtime parameters are killed at random
// instants, and after each kill the file must hold one whole round (or none),
// no older round than the writer had applied, and, once loaded, no
// temporary file.

#include <gtest/gtest.h>

#include <iostream>

#include "TempDirectory.h"
#include "WriterKills.h"

namespace {

WriterKills KillWriters(int count, unsigned seed) {
  TempDirectory folder;
  WriterKills::Setup setup;
  setup.writer = APPLY_WRITER_PROGRAM;
  setup.plugin = VELT_PLUGIN_PATH;
  setup.folder = folder.Path();
  setup.count = count;
  setup.kills = 50;
  setup.seed = seed;
  const WriterKills result = WriterKills::Run(setup);
  std::cout << result.kills << " kills of writers applying " << count
            << " values: " << result.roundsSeen << " different rounds found, "
            << result.temporariesFound << " temporary files swept\n";
  return result;
}

void ExpectWhole(const WriterKills& result) {
  EXPECT_EQ(result.error, "");
  EXPECT_EQ(result.kills, 50);
  EXPECT_EQ(result.mixed, 0);
  for (const std::string& mix : result.mixes) {
    ADD_FAILURE() << mix;
  }
  EXPECT_EQ(result.wentBack, 0);
  EXPECT_EQ(result.temporariesLeft, 0);
}

}  // namespace

TEST(WholeApply, WritersKilledAtRandomInstantsLeaveWholeAppliesOfThreeValues) {
  ExpectWhole(KillWriters(3, 20240613U));
}

TEST(WholeApply, WritersKilledAtRandomInstantsLeaveWholeAppliesOfThirteenValues) {
  ExpectWhole(KillWriters(13, 20240614U));
}
