// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// What idle and offline channels cost: CPU of one velt-host process (all its
// threads) over a few seconds, its resident memory, and how soon a channel
// reconnects once its absent peer comes back. Each scenario runs velt-host
// as a child fed through a pipe, so the same program measures a build from
// before a change (--before-host, --before-plugin) and the current one, in
// alternation, and prints the median of the runs. "floor" runs threads in
// this program that only sleep and wake as a channel's worker does, without
// any host or driver: what the machine charges for the wakes alone.
//
//   bench_idle [--host PATH] [--plugin PATH] [--before-host PATH --before-plugin PATH]
//              [--seconds S] [--runs N] [--channels N] [--absent-seconds S]
//              [--reconnects N] [SCENARIO...]
//   SCENARIO: floor paths none absent udp tcp many reconnect (default: all)
#include <arpa/inet.h>
#include <poll.h>
#include <sched.h>
#include <sys/eventfd.h>
#include <time.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <functional>
#include <map>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "ChildHost.h"
#include "HostSocketFactory.h"
#include "IdlePeers.h"
#include "TempDirectory.h"

namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

struct Build {
  std::string label;
  std::string host;
  std::string plugin;
};

struct Options {
  std::vector<Build> builds;
  double seconds = 3;
  int runs = 3;
  int channels = 256;
  double absentSeconds = 3;
  int reconnects = 5;
  std::vector<std::string> scenarios;
};

// One measured figure of a scenario and build, over its runs.
struct Figure {
  std::string scenario;
  std::string what;
  std::string label;
  std::vector<double> values;
};

double Median(std::vector<double> values) {
  if (values.empty()) {
    return 0;
  }
  std::sort(values.begin(), values.end());
  const std::size_t middle = values.size() / 2;
  return values.size() % 2 == 1 ? values[middle] : (values[middle - 1] + values[middle]) / 2;
}

double Seconds(Clock::duration duration) { return std::chrono::duration<double>(duration).count(); }

void SleepSeconds(double seconds) {
  std::this_thread::sleep_for(std::chrono::duration<double>(seconds));
}

// The channels of one scenario: their configuration strings, and how many of
// them are TCP channels that must be accepted before measuring.
struct Channels {
  std::vector<std::string> configs;
  std::size_t accepted = 0;
};

std::string Tcp(const std::string& address, std::uint16_t port) {
  return "CfgVer=1 model=1 socketType=TCP remoteIpAddress=" + address +
         " remotePort=" + std::to_string(port);
}

std::string Udp(std::uint16_t port) {
  return "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=" +
         std::to_string(port);
}

// A different loopback address per absent device, so each is a target of
// its own, as twenty switched-off devices are.
std::string AbsentAddress(int index) {
  return "127.0." + std::to_string(1 + index / 250) + "." + std::to_string(1 + index % 250);
}

std::vector<std::string> Arguments(const Build& build, const TempDirectory& folder,
                                   const std::vector<std::string>& configs) {
  std::vector<std::string> arguments = {"--plugin", build.plugin, "--storage",
                                        folder.File("storage.ini"), "-q"};
  for (const std::string& config : configs) {
    arguments.push_back("--config");
    arguments.push_back(config);
  }
  return arguments;
}

std::vector<std::string> ConnectLines(std::size_t count) {
  std::vector<std::string> lines;
  for (std::size_t i = 0; i < count; ++i) {
    lines.push_back(".use " + (i == 0 ? std::string("VELT") : "VELT" + std::to_string(i + 1)));
    lines.push_back("connect ON");
  }
  return lines;
}

struct Usage {
  double cpuPercent = 0;
  double residentKiB = 0;
  double peakKiB = 0;
  // Context switches of the process's threads per second (a wake from a
  // sleep or a wait is one, a yield to another thread one more), and CPU
  // per switch.
  double switchesPerSecond = 0;
  double microsecondsPerSwitch = 0;
};

Usage Measure(const Build& build, const Channels& channels, const IdlePeers::SilentAcceptor* tcp,
              double seconds) {
  const TempDirectory folder;
  ChildHost child(build.host, Arguments(build, folder, channels.configs));
  if (!child.Send(ConnectLines(channels.configs.size()))) {
    throw std::runtime_error(build.label + ": velt-host ended at start-up");
  }
  if (tcp != nullptr && !tcp->WaitFor(channels.accepted, milliseconds(20000))) {
    throw std::runtime_error(build.label + ": only " + std::to_string(tcp->Accepted()) + " of " +
                             std::to_string(channels.accepted) + " TCP channels connected");
  }
  // Start-up and the first connect attempts settle before the window.
  SleepSeconds(1.5);
  const std::uint64_t switches0 = child.ContextSwitches();
  const auto cpu0 = child.CpuTime();
  const auto wall0 = Clock::now();
  SleepSeconds(seconds);
  const auto cpu1 = child.CpuTime();
  const double wall = Seconds(Clock::now() - wall0);
  const auto switches = static_cast<double>(child.ContextSwitches() - switches0);
  Usage usage;
  const double cpu = std::chrono::duration<double>(cpu1 - cpu0).count();
  usage.cpuPercent = cpu / wall * 100.0;
  usage.switchesPerSecond = switches / wall;
  usage.microsecondsPerSwitch = switches > 0 ? cpu * 1e6 / switches : 0;
  usage.residentKiB = static_cast<double>(child.ResidentKiB());
  usage.peakKiB = static_cast<double>(child.PeakResidentKiB());
  child.Finish(milliseconds(20000));
  return usage;
}

