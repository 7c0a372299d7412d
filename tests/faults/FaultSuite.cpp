// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The fault suite (make faults): each case drives the built plug-in, the
// reference host, velt-host or velt-peer into a fault, prints its figures
// and a verdict line, and the suite ends with status 1 when any case failed.
//   fault_suite [CASE...]     run the cases named (default: all)
//   fault_suite --list        name the cases
// Cases that need root (mounts, network namespaces) say SKIP without it.

#include <signal.h>

#include <chrono>
#include <cstdio>
#include <exception>
#include <string>
#include <vector>

#include "ApplyStreamCase.h"
#include "ChildRun.h"
#include "FaultCase.h"
#include "FloodCases.h"
#include "InputBoundCases.h"
#include "ReconnectCase.h"
#include "StorageCases.h"
#include "VanishedPeerCase.h"

namespace {

const std::vector<FaultCaseEntry>& Cases() {
  static const std::vector<FaultCaseEntry> cases = {
      {"whole-applies", "writers applying 3 and 13 values killed at random instants",
       RunWholeApplies},
      {"full-disk", "velt-host applying on a full 64 KiB tmpfs", RunFullDisk},
      {"read-only-storage", "velt-host applying to a read-only storage file", RunReadOnlyStorage},
      {"reconnect", "100 connections cut after three frames, FIN and reset in turn", RunReconnect},
      {"vanished-peer", "a TCP peer that vanishes without FIN or reset, then comes back",
       RunVanishedPeer},
      {"tcp-flood", "1 GiB of random bytes into a TCP channel", RunTcpFlood},
      {"udp-flood", "1 GiB of random bytes into a UDP channel", RunUdpFlood},
      {"queue-overflow", "1000 frames into a queue of 10 without a reader", RunQueueOverflow},
      {"applies-under-stream", "1000 applies while the peer sends 5000 tokens a second",
       RunAppliesUnderStream},
      {"input-bounds", "velt-host given inputs without bounds", RunInputBounds},
  };
  return cases;
}

FaultPrograms Programs(const char* self) {
  return {VELT_PLUGIN_PATH, VELT_HOST_PROGRAM, VELT_PEER_PROGRAM, APPLY_WRITER_PROGRAM, self};
}

FaultCase::Verdict RunOne(const FaultCaseEntry& entry, const FaultPrograms& programs) {
  std::printf("== %s: %s\n", entry.name, entry.what);
  std::fflush(stdout);
  FaultCase fault(entry.name);
  const auto started = std::chrono::steady_clock::now();
  try {
    entry.run(fault, programs);
  } catch (const std::exception& e) {
    fault.Expect(false, std::string("stopped by an error: ") + e.what());
  }
  fault.Figure(
      "the case took " +
      std::to_string(
          std::chrono::duration<double>(std::chrono::steady_clock::now() - started).count()) +
      " s");
  return fault.Finish();
}

}  // namespace

int main(int argc, char** argv) {
  // A program that ends while the suite still writes to it must not end the
  // suite.
  ::signal(SIGPIPE, SIG_IGN);
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  if (arguments.size() >= 2 && arguments[0] == "--inside" && arguments[1] == "vanished-peer") {
    return RunVanishedPeerInside({arguments.begin() + 2, arguments.end()});
  }
  if (!arguments.empty() && arguments[0] == "--measure") {
    return ChildRun::Measure({arguments.begin() + 1, arguments.end()});
  }
  if (arguments.size() == 1 && arguments[0] == "--list") {
    for (const FaultCaseEntry& entry : Cases()) {
      std::printf("%-22s %s\n", entry.name, entry.what);
    }
    return 0;
  }
  const FaultPrograms programs = Programs(argv[0]);
  int passed = 0;
  int failed = 0;
  int skipped = 0;
  for (const FaultCaseEntry& entry : Cases()) {
    bool wanted = arguments.empty();
    for (const std::string& name : arguments) {
      wanted = wanted || name == entry.name;
    }
    if (!wanted) {
      continue;
    }
    switch (RunOne(entry, programs)) {
      case FaultCase::Verdict::kPass:
        ++passed;
        break;
      case FaultCase::Verdict::kFail:
        ++failed;
        break;
      case FaultCase::Verdict::kSkip:
        ++skipped;
        break;
    }
  }
  std::printf("faults: %d passed, %d failed, %d skipped\n", passed, failed, skipped);
  return failed == 0 && passed + skipped > 0 ? 0 : 1;
}
