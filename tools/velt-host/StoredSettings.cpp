// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/StoredSettings.h"

#include <array>
#include <utility>

#include "velt-host/PrintableText.h"
#include "velt-peer/HexText.h"

namespace velthost {

namespace {

// The plug-in reads stored texts into a buffer of this many bytes.
constexpr int kTextBuffer = 256;
constexpr const char* kAsItStands = "; the channel uses it as it stands";

enum class Check { kSocketType, kBroadcastType, kHex, kPort, kGap, kQueueBound, kNone };

struct Parameter {
  const char* name;
  bool text;
  Check check;
};

// The runtime parameters the plug-in reads at start that have a range to
// keep (all but hex_tokens), in its order.
constexpr std::array<Parameter, 12> kParameters = {{
    {"socket_type", true, Check::kSocketType},
    {"remote_ip_address", true, Check::kNone},
    {"remote_port", false, Check::kPort},
    {"local_ip_address", true, Check::kNone},
    {"local_port", false, Check::kPort},
    {"broadcast_type", true, Check::kBroadcastType},
    {"rx_prefix", true, Check::kHex},
    {"rx_suffix", true, Check::kHex},
    {"tx_prefix", true, Check::kHex},
    {"tx_suffix", true, Check::kHex},
    {"gap", false, Check::kGap},
    {"token_queue_size", false, Check::kQueueBound},
}};

// What is wrong with a text; empty when it keeps its range.
std::string TextFault(Check check, const std::string& text) {
  std::string bytes;
  switch (check) {
    case Check::kSocketType:
      return text == "UDP" || text == "TCP" ? "" : "is neither UDP nor TCP";
    case Check::kBroadcastType:
      return text == "Global" || text == "Local" ? "" : "is neither Global nor Local";
    case Check::kHex:
      return veltpeer::HexText::Decode(text, bytes) ? "" : "is not hex text";
    default:
      return "";
  }
}

// What is wrong with a number; empty when it keeps its range.
std::string NumberFault(Check check, int value) {
  switch (check) {
    case Check::kPort:
      return value >= 0 && value <= 65535 ? "" : "is outside 0 to 65535";
    case Check::kGap:
      return value >= 0 ? "" : "is negative";
    case Check::kQueueBound:
      return value >= 1 && value <= 10000 ? "" : "is outside 1 to 10000";
    default:
      return "";
  }
}

std::string TextWarning(IPermanentStorage2& storage, const std::string& section,
                        const Parameter& parameter) {
  std::array<char, kTextBuffer> buffer{};
  const std::string start = section + ": the stored " + parameter.name;
  if (storage.GetStringValueInto(section.c_str(), parameter.name, buffer.data(), kTextBuffer) ==
      0) {
    const std::string whole = storage.GetStringValue(section.c_str(), parameter.name);
    return start + " of " + std::to_string(whole.size()) + " bytes is longer than " +
           std::to_string(kTextBuffer - 1) + " bytes; the channel reads it as empty";
  }
  const std::string text = buffer.data();
  const std::string fault = TextFault(parameter.check, text);
  return fault.empty() ? ""
                       : start + " \"" + PrintableText::Escape(text) + "\" " + fault + kAsItStands;
}

std::string NumberWarning(IPermanentStorage2& storage, const std::string& section,
                          const Parameter& parameter) {
  const int value = storage.GetIntValue(section.c_str(), parameter.name);
  const std::string fault = NumberFault(parameter.check, value);
  return fault.empty() ? ""
                       : section + ": the stored " + parameter.name + " " + std::to_string(value) +
                             " " + fault + kAsItStands;
}

}  // namespace

std::vector<std::string> StoredSettings::Warnings(IPermanentStorage2& storage,
                                                  const std::string& section) {
  std::vector<std::string> warnings;
  for (const Parameter& parameter : kParameters) {
    if (storage.HasValue(section.c_str(), parameter.name) == 0) {
      continue;
    }
    std::string warning = parameter.text ? TextWarning(storage, section, parameter)
                                         : NumberWarning(storage, section, parameter);
    if (!warning.empty()) {
      warnings.push_back(std::move(warning));
    }
  }
  return warnings;
}

}  // namespace velthost