// The figures of every scenario, printed at the end.
class Report {
 public:
  void Add(const std::string& scenario, const std::string& what, const std::string& label,
           double value) {
    for (Figure& figure : figures_) {
      if (figure.scenario == scenario && figure.what == what && figure.label == label) {
        figure.values.push_back(value);
        return;
      }
    }
    figures_.push_back(Figure{scenario, what, label, {value}});
  }

  void Print() const {
    std::printf("\n%-46s %-20s %-8s %12s   %s\n", "scenario", "figure", "build", "median", "runs");
    for (const Figure& figure : figures_) {
      std::string runs;
      for (const double value : figure.values) {
        runs += (runs.empty() ? "" : " ") + Format(value);
      }
      std::printf("%-46s %-20s %-8s %12s   %s\n", figure.scenario.c_str(), figure.what.c_str(),
                  figure.label.c_str(), Format(Median(figure.values)).c_str(), runs.c_str());
    }
  }

 private:
  static std::string Format(double value) {
    char text[32];
    std::snprintf(text, sizeof text, value < 10 ? "%.4f" : "%.1f", value);
    return text;
  }

  std::vector<Figure> figures_;
};

// ---------------------------------------------------------------------------
// The floor: threads that wake as the workers do, with nothing else.

enum class Wake { kSleep10, kPoll20, kPoll500 };

void WakeLoop(Wake wake, const std::atomic<bool>& stop) {
  const int fd = ::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK);
  while (!stop.load()) {
    if (wake == Wake::kSleep10) {
      const timespec tenMs{0, 10'000'000};
      ::nanosleep(&tenMs, nullptr);
    } else {
      pollfd entry{fd, POLLIN, 0};
      ::poll(&entry, 1, wake == Wake::kPoll20 ? 20 : 500);
    }
    ::sched_yield();
  }
  ::close(fd);
}

double MeasureFloor(const std::vector<Wake>& wakes, double seconds) {
  std::atomic<bool> stop{false};
  std::vector<std::thread> threads;
  for (const Wake wake : wakes) {
    threads.emplace_back(WakeLoop, wake, std::cref(stop));
  }
  SleepSeconds(1);
  timespec cpu0{};
  timespec cpu1{};
  ::clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &cpu0);
  const auto wall0 = Clock::now();
  SleepSeconds(seconds);
  ::clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &cpu1);
  const double wall = Seconds(Clock::now() - wall0);
  stop = true;
  for (std::thread& thread : threads) {
    thread.join();
  }
  const double used = static_cast<double>(cpu1.tv_sec - cpu0.tv_sec) +
                      static_cast<double>(cpu1.tv_nsec - cpu0.tv_nsec) / 1e9;
  return used / wall * 100.0;
}

// The wake pattern of the "many" scenario's channels: half absent (a 10 ms
// sleep per pass), a quarter UDP (a 20 ms receive), a quarter TCP (a 500 ms
// receive).
std::vector<Wake> ManyWakes(int channels) {
  std::vector<Wake> wakes;
  for (int i = 0; i < channels; ++i) {
    wakes.push_back(i < channels / 2       ? Wake::kSleep10
                    : i < channels * 3 / 4 ? Wake::kPoll20
                                           : Wake::kPoll500);
  }
  return wakes;
}

void RunFloor(const Options& options, Report& report) {
  for (int run = 0; run < options.runs; ++run) {
    report.Add("floor: one absent channel", "CPU % of a core", "machine",
               MeasureFloor({Wake::kSleep10}, options.seconds));
    report.Add("floor: one idle UDP channel", "CPU % of a core", "machine",
               MeasureFloor({Wake::kPoll20}, options.seconds));
    report.Add("floor: many channels", "CPU % of a core", "machine",
               MeasureFloor(ManyWakes(options.channels), options.seconds));
  }
}

// ---------------------------------------------------------------------------
// The host's own share of a pass, without the wait: an empty UDP receive
// that only looks (time-out 0), and a TCP connect refused inside a back-off
// window, each timed over many calls of this build's host.

