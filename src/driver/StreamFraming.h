// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <functional>
#include <string>

// Cuts tokens out of a byte stream received one byte at a time. One pass
// synchronises on the prefix, collects the body and ends with the first
// complete token, a receive that gives nothing (the gap elapsed or the
// connection failed), or a frame that grew past the limit.
class StreamFraming {
 public:
  // A frame is dropped when it reaches this many bytes without ending.
  static constexpr std::size_t kDroppedFrameLength = 1001;

  // Receives one byte into its argument; answers the receive's result
  // (below 1 for nothing received).
  using ReceiveByte = std::function<int(unsigned char&)>;
  // Receives each token; the token is handed over, not copied.
  using Emit = std::function<void(std::string)>;

  StreamFraming(std::string prefix, std::string suffix)
      : prefix_(std::move(prefix)), suffix_(std::move(suffix)) {}

  void Pass(const ReceiveByte& receive, const Emit& emit) const;

 private:
  // Receives until the accumulator holds the whole prefix; false when a
  // receive gave nothing.
  bool Synchronise(const ReceiveByte& receive, std::string& accumulator) const;
  // Checks whether the byte just appended ends a token; true when the pass
  // is over.
  bool EndsToken(std::string& accumulator, std::size_t taken, const Emit& emit) const;

  std::string prefix_;
  std::string suffix_;
};
