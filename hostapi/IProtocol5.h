// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol4.h"

// Fifth generation: write grouping and bit-block writes.
class IProtocol5 : public IProtocol4 {
 public:
  virtual bool NeedsReadBeforeWrite(const ITag* tag) = 0;
  virtual bool CanWriteDatagrams(const ITag* tag) = 0;
  virtual bool CanAddToWriteDatagram(const ITag* const* tags, int count, const ITag* newTag) = 0;
  virtual bool WriteDatagramWithStatus(const ITag* const* tags, int count,
                                       const unsigned char* buffer, idal_error_t* status) = 0;
  virtual bool CanWriteBitBlock(const ITag* tag) = 0;
  virtual bool WriteBitBlock(const ITag* tag, const unsigned char* buffer, int bits) = 0;
};