double NanosecondsPerCall(const std::function<void()>& call, int calls) {
  const auto start = Clock::now();
  for (int i = 0; i < calls; ++i) {
    call();
  }
  return std::chrono::duration<double, std::nano>(Clock::now() - start).count() / calls;
}

void RunPaths(const Options& options, Report& report) {
  constexpr int kCalls = 200000;
  HostSocketFactory factory;
  ISocket* const udp = factory.CreateSocket(0, 0, 0);
  ISocket* const tcp = factory.CreateSocket(0, 1, 0);
  const IdlePeers::RefusingPort refusing;
  if (udp == nullptr || tcp == nullptr || tcp->Connect("127.0.0.1", refusing.Port()) == 0) {
    throw std::runtime_error("no sockets for the path timings");
  }
  std::vector<unsigned char> buffer(1536);
  for (int run = 0; run < options.runs; ++run) {
    report.Add("path: empty UDP receive, time-out 0", "ns per call", "after",
               NanosecondsPerCall([&] { udp->Receive(buffer.data(), 1536, 0); }, kCalls));
    // Fail until the window lasts at least half a second, then time the
    // refusals inside it.
    const ConnectPacing::Target target{htonl(INADDR_LOOPBACK), refusing.Port(), 0};
    while (factory.Pacing().WindowLeft(target, Clock::now()) < milliseconds(500)) {
      tcp->Connect("127.0.0.1", refusing.Port());
      std::this_thread::sleep_for(milliseconds(5));
    }
    const std::uint64_t attempts = factory.ConnectAttempts();
    const double perCall =
        NanosecondsPerCall([&] { tcp->Connect("127.0.0.1", refusing.Port()); }, kCalls / 10);
    if (factory.ConnectAttempts() != attempts) {
      throw std::runtime_error("a timed connect left the back-off window");
    }
    report.Add("path: connect inside a back-off window", "ns per call", "after", perCall);
  }
}

// ---------------------------------------------------------------------------
// Channels in velt-host.

void RunOne(const Options& options, Report& report, const std::string& scenario,
            const std::function<Channels(IdlePeers::SilentAcceptor&)>& make) {
  for (int run = 0; run < options.runs; ++run) {
    for (const Build& build : options.builds) {
      IdlePeers::SilentAcceptor acceptor;
      const Channels channels = make(acceptor);
      const Usage usage = Measure(build, channels, &acceptor, options.seconds);
      report.Add(scenario, "CPU % of a core", build.label, usage.cpuPercent);
      report.Add(scenario, "resident KiB", build.label, usage.residentKiB);
      report.Add(scenario, "peak resident KiB", build.label, usage.peakKiB);
      report.Add(scenario, "switches per second", build.label, usage.switchesPerSecond);
      report.Add(scenario, "CPU us per switch", build.label, usage.microsecondsPerSwitch);
      std::printf("%s, %s, run %d: %.4f %% CPU, %.0f KiB resident\n", scenario.c_str(),
                  build.label.c_str(), run + 1, usage.cpuPercent, usage.residentKiB);
      std::fflush(stdout);
    }
  }
}

void RunSingles(const Options& options, Report& report, const std::string& which) {
  const IdlePeers::RefusingPort refusing;
  const IdlePeers::SilentUdp udp;
  if (which == "absent") {
    RunOne(options, report, "absent TCP peer, 1 channel", [&](IdlePeers::SilentAcceptor&) {
      return Channels{{Tcp(AbsentAddress(0), refusing.Port())}, 0};
    });
  } else if (which == "udp") {
    RunOne(options, report, "connected idle UDP, 1 channel", [&](IdlePeers::SilentAcceptor&) {
      return Channels{{Udp(udp.Port())}, 0};
    });
  } else if (which == "tcp") {
    RunOne(options, report, "connected idle TCP, 1 channel", [&](IdlePeers::SilentAcceptor& peer) {
      return Channels{{Tcp("127.0.0.1", peer.Port())}, 1};
    });
  } else if (which == "none") {
    RunOne(options, report, "no channel", [&](IdlePeers::SilentAcceptor&) { return Channels{}; });
  }
}

void RunMany(const Options& options, Report& report) {
  const IdlePeers::RefusingPort refusing;
  const IdlePeers::SilentUdp udp;
  const int count = options.channels;
  const std::string scenario = std::to_string(count) + " channels (1/2 absent, 1/4 UDP, 1/4 TCP)";
  RunOne(options, report, scenario, [&](IdlePeers::SilentAcceptor& peer) {
    Channels channels;
    for (int i = 0; i < count; ++i) {
      if (i < count / 2) {
        channels.configs.push_back(Tcp(AbsentAddress(i), refusing.Port()));
      } else if (i < count * 3 / 4) {
        channels.configs.push_back(Udp(udp.Port()));
      } else {
        channels.configs.push_back(Tcp("127.0.0.1", peer.Port()));
        ++channels.accepted;
      }
    }
    return channels;
  });
}

