// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

#include "IPermanentStorage.h"

namespace velthost {

// The runtime parameters an instance finds in the permanent storage when it
// starts, read as the plug-in reads them (HasValue, then the getter of the
// parameter's type; texts into a buffer of 256 bytes), and checked against
// the ranges its configuration would have to keep: a socket type of UDP or
// TCP, a broadcast type of Global or Local, ports from 0 to 65535, a gap of
// 0 or more, a queue bound from 1 to 10000, markers in hex text, texts of at
// most 255 bytes. The plug-in takes stored values as they stand; a value
// outside these ranges changes how the channel works, so it is worth a
// warning, and nothing more.
class StoredSettings {
 public:
  // One warning per stored value of section that breaks its range, in the
  // order of the parameters, such as
  //   VELT: the stored gap -5 is negative; the channel uses it as it stands
  static std::vector<std::string> Warnings(IPermanentStorage2& storage, const std::string& section);
};

}  // namespace velthost
