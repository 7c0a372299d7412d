// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol4.h"

// Fifth generation: write grouping and bit-block writes. Called on the tag
// threads. This plug-in offers none of them (false).
class IProtocol5 : public IProtocol4 {
 public:
  // Whether the host must read the tag before writing it.
  virtual bool NeedsReadBeforeWrite(const ITag* tag) = 0;
  // Whether the tag may be written in a datagram.
  virtual bool CanWriteDatagrams(const ITag* tag) = 0;
  // Whether newTag may join the count tags of one datagram write.
  virtual bool CanAddToWriteDatagram(const ITag* const* tags, int count, const ITag* newTag) = 0;
  // Writes count tags in one request from buffer, with status[i] per tag.
  // False on failure and when not supported.
  virtual bool WriteDatagramWithStatus(const ITag* const* tags, int count,
                                       const unsigned char* buffer, idal_error_t* status) = 0;
  // Whether Write may take the tag as a bit block (WriteBitBlock).
  virtual bool CanWriteBitBlock(const ITag* tag) = 0;
  // Writes bits bits from buffer, packed as on the device, from the tag's
  // first bit. False on failure and when not supported.
  virtual bool WriteBitBlock(const ITag* tag, const unsigned char* buffer, int bits) = 0;
};
