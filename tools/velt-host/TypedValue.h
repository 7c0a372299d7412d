// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

#include "velt-host/ValueShape.h"

namespace velthost {

// Turns a tag's value in the host's buffer into text and back, typed as the
// tag's data type:
//   string-N                     the text up to its first zero byte (at most N bytes)
//   boolean                      0 or 1 (written: 0, 1, true or false)
//   byte .. unsignedInt, int64,
//   uint64                       decimal (written: decimal or 0x hex, range-checked)
//   float, double                printf's %g (written: any number strtod reads)
//   binary-N, time, object       lower-case hex digits, two per byte (written: at
//                                most N pairs in either case; the rest is zero)
//   arrays (unsignedInt-4, ...)  the items as above, separated by one blank
//                                (written: exactly N items separated by blanks)
class TypedValue {
 public:
  // The data-type text of a shape, such as "unsignedInt" or "string-20".
  static std::string TypeName(const ValueShape& shape);
  // The value in bytes, which holds shape.length bytes.
  static std::string Format(const ValueShape& shape, const unsigned char* bytes);
  // Fills bytes (resized to shape.length, zero-filled) from text; false with
  // error set to "bad TYPE value 'TEXT' (WHAT expected...)" when the text
  // does not fit the type.
  static bool Parse(const ValueShape& shape, const std::string& text,
                    std::vector<unsigned char>& bytes, std::string& error);
};

}  // namespace velthost
