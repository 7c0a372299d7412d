// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol2.h"

// Third generation: reads and writes of unrelated tags in one request.
class IProtocol3 : public IProtocol2 {
 public:
  virtual bool MultipleReadSupported(const ITag* tag) = 0;
  virtual int MultipleRead(const ITag* const* tags, int count, unsigned char* const* buffers,
                           idal_error_t* status) = 0;
  virtual bool MultipleWriteSupported(const ITag* tag) = 0;
  virtual int MultipleWrite(const ITag* const* tags, int count, const unsigned char* const* buffers,
                            idal_error_t* status) = 0;
};
