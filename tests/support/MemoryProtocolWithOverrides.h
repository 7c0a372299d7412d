// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "MemoryProtocol.h"

// The memory protocol with the optional operations that change the base's
// read and datagram paths: bit-block reads and datagram reads. Each records
// how often it ran; the answers of the grouping questions are set by the test.
// ReadDatagramWithStatus and Read stay the base's.
class MemoryProtocolWithOverrides : public MemoryProtocol {
 public:
  MemoryProtocolWithOverrides() = default;
  MemoryProtocolWithOverrides(const MemoryProtocolWithOverrides&) = delete;
  MemoryProtocolWithOverrides& operator=(const MemoryProtocolWithOverrides&) = delete;
  MemoryProtocolWithOverrides(MemoryProtocolWithOverrides&&) = delete;
  MemoryProtocolWithOverrides& operator=(MemoryProtocolWithOverrides&&) = delete;
  ~MemoryProtocolWithOverrides() override = default;

  bool CanReadBitBlock(const ITag* /*tag*/) override { return bitBlocks; }
  // Copies bits from bit GetBitIndex() of the tag's first memory byte into
  // buffer, each at its position within its byte (device layout).
  bool ReadBitBlock(const ITag* tag, unsigned char* buffer, int bits) override;
  bool CanCoexistInDatagram(const ITag* /*tag1*/, const ITag* /*tag2*/) override { return coexist; }
  int MaxDatagramItems(const ITag* /*tag*/) override { return maxItems; }
  int MaxDatagramLength(const ITag* /*tag*/) override { return maxLength; }
  // Each tag's PackedLen() bytes of memory, one after the other.
  bool ReadDatagram(const ITag* const* tags, int count, unsigned char* buffer) override;

  bool bitBlocks = true;
  bool coexist = true;
  int maxItems = 8;
  int maxLength = 64;
  // While set, ReadBitBlock and ReadDatagram fail with error -1
  // "device read failed".
  bool failGroupReads = false;

  int bitBlockReads = 0;
  int lastBits = -1;
  int datagramReads = 0;
};
