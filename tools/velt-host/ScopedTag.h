// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

#include "IProtocol.h"
#include "ITag.h"
#include "velt-host/ValueShape.h"

namespace velthost {

// A tag created from its address for one operation and freed through its
// protocol when the object goes, as the host frees tags it no longer needs.
class ScopedTag {
 public:
  // Creates the tag; Get() is null when the protocol refused the address
  // (its last error tells why).
  ScopedTag(IProtocol& protocol, const std::string& uri);
  ScopedTag(const ScopedTag&) = delete;
  ScopedTag& operator=(const ScopedTag&) = delete;
  ScopedTag(ScopedTag&&) = delete;
  ScopedTag& operator=(ScopedTag&&) = delete;
  ~ScopedTag();

  ITag* Get() const { return tag_; }
  ValueShape Shape() const;

 private:
  IProtocol& protocol_;
  ITag* tag_;
};

}  // namespace velthost
