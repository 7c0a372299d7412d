// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol6.h"

// Seventh generation: time-stamped reads, tag address fields and array items.
// Time stamps are milliseconds since the Unix epoch, taken from the host's
// clock after a successful read; a null ts is allowed and left alone. Called
// on the tag threads (the address-field queries on any thread).
class IProtocol7 : public IProtocol6 {
 public:
  // Whether the device supplies the tag's time stamps itself (false: the
  // protocol stamps reads with the host's clock).
  virtual bool hasPlcTimestamp(const ITag* tag) = 0;
  // Read, then *ts. False with the last error, ts untouched.
  virtual bool readWithTimestamp(const ITag* tag, unsigned char* dst, unsigned long long* ts) = 0;
  // ReadBlock, then *ts. False with the last error, ts untouched.
  virtual bool readBlockWithTimestamp(const ITag* tag, unsigned char* buffer, int length,
                                      unsigned long long* ts) = 0;
  // ReadDatagramWithStatus, then one time stamp in ts[i] for each of the
  // count tags. False on failure and when datagrams are not supported.
  virtual bool readDatagramWithTimestamp(const ITag* const* tags, int count, unsigned char* buffer,
                                         idal_error_t* status, unsigned long long* ts) = 0;
  // The number of fields of a tag's address text ("node", "memorytype",
  // "datatype": 3).
  virtual int getTagUriFieldCount() = 0;
  // The name of field index; null for an index below 0 or not below the
  // count. Constant text.
  virtual const char* getTagUriFieldName(int index) = 0;
  // The index of the field called name (exact, case-sensitive); -1 if none.
  virtual int getTagUriFieldPosition(const char* name) = 0;
  // Start of field `index` inside the tag's address text (fields separated
  // by "?"), not terminated at the field's end; *length receives the field's
  // length. Null when the address has fewer fields.
  virtual const char* getTagUriField(const ITag* tag, int index, int* length) = 0;
  // Reads item index of an array tag into dst (one item's host bytes).
  // False with error -1 "accessing an array item where the tag is not array"
  // or "accessing array item out of range", or the read's own error.
  virtual bool readArrayItem(const ITag* tag, int index, unsigned char* dst) = 0;
  // Replaces item index of an array tag from src: reads the whole array,
  // changes the item and writes the array back. Errors as readArrayItem,
  // or the write's own.
  virtual bool writeArrayItem(const ITag* tag, int index, const unsigned char* src) = 0;
  // ReadBitBlock, then *ts. False on failure and when bit blocks are not
  // supported.
  virtual bool readBitBlockWithTimestamp(const ITag* tag, unsigned char* buffer, int bits,
                                         unsigned long long* ts) = 0;
};
