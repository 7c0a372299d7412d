// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/CfgParser.h"

#include <gtest/gtest.h>

#include <string>

namespace {

// The value of a look-up, or "<null>" when absent.
std::string Plain(CfgParser& parser, const char* name) {
  const char* const value = parser.GetParam(name);
  return value == nullptr ? "<null>" : value;
}

const char* const kWorkedExample =
    "CfgVer=1 socketType=UDP remoteIpAddress=192.168.0.10 remotePort=4000 rx_suffix=0D0A "
    "model=1 Node3::model=2";

}  // namespace

TEST(CfgParser, WorkedExampleAnswersPerNodeAndProtocolWide) {
  CfgParser parser(kWorkedExample);
  EXPECT_EQ(parser.KnownFormat(), 1);
  ASSERT_EQ(parser.GetNodeCount(), 1);
  EXPECT_EQ(parser.GetNodeID(0), 3);
  std::string value;
  EXPECT_EQ(parser.getParam("model", 3, value, 0), CfgParser::ParseOk);
  EXPECT_EQ(value, "2");
  EXPECT_EQ(parser.getParam("model", 5, value, 0), CfgParser::ParseOk);
  EXPECT_EQ(value, "1");
  EXPECT_EQ(parser.getParam("model", -1, value, 0), CfgParser::ParseOk);
  EXPECT_EQ(value, "1");
  EXPECT_EQ(Plain(parser, "socketType"), "UDP");
  EXPECT_EQ(Plain(parser, "remoteIpAddress"), "192.168.0.10");
  EXPECT_EQ(Plain(parser, "remotePort"), "4000");
  EXPECT_EQ(Plain(parser, "rx_suffix"), "0D0A");
}

TEST(CfgParser, MarkerFollowedByDigitStartsSectionWithThatDigit) {
  CfgParser parser("CfgVer=10=5 a=1");
  EXPECT_EQ(parser.KnownFormat(), 1);
  EXPECT_EQ(Plain(parser, "a"), "1");
  // The section text begins with the 0, so "0" is an entry at position 0.
  EXPECT_EQ(Plain(parser, "0"), "5");
  CfgParser plainTen("CfgVer=10 a=1");
  EXPECT_EQ(plainTen.KnownFormat(), 1);
  EXPECT_EQ(Plain(plainTen, "a"), "1");
}

TEST(CfgParser, OnlyTextBetweenMarkerAndNextVersionIsRead) {
  CfgParser parser("x=1 CfgVer=1 y=2 CfgVer=2 z=3");
  EXPECT_EQ(Plain(parser, "x"), "<null>");
  EXPECT_EQ(Plain(parser, "y"), "2");
  EXPECT_EQ(Plain(parser, "z"), "<null>");
}

TEST(CfgParser, NodesAfterNextVersionAreNotScanned) {
  CfgParser parser("CfgVer=1 Node1::a=1 CfgVer=2 Node2::a=2");
  ASSERT_EQ(parser.GetNodeCount(), 1);
  EXPECT_EQ(parser.GetNodeID(0), 1);
}

TEST(CfgParser, WithoutMarkerFormatIsUnknownAndNoNodesAreScanned) {
  CfgParser parser("CfgVer=2 a=1 Node3::b=2");
  EXPECT_EQ(parser.KnownFormat(), 0);
  EXPECT_EQ(parser.GetNodeCount(), 0);
}

TEST(CfgParser, WithoutMarkerWholeTextIsKeptForLookUps) {
  CfgParser parser("a=1 CfgVer=2 b=2");
  EXPECT_EQ(Plain(parser, "a"), "1");
  EXPECT_EQ(Plain(parser, "b"), "2");
  CfgParser empty(nullptr);
  EXPECT_EQ(empty.KnownFormat(), 0);
  EXPECT_EQ(Plain(empty, "a"), "<null>");
}

TEST(CfgParser, EmptyNodeNumberRegistersNodeZeroButIsNeverMatched) {
  CfgParser parser("CfgVer=1 Node::a=1 a=9");
  ASSERT_EQ(parser.GetNodeCount(), 1);
  EXPECT_EQ(parser.GetNodeID(0), 0);
  std::string value;
  EXPECT_EQ(parser.getParam("a", 0, value, 0), CfgParser::ParseOk);
  EXPECT_EQ(value, "9");
}

