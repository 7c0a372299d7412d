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
// it is about to receive; then the received bytes.

#include <cstdint>
#include <string>
#include <vector>

#include "FramingDifferential.h"
#include "FramingReference.h"
#include "FuzzInput.h"
#include "Require.h"
#include "driver/StreamFraming.h"

namespace {

using framing_reference::Passes;
using framing_reference::Stream;
using framing_reference::Tokens;

constexpr std::size_t kDatagramSize = 1536;

void CheckDatagrams(const std::string& bytes, const std::string& prefix,
                    const std::string& suffix) {
  for (std::size_t start = 0; start < bytes.size(); start += kDatagramSize) {
    const std::string datagram = bytes.substr(start, kDatagramSize);
    Require(framing_reference::FramerDatagram(datagram, prefix, suffix) ==
                framing_reference::DatagramTokens(datagram, prefix, suffix),
            "the datagram framer cuts the tokens of the one-byte reference");
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

void CheckStream(const std::string& bytes, const std::string& prefix, const std::string& suffix,
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
  for (const Tokens& pass : actual) {
    for (const std::string& token : pass) {
      Require(token.size() < StreamFraming::kDroppedFrameLength,
              "no stream token reaches the dropped length");
    }
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzInput input(data, size);
  const std::string prefix = input.ShortText(6);
  const std::string suffix = input.ShortText(6);
  const Layout layout = ReadLayout(input);
  const std::string bytes = input.Rest();
  CheckDatagrams(bytes, prefix, suffix);
  CheckStream(bytes, prefix, suffix, layout);
  return 0;
}
