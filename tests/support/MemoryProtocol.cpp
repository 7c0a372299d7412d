// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "MemoryProtocol.h"

#include <cstdlib>
#include <cstring>
#include <memory>

#include "TestTagBase.h"
#include "protlib/DataTypes.h"
#include "protlib/TextUtils.h"

namespace {

// A whole decimal number, or -1.
int ParseIndex(const std::string& text) {
  if (text.empty() || text.size() > 6 ||
      text.find_first_not_of("0123456789") != std::string::npos) {
    return -1;
  }
  return std::atoi(text.c_str());
}

// Builds the tag from the fields; false with the tag's error text set.
bool ParseAddress(TestTagBase& tag, const std::string& uri) {
  std::vector<std::string> fields;
  ProtUtilsN::ParseSubstrings(uri, fields, '?');
  if (fields.size() != 2 && fields.size() != 3) {
    tag.SetError("address must be offset?datatype[?bit]");
    return false;
  }
  const int offset = ParseIndex(fields[0]);
  if (offset < 0) {
    tag.SetError("bad offset");
    return false;
  }
  ICU_Type type = ICU_NONE;
  ICU_Type itemType = ICU_NONE;
  int length = 0;
  if (!ProtUtilsN::GetTAVUType(fields[1], type, itemType, length, tag.conversionList())) {
    tag.SetError((fields[1] + ": data type unknown").c_str());
    return false;
  }
  tag.setType(type, length, itemType);
  tag.setByteOffset(offset);
  if (fields.size() == 3) {
    const int bit = ParseIndex(fields[2]);
    if (bit < 0 || bit > 7) {
      tag.SetError("bad bit index");
      return false;
    }
    tag.setBitIndex(bit);
  }
  return true;
}

}  // namespace

TagBase* MemoryProtocol::CreateTagBase(const char* uri) {
  auto tag = std::make_unique<TestTagBase>();
  tag->setVarName(uri == nullptr ? "" : uri);
  if (!ParseAddress(*tag, tag->GetVarName())) {
    SetTagError(tag.get());
    return nullptr;
  }
  return tag.release();
}

bool MemoryProtocol::inRange(int offset, long long length) {
  if (offset < 0 || length < 0 || offset + length > static_cast<long long>(memory.size())) {
    SetError(-1, "address out of range");
    return false;
  }
  return true;
}

bool MemoryProtocol::ReadBlock(const ITag* tag, unsigned char* buffer, int length) {
  ++blockReadCount;
  lastReadLength = length;
  if (failReads) {
    SetError(-1, "device read failed");
    return false;
  }
  if (tag == nullptr || buffer == nullptr || !inRange(tag->GetByteOffset(), length)) {
    return false;
  }
  std::memcpy(buffer, memory.data() + tag->GetByteOffset(), static_cast<std::size_t>(length));
  return true;
}

bool MemoryProtocol::Write(const ITag* tag, const unsigned char* data) {
  ++writeCount;
  if (failWrites) {
    SetError(-1, "device write failed");
    return false;
  }
  if (tag == nullptr || data == nullptr || !inRange(tag->GetByteOffset(), tag->PackedLen())) {
    return false;
  }
  if (!tag->ConvertVariable(data, memory.data() + tag->GetByteOffset(), true)) {
    SetError(-9, "write conversion error");
    return false;
  }
  return true;
}
