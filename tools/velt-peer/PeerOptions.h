// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <limits>
#include <string>

#include "velt-peer/PeerEvent.h"

namespace veltpeer {

enum class Transport { kTcp, kUdp };

// Everything that shapes one simulator. Markers, payload bytes and the like
// are raw bytes here; the command line decodes them from hex text. Zero turns
// an optional behaviour off.
struct PeerOptions {
  static constexpr std::uint64_t kForever = std::numeric_limits<std::uint64_t>::max();

  Transport transport = Transport::kTcp;
  // Local port; 0 lets the system pick a free one (see Peer::Started::port).
  std::uint16_t port = 0;
  // Local address to bind: a numeric IPv4/IPv6 address or a host name.
  std::string bindAddress = "127.0.0.1";
  // UDP only: fixed destination "HOST:PORT" of emitted datagrams. Empty: emit
  // to the sender of the last datagram received (nothing before the first).
  std::string to;

  // Markers that cut received data into frames. With neither, a TCP frame is
  // whatever one read returns and a UDP frame is one datagram.
  std::string rxPrefix;
  std::string rxSuffix;
  // With a prefix and no suffix, a TCP frame also ends after this much silence.
  int gapMs = 500;
  // Send every received frame back whole (TCP: on the connection; UDP: to its
  // sender).
  bool echo = false;

  // Tokens to emit (kForever for no end); emitted frame = txPrefix + payload +
  // txSuffix, one per datagram for UDP. TCP emits while a client is connected,
  // starting when it connects; the count runs over the simulator's life.
  std::uint64_t emitCount = 0;
  // Tokens per second; 0 emits as fast as the socket takes them.
  double rate = 1.0;
  std::string txPrefix;
  std::string txSuffix;
  std::string payload = "token {n}";
  // Replace every "{n}" in the payload by the token's number, counting from 1.
  bool payloadCounter = true;

  // Pause before each echo and each emitted token.
  int delayMs = 0;
  // Split every write into pieces of at most this many bytes (UDP: one
  // datagram per piece), with chunkDelayMs between the pieces.
  std::size_t chunkBytes = 0;
  int chunkDelayMs = 0;
  // TCP only: abort the connection with a reset after this many frames on it
  // (frames received plus tokens emitted), or this long after it was accepted.
  std::uint64_t closeAfterFrames = 0;
  int closeAfterMs = 0;
  // End the simulator after this many frames (received plus emitted), or
  // after this many seconds.
  std::uint64_t exitAfterFrames = 0;
  double maxSeconds = 0;

  // Keep up to this many received frames for Peer::NextFrame (the oldest is
  // dropped when full); 0 keeps none.
  std::size_t keepFrames = 0;
  // Called for every event, on the simulator's worker thread (kListening on
  // the thread that calls Start, before the worker starts). Must not call
  // Stop. May be empty.
  std::function<void(const PeerEvent&)> onEvent;
};

}  // namespace veltpeer
