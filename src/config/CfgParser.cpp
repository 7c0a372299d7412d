// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/CfgParser.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cerrno>
#include <climits>
#include <cstdlib>

#include "protlib/TextUtils.h"

namespace {

const char* const kMarker = "CfgVer=1";
const char* const kAnyVersion = "CfgVer=";
const char* const kNode = "Node";
const char* const kSeparator = "::";

bool isBlank(char c) { return std::isspace(static_cast<unsigned char>(c)) != 0; }

bool allDigits(const std::string& text) {
  return std::all_of(text.begin(), text.end(),
                     [](char c) { return std::isdigit(static_cast<unsigned char>(c)) != 0; });
}

// "Node<number>::"; the number as itoa writes it, so without leading zeros.
// A negative number keeps its sign so that it never reads as another node.
std::string nodePrefix(int node) {
  std::array<char, 12> digits{};
  ProtUtilsN::itoa(node, digits.data(), 10);
  return std::string(kNode) + (node < 0 ? "-" : "") + digits.data() + kSeparator;
}

}  // namespace

CfgParser::CfgParser(const char* text) : cfgText(text == nullptr ? "" : text) {
  selectSection();
  if (knownFormat != 0) {
    scanNodes();
  }
}

void CfgParser::selectSection() {
  const std::string::size_type marker = cfgText.find(kMarker);
  if (marker == std::string::npos) {
    knownFormat = 0;
    return;
  }
  knownFormat = 1;
  const std::string::size_type begin = marker + std::char_traits<char>::length(kMarker);
  const std::string::size_type next = cfgText.find(kAnyVersion, begin);
  cfgText = next == std::string::npos ? cfgText.substr(begin) : cfgText.substr(begin, next - begin);
}

// Every "Node<digits>::" registers its number, wherever it stands: inside a
// value or a longer word too.
void CfgParser::scanNodes() {
  const std::string::size_type nodeLength = std::char_traits<char>::length(kNode);
  std::string::size_type from = 0;
  for (;;) {
    const std::string::size_type node = cfgText.find(kNode, from);
    if (node == std::string::npos) {
      return;
    }
    const std::string::size_type digitsBegin = node + nodeLength;
    const std::string::size_type separator = cfgText.find(kSeparator, digitsBegin);
    if (separator == std::string::npos) {
      return;
    }
    const std::string digits = cfgText.substr(digitsBegin, separator - digitsBegin);
    if (!allDigits(digits)) {
      from = node + nodeLength;
      continue;
    }
    errno = 0;
    const long number = std::strtol(digits.c_str(), nullptr, 10);
    // A number beyond int cannot be asked for, so it is not listed.
    if (errno != ERANGE && number <= INT_MAX) {
      addNode(static_cast<int>(number));
    }
    from = separator;
  }
}

void CfgParser::addNode(int node) {
  if (std::find(nodeIds.begin(), nodeIds.end(), node) == nodeIds.end()) {
    nodeIds.push_back(node);
  }
}

int CfgParser::KnownFormat() const { return knownFormat; }

int CfgParser::GetNodeCount() const { return static_cast<int>(nodeIds.size()); }

int CfgParser::GetNodeID(int index) const {
  if (index < 0 || index >= GetNodeCount()) {
    return 0;
  }
  return nodeIds[static_cast<std::size_t>(index)];
}

const char* CfgParser::GetParam(const char* name) {
  if (name == nullptr) {
    return nullptr;
  }
  const std::string pattern = std::string(name) + "=";
  std::string::size_type found = cfgText.find(pattern);
  while (found != std::string::npos && found != 0 && !isBlank(cfgText[found - 1])) {
    found = cfgText.find(pattern, found + 1);
  }
  if (found == std::string::npos) {
    return nullptr;
  }
  const std::string::size_type begin = found + pattern.size();
  std::string::size_type end = begin;
  while (end < cfgText.size() && !isBlank(cfgText[end])) {
    ++end;
  }
  lastValue = cfgText.substr(begin, end - begin);
  return lastValue.c_str();
}

CfgParser::parseResult CfgParser::getParam(const char* name, int node, std::string& value,
                                           int flags) {
  if ((flags & ParamNoPrefix) != 0 && (flags & ParamNodeOnly) != 0) {
    return ParseInvalidSpec;
  }
  if (name == nullptr) {
    return ParseNotFound;
  }
  if (node != -1) {
    const char* const prefixed = GetParam((nodePrefix(node) + name).c_str());
    if (prefixed != nullptr) {
      if ((flags & ParamNoPrefix) != 0) {
        return ParseCantBePrefixed;
      }
      value = prefixed;
      return ParseOk;
    }
    const char* const plain = GetParam(name);
    if (plain == nullptr) {
      return ParseNotFound;
    }
    value = plain;
    return ParseOk;
  }
  const char* const plain = GetParam(name);
  if (!nodeIds.empty() && (flags & ParamNodeOnly) != 0) {
    return plain != nullptr ? ParseCantBeNodeIndependent : ParseNodeOnly;
  }
  if (plain == nullptr) {
    return ParseNotFound;
  }
  value = plain;
  return ParseOk;
}
