// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/StreamFraming.h"

namespace {

bool EndsWith(const std::string& text, const std::string& tail) {
  return text.size() >= tail.size() &&
         text.compare(text.size() - tail.size(), tail.size(), tail) == 0;
}

}  // namespace

bool StreamFraming::Synchronise(const ReceiveByte& receive, std::string& accumulator) const {
  std::size_t matched = 0;
  while (matched < prefix_.size()) {
    unsigned char byte = 0;
    if (receive(byte) < 1) {
      return false;
    }
    const char c = static_cast<char>(byte);
    if (c == prefix_[matched]) {
      accumulator.push_back(c);
      ++matched;
    } else {
      // A mismatch restarts the match; the byte itself may begin the prefix.
      accumulator.clear();
      matched = 0;
      if (c == prefix_[0]) {
        accumulator.push_back(c);
        matched = 1;
      }
    }
  }
  return true;
}

bool StreamFraming::EndsToken(std::string& accumulator, std::size_t taken, const Emit& emit) const {
  if (taken < prefix_.size() + suffix_.size()) {
    return false;
  }
  if (!suffix_.empty()) {
    if (!EndsWith(accumulator, suffix_)) {
      return false;
    }
    emit(accumulator.substr(prefix_.size(), accumulator.size() - prefix_.size() - suffix_.size()));
    return true;
  }
  // Without a suffix the next prefix closes the token and opens the next one;
  // it counts only once it does not overlap the leading prefix.
  if (!prefix_.empty() && accumulator.size() >= 2 * prefix_.size() &&
      EndsWith(accumulator, prefix_)) {
    emit(accumulator.substr(prefix_.size(), accumulator.size() - 2 * prefix_.size()));
    accumulator = prefix_;
  }
  return false;
}

void StreamFraming::Pass(const ReceiveByte& receive, const Emit& emit) const {
  std::string accumulator;
  if (!Synchronise(receive, accumulator)) {
    return;
  }
  // The count of bytes taken is not reset when a prefix closes a token, so
  // the end test runs on every further byte.
  std::size_t taken = prefix_.size();
  do {
    unsigned char byte = 0;
    if (receive(byte) < 1) {
      if (suffix_.empty() && accumulator.size() > prefix_.size()) {
        emit(accumulator.substr(prefix_.size()));
      }
      return;
    }
    accumulator.push_back(static_cast<char>(byte));
    ++taken;
    if (EndsToken(accumulator, taken, emit)) {
      return;
    }
  } while (accumulator.size() < kDroppedFrameLength);
}
