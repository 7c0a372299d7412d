// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol6.h"

// Seventh generation: time-stamped reads, tag address fields and array items.
// Time stamps are milliseconds since the Unix epoch.
class IProtocol7 : public IProtocol6 {
 public:
  virtual bool hasPlcTimestamp(const ITag* tag) = 0;
  virtual bool readWithTimestamp(const ITag* tag, unsigned char* dst, unsigned long long* ts) = 0;
  virtual bool readBlockWithTimestamp(const ITag* tag, unsigned char* buffer, int length,
                                      unsigned long long* ts) = 0;
  virtual bool readDatagramWithTimestamp(const ITag* const* tags, int count, unsigned char* buffer,
                                         idal_error_t* status, unsigned long long* ts) = 0;
  virtual int getTagUriFieldCount() = 0;
  virtual const char* getTagUriFieldName(int index) = 0;
  virtual int getTagUriFieldPosition(const char* name) = 0;
  // Start of field `index` inside the tag's address text; *length receives
  // the field's length. Null when the address has fewer fields.
  virtual const char* getTagUriField(const ITag* tag, int index, int* length) = 0;
  virtual bool readArrayItem(const ITag* tag, int index, unsigned char* dst) = 0;
  virtual bool writeArrayItem(const ITag* tag, int index, const unsigned char* src) = 0;
  virtual bool readBitBlockWithTimestamp(const ITag* tag, unsigned char* buffer, int bits,
                                         unsigned long long* ts) = 0;
};
