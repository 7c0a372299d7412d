// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "MemoryProtocolWithOverrides.h"

#include <cstring>

#include "protlib/BitUtils.h"
#include "protlib/DataTypes.h"

bool MemoryProtocolWithOverrides::ReadBitBlock(const ITag* tag, unsigned char* buffer, int bits) {
  ++bitBlockReads;
  lastBits = bits;
  if (failGroupReads) {
    SetError(-1, "device read failed");
    return false;
  }
  if (tag == nullptr || buffer == nullptr) {
    return false;
  }
  const int start = ProtUtilsN::IsBitType(tag) ? tag->GetBitIndex() : 0;
  if (!inRange(tag->GetByteOffset(), ProtUtilsN::GetLenOfBits(start, bits))) {
    return false;
  }
  ProtUtilsN::CopyBits(buffer, memory.data() + tag->GetByteOffset(), start, bits);
  return true;
}

bool MemoryProtocolWithOverrides::ReadDatagram(const ITag* const* tags, int count,
                                               unsigned char* buffer) {
  ++datagramReads;
  if (failGroupReads) {
    SetError(-1, "device read failed");
    return false;
  }
  if (tags == nullptr || buffer == nullptr || count < 0) {
    return false;
  }
  int position = 0;
  for (int i = 0; i < count; ++i) {
    const int length = tags[i]->PackedLen();
    if (!inRange(tags[i]->GetByteOffset(), length)) {
      return false;
    }
    std::memcpy(buffer + position, memory.data() + tags[i]->GetByteOffset(),
                static_cast<std::size_t>(length));
    position += length;
  }
  return true;
}
