// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "TokenReader.h"

#include <cstring>
#include <thread>

TokenReader::TokenReader(LoopbackChannel& channel, std::chrono::microseconds idleWait)
    : channel_(channel),
      available_(channel.Tag("?tokens_available?unsignedInt")),
      rx_(channel.Tag("?rx_token?string-64")),
      ack_(channel.Tag("?token_ack?boolean")),
      idleWait_(idleWait) {}

bool TokenReader::Take(const std::vector<std::string>& expected, std::chrono::milliseconds timeout,
                       std::string& error) {
  const auto deadline = std::chrono::steady_clock::now() + timeout;
  std::size_t taken = 0;
  while (taken < expected.size()) {
    const int waiting = channel_.ReadInt(available_);
    if (waiting == 0) {
      if (std::chrono::steady_clock::now() >= deadline) {
        error = "tokens did not arrive in time";
        return false;
      }
      if (idleWait_.count() == 0) {
        std::this_thread::yield();
      } else {
        std::this_thread::sleep_for(idleWait_);
      }
      continue;
    }
    for (int i = 0; i < waiting && taken < expected.size(); ++i, ++taken) {
      char token[64] = {};
      const unsigned char on = 1;
      if (!channel_.Protocol().Read(rx_, reinterpret_cast<unsigned char*>(token))) {
        error = "rx_token read failed: " + channel_.LastError();
        return false;
      }
      if (expected[taken] != token) {
        error = "unexpected token " + std::string(token);
        return false;
      }
      if (!channel_.Protocol().Write(ack_, &on)) {
        error = "token_ack write failed: " + channel_.LastError();
        return false;
      }
    }
  }
  return true;
}
