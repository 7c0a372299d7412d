// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "VanishedPeerCase.h"

#include <signal.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <memory>
#include <sstream>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "ChildRun.h"
#include "PluginChannel.h"

namespace {

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;

constexpr auto kGone = 8s;
constexpr auto kBackWithin = 40s;
constexpr auto kSendEvery = 100ms;
constexpr const char* kPeerPort = "5000";

std::string IpProgram() {
  for (const char* path : {"/usr/sbin/ip", "/sbin/ip", "/usr/bin/ip", "/bin/ip"}) {
    if (::access(path, X_OK) == 0) {
      return path;
    }
  }
  return {};
}

// Runs ip with arguments; true when it succeeded.
bool Ip(const std::vector<std::string>& arguments) {
  std::vector<std::string> argv{IpProgram()};
  argv.insert(argv.end(), arguments.begin(), arguments.end());
  const ChildRun run = ChildRun::Run(argv, "", 10s);
  return run.status == 0;
}

// A named network namespace, deleted with everything in it when the object
// goes.
class Namespace {
 public:
  explicit Namespace(std::string name)
      : name_(std::move(name)), made_(Ip({"netns", "add", name_})) {}
  Namespace(const Namespace&) = delete;
  Namespace& operator=(const Namespace&) = delete;
  Namespace(Namespace&&) = delete;
  Namespace& operator=(Namespace&&) = delete;
  ~Namespace() { Drop(); }
  void Drop() {
    if (made_) {
      Ip({"netns", "del", name_});
      made_ = false;
    }
  }
  bool Made() const { return made_; }
  const std::string& Name() const { return name_; }

 private:
  std::string name_;
  bool made_;
};

// The peer's side: its namespace, the link to the channel's namespace and a
// velt-peer that sends a token every 20 ms and echoes what it receives.
class VanishingPeer {
 public:
  VanishingPeer(const std::string& name, const std::string& veltPeer, const std::string& hostIp,
                const std::string& peerIp)
      : namespace_(name), hostIp_(hostIp) {
    const std::string link = "vh" + name.substr(name.size() - 6);
    up_ = namespace_.Made() &&
          Ip({"link", "add", link, "type", "veth", "peer", "name", "vp", "netns", name}) &&
          Ip({"addr", "add", hostIp + "/30", "dev", link}) && Ip({"link", "set", link, "up"}) &&
          Ip({"-n", name, "addr", "add", peerIp + "/30", "dev", "vp"}) &&
          Ip({"-n", name, "link", "set", "vp", "up"}) &&
          Ip({"-n", name, "link", "set", "lo", "up"});
    if (!up_) {
      return;
    }
    pid_ = ChildRun::Start({IpProgram(), "netns",  "exec",     name,     veltPeer,
                            "tcp",       "--bind", peerIp,     "--port", kPeerPort,
                            "--echo",    "--emit", "forever",  "--rate", "50",
                            "--prefix",  "02",     "--suffix", "03",     "--count"});
    up_ = pid_ > 0;
  }
  VanishingPeer(const VanishingPeer&) = delete;
  VanishingPeer& operator=(const VanishingPeer&) = delete;
  VanishingPeer(VanishingPeer&&) = delete;
  VanishingPeer& operator=(VanishingPeer&&) = delete;
  ~VanishingPeer() { Vanish(); }

  bool Up() const { return up_; }
  // The peer's packets go nowhere from now on (so nothing it does on its way
  // out is seen), the peer is killed and its namespace dropped, with the
  // link and the channel's route to it.
  void Vanish() {
    if (namespace_.Made()) {
      Ip({"-n", namespace_.Name(), "route", "add", "blackhole", hostIp_ + "/32"});
    }
    if (pid_ > 0) {
      ::kill(pid_, SIGKILL);
      ::waitpid(pid_, nullptr, 0);
      pid_ = -1;
    }
    namespace_.Drop();
  }

 private:
  Namespace namespace_;
  std::string hostIp_;
  pid_t pid_ = -1;
  bool up_ = false;
};

double CpuSeconds() {
  rusage usage{};
  ::getrusage(RUSAGE_SELF, &usage);
  return static_cast<double>(usage.ru_utime.tv_sec + usage.ru_stime.tv_sec) +
         static_cast<double>(usage.ru_utime.tv_usec + usage.ru_stime.tv_usec) / 1e6;
}

double Since(Clock::time_point start) {
  return std::chrono::duration<double>(Clock::now() - start).count();
}

// Waits for a token from the peer (the first token of a new peer, when
// fresh is set); the time it took, or a negative value.
double TokenWithin(PluginChannel& channel, std::chrono::seconds limit, bool fresh) {
  const auto start = Clock::now();
  std::string token;
  while (Since(start) < static_cast<double>(limit.count())) {
    if (channel.TakeToken(token) && (!fresh || token == "token 1")) {
      return Since(start);
    }
    std::this_thread::sleep_for(5ms);
  }
  return -1;
}

void Drain(PluginChannel& channel) {
  std::string token;
  while (channel.TakeToken(token)) {
  }
}

// While the peer is gone: a token sent every 100 ms; how long the longest
// write took, when the channel first read as disconnected, the CPU used.
void WhileGone(PluginChannel& channel, double& longestWrite, double& noticed, double& cpu) {
  const auto start = Clock::now();
  const double cpuBefore = CpuSeconds();
  longestWrite = 0;
  noticed = -1;
  while (Clock::now() - start < kGone) {
    const auto write = Clock::now();
    channel.WriteText("?tx_token?string-16", "ping");
    longestWrite = std::max(longestWrite, Since(write));
    if (noticed < 0 && channel.ReadNumber("?conn_stat?boolean") == 0) {
      noticed = Since(start);
    }
    std::this_thread::sleep_for(kSendEvery);
  }
  cpu = (CpuSeconds() - cpuBefore) / Since(start);
}

}  // namespace

