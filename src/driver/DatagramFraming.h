// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>

#include "driver/TokenSink.h"

// Cuts the tokens out of one received datagram. Markers are matched as
// zero-terminated texts: a marker counts up to its first zero byte, and a
// search never looks past the first zero byte of the datagram at or after its
// starting point, nor past the datagram's end. Nothing is carried from one
// datagram to the next.
class DatagramFraming {
 public:
  DatagramFraming() : DatagramFraming({}, {}) {}
  DatagramFraming(const std::string& prefix, const std::string& suffix);

  // Hands every non-empty token of data[0, length) to sink. With neither
  // marker the whole datagram is one token.
  void Feed(const unsigned char* data, std::size_t length, TokenSink& sink) const;

 private:
  // Position of the first match of marker that lies whole in
  // data[from, limit), or limit when there is none.
  static std::size_t Find(const std::string& marker, const unsigned char* data, std::size_t from,
                          std::size_t limit);

  std::string prefix_;
  std::string suffix_;
};
