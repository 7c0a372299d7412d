// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>

#include "driver/TokenSink.h"

// Cuts tokens out of a byte stream, fed with the bytes as they arrive. It
// keeps the framing of one pass: prefix synchronisation, then the body up to
// the suffix (or, without a suffix, up to the next prefix or a silence).
// Bytes are taken one at a time in effect, exactly as a pass that receives
// single bytes takes them, but scanned in bulk:
// - Synchronisation matches the prefix byte by byte; a mismatch restarts the
//   match, and the mismatching byte may begin it again.
// - With a suffix, the first suffix that follows the prefix whole ends the
//   pass with a token (which may be empty).
// - With a prefix alone, a prefix that does not overlap the leading one ends
//   a token and opens the next; the pass goes on.
// - A frame whose accumulated bytes (prefix included) reach
//   kDroppedFrameLength without ending is dropped, and the pass ends; a
//   frame completed by that very byte is still a token.
// - A silence ends the pass; it completes a token only when there is no
//   suffix and a body was collected.
// A pass that ends restarts the framing afresh for the next one.
class StreamFraming {
 public:
  static constexpr std::size_t kDroppedFrameLength = 1001;

  struct Fed {
    // How many of the bytes were taken: all of them, unless the pass ended
    // before the last one.
    std::size_t taken;
    bool passEnded;
  };

  StreamFraming() : StreamFraming({}, {}) {}
  StreamFraming(std::string prefix, std::string suffix);

  // Takes bytes until the pass ends or the bytes run out; every token
  // completed on the way goes to sink.
  Fed Feed(const unsigned char* data, std::size_t length, TokenSink& sink);
  // The receive gave nothing: ends the pass.
  void Gap(TokenSink& sink);
  // Starts a pass afresh: a partial frame is dropped.
  void Restart();

 private:
  // Takes bytes until the prefix is matched; returns how many.
  std::size_t Synchronise(const unsigned char* data, std::size_t length);
  Fed CollectToSuffix(const unsigned char* data, std::size_t length, TokenSink& sink);
  Fed CollectToPrefix(const unsigned char* data, std::size_t length, TokenSink& sink);
  Fed CollectToGap(const unsigned char* data, std::size_t length);
  // Appends bytes that ended nothing; ends the pass when the frame reached
  // the dropped length.
  bool AppendDropping(const unsigned char* data, std::size_t length);
  // How many more bytes the frame may take before the dropped length is
  // checked: at least one.
  std::size_t Room() const;
  // The index of the first byte in data[0, length) with which the
  // accumulated bytes plus data up to it end with marker while holding at
  // least minimum bytes; length when there is none.
  std::size_t FindEnd(const std::string& marker, std::size_t minimum, const unsigned char* data,
                      std::size_t length) const;
  bool EndsWithAt(const std::string& marker, const unsigned char* data, std::size_t at) const;
  // Hands over the bytes of the accumulator plus data[0, count), less head
  // bytes in front and tail bytes behind.
  void Emit(const unsigned char* data, std::size_t count, std::size_t head, std::size_t tail,
            TokenSink& sink);

  std::string prefix_;
  std::string suffix_;
  std::string accumulator_;
  // Bytes of the prefix matched so far, during synchronisation.
  std::size_t matched_ = 0;
  bool synchronised_ = false;
};
