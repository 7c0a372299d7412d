// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "InputBoundCases.h"

#include <sys/stat.h>

#include <chrono>
#include <string>
#include <vector>

#include "ChildRun.h"
#include "TempDirectory.h"

namespace {

using namespace std::chrono_literals;

constexpr long kLargestResidentKiB = 64 * 1024;
const std::string kConfig =
    "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9";

struct Bound {
  std::string what;
  std::vector<std::string> arguments;  // after --storage FILE (unless given)
  std::string input;
  std::string expectedError;  // a part of what velt-host must say
  bool terminal = false;
};

std::string Describe(const ChildRun& run) {
  return "peak resident " + std::to_string(run.peakResidentKiB / 1024) + " MiB, " +
         std::to_string(run.seconds) + " s, exit status " +
         (run.status ? std::to_string(*run.status) : std::string("none"));
}

void Check(FaultCase& fault, const FaultPrograms& programs, const Bound& bound) {
  std::vector<std::string> argv{programs.veltHost};
  argv.insert(argv.end(), bound.arguments.begin(), bound.arguments.end());
  const ChildRun run = bound.terminal
                           ? ChildRun::OnTerminal(argv, "> ", bound.input, 120s, programs.self)
                           : ChildRun::Run(argv, bound.input, 60s, programs.self);
  const std::string& said = bound.terminal ? run.out : run.err;
  fault.Figure(bound.what + ": " + Describe(run));
  fault.Expect(run.status.has_value(), bound.what + ": velt-host did not end in time");
  fault.Expect(run.peakResidentKiB < kLargestResidentKiB,
               bound.what + ": velt-host held 64 MiB or more");
  fault.Expect(said.find(bound.expectedError) != std::string::npos,
               bound.what + ": velt-host did not say '" + bound.expectedError + "'");
}

}  // namespace

void RunInputBounds(FaultCase& fault, const FaultPrograms& programs) {
  const TempDirectory folder;
  const std::string storage = folder.File("storage.ini");
  const std::string fifo = folder.File("fifo");
  ::mkfifo(fifo.c_str(), 0600);
  const std::string tooLong = "longer than velt-host's limit of 16777216 bytes";
  const std::vector<Bound> bounds = {
      {"console read of string-1000000000",
       {"--storage", storage, "--config", kConfig, "-c", "read ?rx_token?string-1000000000"},
       "",
       tooLong},
      {".read of string-2147483647",
       {"--storage", storage, "--config", kConfig, "-c", ".read ?rx_token?string-2147483647"},
       "",
       tooLong},
      {"console write of string-1000000000",
       {"--storage", storage, "--config", kConfig, "-c", "write ?tx_token?string-1000000000 00"},
       "",
       tooLong},
      {"a line of 50 MB on standard input",
       {"--storage", storage, "--config", kConfig},
       std::string(50000000, 'x') + "\nget_stat\n",
       "a line longer than 1048576 bytes was refused"},
      {"a line of 1 MiB and 1 byte at a terminal",
       {"--storage", storage, "--config", kConfig},
       std::string(1048577, 'x') + "\n.quit\n",
       "a line longer than 1048576 bytes was refused",
       true},
      {"storage /dev/zero",
       {"--storage", "/dev/zero", "--config", kConfig},
       "",
       "not a regular file but a character device"},
      {"storage /dev/urandom",
       {"--storage", "/dev/urandom", "--config", kConfig},
       "",
       "not a regular file but a character device"},
      {"storage a FIFO",
       {"--storage", fifo, "--config", kConfig},
       "",
       "not a regular file but a FIFO"},
  };
  for (const Bound& bound : bounds) {
    Check(fault, programs, bound);
  }
}
