// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/Endpoint.h"

#include <gtest/gtest.h>
#include <netinet/in.h>

using veltpeer::Endpoint;

TEST(Endpoint, ParsesIpv4HostAndPort) {
  Endpoint endpoint;
  std::string error;
  ASSERT_TRUE(Endpoint::ParseHostPort("127.0.0.1:4000", SOCK_DGRAM, endpoint, error)) << error;
  EXPECT_EQ(endpoint.Family(), AF_INET);
  EXPECT_EQ(endpoint.Port(), 4000);
  EXPECT_EQ(endpoint.ToString(), "127.0.0.1:4000");
}

TEST(Endpoint, ParsesIpv6InBracketsOrByLastColon) {
  Endpoint endpoint;
  std::string error;
  ASSERT_TRUE(Endpoint::ParseHostPort("[::1]:5000", SOCK_DGRAM, endpoint, error)) << error;
  EXPECT_EQ(endpoint.Family(), AF_INET6);
  EXPECT_EQ(endpoint.ToString(), "[::1]:5000");
  ASSERT_TRUE(Endpoint::ParseHostPort("::1:5001", SOCK_DGRAM, endpoint, error)) << error;
  EXPECT_EQ(endpoint.ToString(), "[::1]:5001");
}

TEST(Endpoint, RejectsMalformedText) {
  Endpoint endpoint;
  std::string error;
  EXPECT_FALSE(Endpoint::ParseHostPort("4000", SOCK_DGRAM, endpoint, error));
  EXPECT_EQ(error, "bad address '4000' (HOST:PORT expected)");
  EXPECT_FALSE(Endpoint::ParseHostPort(":4000", SOCK_DGRAM, endpoint, error));
  EXPECT_EQ(error, "bad address ':4000' (HOST:PORT expected)");
  EXPECT_FALSE(Endpoint::ParseHostPort("[::1]4000", SOCK_DGRAM, endpoint, error));
  EXPECT_EQ(error, "bad address '[::1]4000' (HOST:PORT expected)");
  EXPECT_FALSE(Endpoint::ParseHostPort("127.0.0.1:", SOCK_DGRAM, endpoint, error));
  EXPECT_EQ(error, "bad port '' in '127.0.0.1:' (0..65535 expected)");
  EXPECT_TRUE(endpoint.Empty());
}

TEST(Endpoint, EmptyUntilSet) {
  const Endpoint endpoint;
  EXPECT_TRUE(endpoint.Empty());
  EXPECT_EQ(endpoint.Port(), 0);
  EXPECT_EQ(endpoint.ToString(), "?");
}