TEST(CfgParser, ZeroPaddedNodeRegistersButLookUpFallsBackToPlain) {
  CfgParser parser("CfgVer=1 Node007::a=1 a=2");
  ASSERT_EQ(parser.GetNodeCount(), 1);
  EXPECT_EQ(parser.GetNodeID(0), 7);
  std::string value;
  EXPECT_EQ(parser.getParam("a", 7, value, 0), CfgParser::ParseOk);
  EXPECT_EQ(value, "2");
}

TEST(CfgParser, NodeWithNonDigitsRegistersNothing) {
  CfgParser parser("CfgVer=1 NodeX::a=1 Node1x::b=2");
  EXPECT_EQ(parser.GetNodeCount(), 0);
}

TEST(CfgParser, NodeNumberMetTwiceIsListedOnce) {
  CfgParser parser("CfgVer=1 Node4::a=1 Node2::a=1 Node4::b=2 Node02::c=3");
  ASSERT_EQ(parser.GetNodeCount(), 2);
  EXPECT_EQ(parser.GetNodeID(0), 4);
  EXPECT_EQ(parser.GetNodeID(1), 2);
}

TEST(CfgParser, NodePrefixInsideValueOrWordRegistersToo) {
  CfgParser parser("CfgVer=1 name=xNode5::y MyNode6::a=1");
  ASSERT_EQ(parser.GetNodeCount(), 2);
  EXPECT_EQ(parser.GetNodeID(0), 5);
  EXPECT_EQ(parser.GetNodeID(1), 6);
}

TEST(CfgParser, NodeWithoutSeparatorEndsScan) {
  CfgParser parser("CfgVer=1 Node3:a=1 Node");
  EXPECT_EQ(parser.GetNodeCount(), 0);
}

TEST(CfgParser, NodeNumberBeyondIntIsNotListed) {
  CfgParser parser("CfgVer=1 Node99999999999::a=1 Node2147483647::b=2");
  ASSERT_EQ(parser.GetNodeCount(), 1);
  EXPECT_EQ(parser.GetNodeID(0), 2147483647);
}

TEST(CfgParser, NodeIdPastTheEndOrNegativeIsZero) {
  CfgParser parser("CfgVer=1 Node5::a=1");
  EXPECT_EQ(parser.GetNodeID(0), 5);
  EXPECT_EQ(parser.GetNodeID(1), 0);
  EXPECT_EQ(parser.GetNodeID(-1), 0);
}

TEST(CfgParser, NameIsNotFoundInsideLongerName) {
  CfgParser parser("CfgVer=1 ab=1 b=2");
  EXPECT_EQ(Plain(parser, "b"), "2");
  CfgParser onlyLonger("CfgVer=1 ab=1");
  EXPECT_EQ(Plain(onlyLonger, "b"), "<null>");
}

TEST(CfgParser, PlainLookUpDoesNotSeePrefixedEntry) {
  CfgParser parser("CfgVer=1 Node1::b=5");
  EXPECT_EQ(Plain(parser, "b"), "<null>");
  EXPECT_EQ(Plain(parser, "Node1::b"), "5");
}

TEST(CfgParser, EmptyValueIsFound) {
  CfgParser parser("CfgVer=1 a= b=2");
  EXPECT_EQ(Plain(parser, "a"), "");
  EXPECT_EQ(Plain(parser, "b"), "2");
}

TEST(CfgParser, ValueAtTheVeryEndOfTheText) {
  CfgParser parser("CfgVer=1 a=xyz");
  EXPECT_EQ(Plain(parser, "a"), "xyz");
  CfgParser bare("CfgVer=1 a=");
  EXPECT_EQ(Plain(bare, "a"), "");
  CfgParser nameOnly("CfgVer=1 a");
  EXPECT_EQ(Plain(nameOnly, "a"), "<null>");
}

TEST(CfgParser, AnyWhiteSpaceSeparatesEntries) {
  CfgParser parser("CfgVer=1\ta=1\nb=2\r\nc=3\vd=4");
  EXPECT_EQ(Plain(parser, "a"), "1");
  EXPECT_EQ(Plain(parser, "b"), "2");
  EXPECT_EQ(Plain(parser, "c"), "3");
  EXPECT_EQ(Plain(parser, "d"), "4");
}

TEST(CfgParser, FirstAcceptableOccurrenceWins) {
  CfgParser parser("CfgVer=1 xa=0 a=1 a=2");
  EXPECT_EQ(Plain(parser, "a"), "1");
}

