// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

// Takes a fuzzer's input apart into the values a target needs. Reading past
// the end gives zero bytes and empty texts, so every input, however short,
// makes a complete set of values.
class FuzzInput {
 public:
  FuzzInput(const std::uint8_t* data, std::size_t size) : data_(data), size_(size) {}

  bool Empty() const { return position_ >= size_; }
  std::size_t Remaining() const { return Empty() ? 0 : size_ - position_; }

  // The next byte, 0 at the end.
  std::uint8_t Byte();
  // A number in [low, high] made of the next two bytes.
  int IntInRange(int low, int high);
  // Up to count of the next bytes.
  std::string Bytes(std::size_t count);
  // A length byte (below limit) followed by that many bytes.
  std::string ShortText(std::size_t limit);
  // Everything not yet taken.
  std::string Rest();

  // The pieces of text between separators, untrimmed, at most most of them.
  static std::vector<std::string> Split(const std::string& text, char separator, std::size_t most);

 private:
  const std::uint8_t* data_;
  std::size_t size_;
  std::size_t position_ = 0;
};
