// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/TokenEmitter.h"

#include <gtest/gtest.h>

using veltpeer::PeerOptions;
using veltpeer::TokenEmitter;

TEST(TokenEmitter, FramesNumberedTokensWithPrefixAndSuffix) {
  PeerOptions options;
  options.emitCount = 3;
  options.txPrefix = "\x02";
  options.txSuffix = "\x03";
  options.payload = "T{n}/{n}";
  TokenEmitter emitter(options);
  ASSERT_TRUE(emitter.Active());
  EXPECT_EQ(emitter.Next(), "\x02T1/1\x03");
  EXPECT_EQ(emitter.Next(), "\x02T2/2\x03");
  EXPECT_EQ(emitter.Next(), "\x02T3/3\x03");
  EXPECT_FALSE(emitter.Active());
  EXPECT_EQ(emitter.Emitted(), 3U);
}

TEST(TokenEmitter, DefaultPayloadAndBytePayloadWithoutCounter) {
  PeerOptions options;
  options.emitCount = 2;
  TokenEmitter text(options);
  EXPECT_EQ(text.Next(), "token 1");
  options.payload = std::string("{n}\x00", 4);
  options.payloadCounter = false;
  TokenEmitter bytes(options);
  EXPECT_EQ(bytes.Next(), std::string("{n}\x00", 4));
}

TEST(TokenEmitter, NotDueBeforeBeginThenPacedByRate) {
  PeerOptions options;
  options.emitCount = 3;
  options.rate = 4;  // one token every 250 ms
  TokenEmitter emitter(options);
  EXPECT_EQ(emitter.Due(), TokenEmitter::Clock::time_point::max());
  const TokenEmitter::Clock::time_point start{std::chrono::seconds(100)};
  emitter.Begin(start);
  EXPECT_EQ(emitter.Due(), start);
  emitter.Next();
  EXPECT_EQ(emitter.Due(), start + std::chrono::milliseconds(250));
  emitter.Pause();
  EXPECT_EQ(emitter.Due(), TokenEmitter::Clock::time_point::max());
  emitter.Begin(start + std::chrono::seconds(1));
  EXPECT_EQ(emitter.Due(), start + std::chrono::seconds(1));
  emitter.Next();
  emitter.Next();
  EXPECT_EQ(emitter.Due(), TokenEmitter::Clock::time_point::max());
}

TEST(TokenEmitter, UnpacedTokensAreAllDueAtOnce) {
  PeerOptions options;
  options.emitCount = PeerOptions::kForever;
  options.rate = 0;
  TokenEmitter emitter(options);
  const TokenEmitter::Clock::time_point start{std::chrono::seconds(5)};
  emitter.Begin(start);
  for (int i = 0; i < 1000; ++i) {
    emitter.Next();
  }
  EXPECT_TRUE(emitter.Active());
  EXPECT_EQ(emitter.Due(), start);
}

TEST(TokenEmitter, NoEmissionByDefault) {
  TokenEmitter emitter{PeerOptions()};
  EXPECT_FALSE(emitter.Active());
}
