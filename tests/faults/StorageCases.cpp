// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The storage cases: applies reach the file whole under kill -9, and a full
// disk or a read-only file is reported once per apply while the applied
// values hold.

#include "StorageCases.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <fstream>
#include <iterator>
#include <string>

#include "ChildRun.h"
#include "TempDirectory.h"
#include "WriterKills.h"

namespace {

constexpr int kKills = 250;
constexpr int kCannotMount = 77;
const std::string kConfig =
    "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9";

std::string FileText(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
}

void KillWriters(FaultCase& fault, const FaultPrograms& programs, int count, unsigned seed) {
  const TempDirectory folder;
  WriterKills::Setup setup;
  setup.writer = programs.applyWriter;
  setup.plugin = programs.plugin;
  setup.folder = folder.Path();
  setup.count = count;
  setup.kills = kKills;
  setup.seed = seed;
  const auto started = std::chrono::steady_clock::now();
  const WriterKills result = WriterKills::Run(setup);
  const double seconds =
      std::chrono::duration<double>(std::chrono::steady_clock::now() - started).count();
  fault.Figure(std::to_string(result.kills) + " kills of writers applying " +
               std::to_string(count) + " values: " + std::to_string(result.mixed) +
               " files with values of two applies, " + std::to_string(result.wentBack) +
               " went back, " + std::to_string(result.roundsSeen) + " different applies found, " +
               std::to_string(result.temporariesFound) + " temporary files swept, " +
               std::to_string(result.temporariesLeft) + " left (" + std::to_string(seconds) +
               " s)");
  fault.Expect(result.error.empty(), result.error);
  fault.Expect(result.kills == kKills, "fewer kills than planned");
  fault.Expect(result.mixed == 0, "a file held values of two applies");
  for (const std::string& mix : result.mixes) {
    fault.Figure(mix);
  }
  fault.Expect(result.wentBack == 0, "a kill left an older apply");
  fault.Expect(result.temporariesLeft == 0, "a temporary file outlived the next load");
}

// velt-host applies gap 5 then gap 6 on storage in a 64 KiB tmpfs that a
// filler leaves room for one file only, in a mount namespace of its own.
void FullDisk(FaultCase& fault, const FaultPrograms& programs) {
  const TempDirectory folder;
  const std::string path = folder.Path() + "/storage.ini";
  const std::string script = "mount -t tmpfs -o size=64k tmpfs '" + folder.Path() +
                             "' 2>/dev/null || exit " + std::to_string(kCannotMount) +
                             "\nhead -c 60000 /dev/zero > '" + folder.Path() + "/filler'\n'" +
                             programs.veltHost + "' --storage '" + path + "' --config '" + kConfig +
                             "' -c '.write ?SP_Gap?unsignedInt 5' -c '.write ?SP_Done?boolean 1'"
                             " -c '.write ?SP_Gap?unsignedInt 6' -c '.write ?SP_Done?boolean 1'"
                             " -c '.read ?SP_Gap?unsignedInt'\necho \"exit status $?\"\n"
                             "echo \"file: $(grep gap '" +
                             path + "')\"\n";
  const ChildRun run =
      ChildRun::Run({"/usr/bin/unshare", "-m", "sh", "-c", script}, "", std::chrono::seconds(30));
  if (run.status == kCannotMount || !run.status.has_value() ||
      run.out.find("exit status") == std::string::npos) {
    fault.Skip("cannot mount a tmpfs in a mount namespace here (" + run.err + ")");
    return;
  }
  fault.Figure("velt-host said: " + run.err.substr(0, run.err.find('\n')));
  std::string said = run.out;
  std::replace(said.begin(), said.end(), '\n', ' ');
  fault.Figure("read back after the failed apply: gap " + said);
  fault.Expect(run.err == "velt-host: the storage file " + path +
                              " was not updated (cannot write: No space left on device); the "
                              "value just applied holds until restart\n",
               "the failure was not reported once as expected");
  fault.Expect(run.out == "6\nexit status 1\nfile: \"gap\" = int 5\n",
               "the applied value or the file is not as expected");
}

void ReadOnly(FaultCase& fault, const FaultPrograms& programs) {
  const TempDirectory folder;
  const std::string path = folder.Path() + "/storage.ini";
  std::ofstream(path) << "[\"VELT\"]\n\"gap\" = int 4\n";
  ::chmod(path.c_str(), 0444);
  const ChildRun run =
      ChildRun::Run({programs.veltHost, "--storage", path, "--config", kConfig, "-c",
                     ".write ?SP_Gap?unsignedInt 5", "-c", ".write ?SP_Done?boolean 1", "-c",
                     ".read ?SP_Gap?unsignedInt"},
                    "", std::chrono::seconds(30));
  fault.Figure("read-only file: velt-host said: " + run.err.substr(0, run.err.find('\n')) +
               "; exit status " + (run.status ? std::to_string(*run.status) : "none"));
  fault.Expect(run.err == "velt-host: the storage file " + path +
                              " was not updated (cannot write: Permission denied); the value "
                              "just applied holds until restart\n",
               "the read-only file was not reported once as expected");
  fault.Expect(run.out == "5\n" && run.status == 1, "the applied value or the status is wrong");
  fault.Expect(FileText(path) == "[\"VELT\"]\n\"gap\" = int 4\n", "the read-only file changed");
}

}  // namespace

void RunWholeApplies(FaultCase& fault, const FaultPrograms& programs) {
  KillWriters(fault, programs, 3, 20240701U);
  KillWriters(fault, programs, 13, 20240702U);
}

void RunFullDisk(FaultCase& fault, const FaultPrograms& programs) {
  if (::access("/usr/bin/unshare", X_OK) != 0) {
    fault.Skip("no /usr/bin/unshare");
    return;
  }
  FullDisk(fault, programs);
}

void RunReadOnlyStorage(FaultCase& fault, const FaultPrograms& programs) {
  ReadOnly(fault, programs);
}
