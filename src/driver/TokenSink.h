// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>

// Receives the tokens that a framer cuts out. The bytes are valid for the
// call only: a sink that keeps a token copies it.
class TokenSink {
 public:
  virtual void Token(const char* data, std::size_t length) = 0;

 protected:
  TokenSink() = default;
  TokenSink(const TokenSink&) = default;
  TokenSink& operator=(const TokenSink&) = default;
  TokenSink(TokenSink&&) = default;
  TokenSink& operator=(TokenSink&&) = default;
  ~TokenSink() = default;
};
