// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol.h"

// Second generation: datagram grouping with per-tag status. Called on the
// tag threads, like IProtocol's reads.
class IProtocol2 : public IProtocol {
 public:
  // Whether newTag may join the count tags (tags[0] first) of one datagram
  // read. False for a count of 0, and when datagrams are not supported.
  virtual bool CanAddToDatagram(const ITag* const* tags, int count, const ITag* newTag) = 0;
  // ReadDatagram, then status[i] = 1 for each of the count tags on success.
  // False, with no status written, on failure and when not supported.
  virtual bool ReadDatagramWithStatus(const ITag* const* tags, int count, unsigned char* buffer,
                                      idal_error_t* status) = 0;
};
