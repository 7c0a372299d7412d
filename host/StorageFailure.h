// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

// A write of the permanent storage file that failed. The values it carried
// are in force in memory (the plug-in applied them, and reading them back
// gives them), but the file still holds the older ones, so a restart would
// go back to those unless a later write succeeds: the next apply writes the
// whole storage again, these values included.
struct StorageFailure {
  // The storage file.
  std::string path;
  // What failed and the system's reason, such as "cannot write: No space
  // left on device".
  std::string reason;
  // How many values the failed write was to save (those of one apply, or
  // the one value set outside an apply).
  int values = 0;

  // "the storage file PATH was not updated (REASON); the 3 values just
  // applied hold until restart"
  std::string Text() const;
};
