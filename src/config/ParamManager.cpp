// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/ParamManager.h"

#include "config/CfgParserN.h"
#include "protlib/HexText.h"

namespace _VELT {

namespace {

using CfgParserN::readParam;

constexpr int kProtocolWide = CfgParser::ParamNoPrefix;
constexpr int kAnyNode = -1;
constexpr bool kMandatory = false;
constexpr bool kOptional = true;

template <typename T>
struct Same {
  using type = T;
};

// Stores the default into the field immediately before the read, so every
// parse starts the optional fields afresh and a failure leaves the fields
// after the failing key untouched.
template <typename T>
bool readWithDefault(CfgParser& parser, const char* name, T& field,
                     const typename Same<T>::type& defaultValue, std::string& error) {
  field = defaultValue;
  return readParam(parser, name, kAnyNode, field, kProtocolWide, kOptional, error);
}

}  // namespace

bool ParamManager::parse(const char* text) {
  CfgParser parser(text);
  if (parser.KnownFormat() == 0) {
    return fail("Parser: unknown format");
  }
  return readNodes(parser) && readCommon(parser);
}

bool ParamManager::readNodes(CfgParser& parser) {
  std::string error;
  defaultNode.nodeId = -1;
  if (!readParam(parser, "model", kAnyNode, defaultNode.model, 0, kMandatory, error)) {
    return fail(error);
  }
  for (int index = 0; index < parser.GetNodeCount(); ++index) {
    NodeParams node = defaultNode;
    node.nodeId = parser.GetNodeID(index);
    if (!readParam(parser, "model", node.nodeId, node.model, 0, kMandatory, error)) {
      return fail(error);
    }
    nodes.push_back(node);
  }
  return true;
}

bool ParamManager::readCommon(CfgParser& parser) {
  return readMandatory(parser) && readOptional(parser) && checkFraming();
}

bool ParamManager::readMandatory(CfgParser& parser) {
  std::string error;
  if (!readParam(parser, "socketType", kAnyNode, common.socketType, kProtocolWide, kMandatory,
                 error) ||
      !readParam(parser, "remoteIpAddress", kAnyNode, common.remoteIpAddress, kProtocolWide,
                 kMandatory, error) ||
      !readParam(parser, "remotePort", kAnyNode, common.remotePort, kProtocolWide, kMandatory,
                 error)) {
    return fail(error);
  }
  // Compared unsigned, so a negative port is out of range too.
  if (static_cast<unsigned int>(common.remotePort) > 65535U) {
    return fail("parameter 'remotePort' out of range");
  }
  return true;
}

bool ParamManager::readOptional(CfgParser& parser) {
  std::string error;
  if (!readWithDefault(parser, "localIpAddress", common.localIpAddress, "0.0.0.0", error) ||
      !readWithDefault(parser, "localPort", common.localPort, 0, error)) {
    return fail(error);
  }
  common.broadcastType = "Global";
  // A TCP channel has no broadcast: the key is not even read then. The
  // socket type was read by this parse just before, from the same text.
  if (common.socketType != "TCP" &&
      !readParam(parser, "broadcastType", kAnyNode, common.broadcastType, kProtocolWide, kOptional,
                 error)) {
    return fail(error);
  }
  if (!readWithDefault(parser, "rx_prefix", common.rx_prefix, "", error) ||
      !readWithDefault(parser, "rx_suffix", common.rx_suffix, "", error) ||
      !readWithDefault(parser, "gap", common.gap, 0, error) ||
      !readWithDefault(parser, "tx_prefix", common.tx_prefix, "", error) ||
      !readWithDefault(parser, "tx_suffix", common.tx_suffix, "", error) ||
      !readWithDefault(parser, "hex_tokens", common.hex_tokens, false, error) ||
      !readWithDefault(parser, "token_queue_size", common.token_queue_size, 100, error)) {
    return fail(error);
  }
  if (common.token_queue_size < 1 || common.token_queue_size > 10000) {
    return fail("parameter 'token_queue_size' out of range");
  }
  return true;
}

// Framing strings are always hexadecimal text, whatever hex_tokens says.
bool ParamManager::checkFraming() {
  if (!isHex(common.rx_prefix.c_str())) {
    return fail("rx_prefix not in hex format");
  }
  if (!isHex(common.rx_suffix.c_str())) {
    return fail("rx_suffix not in hex format");
  }
  if (!isHex(common.tx_prefix.c_str())) {
    return fail("tx_prefix not in hex format");
  }
  if (!isHex(common.tx_suffix.c_str())) {
    return fail("tx_suffix not in hex format");
  }
  return true;
}

bool ParamManager::fail(const std::string& text) {
  lastError = text;
  return false;
}

const NodeParams* ParamManager::getNodeParams(int node) const {
  for (const NodeParams& record : nodes) {
    if (record.nodeId == node) {
      return &record;
    }
  }
  return &defaultNode;
}

const CommonParams* ParamManager::getCommonParams() const { return &common; }

const std::string& ParamManager::getLastError() const { return lastError; }

const std::vector<NodeParams>& ParamManager::getNodes() const { return nodes; }

}  // namespace _VELT
