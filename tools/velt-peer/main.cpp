// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-peer: the device simulator's command-line program.

#include <pthread.h>
#include <unistd.h>

#include <chrono>
#include <csignal>
#include <cstdio>
#include <ctime>
#include <string>
#include <vector>

#include "velt-peer/LineWriter.h"
#include "velt-peer/Peer.h"
#include "velt-peer/PeerCommandLine.h"
#include "velt-peer/PeerOutput.h"
#include "velt-peer/StopSignal.h"

namespace {

constexpr int kRuntimeError = 1;
constexpr int kUsageError = 2;
constexpr long kSignalPollNanoseconds = 50L * 1000 * 1000;
// How long the last lines (closed, totals) may wait for a reader of standard
// output that has fallen behind, once the run is over.
constexpr std::chrono::seconds kOutputGrace{2};

// A failed write to standard error has nowhere left to be reported.
void PrintError(const std::string& text) {
  (void)std::fprintf(stderr, "velt-peer: %s\n", text.c_str());
}

// Waits until the simulator ends by itself or SIGINT/SIGTERM arrives. The
// signals are blocked in every thread and taken here synchronously, so no
// handler runs in the middle of anything.
void WaitForEnd(const veltpeer::Peer& peer, const sigset_t& signals) {
  while (!peer.Finished()) {
    const timespec poll{0, kSignalPollNanoseconds};
    const int taken = sigtimedwait(&signals, nullptr, &poll);
    if (taken == SIGINT || taken == SIGTERM) {
      return;
    }
  }
}

veltpeer::StopSignal::Clock::duration Seconds(double seconds) {
  return std::chrono::duration_cast<veltpeer::StopSignal::Clock::duration>(
      std::chrono::duration<double>(seconds));
}

}  // namespace

int main(int argc, char** argv) {
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  veltpeer::PeerCommandLine commandLine;
  if (!commandLine.Parse(arguments)) {
    PrintError(commandLine.Error());
    (void)std::fputs("Try 'velt-peer --help'.\n", stderr);
    return kUsageError;
  }
  if (commandLine.GetAction() == veltpeer::PeerCommandLine::Action::kHelp) {
    // Best effort, as for the version line below.
    (void)std::fputs(veltpeer::PeerCommandLine::Usage(), stdout);
    return 0;
  }
  if (commandLine.GetAction() == veltpeer::PeerCommandLine::Action::kVersion) {
    std::puts(veltpeer::PeerCommandLine::Version().c_str());
    return 0;
  }

  // Blocked before the worker starts, so that it inherits the mask.
  sigset_t signals;
  sigemptyset(&signals);
  sigaddset(&signals, SIGINT);
  sigaddset(&signals, SIGTERM);
  pthread_sigmask(SIG_BLOCK, &signals, nullptr);

  veltpeer::PeerOptions options = commandLine.Options();
  // Event lines wait for a slow reader of standard output, but only until
  // shortly after the run is over, so that a reader that stopped reading
  // cannot hold velt-peer up.
  std::string error;
  veltpeer::StopSignal outputStop;
  if (!outputStop.Open(error)) {
    PrintError(error);
    return kRuntimeError;
  }
  if (options.maxSeconds > 0) {
    outputStop.EndAt(veltpeer::StopSignal::Clock::now() + Seconds(options.maxSeconds) +
                     kOutputGrace);
  }
  veltpeer::LineWriter stdoutLines(STDOUT_FILENO);
  const veltpeer::PeerOutput output(options.transport, commandLine.Text(), commandLine.CountOnly());
  options.onEvent = [&](const veltpeer::PeerEvent& event) {
    const std::string line = output.Line(event);
    if (!line.empty()) {
      stdoutLines.Write(line, outputStop);
    }
  };

  veltpeer::Peer peer(options);
  const veltpeer::Peer::Started started = peer.Start();
  if (!started.Ok()) {
    PrintError(started.error);
    return kRuntimeError;
  }
  WaitForEnd(peer, signals);
  peer.RequestStop();
  if (!peer.WaitFinished(kOutputGrace)) {
    outputStop.Raise();
  }
  peer.Stop();
  if (commandLine.CountOnly()) {
    const veltpeer::StopSignal noStop;
    stdoutLines.Write(veltpeer::PeerOutput::TotalsLine(peer.Totals()), noStop,
                      veltpeer::StopSignal::Clock::now() + kOutputGrace);
  }
  const std::string failure = peer.Failure();
  if (!failure.empty()) {
    PrintError(failure);
    return kRuntimeError;
  }
  return 0;
}
