// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <memory>
#include <string>

#include "velt-host/Console.h"
#include "velt-host/ConsoleOutput.h"
#include "velt-host/DemoInput.h"
#include "velt-host/PluginSession.h"
#include "velt-host/StopSignals.h"

namespace veltpeer {
class Peer;
}

namespace velthost {

// The self-contained demo: an in-process velt-peer on loopback, a temporary
// storage file, and the plug-in loaded into the reference host. A TCP
// instance connects, sends tokens that come back, drains its queue through
// tokens_available, rx_token_len, rx_token and token_ack, then stages and
// applies a runtime parameter; a UDP instance follows. Every step is shown
// as the console command that performs it, with its output; lines starting
// with "#" explain.
class Demo {
 public:
  // How long the demo waits for any one thing to happen.
  static constexpr std::chrono::seconds kStepTimeout{5};

  Demo(std::string pluginPath, ConsoleOutput& output, StopSignals& signals);
  Demo(const Demo&) = delete;
  Demo& operator=(const Demo&) = delete;
  Demo(Demo&&) = delete;
  Demo& operator=(Demo&&) = delete;
  ~Demo();

  // False with Error() set when a step did not turn out as it should.
  bool Run();
  const std::string& Error() const { return error_; }

 private:
  bool RunTcp(PluginSession& session, std::uint16_t port);
  bool DrainQueue(Instance& instance, int tokens);
  bool StageAndApply(PluginSession& session, Instance& instance);
  bool RunUdp(PluginSession& session);
  bool StartPeer(std::unique_ptr<veltpeer::Peer>& peer, bool tcp, std::uint16_t& port);
  // Shows the command as typed at the console, then runs it.
  bool Step(const std::string& command);
  // Waits until the tag at uri reads expected.
  bool WaitFor(Instance& instance, const std::string& uri, const std::string& expected,
               const std::string& what);
  void Say(const std::string& text);
  bool Fail(const std::string& text);
  static std::string Config(const std::string& socketType, std::uint16_t port);

  std::string pluginPath_;
  ConsoleOutput& output_;
  StopSignals& signals_;
  DemoInput input_;
  std::unique_ptr<Console> console_;
  std::unique_ptr<veltpeer::Peer> tcpPeer_;
  std::unique_ptr<veltpeer::Peer> udpPeer_;
  std::string error_;
};

}  // namespace velthost
