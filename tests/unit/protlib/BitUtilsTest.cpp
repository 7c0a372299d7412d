// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/BitUtils.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <vector>

#include "TestTagBase.h"

using ProtUtilsN::CopyBits;
using ProtUtilsN::GetLenOfBits;
using ProtUtilsN::PackBits;
using ProtUtilsN::shiftBits;
using ProtUtilsN::UnpackBits;

namespace {

using Bytes = std::vector<unsigned char>;

bool BitOf(const Bytes& buffer, int bit) { return ((buffer[bit / 8] >> (bit % 8)) & 1) != 0; }

}  // namespace

TEST(GetLenOfBits, CountsTouchedBytes) {
  EXPECT_EQ(GetLenOfBits(7, 2), 2);
  EXPECT_EQ(GetLenOfBits(8, 8), 1);
  EXPECT_EQ(GetLenOfBits(0, 1), 1);
  EXPECT_EQ(GetLenOfBits(0, 8), 1);
  EXPECT_EQ(GetLenOfBits(0, 9), 2);
  EXPECT_EQ(GetLenOfBits(3, 22), 4);
}

TEST(GetLenOfBits, NoBitsTouchNoBytes) {
  EXPECT_EQ(GetLenOfBits(0, 0), 0);
  EXPECT_EQ(GetLenOfBits(8, 0), 0);
  EXPECT_EQ(GetLenOfBits(3, -2), 0);
  EXPECT_EQ(GetLenOfBits(-1, 4), 0);
}

TEST(PackBits, ThreeBitsFromBitSixTouchOnlyThoseBits) {
  Bytes dst{0x00, 0x00, 0x00};
  const Bytes ones{1, 1, 1};
  PackBits(dst.data(), ones.data(), 6, 3);
  EXPECT_EQ(dst, (Bytes{0xC0, 0x01, 0x00}));
  Bytes full{0xFF, 0xFF, 0xFF};
  const Bytes zeros{0, 0, 0};
  PackBits(full.data(), zeros.data(), 6, 3);
  EXPECT_EQ(full, (Bytes{0x3F, 0xFE, 0xFF}));
}

TEST(PackBits, NonZeroSourceByteSetsTheBit) {
  Bytes dst{0x00};
  const Bytes src{0x80, 0x00, 0x02};
  PackBits(dst.data(), src.data(), 1, 3);
  EXPECT_EQ(dst, (Bytes{0x0A}));
}

TEST(UnpackBits, WritesOneByteOfZeroOrOnePerBit) {
  const Bytes src{0xA5, 0x01};
  Bytes dst(6, 0x77);
  UnpackBits(dst.data(), src.data(), 5, 4);
  EXPECT_EQ(dst, (Bytes{1, 0, 1, 1, 0x77, 0x77}));
}

TEST(PackUnpack, PackAfterUnpackRestoresTouchedBitsOnly) {
  const Bytes pattern{0x5A, 0xC3, 0x96, 0x0F, 0xE1, 0x3C, 0x81};
  for (int start = 0; start <= 15; ++start) {
    for (int count = 0; count <= 24; ++count) {
      SCOPED_TRACE(testing::Message() << "start " << start << " count " << count);
      Bytes unpacked(24, 0xEE);
      UnpackBits(unpacked.data(), pattern.data(), start, count);
      // Pack into an inverted copy: the touched bits must come back, the
      // others must stay inverted.
      Bytes target(pattern.size());
      for (std::size_t i = 0; i < pattern.size(); ++i) {
        target[i] = static_cast<unsigned char>(~pattern[i]);
      }
      PackBits(target.data(), unpacked.data(), start, count);
      for (int bit = 0; bit < static_cast<int>(pattern.size()) * 8; ++bit) {
        const bool touched = bit >= start && bit < start + count;
        EXPECT_EQ(BitOf(target, bit), touched ? BitOf(pattern, bit) : !BitOf(pattern, bit))
            << "bit " << bit;
      }
      for (int i = count; i < 24; ++i) {
        EXPECT_EQ(unpacked[i], 0xEE) << "unpacked byte " << i;
      }
    }
  }
}

