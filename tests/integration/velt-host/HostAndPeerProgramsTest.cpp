// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-host and velt-peer as two programs talking over loopback, as an
// operator runs them: the peer picks a free port and announces it on its
// first line.

#include <gtest/gtest.h>
#include <signal.h>

#include <optional>
#include <regex>
#include <string>

#include "HostProcess.h"
#include "ScratchFolder.h"

namespace {

using Line = std::optional<std::string>;

// The port from velt-peer's first line; 0 when the line has another form.
std::string AnnouncedPort(HostProcess& peer) {
  const Line line = peer.ReadLine();
  std::smatch match;
  const std::regex form(R"(velt-peer: listening tcp 127\.0\.0\.1:([0-9]+))");
  if (!line || !std::regex_match(*line, match, form)) {
    ADD_FAILURE() << "unexpected first line: " << line.value_or("(none)");
    return "0";
  }
  return match[1].str();
}

}  // namespace

TEST(HostAndPeerPrograms, TokensTravelBothWays) {
  ScratchFolder scratch;
  HostProcess peer(
      {"tcp",           "--port", "0",        "--echo", "--rx-prefix", "02",
       "--rx-suffix",   "03",     "--emit",   "1",      "--rate",      "0",
       "--prefix",      "02",     "--suffix", "03",     "--payload",   "hello from the peer",
       "--max-seconds", "30"},
      {}, VELT_PEER_PROGRAM);
  ASSERT_TRUE(peer.Started());
  const std::string port = AnnouncedPort(peer);
  ASSERT_NE(port, "0");
  const std::string config =
      "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 "
      "remotePort=" +
      port + " rx_prefix=02 rx_suffix=03 tx_prefix=02 tx_suffix=03";

  const HostProcess::Result host = HostProcess::Run(
      {"--storage", scratch.File("storage.ini"), "--config", config, "-c", "connect ON", "-c",
       ".watch 1", "-c", "put ping", "-c", ".watch 1", "-c", "get_stat"});
  EXPECT_EQ(host.out, "OK\nhello from the peer\nOK\nping\nConnected\n");
  EXPECT_EQ(host.err, "");
  EXPECT_EQ(host.status, std::optional<int>(0));

  const Line connected = peer.ReadLine();
  ASSERT_TRUE(connected);
  EXPECT_TRUE(std::regex_match(*connected, std::regex(R"(connected 127\.0\.0\.1:[0-9]+)")))
      << *connected;
  EXPECT_EQ(peer.ReadLine(), Line("tx 0268656C6C6F2066726F6D207468652070656572"
                                  "03"));
  EXPECT_EQ(peer.ReadLine(), Line("rx 0270696E6703"));
  EXPECT_EQ(peer.ReadLine(), Line("tx 0270696E6703"));
  // velt-host stopped its instance before it exited.
  EXPECT_EQ(peer.ReadLine(), Line("closed"));
  peer.Signal(SIGTERM);
  EXPECT_EQ(peer.Wait(), std::optional<int>(0));
  EXPECT_EQ(peer.ReadErrors(), "");
}