// One channel whose peer is absent for a while and then starts listening;
// the time from the listen to the accepted connection, repeatedly. The
// absences differ by a fraction of a second from trial to trial, so the
// peer returns at every point of the back-off window (1 s by default), the
// last moment of a window included.
void RunReconnect(const Options& options, Report& report) {
  for (const Build& build : options.builds) {
    IdlePeers::RefusingPort port;
    const TempDirectory folder;
    ChildHost child(build.host, Arguments(build, folder, {Tcp("127.0.0.1", port.Port())}));
    child.Send(ConnectLines(1));
    for (int trial = 0; trial < options.reconnects; ++trial) {
      SleepSeconds(options.absentSeconds + static_cast<double>(trial) / options.reconnects);
      const auto start = Clock::now();
      if (!port.Listen()) {
        throw std::runtime_error("cannot listen on the refusing port");
      }
      const FileDescriptor accepted = port.Accept(milliseconds(10000));
      const double took = Seconds(Clock::now() - start) * 1000.0;
      if (!accepted.Valid()) {
        throw std::runtime_error(build.label + ": no reconnect within 10 s");
      }
      report.Add("reconnect after the peer returns", "ms", build.label, took);
      std::printf("reconnect, %s, trial %d: %.1f ms\n", build.label.c_str(), trial + 1, took);
      std::fflush(stdout);
      port.Refuse();
    }
    child.Finish(milliseconds(10000));
  }
}

// ---------------------------------------------------------------------------
// The command line.

bool TakeValue(int argc, char** argv, int& i, std::string& value) {
  if (i + 1 >= argc) {
    std::fprintf(stderr, "bench_idle: %s needs a value\n", argv[i]);
    return false;
  }
  value = argv[++i];
  return true;
}

bool Parse(int argc, char** argv, Options& options) {
  Build current{"after", VELT_HOST_PROGRAM, VELT_PLUGIN_PATH};
  Build before{"before", "", ""};
  std::map<std::string, std::string*> texts = {{"--host", &current.host},
                                               {"--plugin", &current.plugin},
                                               {"--before-host", &before.host},
                                               {"--before-plugin", &before.plugin}};
  for (int i = 1; i < argc; ++i) {
    const std::string word = argv[i];
    std::string value;
    if (texts.count(word) != 0) {
      if (!TakeValue(argc, argv, i, *texts[word])) {
        return false;
      }
    } else if (word == "--seconds" || word == "--absent-seconds") {
      if (!TakeValue(argc, argv, i, value)) {
        return false;
      }
      (word == "--seconds" ? options.seconds : options.absentSeconds) = std::stod(value);
    } else if (word == "--runs" || word == "--channels" || word == "--reconnects") {
      if (!TakeValue(argc, argv, i, value)) {
        return false;
      }
      (word == "--runs"       ? options.runs
       : word == "--channels" ? options.channels
                              : options.reconnects) = std::stoi(value);
    } else if (word.rfind("--", 0) == 0) {
      std::fprintf(stderr, "bench_idle: unknown option %s\n", word.c_str());
      return false;
    } else {
      options.scenarios.push_back(word);
    }
  }
  if (before.host.empty() != before.plugin.empty()) {
    std::fprintf(stderr, "bench_idle: give --before-host and --before-plugin together\n");
    return false;
  }
  if (!before.host.empty()) {
    options.builds.push_back(before);
  }
  options.builds.push_back(current);
  if (options.scenarios.empty()) {
    options.scenarios = {"floor", "paths", "none", "absent", "udp", "tcp", "many", "reconnect"};
  }
  return true;
}

}  // namespace

int main(int argc, char** argv) {
  Options options;
  try {
    if (!Parse(argc, argv, options)) {
      return 2;
    }
    Report report;
    for (const std::string& scenario : options.scenarios) {
      if (scenario == "floor") {
        RunFloor(options, report);
      } else if (scenario == "many") {
        RunMany(options, report);
      } else if (scenario == "paths") {
        RunPaths(options, report);
      } else if (scenario == "reconnect") {
        RunReconnect(options, report);
      } else if (scenario == "absent" || scenario == "udp" || scenario == "tcp" ||
                 scenario == "none") {
        RunSingles(options, report, scenario);
      } else {
        std::fprintf(stderr, "bench_idle: unknown scenario %s\n", scenario.c_str());
        return 2;
      }
    }
    report.Print();
  } catch (const std::exception& e) {
    std::fprintf(stderr, "bench_idle: %s\n", e.what());
    return 1;
  }
  return 0;
}
