// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-host's one-shot commands: xml, info, demo, --help and --version.

#include <gtest/gtest.h>

#include <optional>
#include <string>

#include "HostProcess.h"

namespace {

bool Contains(const std::string& text, const std::string& part) {
  return text.find(part) != std::string::npos;
}

}  // namespace

TEST(Program, XmlPrintsTheInflatedDescription) {
  const HostProcess::Result result = HostProcess::Run({"xml"});
  EXPECT_EQ(result.out.rfind("<?xml version=\"1.0\" encoding=\"utf-8\"?>\n<protocol_cfg>\n", 0), 0U)
      << result.out.substr(0, 200);
  EXPECT_TRUE(Contains(result.out, "<name>VELT</name>"));
  EXPECT_TRUE(Contains(result.out, "<display>Velt Conduit</display>"));
  EXPECT_EQ(result.out.substr(result.out.size() - 16), "</protocol_cfg>\n");
  EXPECT_EQ(result.err, "");
  EXPECT_EQ(result.status, std::optional<int>(0));
}

TEST(Program, InfoPrintsTheInformationTextOfANewInstance) {
  const HostProcess::Result result = HostProcess::Run({"info"});
  EXPECT_EQ(result.out,
            "Protocol: VELT (472) v.112\n"
            "Implementation: Protocol_VELT v.100\n"
            "ProtocolBase v.100\n"
            "ProtLib v.200\n"
            "HostMultiTask v.100\n"
            "HostSerialFactory v.100\n"
            "HostSocketFactory v.100\n");
  EXPECT_EQ(result.err, "");
  EXPECT_EQ(result.status, std::optional<int>(0));
}

TEST(Program, InfoWithAGivenPlugin) {
  const HostProcess::Result result = HostProcess::Run({"--plugin", VELT_PLUGIN_PATH, "info"});
  EXPECT_EQ(result.out.rfind("Protocol: VELT (472) v.112\n", 0), 0U);
  EXPECT_EQ(result.status, std::optional<int>(0));
}

TEST(Program, DemoRunsTcpAndUdpAndSucceeds) {
  const HostProcess::Result result = HostProcess::Run({"demo"});
  EXPECT_EQ(result.err, "");
  EXPECT_EQ(result.status, std::optional<int>(0));
  const std::string& out = result.out;
  EXPECT_EQ(out.rfind("# velt-host demo: ", 0), 0U) << out;
  EXPECT_TRUE(
      Contains(out, "\nVELT> .write ?connect?boolean 1\nVELT> .read ?conn_stat?boolean\n1\n"))
      << out;
  EXPECT_TRUE(Contains(out, "\nVELT> .read ?tokens_available?unsignedInt\n2\n")) << out;
  EXPECT_TRUE(Contains(out, "\nVELT> .write ?tx_token?string-32 hello\n")) << out;
  EXPECT_TRUE(Contains(out, "\nVELT> .read ?tokens_available?unsignedInt\n4\n")) << out;
  EXPECT_TRUE(Contains(out,
                       "\nVELT> .read ?rx_token_len?unsignedInt\n12\n"
                       "VELT> .read ?rx_token?string-32\npeer token 1\n"
                       "VELT> .write ?token_ack?boolean 1\n"))
      << out;
  EXPECT_TRUE(Contains(out, "\nVELT> .read ?rx_token?string-32\nhello\n")) << out;
  EXPECT_TRUE(Contains(out, "\nVELT> .read ?rx_token?string-32\nvelt conduit\n")) << out;
  EXPECT_TRUE(Contains(out, "\nVELT> .read ?tokens_available?unsignedInt\n0\n")) << out;
  EXPECT_TRUE(Contains(out,
                       "\nVELT> .read ?SP_Gap?unsignedInt\n0\n"
                       "VELT> .write ?SP_Gap?unsignedInt 250\n"
                       "VELT> .read ?SP_Gap?unsignedInt\n250\n"))
      << out;
  EXPECT_TRUE(
      Contains(out, "\nVELT> .write ?SP_Done?boolean 1\nVELT> .read ?SP_Gap?unsignedInt\n250\n"))
      << out;
  EXPECT_TRUE(Contains(out, "\n# the storage file now holds gap = 250 in the section VELT\n"))
      << out;
  EXPECT_TRUE(Contains(out, "\nVELT2> .watch 1\nping over udp\n")) << out;
  EXPECT_TRUE(Contains(out,
                       "\n# velt-peer tcp received 2 frames and sent 4 frames; velt-peer udp "
                       "received 1 frame and sent 1 frame\n# done\n"))
      << out;
}

TEST(Program, HelpAndVersion) {
  HostProcess::Result result = HostProcess::Run({"--help"});
  EXPECT_EQ(result.out.rfind("Usage: velt-host [OPTIONS]", 0), 0U);
  EXPECT_TRUE(Contains(result.out, "\n  -c COMMAND "));
  EXPECT_EQ(result.err, "");
  EXPECT_EQ(result.status, std::optional<int>(0));
  result = HostProcess::Run({"--version"});
  EXPECT_EQ(result.out, "velt-host " VELT_VERSION "\n");
  EXPECT_EQ(result.status, std::optional<int>(0));
}
