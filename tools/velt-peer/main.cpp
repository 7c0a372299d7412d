// velt-peer: the device simulator's command-line program.

#include <pthread.h>
#include <signal.h>

#include <cerrno>
#include <cstdio>
#include <ctime>
#include <string>
#include <vector>

#include "velt-peer/Peer.h"
#include "velt-peer/PeerCommandLine.h"
#include "velt-peer/PeerOutput.h"

namespace {

constexpr int kRuntimeError = 1;
constexpr int kUsageError = 2;
constexpr long kSignalPollNanoseconds = 50L * 1000 * 1000;

void PrintLine(const std::string& line) {
  std::fwrite(line.data(), 1, line.size(), stdout);
  std::fputc('\n', stdout);
  std::fflush(stdout);
}

void PrintError(const std::string& text) { std::fprintf(stderr, "velt-peer: %s\n", text.c_str()); }

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

}  // namespace

int main(int argc, char** argv) {
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  veltpeer::PeerCommandLine commandLine;
  if (!commandLine.Parse(arguments)) {
    PrintError(commandLine.Error());
    std::fputs("Try 'velt-peer --help'.\n", stderr);
    return kUsageError;
  }
  if (commandLine.GetAction() == veltpeer::PeerCommandLine::Action::kHelp) {
    std::fputs(veltpeer::PeerCommandLine::Usage(), stdout);
    return 0;
  }
  if (commandLine.GetAction() == veltpeer::PeerCommandLine::Action::kVersion) {
    PrintLine(veltpeer::PeerCommandLine::Version());
    return 0;
  }

  // Blocked before the worker starts, so that it inherits the mask.
  sigset_t signals;
  sigemptyset(&signals);
  sigaddset(&signals, SIGINT);
  sigaddset(&signals, SIGTERM);
  pthread_sigmask(SIG_BLOCK, &signals, nullptr);

  veltpeer::PeerOptions options = commandLine.Options();
  const veltpeer::PeerOutput output(options.transport, commandLine.Text(), commandLine.CountOnly());
  options.onEvent = [&output](const veltpeer::PeerEvent& event) {
    const std::string line = output.Line(event);
    if (!line.empty()) {
      PrintLine(line);
    }
  };
  veltpeer::Peer peer(options);
  const veltpeer::Peer::Started started = peer.Start();
  if (!started.Ok()) {
    PrintError(started.error);
    return kRuntimeError;
  }
  WaitForEnd(peer, signals);
  peer.Stop();
  if (commandLine.CountOnly()) {
    PrintLine(veltpeer::PeerOutput::TotalsLine(peer.Totals()));
  }
  const std::string failure = peer.Failure();
  if (!failure.empty()) {
    PrintError(failure);
    return kRuntimeError;
  }
  return 0;
}
