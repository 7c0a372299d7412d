// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/Tag_VELT.h"

#include <cstdlib>
#include <vector>

#include "driver/Protocol_VELT.h"
#include "protlib/ProtUtilsN.h"

Tag_VELT::Tag_VELT(const char* uri_, Protocol_VELT* protocol) : uri(uri_ == nullptr ? "" : uri_) {
  // A false positive: valid is the first field, so as a member initialiser
  // the parse would run before uri and the fields it fills are initialised.
  // NOLINTNEXTLINE(cppcoreguidelines-prefer-member-initializer)
  valid = parseTagUrl(protocol) ? 1 : 0;
}

ITag* Tag_VELT::Clone() const { return new Tag_VELT(*this); }

int Tag_VELT::GetByteOffset() const {
  if (memoryType == nullptr) {
    return 0;
  }
  const ICU_Type natural = memoryType->getNaturalType();
  const int naturalLength = ProtUtilsN::GetDataLength(natural);
  if (!ProtUtilsN::IsBitType(varType)) {
    return offset * ProtUtilsN::GetBasicLength(this) + index * naturalLength;
  }
  if (!ProtUtilsN::IsBitType(natural)) {
    return index * naturalLength + offset / 8;
  }
  return index / 8;
}

int Tag_VELT::GetBitIndex() const {
  if (memoryType == nullptr) {
    return 0;
  }
  const int position = ProtUtilsN::IsBitType(memoryType->getNaturalType()) ? index : offset;
  return position % 8;
}

bool Tag_VELT::IsReadOnly() const { return memoryType != nullptr && memoryType->isReadOnly(); }

bool Tag_VELT::IsWriteOnly() const { return memoryType != nullptr && memoryType->isWriteOnly(); }

bool Tag_VELT::fail(const std::string& text) const {
  SetError(text.c_str());
  return false;
}

bool Tag_VELT::parseTagUrl(Protocol_VELT* protocol) {
  std::vector<std::string> fields;
  ProtUtilsN::ParseSubstrings(uri, fields, '?');
  if (fields.size() != 3) {
    return fail("there must be 3 tag specification fields");
  }
  const std::string& memoryTypeField = fields[1];
  const std::string& dataTypeField = fields[2];
  if (memoryTypeField.empty()) {
    return fail("memorytype field missing");
  }
  if (dataTypeField.empty()) {
    return fail("tavuType field missing");
  }
  return resolveNode(*protocol, fields[0]) && resolveMemoryType(*protocol, memoryTypeField) &&
         resolveDataType(dataTypeField);
}

bool Tag_VELT::resolveNode(const Protocol_VELT& protocol, const std::string& nodeField) {
  const _VELT::ParamManager& parameters = protocol.getParamManager();
  commonParams = parameters.getCommonParams();
  if (commonParams == nullptr) {
    return fail("Can't access protocol common parameters");
  }
  node = static_cast<std::int32_t>(std::strtol(nodeField.c_str(), nullptr, 0));
  nodeParams = parameters.getNodeParams(node);
  if (nodeParams == nullptr) {
    return fail("Can't access protocol node parameters");
  }
  return true;
}

bool Tag_VELT::resolveMemoryType(const Protocol_VELT& protocol, const std::string& field) {
  const MemoryManager& memory = protocol.getMemoryManager();
  model = memory.getModel(nodeParams->model);
  if (model == nullptr) {
    return fail("Can't access model");
  }
  memoryType = memory.getMemoryType(nodeParams->model, field);
  if (memoryType == nullptr) {
    return fail("Can't access memory type");
  }
  return true;
}

bool Tag_VELT::resolveDataType(const std::string& field) {
  int length = 0;
  if (!ProtUtilsN::GetTAVUType(field, varType, itemType, length, conversions) || length < 0) {
    return fail(field + ": data type unknown");
  }
  varLength = length;
  if ((ProtUtilsN::GetTypeFlag(GetVarType()) & memoryType->getTavuTypes()) == 0) {
    return fail("not allowed tavu type");
  }
  if (ProtUtilsN::GetDataLength(memoryType->getNaturalType()) == 0) {
    return fail("invalid natural data type for this memory type");
  }
  const std::string name = memoryType->getName();
  isRuntimeParameter = IsRuntimeParameter(name);
  memoryRole = ResolveMemory(name);
  return true;
}
