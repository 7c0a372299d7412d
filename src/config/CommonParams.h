// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <string>

namespace _VELT {

// The protocol-wide socket and framing settings, each named after its
// configuration key. The initial values are those the parser gives to the
// optional keys; the framing strings are hexadecimal text ("none" or empty
// for no marker).
struct CommonParams {
  std::string socketType;
  std::string remoteIpAddress;
  std::int32_t remotePort = 0;
  std::string localIpAddress = "0.0.0.0";
  std::int32_t localPort = 0;
  std::string broadcastType = "Global";
  std::string rx_prefix;
  std::string rx_suffix;
  std::int32_t gap = 0;
  std::string tx_prefix;
  std::string tx_suffix;
  bool hex_tokens = false;
  std::int32_t token_queue_size = 100;
};

}  // namespace _VELT
