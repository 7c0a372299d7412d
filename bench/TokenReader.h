// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <string>
#include <vector>

#include "ITag.h"
#include "LoopbackChannel.h"

// Reads received tokens as a panel does: the count from tokens_available,
// then each oldest token from rx_token (up to 63 bytes) and its
// acknowledgement to token_ack. While the queue is empty it yields its
// processor and asks again at once, or, given an idle wait, sleeps that long
// between two questions, as a panel that polls its tags does.
class TokenReader {
 public:
  explicit TokenReader(LoopbackChannel& channel,
                       std::chrono::microseconds idleWait = std::chrono::microseconds(0));

  // Takes the tokens expected, in order; false, with the reason in error,
  // when they do not all arrive within timeout or one differs.
  bool Take(const std::vector<std::string>& expected, std::chrono::milliseconds timeout,
            std::string& error);

 private:
  LoopbackChannel& channel_;
  ITag* available_;
  ITag* rx_;
  ITag* ack_;
  std::chrono::microseconds idleWait_;
};
