#include "ApplyStreamCase.h"

#include <sys/inotify.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <string>
#include <vector>

#include "FileDescriptor.h"
#include "HostPermanentStorage.h"
#include "PluginChannel.h"
#include "TempDirectory.h"
#include "TokenTaker.h"
#include "velt-peer/Peer.h"

namespace {

using Clock = std::chrono::steady_clock;

constexpr int kApplies = 1000;
constexpr int kWindows = 10;
constexpr double kTokensPerSecond = 5000;

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
  std::vector<std::size_t> takenPerWindow;
  int failed = 0;
  const auto begin = Clock::now();
  {
    const TokenTaker taker(channel);
    std::size_t takenBefore = 0;
    for (int apply = 0; apply < kApplies; ++apply) {
      const auto start = Clock::now();
      failed += channel.ApplyGap(static_cast<unsigned>(100 + apply)) ? 0 : 1;
      latencies.push_back(std::chrono::duration<double, std::milli>(Clock::now() - start).count());
      if ((apply + 1) % (kApplies / kWindows) == 0) {
        takenPerWindow.push_back(taker.Count() - takenBefore);
        takenBefore = taker.Count();
      }
    }
  }
  const double seconds = std::chrono::duration<double>(Clock::now() - begin).count();
  peer.Stop();
  const veltpeer::PeerTotals totals = peer.Totals();
  const int replacements = Replacements(watch.Get(), "storage.ini");
  std::size_t taken = 0;
  for (const std::size_t count : takenPerWindow) {
    taken += count;
  }
  fault.Figure(std::to_string(kApplies) + " applies in " + std::to_string(seconds) +
               " s under a stream of " + std::to_string(totals.framesSent) +
               " tokens sent: apply time median " + std::to_string(Percentile(latencies, 0.5)) +
               " ms, 99th percentile " + std::to_string(Percentile(latencies, 0.99)) +
               " ms, largest " + std::to_string(Percentile(latencies, 1.0)) + " ms");
  fault.Figure(std::to_string(replacements) + " replacements of the storage file, " +
               std::to_string(failed) + " failed applies, " + std::to_string(totals.connections) +
               " connections, " + std::to_string(taken) +
               " tokens taken (an apply empties the queue), fewest in a tenth of the run: " +
               std::to_string(*std::min_element(takenPerWindow.begin(), takenPerWindow.end())));
  fault.Expect(failed == 0, "an apply failed");
  fault.Expect(replacements == kApplies, "the applies did not each replace the file once");
  fault.Expect(totals.connections == 1, "an apply of the gap renewed the connection");
  fault.Expect(*std::min_element(takenPerWindow.begin(), takenPerWindow.end()) > 0,
               "tokens stopped arriving during the applies");
  fault.Expect(HostPermanentStorage(folder.File("storage.ini")).GetIntValue("VELT", "gap") ==
                   100 + kApplies - 1,
               "the file does not hold the last apply");
}
