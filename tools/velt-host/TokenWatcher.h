// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

#include "velt-host/Instance.h"

namespace velthost {

// Takes received tokens from an instance's queue through its tags, as a
// panel does: tokens_available tells whether one waits, rx_token_len sizes
// the read of rx_token, and a write to token_ack removes it.
class TokenWatcher {
 public:
  enum class Result { kToken, kEmpty, kError };

  static constexpr const char* kTokensAvailable = "?tokens_available?unsignedInt";
  static constexpr const char* kTokenLength = "?rx_token_len?unsignedInt";
  static constexpr const char* kTokenAck = "?token_ack?boolean";

  explicit TokenWatcher(Instance& instance) : instance_(instance) {}

  // The address of an rx_token tag with room for a token of length bytes
  // and its terminating zero.
  static std::string TokenUri(unsigned long length);

  // Takes the oldest token into token (cut at a zero byte inside it, as
  // rx_token reads). kEmpty when none waits; kError with error set when a
  // tag cannot be read or written.
  Result Take(std::string& token, std::string& error);

 private:
  bool ReadCount(const char* uri, unsigned long& count, std::string& error);

  Instance& instance_;
};

}  // namespace velthost
