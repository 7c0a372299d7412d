// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/SettingsTable.h"

#include <algorithm>

#include "protlib/HexText.h"

namespace {

using Params = _VELT::CommonParams;
using Kind = SettingKind;
using Check = SettingCheck;
using S = Setting;

constexpr std::string Params::*kNoText = nullptr;
constexpr std::int32_t Params::*kNoNumber = nullptr;
constexpr bool Params::*kNoFlag = nullptr;

// The thirteen runtime settings. Adding one means one row here, its value in
// Setting, its configuration key in CommonParams and its memory type and
// parameter in the description (VeltDescription.xml).
// clang-format off
constexpr std::array<SettingRow, kSettingCount> kRows = {{
    {S::SocketType, "SP_SocketType", "socket_type", "socketType", Kind::Text, Check::SocketType,
     "illegal socket type", "socket type too long to read", true, 0,
     &Params::socketType, kNoNumber, kNoFlag},
    {S::RemoteIp, "SP_RemoteIP", "remote_ip_address", "remoteIpAddress", Kind::Text, Check::None,
     nullptr, "remote ip address too long to read", true, 3,
     &Params::remoteIpAddress, kNoNumber, kNoFlag},
    {S::RemotePort, "SP_RemotePort", "remote_port", "remotePort", Kind::Port, Check::None,
     nullptr, nullptr, true, 4,
     kNoText, &Params::remotePort, kNoFlag},
    {S::LocalIp, "SP_LocalIP", "local_ip_address", "localIpAddress", Kind::Text, Check::None,
     nullptr, "local ip address too long to read", true, 1,
     &Params::localIpAddress, kNoNumber, kNoFlag},
    {S::LocalPort, "SP_LocalPort", "local_port", "localPort", Kind::Port, Check::None,
     nullptr, nullptr, true, 2,
     kNoText, &Params::localPort, kNoFlag},
    {S::BroadcastType, "SP_BroadcastType", "broadcast_type", "broadcastType", Kind::Text,
     Check::BroadcastType, "illegal broadcast type", "broadcast address too long to read", true, 5,
     &Params::broadcastType, kNoNumber, kNoFlag},
    {S::RxPrefix, "SP_RxPrefix", "rx_prefix", "rx_prefix", Kind::Text, Check::HexText,
     "Rx prefix value is not hex format", "rx prefix too long to read", false, 6,
     &Params::rx_prefix, kNoNumber, kNoFlag},
    {S::RxSuffix, "SP_RxSuffix", "rx_suffix", "rx_suffix", Kind::Text, Check::HexText,
     "Rx suffix value is not hex format", "rx suffix too long to read", false, 7,
     &Params::rx_suffix, kNoNumber, kNoFlag},
    {S::Gap, "SP_Gap", "gap", "gap", Kind::Number, Check::None,
     nullptr, nullptr, false, 10,
     kNoText, &Params::gap, kNoFlag},
    {S::TxPrefix, "SP_TxPrefix", "tx_prefix", "tx_prefix", Kind::Text, Check::HexText,
     "Tx prefix value is not hex format", "tx prefix too long to read", false, 8,
     &Params::tx_prefix, kNoNumber, kNoFlag},
    {S::TxSuffix, "SP_TxSuffix", "tx_suffix", "tx_suffix", Kind::Text, Check::HexText,
     "Tx suffix value is not hex format", "tx suffix too long to read", false, 9,
     &Params::tx_suffix, kNoNumber, kNoFlag},
    {S::HexTokens, "SP_HexTokens", "hex_tokens", "hex_tokens", Kind::Flag, Check::None,
     nullptr, nullptr, false, 11,
     kNoText, kNoNumber, &Params::hex_tokens},
    {S::TokenQueueSize, "SP_TokenQueueSize", "token_queue_size", "token_queue_size", Kind::Number,
     Check::None, nullptr, nullptr, false, 12,
     kNoText, &Params::token_queue_size, kNoFlag},
}};
// clang-format on

constexpr bool RowsFollowTheSettings() {
  for (std::size_t i = 0; i < kRows.size(); ++i) {
    if (static_cast<std::size_t>(kRows[i].setting) != i) {
      return false;
    }
  }
  return true;
}
static_assert(RowsFollowTheSettings(), "the rows are in the order of Setting");

constexpr bool ApplyPositionsAreAPermutation() {
  unsigned int seen = 0;
  for (const SettingRow& row : kRows) {
    seen |= row.applyPosition < kSettingCount ? 1U << row.applyPosition : 0U;
  }
  return seen == (1U << kSettingCount) - 1U;
}
static_assert(ApplyPositionsAreAPermutation(),
              "every setting has its own place in the apply order");

constexpr std::array<const SettingRow*, kSettingCount> BuildApplyOrder() {
  std::array<const SettingRow*, kSettingCount> order{};
  for (const SettingRow& row : kRows) {
    order[row.applyPosition] = &row;
  }
  return order;
}
constexpr std::array<const SettingRow*, kSettingCount> kApplyOrder = BuildApplyOrder();

}  // namespace

const std::array<SettingRow, kSettingCount>& SettingRows() { return kRows; }

const SettingRow& RowOf(Setting setting) { return kRows[static_cast<std::size_t>(setting)]; }

const std::array<const SettingRow*, kSettingCount>& ApplyOrder() { return kApplyOrder; }

const SettingRow* RowForMemoryType(std::string_view name) {
  const auto* const found = std::find_if(
      kRows.begin(), kRows.end(), [name](const SettingRow& row) { return name == row.memoryType; });
  return found == kRows.end() ? nullptr : found;
}

bool PassesCheck(const SettingRow& row, const std::string& value) {
  switch (row.check) {
    case SettingCheck::None:
      return true;
    case SettingCheck::SocketType:
      return value == "UDP" || value == "TCP";
    case SettingCheck::BroadcastType:
      return value == "Global" || value == "Local";
    case SettingCheck::HexText:
      return isHex(value.c_str());
  }
  return false;
}
