// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ApplyRound.h"

#include <array>
#include <cstdio>

namespace ApplyRound {

namespace {

constexpr const char* kSection = "VELT";

std::string Hex8(int value) {
  std::array<char, 9> text{};
  (void)std::snprintf(text.data(), text.size(), "%08X", static_cast<unsigned>(value));
  return text.data();
}

std::string Address(int first, int round) {
  return std::to_string(first) + "." + std::to_string(round / 65536 % 256) + "." +
         std::to_string(round / 256 % 256) + "." + std::to_string(round % 256);
}

Staged Text(const char* uri, const char* name, const std::string& text) {
  return {uri, name, StoredValue::OfText(text)};
}

Staged Integer(const char* uri, const char* name, int value) {
  return {uri, name, StoredValue::OfInteger(value)};
}

std::string Describe(const StoredValue& value) {
  return value.GetType() == StoredValue::Type::Text ? "\"" + value.AsText() + "\"" : value.AsText();
}

}  // namespace

std::vector<Staged> ValuesOf(int round, int count) {
  const bool odd = round % 2 != 0;
  if (count == 3) {
    return {Integer("?SP_Gap?unsignedInt", "gap", round),
            Integer("?SP_RemotePort?unsignedShort", "remote_port", round % 65536),
            Text("?SP_TxPrefix?string-16", "tx_prefix", "03" + Hex8(round))};
  }
  return {
      Text("?SP_SocketType?string-8", "socket_type", odd ? "TCP" : "UDP"),
      Text("?SP_RemoteIP?string-32", "remote_ip_address", Address(127, round)),
      Integer("?SP_RemotePort?unsignedShort", "remote_port", round % 65536),
      // The local address and port make the writer's socket anew at each
      // apply: a loopback address, and a port outside the range the system
      // hands out, so no other program's port is taken.
      Text("?SP_LocalIP?string-32", "local_ip_address", Address(127, round + 65536)),
      Integer("?SP_LocalPort?unsignedShort", "local_port", 61000 + round % 4000),
      Text("?SP_BroadcastType?string-8", "broadcast_type", odd ? "Local" : "Global"),
      Text("?SP_RxPrefix?string-16", "rx_prefix", "01" + Hex8(round)),
      Text("?SP_RxSuffix?string-16", "rx_suffix", "02" + Hex8(round)),
      Text("?SP_TxPrefix?string-16", "tx_prefix", "03" + Hex8(round)),
      Text("?SP_TxSuffix?string-16", "tx_suffix", "04" + Hex8(round)),
      Integer("?SP_Gap?unsignedInt", "gap", round),
      {"?SP_HexTokens?boolean", "hex_tokens", StoredValue::OfBoolean(odd)},
      Integer("?SP_TokenQueueSize?unsignedInt", "token_queue_size", 1 + round % 10000),
  };
}

bool Whole(HostPermanentStorage& storage, int count, int& round, std::string& mix) {
  round = -1;
  mix.clear();
  if (storage.HasValue(kSection, "gap") == 0) {
    for (const Staged& value : ValuesOf(0, count)) {
      if (storage.HasValue(kSection, value.name.c_str()) != 0) {
        mix = value.name + " is stored without gap";
        return false;
      }
    }
    return true;
  }
  round = storage.GetIntValue(kSection, "gap");
  for (const Staged& value : ValuesOf(round, count)) {
    const char* const name = value.name.c_str();
    if (storage.HasValue(kSection, name) == 0) {
      mix += value.name + " is missing; ";
      continue;
    }
    const std::string text = storage.GetStringValue(kSection, name);
    if (text != value.stored.AsText()) {
      mix += value.name + " is " + text + ", round " + std::to_string(round) + " wrote " +
             Describe(value.stored) + "; ";
    }
  }
  return mix.empty();
}

}  // namespace ApplyRound