TEST(CopyBits, KeepsBitPositionWithinByteRelativeToFirstByte) {
  const Bytes src{0x00, 0xFF, 0xFF, 0x00};
  Bytes dst{0x00, 0x00};
  CopyBits(dst.data(), src.data(), 12, 8);
  // Bits 12..19 of src land on bits 4..11 of dst.
  EXPECT_EQ(dst, (Bytes{0xF0, 0x0F}));
}

TEST(CopyBits, OnlyCopiedBitsChange) {
  const Bytes src{0x00, 0x00};
  Bytes dst{0xFF, 0xFF};
  CopyBits(dst.data(), src.data(), 3, 7);
  EXPECT_EQ(dst, (Bytes{0x07, 0xFC}));
}

TEST(ShiftBits, MovesBitsBetweenAnyPositions) {
  const Bytes src{0x0F};
  Bytes dst{0x00, 0x00};
  shiftBits(dst.data(), 6, src.data(), 0, 4);
  EXPECT_EQ(dst, (Bytes{0xC0, 0x03}));
  Bytes back{0xFF};
  const Bytes zero{0x00, 0x00};
  shiftBits(back.data(), 2, zero.data(), 9, 3);
  EXPECT_EQ(back, (Bytes{0xE3}));
}

TEST(BitFunctions, NoBitsOrNegativePositionsTouchNothing) {
  const Bytes src{0xFF, 0xFF};
  Bytes dst{0x00, 0x00};
  PackBits(dst.data(), src.data(), 0, 0);
  UnpackBits(dst.data(), src.data(), 0, 0);
  CopyBits(dst.data(), src.data(), 0, 0);
  shiftBits(dst.data(), 0, src.data(), 0, 0);
  PackBits(dst.data(), src.data(), -1, 4);
  UnpackBits(dst.data(), src.data(), -3, 1);
  CopyBits(dst.data(), src.data(), 2, -5);
  shiftBits(dst.data(), -1, src.data(), 0, 4);
  shiftBits(dst.data(), 0, src.data(), -1, 4);
  PackBits(nullptr, src.data(), 0, 4);
  UnpackBits(dst.data(), nullptr, 0, 4);
  EXPECT_EQ(dst, (Bytes{0x00, 0x00}));
}

TEST(StartingBit, ByteOffsetTimesEightPlusBitIndexForBitTypes) {
  TestTagBase bit(ICU_BOOLEAN, 1);
  bit.setByteOffset(3);
  bit.setBitIndex(5);
  EXPECT_EQ(ProtUtilsN::getStartingBit(&bit), 29);
  EXPECT_EQ(ProtUtilsN::getEndingBit(&bit), 30);
  TestTagBase bits(ICU_BOOLEAN_ARRAY, 10, ICU_BOOLEAN);
  bits.setByteOffset(1);
  bits.setBitIndex(2);
  EXPECT_EQ(ProtUtilsN::getStartingBit(&bits), 10);
  EXPECT_EQ(ProtUtilsN::getEndingBit(&bits), 20);
}

TEST(StartingBit, NonBitTypeIgnoresBitIndexAndUsesPackedLength) {
  TestTagBase word(ICU_UNSIGNED_SHORT, 2);
  word.setByteOffset(4);
  word.setBitIndex(3);
  EXPECT_EQ(ProtUtilsN::getStartingBit(&word), 32);
  EXPECT_EQ(ProtUtilsN::getEndingBit(&word), 48);
  word.setPackedLen(3);
  EXPECT_EQ(ProtUtilsN::getEndingBit(&word), 56);
  EXPECT_EQ(ProtUtilsN::getStartingBit(nullptr), 0);
  EXPECT_EQ(ProtUtilsN::getEndingBit(nullptr), 0);
}
