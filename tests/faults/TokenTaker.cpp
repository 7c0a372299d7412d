// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "TokenTaker.h"

#include <chrono>

TokenTaker::TokenTaker(PluginChannel& channel) : thread_([this, &channel] { Take(channel); }) {}

TokenTaker::~TokenTaker() {
  stop_ = true;
  thread_.join();
}

void TokenTaker::Take(PluginChannel& channel) {
  while (!stop_) {
    std::string token;
    if (channel.TakeToken(token)) {
      const std::lock_guard<std::mutex> lock(lock_);
      tokens_.push_back(token);
    } else {
      std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
  }
}

std::vector<std::string> TokenTaker::Tokens() const {
  const std::lock_guard<std::mutex> lock(lock_);
  return tokens_;
}

std::size_t TokenTaker::Count() const {
  const std::lock_guard<std::mutex> lock(lock_);
  return tokens_.size();
}
