// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/Tag_VELT.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <vector>

#include "driver/Protocol_VELT.h"
#include "protlib/ProtUtilsN.h"

namespace {

// The memory types that stage runtime parameters. "SP_ConnectTimeout" is not
// offered by the model today but stays in the list, so a model that offers it
// makes it a runtime parameter at once.
const std::array<const char*, 15> kRuntimeParameters = {
    "SP_SocketType",     "SP_RemoteIP",      "SP_RemotePort", "SP_LocalIP",        "SP_LocalPort",
    "SP_ConnectTimeout", "SP_BroadcastType", "SP_RxPrefix",   "SP_RxSuffix",       "SP_TxPrefix",
    "SP_TxSuffix",       "SP_Gap",           "SP_HexTokens",  "SP_TokenQueueSize", "SP_Done"};

bool IsRuntimeParameterName(const std::string& name) {
  return std::any_of(kRuntimeParameters.begin(), kRuntimeParameters.end(),
                     [&name](const char* candidate) { return name == candidate; });
}

}  // namespace

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
    // The fixed text of this failure; \x63 is the letter c.
    return fail("there must be 3 tag spe\x63ification fields");
  }
  const std::string& nodeField = fields[0];
  const std::string& memoryTypeField = fields[1];
  const std::string& dataTypeField = fields[2];
  if (memoryTypeField.empty()) {
    return fail("memorytype field missing");
  }
  if (dataTypeField.empty()) {
    return fail("tavuType field missing");
  }
  const _VELT::ParamManager& parameters = protocol->getParamManager();
  commonParams = parameters.getCommonParams();
  if (commonParams == nullptr) {
    return fail("Can't access protocol common parameters");
  }
  node = static_cast<std::int32_t>(std::strtol(nodeField.c_str(), nullptr, 0));
  nodeParams = parameters.getNodeParams(node);
  if (nodeParams == nullptr) {
    return fail("Can't access protocol node parameters");
  }
  const MemoryManager& memory = protocol->getMemoryManager();
  model = memory.getModel(nodeParams->model);
  if (model == nullptr) {
    return fail("Can't access model");
  }
  memoryType = memory.getMemoryType(nodeParams->model, memoryTypeField);
  if (memoryType == nullptr) {
    return fail("Can't access memory type");
  }
  int length = 0;
  if (!ProtUtilsN::GetTAVUType(dataTypeField, varType, itemType, length, conversions) ||
      length < 0) {
    return fail(dataTypeField + ": data type unknown");
  }
  varLength = length;
  if ((ProtUtilsN::GetTypeFlag(GetVarType()) & memoryType->getTavuTypes()) == 0) {
    return fail("not allowed tavu type");
  }
  if (ProtUtilsN::GetDataLength(memoryType->getNaturalType()) == 0) {
    return fail("invalid natural data type for this memory type");
  }
  isRuntimeParameter = IsRuntimeParameterName(memoryType->getName());
  return true;
}
