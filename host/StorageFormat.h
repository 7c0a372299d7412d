// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

#include "StoredValue.h"

// The text form of the permanent storage file: line based and readable.
//
//   # comment
//   ["section"]
//   "name" = text "value"
//   "flag" = bool true
//   "count" = int -42
//
// Sections and names are quoted texts; a value is its type (text, bool or
// int) and the value: a quoted text, true or false, or a signed 32-bit
// decimal number. Quoted texts hold any bytes: a backslash, a double quote
// and control bytes are escaped as \\ \" \n \r \t or \xHH; all other bytes
// (including UTF-8) stand as they are. Blank lines and lines starting with
// '#' are ignored; spaces and tabs may surround every part.
class StorageFormat {
 public:
  // The file text for sections, in map order, with a header comment.
  static std::string Serialize(const StoredSections& sections);
  // The sections held in content. Throws StorageError naming path and the
  // line of the first fault: a line that is neither a header nor an entry,
  // an entry before the first header, a bad quoted text or escape, an
  // unknown type, a bad or out-of-range value, text after the value, or a
  // name given twice in one section.
  static StoredSections Parse(const std::string& content, const std::string& path);
  // raw in double quotes, escaped as above.
  static std::string Quote(const std::string& raw);
};
