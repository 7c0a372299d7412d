// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "FuzzInput.h"

#include <algorithm>

std::uint8_t FuzzInput::Byte() { return Empty() ? 0 : data_[position_++]; }

int FuzzInput::IntInRange(int low, int high) {
  const unsigned raw = static_cast<unsigned>(Byte()) << 8 | Byte();
  const auto span = static_cast<unsigned>(static_cast<long long>(high) - low + 1);
  return static_cast<int>(low + static_cast<long long>(raw % span));
}

std::string FuzzInput::Bytes(std::size_t count) {
  const std::size_t taken = std::min(count, Remaining());
  std::string bytes(reinterpret_cast<const char*>(data_ + position_), taken);
  position_ += taken;
  return bytes;
}

std::string FuzzInput::ShortText(std::size_t limit) {
  return Bytes(limit == 0 ? 0 : Byte() % limit);
}

std::string FuzzInput::Rest() { return Bytes(Remaining()); }

std::vector<std::string> FuzzInput::Split(const std::string& text, char separator,
                                          std::size_t most) {
  std::vector<std::string> pieces;
  std::size_t start = 0;
  while (pieces.size() < most) {
    const std::size_t end = text.find(separator, start);
    pieces.push_back(text.substr(start, end == std::string::npos ? end : end - start));
    if (end == std::string::npos) {
      break;
    }
    start = end + 1;
  }
  return pieces;
}
