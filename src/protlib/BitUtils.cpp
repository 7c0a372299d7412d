// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/BitUtils.h"

#include <cstddef>

#include "protlib/DataTypes.h"

namespace ProtUtilsN {

namespace {

bool TestBit(const unsigned char* buffer, std::size_t bit) {
  return (buffer[bit / 8] & (1U << (bit % 8))) != 0;
}

void AssignBit(unsigned char* buffer, std::size_t bit, bool set) {
  const auto mask = static_cast<unsigned char>(1U << (bit % 8));
  if (set) {
    buffer[bit / 8] = static_cast<unsigned char>(buffer[bit / 8] | mask);
  } else {
    buffer[bit / 8] = static_cast<unsigned char>(buffer[bit / 8] & ~mask);
  }
}

// A walk over no bits, or from a position before the buffer, does nothing.
bool Walkable(int startBit, int bitCount) { return startBit >= 0 && bitCount > 0; }

}  // namespace

int GetLenOfBits(int startBit, int bitCount) {
  if (!Walkable(startBit, bitCount)) {
    return 0;
  }
  const long long lastBit = static_cast<long long>(startBit) + bitCount - 1;
  return static_cast<int>(lastBit / 8 - startBit / 8 + 1);
}

void CopyBits(unsigned char* dst, const unsigned char* src, int startBit, int bitCount) {
  if (dst == nullptr || src == nullptr || !Walkable(startBit, bitCount)) {
    return;
  }
  const auto first = static_cast<std::size_t>(startBit);
  const std::size_t base = first / 8 * 8;
  for (std::size_t k = first; k < first + static_cast<std::size_t>(bitCount); ++k) {
    AssignBit(dst, k - base, TestBit(src, k));
  }
}

void UnpackBits(unsigned char* dst, const unsigned char* src, int startBit, int bitCount) {
  if (dst == nullptr || src == nullptr || !Walkable(startBit, bitCount)) {
    return;
  }
  const auto first = static_cast<std::size_t>(startBit);
  for (std::size_t i = 0; i < static_cast<std::size_t>(bitCount); ++i) {
    dst[i] = TestBit(src, first + i) ? 1 : 0;
  }
}

void PackBits(unsigned char* dst, const unsigned char* src, int startBit, int bitCount) {
  if (dst == nullptr || src == nullptr || !Walkable(startBit, bitCount)) {
    return;
  }
  const auto first = static_cast<std::size_t>(startBit);
  for (std::size_t i = 0; i < static_cast<std::size_t>(bitCount); ++i) {
    AssignBit(dst, first + i, src[i] != 0);
  }
}

void shiftBits(unsigned char* dst, int dstStartBit, const unsigned char* src, int srcStartBit,
               int bitCount) {
  if (dst == nullptr || src == nullptr || dstStartBit < 0 || !Walkable(srcStartBit, bitCount)) {
    return;
  }
  const auto dstFirst = static_cast<std::size_t>(dstStartBit);
  const auto srcFirst = static_cast<std::size_t>(srcStartBit);
  for (std::size_t i = 0; i < static_cast<std::size_t>(bitCount); ++i) {
    AssignBit(dst, dstFirst + i, TestBit(src, srcFirst + i));
  }
}

int getStartingBit(const ITag* tag) {
  if (tag == nullptr) {
    return 0;
  }
  // Wide arithmetic: an absurd offset must not overflow.
  long long bit = static_cast<long long>(tag->GetByteOffset()) * 8;
  if (IsBitType(tag)) {
    bit += tag->GetBitIndex();
  }
  return static_cast<int>(bit);
}

int getEndingBit(const ITag* tag) {
  if (tag == nullptr) {
    return 0;
  }
  const long long start = getStartingBit(tag);
  const long long span = IsBitType(tag) ? static_cast<long long>(tag->GetVarLength())
                                        : static_cast<long long>(tag->PackedLen()) * 8;
  return static_cast<int>(start + span);
}

}  // namespace ProtUtilsN
