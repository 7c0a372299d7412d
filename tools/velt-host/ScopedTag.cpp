// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/ScopedTag.h"

namespace velthost {

ScopedTag::ScopedTag(IProtocol& protocol, const std::string& uri)
    : protocol_(protocol), tag_(protocol.CreateTag(uri.c_str())) {}

ScopedTag::~ScopedTag() {
  if (tag_ != nullptr) {
    protocol_.FreeTag(tag_);
  }
}

ValueShape ScopedTag::Shape() const {
  ValueShape shape;
  if (tag_ != nullptr) {
    shape.type = tag_->GetVarType();
    shape.length = tag_->GetVarLength();
    shape.itemType = tag_->GetItemType();
  }
  return shape;
}

}  // namespace velthost
