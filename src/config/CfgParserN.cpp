// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/CfgParserN.h"

#include <climits>
#include <cstdlib>

namespace CfgParserN {

bool parseValue(const std::string& text, std::string& out) {
  static const std::string kEntity = "&nbsp;";
  std::string result;
  result.reserve(text.size());
  std::string::size_type from = 0;
  for (std::string::size_type found = text.find(kEntity); found != std::string::npos;
       found = text.find(kEntity, from)) {
    result.append(text, from, found - from);
    result.push_back(' ');
    from = found + kEntity.size();
  }
  result += text.substr(from);
  out = result;
  return true;
}

bool parseValue(const std::string& text, bool& out) {
  if (text == "true") {
    out = true;
    return true;
  }
  if (text == "false") {
    out = false;
    return true;
  }
  return false;
}

bool parseValue(const std::string& text, int& out) {
  const long number = std::strtol(text.c_str(), nullptr, 0);
  if (number > INT_MAX) {
    out = INT_MAX;
  } else if (number < INT_MIN) {
    out = INT_MIN;
  } else {
    out = static_cast<int>(number);
  }
  return true;
}

std::string getErrorString(CfgParser::parseResult result, const char* name) {
  const char* reason = "has unknown error";
  switch (result) {
    case CfgParser::ParseNotFound:
      reason = "is not found";
      break;
    case CfgParser::ParseIllegalValue:
      reason = "has illegal value";
      break;
    case CfgParser::ParseCantBePrefixed:
      reason = "can't be prefixed";
      break;
    case CfgParser::ParseCantBeNodeIndependent:
      reason = "can't be node independent";
      break;
    case CfgParser::ParseInvalidSpec:
      reason = "has invalid internal specification";
      break;
    default:
      break;
  }
  return std::string("Parser: parameter '") + (name == nullptr ? "" : name) + "' " + reason;
}

}  // namespace CfgParserN
