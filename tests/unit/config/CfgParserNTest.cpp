// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/CfgParserN.h"

#include <gtest/gtest.h>

#include <climits>
#include <string>

using CfgParserN::getErrorString;
using CfgParserN::parseValue;
using CfgParserN::readParam;

TEST(ParseValueText, EntityBecomesBlank) {
  std::string out;
  EXPECT_TRUE(parseValue("Hello&nbsp;World", out));
  EXPECT_EQ(out, "Hello World");
  EXPECT_TRUE(parseValue("&nbsp;&nbsp;x&nbsp", out));
  EXPECT_EQ(out, "  x&nbsp");
  EXPECT_TRUE(parseValue("", out));
  EXPECT_EQ(out, "");
}

TEST(ParseValueBool, OnlyExactTrueAndFalse) {
  bool out = false;
  EXPECT_TRUE(parseValue("true", out));
  EXPECT_TRUE(out);
  EXPECT_TRUE(parseValue("false", out));
  EXPECT_FALSE(out);
  out = true;
  EXPECT_FALSE(parseValue("True", out));
  EXPECT_FALSE(parseValue("1", out));
  EXPECT_FALSE(parseValue("", out));
  EXPECT_FALSE(parseValue("true ", out));
  EXPECT_TRUE(out);
}

TEST(ParseValueInt, ReadsLikeStrtolWithBaseZero) {
  int out = -1;
  EXPECT_TRUE(parseValue("0x1F", out));
  EXPECT_EQ(out, 31);
  EXPECT_TRUE(parseValue("010", out));
  EXPECT_EQ(out, 8);
  EXPECT_TRUE(parseValue("12abc", out));
  EXPECT_EQ(out, 12);
  EXPECT_TRUE(parseValue("abc", out));
  EXPECT_EQ(out, 0);
  EXPECT_TRUE(parseValue("-5", out));
  EXPECT_EQ(out, -5);
}

TEST(ParseValueInt, NumbersBeyondIntAreClamped) {
  int out = 0;
  EXPECT_TRUE(parseValue("4294967296", out));
  EXPECT_EQ(out, INT_MAX);
  EXPECT_TRUE(parseValue("-99999999999999999999", out));
  EXPECT_EQ(out, INT_MIN);
}

TEST(GetErrorString, TextForEveryResult) {
  EXPECT_EQ(getErrorString(CfgParser::ParseNotFound, "remotePort"),
            "Parser: parameter 'remotePort' is not found");
  EXPECT_EQ(getErrorString(CfgParser::ParseIllegalValue, "hex_tokens"),
            "Parser: parameter 'hex_tokens' has illegal value");
  EXPECT_EQ(getErrorString(CfgParser::ParseCantBePrefixed, "p"),
            "Parser: parameter 'p' can't be prefixed");
  EXPECT_EQ(getErrorString(CfgParser::ParseCantBeNodeIndependent, "m"),
            "Parser: parameter 'm' can't be node independent");
  EXPECT_EQ(getErrorString(CfgParser::ParseInvalidSpec, "x"),
            "Parser: parameter 'x' has invalid internal specification");
  EXPECT_EQ(getErrorString(CfgParser::ParseOk, "x"), "Parser: parameter 'x' has unknown error");
  EXPECT_EQ(getErrorString(CfgParser::ParseNodeOnly, "x"),
            "Parser: parameter 'x' has unknown error");
  EXPECT_EQ(getErrorString(static_cast<CfgParser::parseResult>(42), "x"),
            "Parser: parameter 'x' has unknown error");
  EXPECT_EQ(getErrorString(CfgParser::ParseNotFound, nullptr), "Parser: parameter '' is not found");
}

TEST(ReadParam, StringValueWithEntity) {
  CfgParser parser("CfgVer=1 name=a&nbsp;b");
  std::string value;
  std::string error;
  EXPECT_TRUE(readParam(parser, "name", -1, value, 0, false, error));
  EXPECT_EQ(value, "a b");
  EXPECT_EQ(error, "");
}

TEST(ReadParam, IntValueBaseDetectedTrailingIgnored) {
  CfgParser parser("CfgVer=1 hex=0x10 oct=017 dec=42ms word=abc");
  int value = -1;
  std::string error;
  EXPECT_TRUE(readParam(parser, "hex", -1, value, 0, false, error));
  EXPECT_EQ(value, 16);
  EXPECT_TRUE(readParam(parser, "oct", -1, value, 0, false, error));
  EXPECT_EQ(value, 15);
  EXPECT_TRUE(readParam(parser, "dec", -1, value, 0, false, error));
  EXPECT_EQ(value, 42);
  EXPECT_TRUE(readParam(parser, "word", -1, value, 0, false, error));
  EXPECT_EQ(value, 0);
}

TEST(ReadParam, IllegalBoolGivesIllegalValueText) {
  CfgParser parser("CfgVer=1 flag=yes");
  bool value = true;
  std::string error;
  EXPECT_FALSE(readParam(parser, "flag", -1, value, 0, true, error));
  EXPECT_EQ(error, "Parser: parameter 'flag' has illegal value");
  EXPECT_TRUE(value);
}

TEST(ReadParam, MissingOptionalKeepsDefault) {
  CfgParser parser("CfgVer=1 other=1");
  int value = 100;
  std::string error;
  EXPECT_TRUE(readParam(parser, "size", -1, value, CfgParser::ParamNoPrefix, true, error));
  EXPECT_EQ(value, 100);
  EXPECT_EQ(error, "");
}

TEST(ReadParam, MissingMandatoryIsNotFound) {
  CfgParser parser("CfgVer=1 other=1");
  std::string value = "kept";
  std::string error;
  EXPECT_FALSE(readParam(parser, "remotePort", -1, value, 0, false, error));
  EXPECT_EQ(error, "Parser: parameter 'remotePort' is not found");
  EXPECT_EQ(value, "kept");
}

TEST(ReadParam, NodeOnlyResultCountsAsSuccessAndCopiesNothing) {
  CfgParser parser("CfgVer=1 Node1::m=1");
  std::string value = "kept";
  std::string error;
  EXPECT_TRUE(readParam(parser, "m", -1, value, CfgParser::ParamNodeOnly, false, error));
  EXPECT_EQ(value, "kept");
}

TEST(ReadParam, PrefixAndBothFlagErrorsFailEvenWhenOptional) {
  CfgParser parser("CfgVer=1 m=1 Node1::p=1");
  std::string value;
  std::string error;
  EXPECT_FALSE(readParam(parser, "p", 1, value, CfgParser::ParamNoPrefix, true, error));
  EXPECT_EQ(error, "Parser: parameter 'p' can't be prefixed");
  EXPECT_FALSE(readParam(parser, "m", -1, value, CfgParser::ParamNodeOnly, true, error));
  EXPECT_EQ(error, "Parser: parameter 'm' can't be node independent");
  EXPECT_FALSE(readParam(parser, "m", -1, value, 3, true, error));
  EXPECT_EQ(error, "Parser: parameter 'm' has invalid internal specification");
}
