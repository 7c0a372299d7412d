// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The configuration string: the driver's parameter reading (ParamManager)
// and the parser's look-ups (CfgParser, readParam) and text utilities.
//
// Input: the configuration text up to the first zero byte; after it, extra
// parameter names to look up, separated by zero bytes.

#include <algorithm>
#include <cctype>
#include <cstdint>
#include <string>
#include <vector>

#include "Require.h"
#include "config/CfgParser.h"
#include "config/CfgParserN.h"
#include "config/ParamManager.h"
#include "protlib/HexText.h"
#include "protlib/TextUtils.h"

namespace {

// Every key the driver reads, plus a name that is never one.
const char* const kKeys[] = {
    "model",       "socketType",    "remoteIpAddress", "remotePort",       "localIpAddress",
    "localPort",   "broadcastType", "rx_prefix",       "rx_suffix",        "gap",
    "tx_prefix",   "tx_suffix",     "hex_tokens",      "token_queue_size", "CfgVer",
    "Node1::model"};

constexpr std::size_t kMostExtraNames = 8;
constexpr int kMostNodes = 4;

bool HasWhiteSpace(const std::string& text) {
  return std::any_of(text.begin(), text.end(),
                     [](char c) { return std::isspace(static_cast<unsigned char>(c)) != 0; });
}

void CheckCommon(const _VELT::ParamManager& manager) {
  const _VELT::CommonParams& common = *manager.getCommonParams();
  Require(common.remotePort >= 0 && common.remotePort <= 65535, "remotePort within 0..65535");
  Require(common.token_queue_size >= 1 && common.token_queue_size <= 10000,
          "token_queue_size within 1..10000");
  Require(isHex(common.rx_prefix.c_str()) && isHex(common.rx_suffix.c_str()) &&
              isHex(common.tx_prefix.c_str()) && isHex(common.tx_suffix.c_str()),
          "the framing strings are hexadecimal");
  if (common.socketType == "TCP") {
    Require(common.broadcastType == "Global", "a TCP channel keeps broadcastType Global");
  }
}

void CheckNodes(const _VELT::ParamManager& manager, const CfgParser& parser) {
  for (int i = 0; i < parser.GetNodeCount() && i < kMostNodes; ++i) {
    const int node = parser.GetNodeID(i);
    const _VELT::NodeParams* params = manager.getNodeParams(node);
    Require(params != nullptr && params->nodeId == node, "every listed node has its record");
  }
  const _VELT::NodeParams* fallback = manager.getNodeParams(-2);
  Require(fallback != nullptr && fallback->nodeId == -1, "an unknown node gets the default");
}

void CheckParamManager(const std::string& text) {
  _VELT::ParamManager manager;
  if (!manager.parse(text.c_str())) {
    Require(!manager.getLastError().empty(), "a failed parse says why");
    return;
  }
  CheckCommon(manager);
  const CfgParser parser(text.c_str());
  CheckNodes(manager, parser);
  // A second parse appends a second set of records; the first one answers.
  std::vector<std::string> models;
  for (int i = 0; i < parser.GetNodeCount() && i < kMostNodes; ++i) {
    models.push_back(manager.getNodeParams(parser.GetNodeID(i))->model);
  }
  Require(manager.parse(text.c_str()), "the same text parses twice");
  Require(manager.getNodes().size() == 2 * static_cast<std::size_t>(parser.GetNodeCount()),
          "a second parse appends one record per node");
  for (std::size_t i = 0; i < models.size(); ++i) {
    Require(manager.getNodeParams(parser.GetNodeID(static_cast<int>(i)))->model == models[i],
            "the earliest record of a node answers");
  }
}

template <typename T>
void CheckReadParam(CfgParser& parser, const std::string& name, int node, int flags,
                    bool optional) {
  T value{};
  std::string error;
  if (!CfgParserN::readParam(parser, name.c_str(), node, value, flags, optional, error)) {
    const std::string start = "Parser: parameter '" + name + "' ";
    Require(error.compare(0, start.size(), start) == 0, "readParam's error names the parameter");
  }
}

void CheckLookUp(CfgParser& parser, const std::string& name, int node) {
  const std::string untouched = "\x01untouched";
  for (int flags = 0; flags <= 3; ++flags) {
    std::string value = untouched;
    const CfgParser::parseResult result = parser.getParam(name.c_str(), node, value, flags);
    Require(result >= CfgParser::ParseOk && result <= CfgParser::ParseInvalidSpec &&
                result != CfgParser::ParseIllegalValue,
            "getParam answers a look-up result");
    Require((flags == 3) == (result == CfgParser::ParseInvalidSpec),
            "both flags, and only both, are refused as a bad flag combination");
    if (result == CfgParser::ParseOk) {
      Require(!HasWhiteSpace(value), "a value holds no white space");
    } else {
      Require(value == untouched, "a failed look-up copies nothing");
    }
  }
  // One flag set per node for the conversions keeps the run fast.
  const int flags = node < 0 ? 2 : node % 4;
  CheckReadParam<std::string>(parser, name, node, flags, node % 2 == 0);
  CheckReadParam<int>(parser, name, node, flags, false);
  CheckReadParam<bool>(parser, name, node, flags, true);
}

void CheckParser(const std::string& text, const std::vector<std::string>& names) {
  CfgParser parser(text.c_str());
  const int count = parser.GetNodeCount();
  if (parser.KnownFormat() == 0) {
    Require(count == 0, "an unknown format lists no nodes");
  }
  Require(parser.GetNodeID(count) == 0 && parser.GetNodeID(-1) == 0,
          "a node index out of range answers 0");
  std::vector<int> nodes = {-1, 0, 1, 7};
  for (int i = 0; i < count; ++i) {
    const int node = parser.GetNodeID(i);
    Require(std::count(nodes.begin() + 4, nodes.end(), node) == 0, "each node is listed once");
    nodes.push_back(node);
  }
  nodes.resize(std::min<std::size_t>(nodes.size(), 4 + kMostNodes));
  for (const std::string& name : names) {
    if (const char* plain = parser.GetParam(name.c_str())) {
      Require(!HasWhiteSpace(plain), "a plain value holds no white space");
    }
    for (const int node : nodes) {
      CheckLookUp(parser, name, node);
    }
  }
}

void CheckTextUtilities(const std::string& text, const std::vector<std::string>& names) {
  std::vector<std::string> pieces{"kept"};
  ProtUtilsN::ParseSubstrings(text, pieces, ' ');
  Require(pieces.front() == "kept", "ParseSubstrings appends");
  Require(pieces.size() == 2 + static_cast<std::size_t>(std::count(text.begin(), text.end(), ' ')),
          "one piece more than separators");
  const std::string trimmed = ProtUtilsN::GetTrim(text);
  Require(trimmed.empty() || (trimmed.front() != ' ' && trimmed.front() != '\t' &&
                              trimmed.back() != ' ' && trimmed.back() != '\t'),
          "a trimmed text has no blank or tab at its ends");
  for (const std::string& name : names) {
    std::string value = "\x01untouched";
    if (ProtUtilsN::GetConfigValue(text.c_str(), name.c_str(), value)) {
      Require(std::all_of(value.begin(), value.end(),
                          [](char c) { return std::isalnum(static_cast<unsigned char>(c)) != 0; }),
              "GetConfigValue keeps letters and digits only");
    } else {
      Require(value == "\x01untouched", "GetConfigValue leaves a missing value alone");
    }
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string input(reinterpret_cast<const char*>(data), size);
  const std::size_t end = input.find('\0');
  const std::string text = input.substr(0, end);
  std::vector<std::string> names(std::begin(kKeys), std::end(kKeys));
  if (end != std::string::npos) {
    std::vector<std::string> extra;
    ProtUtilsN::ParseSubstrings(input.substr(end + 1), extra, '\0');
    extra.resize(std::min(extra.size(), kMostExtraNames));
    names.insert(names.end(), extra.begin(), extra.end());
  }
  CheckParamManager(text);
  CheckParser(text, names);
  CheckTextUtilities(text, names);
  return 0;
}
