// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/RuntimeParameter.h"

#include <algorithm>
#include <array>

#include "protlib/HexText.h"

namespace {

using Kind = RuntimeParameter::Kind;
using S = ChannelSettings;

bool IsSocketType(const std::string& value) { return value == "UDP" || value == "TCP"; }
bool IsBroadcastType(const std::string& value) { return value == "Global" || value == "Local"; }
bool IsHexText(const std::string& value) { return isHex(value.c_str()); }

// clang-format off
const RuntimeParameter kSocketType{"SP_SocketType", "socket_type", Kind::Text,
    &S::socketType, nullptr, nullptr, "socket type too long to read",
    IsSocketType, "illegal socket type", true};
const RuntimeParameter kRemoteIp{"SP_RemoteIP", "remote_ip_address", Kind::Text,
    &S::remoteIp, nullptr, nullptr, "remote ip address too long to read", nullptr, nullptr, true};
const RuntimeParameter kRemotePort{"SP_RemotePort", "remote_port", Kind::Integer,
    nullptr, &S::remotePort, nullptr, nullptr, nullptr, nullptr, true};
const RuntimeParameter kLocalIp{"SP_LocalIP", "local_ip_address", Kind::Text,
    &S::localIp, nullptr, nullptr, "local ip address too long to read", nullptr, nullptr, true};
const RuntimeParameter kLocalPort{"SP_LocalPort", "local_port", Kind::Integer,
    nullptr, &S::localPort, nullptr, nullptr, nullptr, nullptr, true};
const RuntimeParameter kBroadcastType{"SP_BroadcastType", "broadcast_type", Kind::Text,
    &S::broadcastType, nullptr, nullptr, "broadcast address too long to read",
    IsBroadcastType, "illegal broadcast type", true};
const RuntimeParameter kRxPrefix{"SP_RxPrefix", "rx_prefix", Kind::Text,
    &S::rxPrefix, nullptr, nullptr, "rx prefix too long to read",
    IsHexText, "Rx prefix value is not hex format", false};
const RuntimeParameter kRxSuffix{"SP_RxSuffix", "rx_suffix", Kind::Text,
    &S::rxSuffix, nullptr, nullptr, "rx suffix too long to read",
    IsHexText, "Rx suffix value is not hex format", false};
const RuntimeParameter kTxPrefix{"SP_TxPrefix", "tx_prefix", Kind::Text,
    &S::txPrefix, nullptr, nullptr, "tx prefix too long to read",
    IsHexText, "Tx prefix value is not hex format", false};
const RuntimeParameter kTxSuffix{"SP_TxSuffix", "tx_suffix", Kind::Text,
    &S::txSuffix, nullptr, nullptr, "tx suffix too long to read",
    IsHexText, "Tx suffix value is not hex format", false};
const RuntimeParameter kGap{"SP_Gap", "gap", Kind::Integer,
    nullptr, &S::gap, nullptr, nullptr, nullptr, nullptr, false};
const RuntimeParameter kHexTokens{"SP_HexTokens", "hex_tokens", Kind::Boolean,
    nullptr, nullptr, &S::hexTokens, nullptr, nullptr, nullptr, false};
const RuntimeParameter kTokenQueueSize{"SP_TokenQueueSize", "token_queue_size", Kind::Integer,
    nullptr, &S::tokenQueueSize, nullptr, nullptr, nullptr, nullptr, false};
const RuntimeParameter kDone{"SP_Done", "", Kind::Apply,
    nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, false};
// clang-format on

const std::array<const RuntimeParameter*, 14> kAll = {
    &kSocketType, &kRemoteIp, &kRemotePort, &kLocalIp,  &kLocalPort, &kBroadcastType,  &kRxPrefix,
    &kRxSuffix,   &kGap,      &kTxPrefix,   &kTxSuffix, &kHexTokens, &kTokenQueueSize, &kDone};

// An apply reloads the socket settings first, then the framing and queue
// settings.
const std::array<const RuntimeParameter*, 14> kReloadOrder = {
    &kSocketType, &kLocalIp,  &kLocalPort, &kRemoteIp, &kRemotePort, &kBroadcastType,  &kRxPrefix,
    &kRxSuffix,   &kTxPrefix, &kTxSuffix,  &kGap,      &kHexTokens,  &kTokenQueueSize, nullptr};

}  // namespace

const RuntimeParameter* RuntimeParameter::ForMemoryType(const MemoryType& memoryType) {
  const auto* const found =
      std::find_if(kAll.begin(), kAll.end(), [&memoryType](const RuntimeParameter* parameter) {
        return memoryType.hasName(parameter->memoryType);
      });
  return found == kAll.end() ? nullptr : *found;
}

const RuntimeParameter* const* RuntimeParameter::ReloadOrder() { return kReloadOrder.data(); }
