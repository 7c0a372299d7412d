// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ApplyStreamCase.h"

#include <sys/inotify.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <string>
#include <thread>
#include <vector>

#include "FileDescriptor.h"
#include "HostPermanentStorage.h"
#include "PluginChannel.h"
#include "TempDirectory.h"
#include "velt-peer/Peer.h"

namespace {

using Clock = std::chrono::steady_clock;

constexpr int kApplies = 1000;
constexpr double kTokensPerSecond = 5000;
// The longest a token may take to come after an apply.
constexpr std::chrono::seconds kLongestWait{1};

// Counts the replacements of the storage file: each renames a temporary
// file of its own away (inotify merges repeated events of one name, so the
// renames onto the file's name cannot be counted).
int Replacements(int watch, const std::string& name) {
  int count = 0;
  std::array<char, 65536> events{};
  for (;;) {
    const ssize_t n = ::read(watch, events.data(), events.size());
    if (n <= 0) {
      return count;
    }
    for (ssize_t at = 0; at < n;) {
      const auto* event = reinterpret_cast<const inotify_event*>(events.data() + at);
      if ((event->mask & IN_MOVED_FROM) != 0 && event->len > 0 &&
          std::string(event->name).rfind(name + ".tmp-", 0) == 0) {
        ++count;
      }
      at += static_cast<ssize_t>(sizeof(inotify_event) + event->len);
    }
  }
}

double Percentile(std::vector<double> values, double share) {
  std::sort(values.begin(), values.end());
  return values.empty() ? 0 : values[static_cast<std::size_t>(share * (values.size() - 1))];
}

}  // namespace

void RunAppliesUnderStream(FaultCase& fault, const FaultPrograms& programs) {
  veltpeer::PeerOptions options;
  options.transport = veltpeer::Transport::kTcp;
  options.emitCount = veltpeer::PeerOptions::kForever;
  options.rate = kTokensPerSecond;
  options.txPrefix = "\x02";
  options.txSuffix = "\x03";
  options.maxSeconds = 600;
  veltpeer::Peer peer(options);
  const veltpeer::Peer::Started started = peer.Start();
  fault.Expect(started.Ok(), "velt-peer did not start: " + started.error);
  const TempDirectory folder;
  const FileDescriptor watch(::inotify_init1(IN_NONBLOCK | IN_CLOEXEC));
  ::inotify_add_watch(watch.Get(), folder.Path().c_str(), IN_MOVED_FROM);
  PluginChannel channel(programs.plugin, folder.File("storage.ini"),
                        "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=" +
                            std::to_string(started.port) + " rx_prefix=02 rx_suffix=03");
  fault.Expect(channel.Connect(std::chrono::seconds(5)), "the channel did not connect");
  std::vector<double> latencies;
  std::vector<double> waits;
  std::size_t taken = 0;
  int failed = 0;
  const auto begin = Clock::now();
  for (int apply = 0; apply < kApplies; ++apply) {
    const auto start = Clock::now();
    failed += channel.ApplyGap(static_cast<unsigned>(100 + apply)) ? 0 : 1;
    const auto applied = Clock::now();
    latencies.push_back(std::chrono::duration<double, std::milli>(applied - start).count());
    // The apply emptied the queue; the stream must fill it again.
    while (channel.ReadNumber("?tokens_available?unsignedInt") == 0 &&
           Clock::now() - applied < kLongestWait) {
      std::this_thread::sleep_for(std::chrono::microseconds(50));
    }
    waits.push_back(std::chrono::duration<double, std::milli>(Clock::now() - applied).count());
    std::string token;
    while (channel.TakeToken(token)) {
      ++taken;
    }
  }
  const double seconds = std::chrono::duration<double>(Clock::now() - begin).count();
  peer.Stop();
  const veltpeer::PeerTotals totals = peer.Totals();
  const int replacements = Replacements(watch.Get(), "storage.ini");
  fault.Figure(std::to_string(kApplies) + " applies in " + std::to_string(seconds) +
               " s under a stream of " + std::to_string(totals.framesSent) +
               " tokens sent: apply time median " + std::to_string(Percentile(latencies, 0.5)) +
               " ms, 99th percentile " + std::to_string(Percentile(latencies, 0.99)) +
               " ms, largest " + std::to_string(Percentile(latencies, 1.0)) + " ms");
  fault.Figure("after each apply the next token came in " + std::to_string(Percentile(waits, 0.5)) +
               " ms (median), " + std::to_string(Percentile(waits, 1.0)) + " ms at the most; " +
               std::to_string(taken) + " tokens taken (an apply empties the queue)");
  fault.Figure(std::to_string(replacements) + " replacements of the storage file, " +
               std::to_string(failed) + " failed applies, " + std::to_string(totals.connections) +
               " connections");
  fault.Expect(failed == 0, "an apply failed");
  fault.Expect(replacements == kApplies, "the applies did not each replace the file once");
  fault.Expect(totals.connections == 1, "an apply of the gap renewed the connection");
  fault.Expect(
      Percentile(waits, 1.0) < std::chrono::duration<double, std::milli>(kLongestWait).count(),
      "after an apply no token came for a second");
  fault.Expect(HostPermanentStorage(folder.File("storage.ini")).GetIntValue("VELT", "gap") ==
                   100 + kApplies - 1,
               "the file does not hold the last apply");
}
