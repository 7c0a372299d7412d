// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/ParamManager.h"

#include <gtest/gtest.h>

#include <string>

using _VELT::CommonParams;
using _VELT::NodeParams;
using _VELT::ParamManager;

namespace {

const std::string kMandatory =
    "CfgVer=1 model=1 socketType=UDP remoteIpAddress=192.168.0.10 remotePort=4000";

// The mandatory keys plus extra entries.
std::string With(const std::string& extra) { return kMandatory + " " + extra; }

// The error text of a configuration that must fail.
std::string FailureOf(const std::string& text) {
  ParamManager manager;
  EXPECT_FALSE(manager.parse(text.c_str())) << text;
  return manager.getLastError();
}

}  // namespace

TEST(ParamManager, MandatoryKeysAloneGiveDefaults) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(kMandatory.c_str())) << manager.getLastError();
  const CommonParams* const common = manager.getCommonParams();
  ASSERT_NE(common, nullptr);
  EXPECT_EQ(common->socketType, "UDP");
  EXPECT_EQ(common->remoteIpAddress, "192.168.0.10");
  EXPECT_EQ(common->remotePort, 4000);
  EXPECT_EQ(common->localIpAddress, "0.0.0.0");
  EXPECT_EQ(common->localPort, 0);
  EXPECT_EQ(common->broadcastType, "Global");
  EXPECT_EQ(common->rx_prefix, "");
  EXPECT_EQ(common->rx_suffix, "");
  EXPECT_EQ(common->gap, 0);
  EXPECT_EQ(common->tx_prefix, "");
  EXPECT_EQ(common->tx_suffix, "");
  EXPECT_FALSE(common->hex_tokens);
  EXPECT_EQ(common->token_queue_size, 100);
  EXPECT_EQ(manager.getLastError(), "");
  EXPECT_TRUE(manager.getNodes().empty());
  EXPECT_EQ(manager.getNodeParams(0)->nodeId, -1);
  EXPECT_EQ(manager.getNodeParams(0)->model, "1");
}

TEST(ParamManager, EveryOptionalKeyIsRead) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(
      With("localIpAddress=10.0.0.2 localPort=5000 broadcastType=Local rx_prefix=02 "
           "rx_suffix=03 gap=250 tx_prefix=aa tx_suffix=BB hex_tokens=true token_queue_size=7")
          .c_str()))
      << manager.getLastError();
  const CommonParams& common = *manager.getCommonParams();
  EXPECT_EQ(common.localIpAddress, "10.0.0.2");
  EXPECT_EQ(common.localPort, 5000);
  EXPECT_EQ(common.broadcastType, "Local");
  EXPECT_EQ(common.rx_prefix, "02");
  EXPECT_EQ(common.rx_suffix, "03");
  EXPECT_EQ(common.gap, 250);
  EXPECT_EQ(common.tx_prefix, "aa");
  EXPECT_EQ(common.tx_suffix, "BB");
  EXPECT_TRUE(common.hex_tokens);
  EXPECT_EQ(common.token_queue_size, 7);
}

TEST(ParamManager, WorkedExampleConfiguration) {
  ParamManager manager;
  ASSERT_TRUE(
      manager.parse("CfgVer=1 socketType=UDP remoteIpAddress=192.168.0.10 "
                    "remotePort=4000 rx_suffix=0D0A model=1 Node3::model=2"))
      << manager.getLastError();
  EXPECT_EQ(manager.getCommonParams()->rx_suffix, "0D0A");
  ASSERT_EQ(manager.getNodes().size(), 1U);
  EXPECT_EQ(manager.getNodeParams(3)->nodeId, 3);
  EXPECT_EQ(manager.getNodeParams(3)->model, "2");
  EXPECT_EQ(manager.getNodeParams(4)->model, "1");
}

TEST(ParamManager, UnknownFormat) {
  EXPECT_EQ(FailureOf("CfgVer=2 model=1"), "Parser: unknown format");
  EXPECT_EQ(FailureOf(""), "Parser: unknown format");
  ParamManager manager;
  EXPECT_FALSE(manager.parse(nullptr));
  EXPECT_EQ(manager.getLastError(), "Parser: unknown format");
}

TEST(ParamManager, MandatoryKeysMissingInOrder) {
  EXPECT_EQ(FailureOf("CfgVer=1"), "Parser: parameter 'model' is not found");
  EXPECT_EQ(FailureOf("CfgVer=1 model=1"), "Parser: parameter 'socketType' is not found");
  EXPECT_EQ(FailureOf("CfgVer=1 model=1 socketType=UDP"),
            "Parser: parameter 'remoteIpAddress' is not found");
  EXPECT_EQ(FailureOf("CfgVer=1 model=1 socketType=UDP remoteIpAddress=1.2.3.4"),
            "Parser: parameter 'remotePort' is not found");
}

TEST(ParamManager, ModelGivenOnlyPerNodeIsNotFound) {
  EXPECT_EQ(FailureOf("CfgVer=1 Node1::model=1 socketType=UDP remoteIpAddress=1.2.3.4 "
                      "remotePort=1"),
            "Parser: parameter 'model' is not found");
}

