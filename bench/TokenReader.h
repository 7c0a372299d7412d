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
// acknowledgement to token_ack.
class TokenReader {
 public:
  explicit TokenReader(LoopbackChannel& channel);

  // Takes the tokens expected, in order; false, with the reason in error,
  // when they do not all arrive within timeout or one differs.
  bool Take(const std::vector<std::string>& expected, std::chrono::milliseconds timeout,
            std::string& error);

 private:
  LoopbackChannel& channel_;
  ITag* available_;
  ITag* rx_;
  ITag* ack_;
};
