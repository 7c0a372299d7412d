// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The channel's push framers against the one-byte reference of the framing
// steps (tests/support/FramingReference), with fuzzed markers (zero bytes
// included): the stream receiver over the received bytes cut into receives
// of a fuzzed size, with silences, a fuzzed receive buffer and passes ended
// early for requests, must give the tokens of the reference pass by pass;
// the datagram framer over datagrams of up to 1536 bytes those of the
// reference datagram steps.
//
// Input: the receive prefix and suffix (a length byte below 6, then the
// bytes); a byte n placing a silence after every n-th received byte (0:
// none but at the end); a byte for the size of each receive (its value
// plus 1); a byte for the receive buffer (0: the channel's 1536 bytes, else
// that many); a byte whose bits, in turn, say whether a pass ends early when
// it is about to receive; a byte for the token queue (its low four bits plus
// 1 the bound, its top bit hex tokens); then the received bytes.
//
// Beside the agreement with the reference, the target checks what holds of
// every token whatever the reference says: a stream token is shorter than
// the dropped length, a datagram token is never empty, each token stands in
// the received bytes between the markers, and a queue fed the tokens never
// holds more than its bound, the newest ones, as upper-case hex of even
// length when hex tokens are on.

#include <algorithm>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "FramingDifferential.h"
#include "FramingReference.h"
#include "FuzzInput.h"
#include "Require.h"
#include "driver/StreamFraming.h"
#include "driver/TokenQueue.h"

namespace {

using framing_reference::Passes;
using framing_reference::Stream;
using framing_reference::Tokens;

constexpr std::size_t kDatagramSize = 1536;

// Whether the token stands in bytes between the markers. A token closed by
// the gap or by the next prefix has no suffix after it.
bool BetweenMarkers(const std::string& bytes, const std::string& prefix, const std::string& token,
                    const std::string& suffix) {
  return bytes.find(prefix + token + suffix) != std::string::npos;
}

// A marker as datagram framing matches it: a C text, cut at a zero byte.
std::string AsCText(const std::string& marker) { return marker.substr(0, marker.find('\0')); }

Tokens CheckDatagrams(const std::string& bytes, const std::string& prefix,
                      const std::string& suffix) {
  Tokens all;
  for (std::size_t start = 0; start < bytes.size(); start += kDatagramSize) {
    const std::string datagram = bytes.substr(start, kDatagramSize);
    const Tokens tokens = framing_reference::FramerDatagram(datagram, prefix, suffix);
    Require(tokens == framing_reference::DatagramTokens(datagram, prefix, suffix),
            "the datagram framer cuts the tokens of the one-byte reference");
    for (const std::string& token : tokens) {
      Require(!token.empty(), "no datagram token is empty");
      Require(BetweenMarkers(datagram, AsCText(prefix), token, AsCText(suffix)),
              "a datagram token stands in its datagram between the markers");
      all.push_back(token);
    }
  }
  return all;
}

std::string UpperHex(const std::string& bytes) {
  constexpr std::string_view kDigits = "0123456789ABCDEF";
  std::string text;
  for (const char byte : bytes) {
    const auto value = static_cast<unsigned char>(byte);
    text.push_back(kDigits[value >> 4U]);
    text.push_back(kDigits[value & 0x0FU]);
  }
  return text;
}

// Queues the tokens with the fuzzed bound and hex setting: the queue keeps
// the newest ones, never more than the bound, in their final form.
void CheckQueue(const Tokens& tokens, std::uint8_t queueByte) {
  const int bound = (queueByte & 0x0F) + 1;
  const bool hex = (queueByte & 0x80U) != 0;
  TokenQueue queue(nullptr);
  TokenQueue::Guard held(queue);
  held.setRules(bound, hex);
  for (const std::string& token : tokens) {
    held.addToken(token);
    Require(held.Size() <= static_cast<std::size_t>(bound), "the queue keeps to its bound");
  }
  const std::size_t kept = held.Size();
  Require(kept == std::min(tokens.size(), static_cast<std::size_t>(bound)),
          "the queue holds as many tokens as its bound allows");
  for (std::size_t i = tokens.size() - kept; i < tokens.size(); ++i) {
    const std::string& front = held.Front();
    Require(front == (hex ? UpperHex(tokens[i]) : tokens[i]),
            "the queue keeps the newest tokens, as upper-case hex of even length with hex on");
    held.PopFront();
  }
}

// The bytes cut into receives of pieceSize bytes, a silence after every
// silenceEvery-th byte and one at the end.
Stream Pieces(const std::string& bytes, std::size_t pieceSize, std::size_t silenceEvery) {
  Stream stream;
  std::string piece;
  for (std::size_t i = 0; i < bytes.size(); ++i) {
    piece.push_back(bytes[i]);
    const bool silence = silenceEvery != 0 && (i + 1) % silenceEvery == 0;
    if (piece.size() == pieceSize || silence || i + 1 == bytes.size()) {
      stream.push_back({false, piece});
      piece.clear();
    }
    if (silence) {
      stream.push_back({true, {}});
    }
  }
  stream.push_back({true, {}});
  return stream;
}

// How the stream is received.
struct Layout {
  std::size_t silenceEvery;
  std::size_t pieceSize;
  std::size_t buffer;
  unsigned interruptBits;
};

Layout ReadLayout(FuzzInput& input) {
  Layout layout{};
  layout.silenceEvery = input.Byte();
  layout.pieceSize = input.Byte() + 1U;
  layout.buffer = input.Byte();
  layout.interruptBits = input.Byte();
  if (layout.buffer == 0) {
    layout.buffer = kDatagramSize;
  }
  return layout;
}

Tokens CheckStream(const std::string& bytes, const std::string& prefix, const std::string& suffix,
                   const Layout& layout) {
  const Stream stream = Pieces(bytes, layout.pieceSize, layout.silenceEvery);
  std::vector<bool> interrupts(4 * stream.size() + 4);
  for (std::size_t i = 0; i < interrupts.size(); ++i) {
    interrupts[i] = ((layout.interruptBits >> (i % 8)) & 1U) != 0;
  }
  const Passes expected = framing_reference::ReferencePasses(stream, prefix, suffix);
  const Passes actual =
      framing_reference::ReceiverPasses(stream, prefix, suffix, layout.buffer, interrupts);
  Require(actual == expected,
          "the stream receiver cuts the tokens of the one-byte reference, pass by pass");
  Tokens all;
  for (const Tokens& pass : actual) {
    for (const std::string& token : pass) {
      Require(token.size() < StreamFraming::kDroppedFrameLength,
              "no stream token reaches the dropped length");
      Require(BetweenMarkers(bytes, prefix, token, "") &&
                  (suffix.empty() || BetweenMarkers(bytes, prefix, token, suffix)),
              "a stream token stands in the received bytes after the prefix, before the suffix");
      all.push_back(token);
    }
  }
  return all;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzInput input(data, size);
  const std::string prefix = input.ShortText(6);
  const std::string suffix = input.ShortText(6);
  const Layout layout = ReadLayout(input);
  const std::uint8_t queueByte = input.Byte();
  const std::string bytes = input.Rest();
  CheckQueue(CheckDatagrams(bytes, prefix, suffix), queueByte);
  CheckQueue(CheckStream(bytes, prefix, suffix, layout), queueByte);
  return 0;
}
