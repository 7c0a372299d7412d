// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol3.h"

// Fourth generation: node identity, bit blocks and read grouping hints.
// Called on the tag threads.
class IProtocol4 : public IProtocol3 {
 public:
  // The node number of the tag's address; 0 for a tag of another protocol.
  virtual int GetNodeID(const ITag* tag) = 0;
  // Whether Read takes the tag as a bit block (ReadBitBlock) rather than a
  // block of bytes.
  virtual bool CanReadBitBlock(const ITag* tag) = 0;
  // Reads bits bits from the tag's first bit into buffer, packed as on the
  // device. False on failure and when not supported.
  virtual bool ReadBitBlock(const ITag* tag, unsigned char* buffer, int bits) = 0;
  // A further interface of the protocol by name; null when there is none.
  virtual IInterface* GetInterface(const char* name) = 0;
  // The most unused device bytes the host may read across to join two tags
  // in one block; the framework's 0xFFFFFF sets no practical limit.
  virtual int MaxUnusedGap(const ITag* tag) = 0;
  // Whether a's byte offset is below b's (compared unsigned).
  virtual bool IsBefore(const ITag* a, const ITag* b) = 0;
  // Whether a begins at the bit right after b ends; the argument order is
  // deliberate.
  virtual bool IsAdjacent(const ITag* a, const ITag* b) = 0;
};
