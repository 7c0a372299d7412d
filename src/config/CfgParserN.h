// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <type_traits>

#include "config/CfgParser.h"

// Value converters and error texts for configuration look-ups, and readParam,
// which joins a look-up, a conversion and an error text into one call.
namespace CfgParserN {

// Copies text with every "&nbsp;" turned into a blank (the only way to put a
// blank into a value). Always true.
bool parseValue(const std::string& text, std::string& out);

// "true" gives true, "false" false (exact, case-sensitive); any other text
// returns false and leaves out unchanged.
bool parseValue(const std::string& text, bool& out);

// Reads the number as strtol does with base 0 (0x hexadecimal, a leading 0
// octal, trailing characters ignored, no number gives 0); a number beyond the
// range of int is clamped to INT_MIN or INT_MAX. Always true.
bool parseValue(const std::string& text, int& out);

// "Parser: parameter '<name>' " followed by the reason for result.
std::string getErrorString(CfgParser::parseResult result, const char* name);

// Looks name up for node with flags and converts the value into value. True
// when found and converted, for ParseNodeOnly (value untouched), and for a
// missing optional parameter (value keeps the default the caller stored).
// Otherwise error gets the text of getErrorString and the result is false.
template <typename T>
bool readParam(CfgParser& parser, const char* name, int node, T& value, int flags, bool optional,
               std::string& error) {
  static_assert(std::is_same<T, std::string>::value || std::is_same<T, int>::value ||
                    std::is_same<T, bool>::value,
                "configuration values are texts, integers or booleans");
  std::string text;
  CfgParser::parseResult result = parser.getParam(name, node, text, flags);
  if (result == CfgParser::ParseOk && !parseValue(text, value)) {
    result = CfgParser::ParseIllegalValue;
  }
  if (result == CfgParser::ParseOk || result == CfgParser::ParseNodeOnly ||
      (result == CfgParser::ParseNotFound && optional)) {
    return true;
  }
  error = getErrorString(result, name);
  return false;
}

}  // namespace CfgParserN
