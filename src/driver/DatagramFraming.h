// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <functional>
#include <string>

// Cuts the tokens out of one received datagram. Markers are matched as
// zero-terminated texts: a marker counts up to its first zero byte, and a
// search never looks past the first zero byte of the datagram at or after its
// starting point. Nothing is carried from one datagram to the next.
class DatagramFraming {
 public:
  DatagramFraming(const std::string& prefix, const std::string& suffix);

  // Calls emit for every non-empty token of data[0, length). With neither
  // marker the whole datagram is one token.
  // The token is handed over to emit, not copied.
  void Split(const unsigned char* data, std::size_t length,
             const std::function<void(std::string)>& emit) const;

 private:
  // Position of the first match of marker in data[from, end) before any zero
  // byte, or end when there is none.
  static std::size_t Find(const std::string& marker, const unsigned char* data, std::size_t from,
                          std::size_t end);

  std::string prefix_;
  std::string suffix_;
};