TEST(ParamManager, RemotePortRange) {
  ParamManager manager;
  EXPECT_TRUE(manager.parse("CfgVer=1 model=1 socketType=UDP remoteIpAddress=a remotePort=65535"));
  EXPECT_EQ(manager.getCommonParams()->remotePort, 65535);
  EXPECT_TRUE(manager.parse("CfgVer=1 model=1 socketType=UDP remoteIpAddress=a remotePort=0"));
  EXPECT_EQ(FailureOf("CfgVer=1 model=1 socketType=UDP remoteIpAddress=a remotePort=65536"),
            "parameter 'remotePort' out of range");
  EXPECT_EQ(FailureOf("CfgVer=1 model=1 socketType=UDP remoteIpAddress=a remotePort=-1"),
            "parameter 'remotePort' out of range");
}

TEST(ParamManager, RemotePortBeyondIntIsOutOfRangeNotWrapped) {
  EXPECT_EQ(FailureOf("CfgVer=1 model=1 socketType=UDP remoteIpAddress=a remotePort=4294967296"),
            "parameter 'remotePort' out of range");
}

TEST(ParamManager, RemotePortIsReadWithBaseDetection) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse("CfgVer=1 model=1 socketType=UDP remoteIpAddress=a remotePort=0x1F"));
  EXPECT_EQ(manager.getCommonParams()->remotePort, 31);
  ASSERT_TRUE(manager.parse("CfgVer=1 model=1 socketType=UDP remoteIpAddress=a remotePort=010"));
  EXPECT_EQ(manager.getCommonParams()->remotePort, 8);
  ASSERT_TRUE(manager.parse("CfgVer=1 model=1 socketType=UDP remoteIpAddress=a remotePort=80x"));
  EXPECT_EQ(manager.getCommonParams()->remotePort, 80);
}

TEST(ParamManager, LocalPortAndGapAreNotRangeChecked) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(With("localPort=-5 gap=-1").c_str())) << manager.getLastError();
  EXPECT_EQ(manager.getCommonParams()->localPort, -5);
  EXPECT_EQ(manager.getCommonParams()->gap, -1);
}

TEST(ParamManager, TokenQueueSizeRange) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(With("token_queue_size=1").c_str()));
  EXPECT_EQ(manager.getCommonParams()->token_queue_size, 1);
  ASSERT_TRUE(manager.parse(With("token_queue_size=10000").c_str()));
  EXPECT_EQ(manager.getCommonParams()->token_queue_size, 10000);
  EXPECT_EQ(FailureOf(With("token_queue_size=0")), "parameter 'token_queue_size' out of range");
  EXPECT_EQ(FailureOf(With("token_queue_size=10001")), "parameter 'token_queue_size' out of range");
}

TEST(ParamManager, BroadcastTypeIsNotReadForTcp) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(
      "CfgVer=1 model=1 socketType=TCP remoteIpAddress=a remotePort=1 broadcastType=Local"));
  EXPECT_EQ(manager.getCommonParams()->broadcastType, "Global");
  ASSERT_TRUE(manager.parse(
      "CfgVer=1 model=1 socketType=tcp remoteIpAddress=a remotePort=1 broadcastType=Local"));
  EXPECT_EQ(manager.getCommonParams()->broadcastType, "Local");
}

TEST(ParamManager, ListValuesAreNotChecked) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(
      "CfgVer=1 model=1 socketType=SCTP remoteIpAddress=a remotePort=1 broadcastType=Subnet"));
  EXPECT_EQ(manager.getCommonParams()->socketType, "SCTP");
  EXPECT_EQ(manager.getCommonParams()->broadcastType, "Subnet");
}

TEST(ParamManager, FramingStringsMustBeHex) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(With("rx_prefix=0d0A").c_str()));
  EXPECT_EQ(manager.getCommonParams()->rx_prefix, "0d0A");
  ASSERT_TRUE(manager.parse(With("rx_prefix=none").c_str()));
  EXPECT_EQ(manager.getCommonParams()->rx_prefix, "none");
  EXPECT_EQ(FailureOf(With("rx_prefix=ABC")), "rx_prefix not in hex format");
  EXPECT_EQ(FailureOf(With("rx_suffix=0G")), "rx_suffix not in hex format");
  EXPECT_EQ(FailureOf(With("tx_prefix=1")), "tx_prefix not in hex format");
  EXPECT_EQ(FailureOf(With("tx_suffix=0d&nbsp;0a")), "tx_suffix not in hex format");
}

TEST(ParamManager, FramingStringsAreCheckedInOrderWhateverHexTokensSays) {
  EXPECT_EQ(FailureOf(With("tx_suffix=x rx_suffix=y hex_tokens=false")),
            "rx_suffix not in hex format");
  EXPECT_EQ(FailureOf(With("tx_suffix=x tx_prefix=y hex_tokens=true")),
            "tx_prefix not in hex format");
}

TEST(ParamManager, HexTokensCapitalisedIsIllegal) {
  EXPECT_EQ(FailureOf(With("hex_tokens=True")), "Parser: parameter 'hex_tokens' has illegal value");
}

