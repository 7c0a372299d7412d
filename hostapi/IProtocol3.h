// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IProtocol2.h"

// Third generation: reads and writes of unrelated tags in one request.
// Called on the tag threads. This plug-in offers neither (false, 0).
class IProtocol3 : public IProtocol2 {
 public:
  // Whether tag may take part in MultipleRead.
  virtual bool MultipleReadSupported(const ITag* tag) = 0;
  // Reads count tags, each into its own buffers[i], with status[i] per tag;
  // returns the number read (0: none, or not supported).
  virtual int MultipleRead(const ITag* const* tags, int count, unsigned char* const* buffers,
                           idal_error_t* status) = 0;
  // Whether tag may take part in MultipleWrite.
  virtual bool MultipleWriteSupported(const ITag* tag) = 0;
  // Writes count tags, each from its own buffers[i], with status[i] per tag;
  // returns the number written (0: none, or not supported).
  virtual int MultipleWrite(const ITag* const* tags, int count, const unsigned char* const* buffers,
                            idal_error_t* status) = 0;
};
