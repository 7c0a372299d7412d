// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/TokenQueue.h"

#include <string_view>

#include "IMultiTask2.h"

TokenQueue::Guard::Guard(TokenQueue& queue) : queue_(queue) {
  if (queue_.lock_ != nullptr) {
    queue_.lock_->Lock();
  }
}

TokenQueue::Guard::~Guard() {
  if (queue_.lock_ != nullptr) {
    queue_.lock_->Unlock();
  }
}

void TokenQueue::Guard::Add(std::string token, unsigned int bound, bool hex) {
  auto& tokens = queue_.tokens_;
  if (!tokens.empty() && tokens.size() >= bound) {
    tokens.pop_front();
  }
  if (!hex) {
    tokens.push_back(std::move(token));
    return;
  }
  constexpr std::string_view kDigits = "0123456789ABCDEF";
  std::string text;
  text.reserve(token.size() * 2);
  for (const char c : token) {
    const auto byte = static_cast<unsigned char>(c);
    text.push_back(kDigits[byte >> 4U]);
    text.push_back(kDigits[byte & 0x0FU]);
  }
  tokens.push_back(std::move(text));
}

void TokenQueue::Guard::PopFront() {
  if (!queue_.tokens_.empty()) {
    queue_.tokens_.pop_front();
  }
}