TEST(ParamManager, BlankEntityInStringValue) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(
      "CfgVer=1 model=my&nbsp;model socketType=UDP remoteIpAddress=a&nbsp;b remotePort=1"));
  EXPECT_EQ(manager.getCommonParams()->remoteIpAddress, "a b");
  EXPECT_EQ(manager.getNodeParams(-1)->model, "my model");
}

TEST(ParamManager, TwoNodeSectionsGiveTwoRecordsAndOthersTheDefault) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(With("Node5::model=A Node2::model=B").c_str()));
  ASSERT_EQ(manager.getNodes().size(), 2U);
  EXPECT_EQ(manager.getNodes()[0].nodeId, 5);
  EXPECT_EQ(manager.getNodes()[0].model, "A");
  EXPECT_EQ(manager.getNodes()[1].nodeId, 2);
  EXPECT_EQ(manager.getNodes()[1].model, "B");
  EXPECT_EQ(manager.getNodeParams(5)->model, "A");
  EXPECT_EQ(manager.getNodeParams(2)->model, "B");
  const NodeParams* const other = manager.getNodeParams(9);
  ASSERT_NE(other, nullptr);
  EXPECT_EQ(other->nodeId, -1);
  EXPECT_EQ(other->model, "1");
}

TEST(ParamManager, NodeSectionWithoutOwnModelInheritsPlainModel) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(With("Node4::gap=9").c_str()));
  ASSERT_EQ(manager.getNodes().size(), 1U);
  EXPECT_EQ(manager.getNodeParams(4)->nodeId, 4);
  EXPECT_EQ(manager.getNodeParams(4)->model, "1");
}

TEST(ParamManager, ZeroPaddedNodeRegistersButNeverMatchesItsEntry) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(With("Node007::model=X").c_str()));
  ASSERT_EQ(manager.getNodes().size(), 1U);
  EXPECT_EQ(manager.getNodeParams(7)->nodeId, 7);
  EXPECT_EQ(manager.getNodeParams(7)->model, "1");
}

TEST(ParamManager, EmptyNodeNumberIsNodeZeroWithPlainModel) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(With("Node::model=X").c_str()));
  ASSERT_EQ(manager.getNodes().size(), 1U);
  EXPECT_EQ(manager.getNodeParams(0)->nodeId, 0);
  EXPECT_EQ(manager.getNodeParams(0)->model, "1");
}

TEST(ParamManager, SecondParseAppendsRecordsAndEarliestIsAnswered) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(With("Node1::model=first").c_str()));
  ASSERT_TRUE(manager.parse(With("Node1::model=second").c_str()));
  ASSERT_EQ(manager.getNodes().size(), 2U);
  EXPECT_EQ(manager.getNodes()[1].model, "second");
  EXPECT_EQ(manager.getNodeParams(1)->model, "first");
}

TEST(ParamManager, ProtocolWideKeysWithNodePrefixAreIgnored) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(With("Node1::localPort=5 Node1::rx_prefix=ZZ").c_str()));
  EXPECT_EQ(manager.getCommonParams()->localPort, 0);
  EXPECT_EQ(manager.getCommonParams()->rx_prefix, "");
  EXPECT_EQ(FailureOf("CfgVer=1 model=1 Node1::socketType=UDP remoteIpAddress=a remotePort=1"),
            "Parser: parameter 'socketType' is not found");
}

TEST(ParamManager, EveryParseStartsOptionalFieldsAfresh) {
  ParamManager manager;
  ASSERT_TRUE(
      manager.parse(With("gap=50 localPort=9 hex_tokens=true broadcastType=Local").c_str()));
  ASSERT_TRUE(manager.parse(kMandatory.c_str()));
  EXPECT_EQ(manager.getCommonParams()->gap, 0);
  EXPECT_EQ(manager.getCommonParams()->localPort, 0);
  EXPECT_FALSE(manager.getCommonParams()->hex_tokens);
  EXPECT_EQ(manager.getCommonParams()->broadcastType, "Global");
}

TEST(ParamManager, FailureLeavesLaterFieldsWithOldValues) {
  ParamManager manager;
  ASSERT_TRUE(manager.parse(With("gap=50 token_queue_size=5 tx_suffix=0A").c_str()));
  EXPECT_FALSE(manager.parse(
      "CfgVer=1 model=2 socketType=TCP remoteIpAddress=b remotePort=7 gap=60 hex_tokens=maybe"));
  const CommonParams& common = *manager.getCommonParams();
  EXPECT_EQ(common.socketType, "TCP");
  EXPECT_EQ(common.remotePort, 7);
  EXPECT_EQ(common.gap, 60);
  EXPECT_EQ(common.tx_suffix, "");
  EXPECT_EQ(common.token_queue_size, 5);
  EXPECT_EQ(manager.getNodeParams(-1)->model, "2");
}

TEST(ParamManager, LastErrorSurvivesLaterSuccess) {
  ParamManager manager;
  EXPECT_FALSE(manager.parse("nothing"));
  EXPECT_TRUE(manager.parse(kMandatory.c_str()));
  EXPECT_EQ(manager.getLastError(), "Parser: unknown format");
}
