// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-host: loads the Velt Conduit plug-in into the reference host and
// drives its instances from a console, prints its description or
// information text, or runs the demo.

#include <cstdio>
#include <string>
#include <vector>

#include "velt-host/HostProgram.h"

int main(int argc, char** argv) {
  velthost::HostProgram program(stdout, stderr);
  return program.Run(std::vector<std::string>(argv + 1, argv + argc));
}
