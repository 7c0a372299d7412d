// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/IPParser.h"

#include <gtest/gtest.h>

#include <array>
#include <cstring>
#include <string>

namespace {

// The parsed octets as "a.b.c.d", or "fail".
std::string Octets(const char* text) {
  IPParser parser;
  if (!parser.Parse(text)) {
    return "fail";
  }
  return std::to_string(parser.octets[0]) + "." + std::to_string(parser.octets[1]) + "." +
         std::to_string(parser.octets[2]) + "." + std::to_string(parser.octets[3]);
}

std::string Printed(unsigned int address) {
  char out[16];
  std::memset(out, 'x', sizeof out);
  ipToString(address, out);
  return out;
}

}  // namespace

TEST(IPParser, DottedQuadLeftmostFirst) {
  EXPECT_EQ(Octets("192.168.0.10"), "192.168.0.10");
  EXPECT_EQ(Octets("0.0.0.0"), "0.0.0.0");
  EXPECT_EQ(Octets("255.255.255.255"), "255.255.255.255");
}

TEST(IPParser, LeadingZeroMeansOctal) {
  EXPECT_EQ(Octets("192.168.001.010"), "192.168.1.8");
  // Conversion stops at the first digit that is not octal.
  EXPECT_EQ(Octets("09.1.1.1"), "0.1.1.1");
  EXPECT_EQ(Octets("0377.1.1.1"), "255.1.1.1");
  EXPECT_EQ(Octets("0400.1.1.1"), "fail");
}

TEST(IPParser, EmptyPieceReadsZero) {
  EXPECT_EQ(Octets("1..2.3"), "1.0.2.3");
  EXPECT_EQ(Octets("1.2.3."), "1.2.3.0");
  EXPECT_EQ(Octets("..."), "0.0.0.0");
}

TEST(IPParser, RejectsWrongShapesAndValues) {
  EXPECT_EQ(Octets("256.1.1.1"), "fail");
  EXPECT_EQ(Octets("1.1.1.256"), "fail");
  EXPECT_EQ(Octets("1.2.3"), "fail");
  EXPECT_EQ(Octets("1.2.3.4.5"), "fail");
  EXPECT_EQ(Octets("1234"), "fail");
  EXPECT_EQ(Octets(""), "fail");
  EXPECT_EQ(Octets("0x1.2.3.4"), "fail");
  EXPECT_EQ(Octets("+1.2.3.4"), "fail");
  EXPECT_EQ(Octets(" 1.2.3.4"), "fail");
  EXPECT_EQ(Octets("1.2.3.4 "), "fail");
  EXPECT_EQ(Octets("1.2.3.99999999999999999999"), "fail");
  EXPECT_EQ(Octets(nullptr), "fail");
}

TEST(IPParser, FailureLeavesOctetsUnchanged) {
  IPParser parser;
  ASSERT_TRUE(parser.Parse("9.8.7.6"));
  EXPECT_FALSE(parser.Parse("1.2.3.x"));
  EXPECT_EQ(parser.octets, (std::array<unsigned char, 4>{9, 8, 7, 6}));
  EXPECT_FALSE(parser.Parse("1.2.3"));
  EXPECT_EQ(parser.octets, (std::array<unsigned char, 4>{9, 8, 7, 6}));
}

TEST(ParseIpAddress, FirstOctetMostSignificant) {
  unsigned int address = 0;
  ASSERT_TRUE(parseIpAddress("192.168.0.1", address));
  EXPECT_EQ(address, 0xC0A80001U);
  ASSERT_TRUE(parseIpAddress("192.168.001.010", address));
  EXPECT_EQ(address, 0xC0A80108U);
}

TEST(ParseIpAddress, FailureLeavesOutputUntouched) {
  unsigned int address = 0x12345678U;
  EXPECT_FALSE(parseIpAddress("256.1.1.1", address));
  EXPECT_FALSE(parseIpAddress("1.2.3", address));
  EXPECT_EQ(address, 0x12345678U);
}

TEST(IpToString, WritesDottedQuad) {
  unsigned int address = 0;
  ASSERT_TRUE(parseIpAddress("192.168.0.1", address));
  EXPECT_EQ(Printed(address), "192.168.0.1");
  EXPECT_EQ(Printed(0xFFFFFFFFU), "255.255.255.255");
  EXPECT_EQ(Printed(0U), "0.0.0.0");
  ipToString(1U, nullptr);
}

TEST(IpToString, RoundTripsOverASweepOfAddresses) {
  // A stride that is odd and coprime to 2^32 visits varied octets.
  unsigned int address = 0;
  for (int i = 0; i < 5000; ++i) {
    address += 0x01020305U * 7919U + 13U;
    const std::string text = Printed(address);
    unsigned int back = ~address;
    ASSERT_TRUE(parseIpAddress(text.c_str(), back)) << text;
    ASSERT_EQ(back, address) << text;
  }
}
