// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "ITag.h"

// Bit packing between byte buffers. Bit n of a buffer is bit n mod 8 (0 the
// least significant, mask 0x01) of byte n / 8. A negative start bit or a count
// below 1 touches nothing; null buffers are ignored. The caller provides
// buffers that hold every addressed bit.
namespace ProtUtilsN {

// The number of bytes that bits [startBit, startBit + bitCount) touch; 0 when
// they are no bits.
int GetLenOfBits(int startBit, int bitCount);

// Copies bits startBit.. of src into dst, each keeping its position within
// its byte: bit k of src goes to bit k mod 8 of dst byte k / 8 - startBit / 8.
// Only the copied bits of dst change.
void CopyBits(unsigned char* dst, const unsigned char* src, int startBit, int bitCount);

// One byte per bit: dst[i] = 1 if bit startBit + i of src is set, else 0.
void UnpackBits(unsigned char* dst, const unsigned char* src, int startBit, int bitCount);

// The inverse of UnpackBits: bit startBit + i of dst is set if src[i] is not
// 0, cleared if it is; no other bit of dst changes.
void PackBits(unsigned char* dst, const unsigned char* src, int startBit, int bitCount);

// Copies bitCount bits from bit srcStartBit of src to bit dstStartBit of dst;
// the other bits of dst keep their values.
void shiftBits(unsigned char* dst, int dstStartBit, const unsigned char* src, int srcStartBit,
               int bitCount);

// The tag's first bit: byte offset times 8, plus the bit index for a bit type.
// 0 for null.
int getStartingBit(const ITag* tag);

// The bit after the tag's last bit: the starting bit plus the variable length
// for a bit type (one host byte per bit), else plus the packed length times 8.
// 0 for null.
int getEndingBit(const ITag* tag);

}  // namespace ProtUtilsN
