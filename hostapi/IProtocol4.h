// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol3.h"

// Fourth generation: node identity, bit blocks and read grouping hints.
class IProtocol4 : public IProtocol3 {
 public:
  virtual int GetNodeID(const ITag* tag) = 0;
  virtual bool CanReadBitBlock(const ITag* tag) = 0;
  virtual bool ReadBitBlock(const ITag* tag, unsigned char* buffer, int bits) = 0;
  virtual IInterface* GetInterface(const char* name) = 0;
  virtual int MaxUnusedGap(const ITag* tag) = 0;
  virtual bool IsBefore(const ITag* a, const ITag* b) = 0;
  virtual bool IsAdjacent(const ITag* a, const ITag* b) = 0;
};
