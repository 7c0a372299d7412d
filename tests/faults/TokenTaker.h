// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "PluginChannel.h"

// Takes tokens from a channel on a thread of its own, as a panel's tag
// thread does, until the object goes.
class TokenTaker {
 public:
  explicit TokenTaker(PluginChannel& channel);
  TokenTaker(const TokenTaker&) = delete;
  TokenTaker& operator=(const TokenTaker&) = delete;
  TokenTaker(TokenTaker&&) = delete;
  TokenTaker& operator=(TokenTaker&&) = delete;
  ~TokenTaker();

  // The tokens taken so far, in order.
  std::vector<std::string> Tokens() const;
  std::size_t Count() const;

 private:
  void Take(PluginChannel& channel);

  std::atomic<bool> stop_{false};
  mutable std::mutex lock_;
  std::vector<std::string> tokens_;
  std::thread thread_;
};
