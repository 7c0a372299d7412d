// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ReconnectCase.h"

#include <netinet/in.h>
#include <netinet/tcp.h>
#include <sys/socket.h>

#include <algorithm>
#include <chrono>
#include <string>
#include <thread>
#include <vector>

#include "LoopbackIo.h"
#include "PluginChannel.h"
#include "TokenTaker.h"

namespace {

using namespace std::chrono_literals;

constexpr int kCuts = 100;
constexpr int kFramesPerConnection = 3;

std::string Body(int connection, int frame) {
  return "c" + std::to_string(connection) + "f" + std::to_string(frame);
}

// Serves one connection: three frames in three writes, then a FIN or a
// reset. False when the channel did not connect in time.
bool ServeOne(int listener, int connection) {
  FileDescriptor peer = LoopbackIo::Accept(listener, 5000ms);
  if (!peer.Valid()) {
    return false;
  }
  const int on = 1;
  ::setsockopt(peer.Get(), IPPROTO_TCP, TCP_NODELAY, &on, sizeof on);
  for (int frame = 0; frame < kFramesPerConnection; ++frame) {
    LoopbackIo::SendAll(peer.Get(),
                        LoopbackIo::FromText("\x02" + Body(connection, frame) + "\x03"));
  }
  if (connection % 2 == 0) {
    peer.Close();
  } else {
    LoopbackIo::Reset(peer);
  }
  return true;
}

}  // namespace

void RunReconnect(FaultCase& fault, const FaultPrograms& programs) {
  std::uint16_t port = 0;
  const FileDescriptor listener = LoopbackIo::ListenBelowEphemeral(8, port);
  PluginChannel channel(programs.plugin, "",
                        "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=" +
                            std::to_string(port) + " rx_prefix=02 rx_suffix=03");
  std::vector<std::string> expected;
  int served = 0;
  const auto started = std::chrono::steady_clock::now();
  {
    TokenTaker taker(channel);
    channel.WriteNumber("?connect?boolean", 1);
    for (int connection = 0; connection < kCuts; ++connection) {
      if (!ServeOne(listener.Get(), connection)) {
        break;
      }
      ++served;
      for (int frame = 0; frame < kFramesPerConnection; ++frame) {
        expected.push_back(Body(connection, frame));
      }
    }
    const auto deadline = std::chrono::steady_clock::now() + 10s;
    while (taker.Tokens().size() < expected.size() && std::chrono::steady_clock::now() < deadline) {
      std::this_thread::sleep_for(10ms);
    }
    const std::vector<std::string> tokens = taker.Tokens();
    const double seconds =
        std::chrono::duration<double>(std::chrono::steady_clock::now() - started).count();
    std::vector<std::string> missing;
    for (const std::string& body : expected) {
      if (std::find(tokens.begin(), tokens.end(), body) == tokens.end()) {
        missing.push_back(body);
      }
    }
    fault.Figure(std::to_string(served) + " connections served and cut (FIN and reset in turn), " +
                 std::to_string(tokens.size()) + " of " + std::to_string(expected.size()) +
                 " complete tokens received, " + std::to_string(missing.size()) + " lost, in " +
                 std::to_string(seconds) + " s");
    if (!missing.empty()) {
      fault.Figure("first lost: " + missing.front() + ", last lost: " + missing.back());
    }
    fault.Expect(served == kCuts, "the channel stopped reconnecting");
    fault.Expect(tokens == expected, "tokens were lost, repeated or reordered");
  }
}