int RunVanishedPeerInside(const std::vector<std::string>& arguments) {
  if (arguments.size() != 5) {
    std::printf("fail the inside part wants: PLUGIN VELT-PEER NAME HOST-IP PEER-IP\n");
    return 2;
  }
  const std::string& plugin = arguments[0];
  const std::string& veltPeer = arguments[1];
  const std::string& name = arguments[2];
  const std::string& hostIp = arguments[3];
  const std::string& peerIp = arguments[4];
  Ip({"link", "set", "lo", "up"});
  auto peer = std::make_unique<VanishingPeer>(name, veltPeer, hostIp, peerIp);
  if (!peer->Up()) {
    std::printf("fail the peer's namespace, link or velt-peer could not be set up\n");
    return 1;
  }
  PluginChannel channel(plugin, "",
                        "CfgVer=1 model=1 socketType=TCP remoteIpAddress=" + peerIp +
                            " remotePort=" + kPeerPort + " rx_prefix=02 rx_suffix=03");
  const bool connected = channel.Connect(10s);
  const double first = TokenWithin(channel, 10s, false);
  std::printf("figure connected %s, first token after %.3f s\n", connected ? "yes" : "no", first);
  peer->Vanish();
  Drain(channel);
  double longestWrite = 0;
  double noticed = 0;
  double cpu = 0;
  WhileGone(channel, longestWrite, noticed, cpu);
  std::printf(
      "figure peer gone for %.0f s, a token sent every 100 ms: longest write %.3f s, CPU %.2f %% "
      "of a core, conn_stat %s\n",
      std::chrono::duration<double>(kGone).count(), longestWrite, cpu * 100,
      noticed < 0 ? "stayed 1 (the loss was not noticed)"
                  : ("read 0 after " + std::to_string(noticed) + " s").c_str());
  if (longestWrite > 3.5) {
    std::printf("fail a write blocked longer than the 3 s send time-out\n");
  }
  if (cpu > 0.05) {
    std::printf("fail the channel used 5 %% of a core or more while the peer was gone\n");
  }
  Drain(channel);
  peer = std::make_unique<VanishingPeer>(name, veltPeer, hostIp, peerIp);
  const auto back = Clock::now();
  double again = -1;
  while (peer->Up() && again < 0 && Clock::now() - back < kBackWithin) {
    channel.WriteText("?tx_token?string-16", "ping");
    again = TokenWithin(channel, 1s, true);
  }
  std::printf("figure peer back: its first token after %.3f s, conn_stat %u\n",
              again < 0 ? -1 : Since(back), channel.ReadNumber("?conn_stat?boolean"));
  if (again < 0) {
    std::printf("fail no token from the peer within 40 s of its return\n");
  }
  std::fflush(stdout);
  return 0;
}

void RunVanishedPeer(FaultCase& fault, const FaultPrograms& programs) {
  if (::geteuid() != 0 || IpProgram().empty()) {
    fault.Skip("needs root and the ip program for network namespaces");
    return;
  }
  const std::string id = std::to_string(::getpid() % 1000000);
  Namespace channelSide("veltc" + std::string(6 - id.size(), '0') + id);
  if (!channelSide.Made()) {
    fault.Skip("ip netns add is not allowed here");
    return;
  }
  const std::string subnet = "10.213." + std::to_string(::getpid() % 250) + ".";
  const ChildRun run =
      ChildRun::Run({IpProgram(), "netns", "exec", channelSide.Name(), programs.self, "--inside",
                     "vanished-peer", programs.plugin, programs.veltPeer,
                     "veltp" + std::string(6 - id.size(), '0') + id, subnet + "1", subnet + "2"},
                    "", 120s);
  std::istringstream lines(run.out);
  std::string line;
  while (std::getline(lines, line)) {
    if (line.rfind("figure ", 0) == 0) {
      fault.Figure(line.substr(7));
    } else if (line.rfind("fail ", 0) == 0) {
      fault.Expect(false, line.substr(5));
    }
  }
  fault.Expect(run.status == 0, "the part in the namespace did not end well: " + run.err);
}
