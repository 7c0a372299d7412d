// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <string>

#include "config/CommonParams.h"
#include "config/NodeParams.h"
#include "driver/ChannelMemory.h"
#include "memory/MemoryType.h"
#include "memory/Model.h"
#include "protlib/TagBase.h"

class Protocol_VELT;

// A tag of the token driver. Its address is "node?memorytype?datatype"; the
// constructor resolves every field once against the protocol's parameters and
// memory model, and from then on the read and write paths use the resolved
// pointers. A tag always addresses a whole memory type: index and offset are
// always 0. The memory type's role on the channel is resolved with the
// address too, so reads and writes dispatch on it without comparing names.
// A tag borrows from its protocol and must not outlive it.
class Tag_VELT final : public TagBase {
 public:
  Tag_VELT(const char* uri, Protocol_VELT* protocol);
  Tag_VELT(const Tag_VELT&) = default;
  Tag_VELT& operator=(const Tag_VELT&) = delete;
  Tag_VELT(Tag_VELT&&) = delete;
  Tag_VELT& operator=(Tag_VELT&&) = delete;
  ~Tag_VELT() override = default;

  // A copy of every field; nothing is parsed again.
  ITag* Clone() const override;
  int GetByteOffset() const override;
  int GetBitIndex() const override;
  const char* GetVarName() const override { return uri.c_str(); }
  ICU_Type GetVarType() const override { return varType; }
  int GetVarLength() const override { return varLength; }
  ICU_Type GetItemType() const override { return itemType; }
  bool IsReadOnly() const override;
  bool IsWriteOnly() const override;

  bool IsValid() const { return valid != 0; }

  const MemoryType* getMemoryType() const { return memoryType; }
  int getNode() const { return node; }
  int getIndex() const { return index; }
  int getOffset() const { return offset; }
  const _VELT::NodeParams* getNodeParams() const { return nodeParams; }
  bool getIsRuntimeParameter() const { return isRuntimeParameter; }
  // What the memory type does on the channel, resolved with the address.
  MemoryRole getMemoryRole() const { return memoryRole; }

 private:
  bool parseTagUrl(Protocol_VELT* protocol);
  // The steps of the parse, in their order: the node and its parameters;
  // the model and the memory type; the data type, checked against the
  // memory type, and the memory type's role.
  bool resolveNode(const Protocol_VELT& protocol, const std::string& nodeField);
  bool resolveMemoryType(const Protocol_VELT& protocol, const std::string& field);
  bool resolveDataType(const std::string& field);
  bool fail(const std::string& text) const;

  std::int32_t valid = 0;
  std::string uri;
  std::int32_t node = 0;
  ICU_Type varType = ICU_NONE;
  std::int32_t varLength = 0;
  ICU_Type itemType = ICU_NONE;
  std::int32_t index = 0;
  std::int32_t offset = 0;
  const MemoryType* memoryType = nullptr;
  const _VELT::NodeParams* nodeParams = nullptr;
  const _VELT::CommonParams* commonParams = nullptr;
  const Model* model = nullptr;
  bool isRuntimeParameter = false;
  MemoryRole memoryRole;
};
