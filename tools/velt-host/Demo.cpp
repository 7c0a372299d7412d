// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/Demo.h"

#include <array>
#include <exception>
#include <iterator>
#include <thread>
#include <utility>
#include <vector>

#include "velt-host/TempFolder.h"
#include "velt-peer/Peer.h"

namespace velthost {

namespace {

constexpr std::chrono::milliseconds kPoll{10};
constexpr const char* kConnect = ".write ?connect?boolean 1";
constexpr const char* kConnected = "?conn_stat?boolean";
constexpr const char* kTokensAvailable = "?tokens_available?unsignedInt";
constexpr const char* kGap = "?SP_Gap?unsignedInt";
constexpr const char* kToken = "?rx_token?string-32";
// velt-peer's own tokens, sent as soon as the driver connects.
constexpr int kPeerTokens = 2;
constexpr std::array<const char*, 2> kSentTokens = {"hello", "velt conduit"};
constexpr int kSentCount = static_cast<int>(kSentTokens.size());
constexpr const char* kUdpToken = "ping over udp";
constexpr int kStagedGap = 250;

std::string Frames(std::uint64_t count) {
  return std::to_string(count) + (count == 1 ? " frame" : " frames");
}

std::string Totals(const char* transport, const veltpeer::PeerTotals& totals) {
  return std::string("velt-peer ") + transport + " received " + Frames(totals.framesReceived) +
         " and sent " + Frames(totals.framesSent);
}

// Why a wait gave up: what did not happen in time, and what uri read instead.
std::string Overdue(const std::string& what, const std::string& uri, const std::string& value,
                    const std::string& expected) {
  return "no " + what + " within " + std::to_string(Demo::kStepTimeout.count()) + " s (" + uri +
         " reads " + value + ", not " + expected + ")";
}

}  // namespace

Demo::Demo(std::string pluginPath, ConsoleOutput& output, StopSignals& signals)
    : pluginPath_(std::move(pluginPath)), output_(output), signals_(signals), input_(signals) {}

Demo::~Demo() = default;

std::string Demo::Config(const std::string& socketType, std::uint16_t port) {
  return "CfgVer=1 model=1 socketType=" + socketType +
         " remoteIpAddress=127.0.0.1 remotePort=" + std::to_string(port) +
         " rx_prefix=02 rx_suffix=03 tx_prefix=02 tx_suffix=03";
}

void Demo::Say(const std::string& text) { output_.Line("# " + text); }

bool Demo::Fail(const std::string& text) {
  if (error_.empty()) {
    error_ = text;
  }
  return false;
}

bool Demo::Step(const std::string& command) {
  output_.Line(console_->Prompt() + command);
  return console_->Run(command) || Fail("the step '" + command + "' failed");
}

bool Demo::WaitFor(Instance& instance, const std::string& uri, const std::string& expected,
                   const std::string& what) {
  const auto deadline = std::chrono::steady_clock::now() + kStepTimeout;
  for (;;) {
    std::string value;
    std::string error;
    if (!instance.ReadText(uri, value, error)) {
      return Fail(error);
    }
    if (value == expected) {
      return true;
    }
    if (signals_.Raised()) {
      return Fail("interrupted");
    }
    if (std::chrono::steady_clock::now() >= deadline) {
      return Fail(Overdue(what, uri, value, expected));
    }
    std::this_thread::sleep_for(kPoll);
  }
}

bool Demo::StartPeer(std::unique_ptr<veltpeer::Peer>& peer, bool tcp, std::uint16_t& port) {
  veltpeer::PeerOptions options;
  options.transport = tcp ? veltpeer::Transport::kTcp : veltpeer::Transport::kUdp;
  options.bindAddress = "127.0.0.1";
  options.echo = true;
  options.rxPrefix = "\x02";
  options.rxSuffix = "\x03";
  if (tcp) {
    options.emitCount = kPeerTokens;
    options.rate = 0;
    options.txPrefix = "\x02";
    options.txSuffix = "\x03";
    options.payload = "peer token {n}";
  }
  peer = std::make_unique<veltpeer::Peer>(options);
  const veltpeer::Peer::Started started = peer->Start();
  if (!started.Ok()) {
    return Fail("cannot start velt-peer: " + started.error);
  }
  port = started.port;
  return true;
}

bool Demo::Run() {
  try {
    const TempFolder folder("velt-demo");
    const std::string storage = folder.File("storage.ini");
    std::uint16_t port = 0;
    if (!StartPeer(tcpPeer_, true, port)) {
      return false;
    }
    Say("velt-host demo: the Velt Conduit plug-in in the reference host, velt-peer as the device");
    Say("velt-peer: tcp 127.0.0.1:" + std::to_string(port) +
        "; echoes every frame 02 ... 03 and sends " + std::to_string(kPeerTokens) +
        " tokens of its own once connected");
    Say("storage: " + storage + " (removed at the end)");
    bool ok = false;
    {
      PluginSession session(pluginPath_, storage);
      ok = RunTcp(session, port) && RunUdp(session);
      console_.reset();
    }
    if (!ok) {
      return false;
    }
    tcpPeer_->Stop();
    udpPeer_->Stop();
    Say(Totals("tcp", tcpPeer_->Totals()) + "; " + Totals("udp", udpPeer_->Totals()));
    Say("done");
    return true;
  } catch (const std::exception& e) {
    console_.reset();
    return Fail(e.what());
  }
}

bool Demo::RunTcp(PluginSession& session, std::uint16_t port) {
  const std::string config = Config("TCP", port);
  Say("instance VELT: " + config);
  Instance& velt = session.AddInstance("VELT", config);
  console_ = std::make_unique<Console>(session.Instances(), output_, input_);
  Say("connect, and wait for the connection");
  if (!Step(kConnect) || !WaitFor(velt, kConnected, "1", "connection to velt-peer") ||
      !Step(std::string(".read ") + kConnected)) {
    return false;
  }
  Say("velt-peer's own tokens are waiting in the queue");
  if (!WaitFor(velt, kTokensAvailable, std::to_string(kPeerTokens), "tokens from velt-peer") ||
      !Step(std::string(".read ") + kTokensAvailable)) {
    return false;
  }
  Say("send two tokens; velt-peer echoes them back");
  for (const char* token : kSentTokens) {
    if (!Step(std::string(".write ?tx_token?string-32 ") + token)) {
      return false;
    }
  }
  const int total = kPeerTokens + kSentCount;
  if (!WaitFor(velt, kTokensAvailable, std::to_string(total), "echoes from velt-peer") ||
      !Step(std::string(".read ") + kTokensAvailable)) {
    return false;
  }
  return DrainQueue(velt, total) && StageAndApply(session, velt) && Step("get_stat");
}

bool Demo::DrainQueue(Instance& instance, int tokens) {
  Say("drain the queue, oldest first: the length, the token, the acknowledgement");
  std::vector<std::string> expected;
  for (int i = 1; i <= kPeerTokens; ++i) {
    expected.push_back("peer token " + std::to_string(i));
  }
  expected.insert(expected.end(), std::begin(kSentTokens), std::end(kSentTokens));
  for (int i = 0; i < tokens; ++i) {
    std::string token;
    std::string error;
    if (!instance.ReadText(kToken, token, error)) {
      return Fail(error);
    }
    if (token != expected[static_cast<std::size_t>(i)]) {
      return Fail("token " + std::to_string(i + 1) + " is '" + token + "', not '" +
                  expected[static_cast<std::size_t>(i)] + "'");
    }
    if (!Step(".read ?rx_token_len?unsignedInt") || !Step(std::string(".read ") + kToken) ||
        !Step(".write ?token_ack?boolean 1")) {
      return false;
    }
  }
  return Step(std::string(".read ") + kTokensAvailable);
}

bool Demo::StageAndApply(PluginSession& session, Instance& instance) {
  Say("runtime parameters: stage a new token gap and read it back before applying it");
  const std::string gap = std::to_string(kStagedGap);
  if (!Step(std::string(".read ") + kGap) || !Step(std::string(".write ") + kGap + " " + gap) ||
      !Step(std::string(".read ") + kGap)) {
    return false;
  }
  std::string staged;
  std::string error;
  if (!instance.ReadText(kGap, staged, error) || staged != gap) {
    return Fail("the staged gap reads back as '" + staged + "', not " + gap);
  }
  Say("staged, not applied yet; SP_Done applies every staged value and stores it");
  if (!Step(".write ?SP_Done?boolean 1") || !Step(std::string(".read ") + kGap)) {
    return false;
  }
  // Read from the file itself, not from the values in force.
  HostPermanentStorage* const storage = session.Host().Storage();
  if (storage == nullptr ||
      HostPermanentStorage(storage->Path()).GetIntValue("VELT", "gap") != kStagedGap) {
    return Fail("the applied gap did not reach the storage file");
  }
  Say("the storage file now holds gap = " + gap + " in the section VELT");
  return true;
}

bool Demo::RunUdp(PluginSession& session) {
  std::uint16_t port = 0;
  if (!StartPeer(udpPeer_, false, port)) {
    return false;
  }
  Say("UDP: velt-peer on udp 127.0.0.1:" + std::to_string(port) +
      " echoes every datagram to its sender");
  const std::string config = Config("UDP", port);
  Say("instance VELT2: " + config);
  Instance& velt2 = session.AddInstance("VELT2", config);
  if (!Step(".use VELT2") || !Step(kConnect) || !WaitFor(velt2, kConnected, "1", "UDP channel") ||
      !Step(std::string(".write ?tx_token?string-32 ") + kUdpToken) ||
      !WaitFor(velt2, kTokensAvailable, "1", "echo from velt-peer")) {
    return false;
  }
  Say(".watch prints each token as it arrives and acknowledges it");
  return Step(".watch 1") && Step(".list");
}

}  // namespace velthost
