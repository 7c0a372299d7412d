// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol.h"

// Second generation: datagram grouping with per-tag status.
class IProtocol2 : public IProtocol {
 public:
  virtual bool CanAddToDatagram(const ITag* const* tags, int count, const ITag* newTag) = 0;
  virtual bool ReadDatagramWithStatus(const ITag* const* tags, int count, unsigned char* buffer,
                                      idal_error_t* status) = 0;
};