TEST(CfgParser, ReturnedTextHoldsTheLastValue) {
  CfgParser parser("CfgVer=1 a=first b=second");
  const char* const value = parser.GetParam("a");
  ASSERT_NE(value, nullptr);
  EXPECT_STREQ(value, "first");
  EXPECT_STREQ(parser.GetParam("b"), "second");
  EXPECT_EQ(parser.GetParam(nullptr), nullptr);
}

TEST(CfgParser, EntityIsKeptByLookUp) {
  CfgParser parser("CfgVer=1 text=Hello&nbsp;World");
  EXPECT_EQ(Plain(parser, "text"), "Hello&nbsp;World");
}

TEST(CfgParserGetParam, BothFlagsAreInvalidBeforeLookingAtText) {
  CfgParser parser("no marker at all");
  std::string value = "kept";
  EXPECT_EQ(parser.getParam("a", -1, value, CfgParser::ParamNoPrefix | CfgParser::ParamNodeOnly),
            CfgParser::ParseInvalidSpec);
  EXPECT_EQ(parser.getParam(nullptr, 3, value, 3), CfgParser::ParseInvalidSpec);
  EXPECT_EQ(value, "kept");
}

TEST(CfgParserGetParam, ProtocolWideParameterWithNodePrefixCantBePrefixed) {
  CfgParser parser("CfgVer=1 Node2::p=1");
  std::string value = "kept";
  EXPECT_EQ(parser.getParam("p", 2, value, CfgParser::ParamNoPrefix),
            CfgParser::ParseCantBePrefixed);
  EXPECT_EQ(parser.getParam("p", -1, value, CfgParser::ParamNoPrefix), CfgParser::ParseNotFound);
  EXPECT_EQ(value, "kept");
}

TEST(CfgParserGetParam, NodeFallsBackToPlainEntry) {
  CfgParser parser("CfgVer=1 p=plain Node2::q=two");
  std::string value;
  EXPECT_EQ(parser.getParam("p", 2, value, CfgParser::ParamNoPrefix), CfgParser::ParseOk);
  EXPECT_EQ(value, "plain");
  EXPECT_EQ(parser.getParam("q", 2, value, CfgParser::ParamNodeOnly), CfgParser::ParseOk);
  EXPECT_EQ(value, "two");
  EXPECT_EQ(parser.getParam("q", 3, value, 0), CfgParser::ParseNotFound);
}

TEST(CfgParserGetParam, NodeOnlyParameterAskedNodeIndependently) {
  CfgParser withNodes("CfgVer=1 m=1 Node2::m=2");
  std::string value = "kept";
  EXPECT_EQ(withNodes.getParam("m", -1, value, CfgParser::ParamNodeOnly),
            CfgParser::ParseCantBeNodeIndependent);
  EXPECT_EQ(withNodes.getParam("absent", -1, value, CfgParser::ParamNodeOnly),
            CfgParser::ParseNodeOnly);
  EXPECT_EQ(value, "kept");
  CfgParser withoutNodes("CfgVer=1 m=1");
  EXPECT_EQ(withoutNodes.getParam("m", -1, value, CfgParser::ParamNodeOnly), CfgParser::ParseOk);
  EXPECT_EQ(value, "1");
  EXPECT_EQ(withoutNodes.getParam("absent", -1, value, CfgParser::ParamNodeOnly),
            CfgParser::ParseNotFound);
}

TEST(CfgParserGetParam, NegativeNodeNeverReadsAnotherNodesEntry) {
  CfgParser parser("CfgVer=1 Node2::a=two a=plain");
  std::string value;
  EXPECT_EQ(parser.getParam("a", -2, value, 0), CfgParser::ParseOk);
  EXPECT_EQ(value, "plain");
}

TEST(CfgParserGetParam, ResultNumbersAreFixed) {
  EXPECT_EQ(CfgParser::ParseOk, 0);
  EXPECT_EQ(CfgParser::ParseNodeOnly, 1);
  EXPECT_EQ(CfgParser::ParseNotFound, 2);
  EXPECT_EQ(CfgParser::ParseIllegalValue, 3);
  EXPECT_EQ(CfgParser::ParseCantBePrefixed, 4);
  EXPECT_EQ(CfgParser::ParseCantBeNodeIndependent, 5);
  EXPECT_EQ(CfgParser::ParseInvalidSpec, 6);
  EXPECT_EQ(CfgParser::ParamNoPrefix, 1);
  EXPECT_EQ(CfgParser::ParamNodeOnly, 2);
}
