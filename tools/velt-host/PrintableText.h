// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

namespace velthost {

// Makes received bytes safe to print on one line: printable ASCII stays as
// it is, a backslash becomes "\\", every other byte "\xHH" (upper-case hex),
// as velt-peer prints frames with --text.
class PrintableText {
 public:
  static std::string Escape(const std::string& bytes);
};

}  // namespace velthost
