// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The channel's push framers against the one-byte reference of the framing
// steps, over random received data: random bytes (mostly from a few values,
// so markers occur often, and sometimes long runs that reach the dropped
// frame length), random receive boundaries and buffer sizes, random
// silences, random markers of 0 to 3 bytes (overlapping and zero-byte ones
// included) and passes that end early for a request. The same tokens must
// come out, in the same order, in the same passes.

#include <gtest/gtest.h>

#include <cstddef>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include "FramingDifferential.h"
#include "FramingReference.h"
#include "driver/StreamFraming.h"

namespace {

using framing_reference::Passes;
using framing_reference::Piece;
using framing_reference::Stream;
using framing_reference::Tokens;
using Random = std::mt19937;

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
#define VELT_SANITIZED 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(thread_sanitizer)
#define VELT_SANITIZED 1
#endif
#endif

// The sanitizers make each case many times slower; they check memory and
// threads, which a tenth of the cases covers as well.
#ifdef VELT_SANITIZED
constexpr int kCases = 10000;
#else
constexpr int kCases = 100000;
#endif
constexpr unsigned kSeed = 20240611U;

std::size_t Below(Random& random, std::size_t bound) {
  return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random);
}

bool Chance(Random& random, int percent) { return static_cast<int>(Below(random, 100)) < percent; }

// A few byte values per case, marker bytes among them.
std::string Alphabet(Random& random) {
  std::string alphabet = {'\x02', '\x03', 'A'};
  if (Chance(random, 30)) {
    alphabet.push_back('\0');
  }
  if (Chance(random, 30)) {
    alphabet.push_back(static_cast<char>(Below(random, 256)));
  }
  return alphabet;
}

std::string Marker(Random& random, const std::string& alphabet) {
  std::string marker(Below(random, 4), ' ');
  for (char& c : marker) {
    c = alphabet[Below(random, alphabet.size())];
  }
  return marker;
}

std::string Bytes(Random& random, const std::string& alphabet) {
  const bool longRun = Chance(random, 4);
  const std::size_t length = longRun ? 900 + Below(random, 1800) : Below(random, 80);
  std::string bytes(length, ' ');
  for (char& c : bytes) {
    // A long run is mostly filler, so frames grow to the dropped length.
    c = longRun && !Chance(random, 1) ? 'z' : alphabet[Below(random, alphabet.size())];
  }
  return bytes;
}

Stream Pieces(Random& random, const std::string& bytes) {
  Stream stream;
  for (std::size_t at = 0; at < bytes.size();) {
    const std::size_t size = Chance(random, 10) ? 1 + Below(random, 2000) : 1 + Below(random, 12);
    stream.push_back({false, bytes.substr(at, size)});
    at += size;
    if (Chance(random, 15)) {
      stream.push_back({true, {}});
    }
  }
  if (Chance(random, 70)) {
    stream.push_back({true, {}});
  }
  return stream;
}

std::vector<bool> Interrupts(Random& random, std::size_t count) {
  std::vector<bool> interrupts(count);
  for (std::size_t i = 0; i < count; ++i) {
    interrupts[i] = Chance(random, 20);
  }
  return interrupts;
}

std::string Hex(const std::string& bytes) {
  std::ostringstream text;
  for (const char c : bytes) {
    text << "0123456789ABCDEF"[static_cast<unsigned char>(c) >> 4U]
         << "0123456789ABCDEF"[static_cast<unsigned char>(c) & 0xFU];
  }
  return text.str();
}

std::string Describe(const std::string& prefix, const std::string& suffix, const Stream& stream) {
  std::string text = "prefix " + Hex(prefix) + ", suffix " + Hex(suffix) + ", stream";
  for (const Piece& piece : stream) {
    text += piece.silence ? " |silence|" : " " + Hex(piece.bytes);
  }
  return text;
}

}  // namespace

TEST(FramingDifferential, StreamPassesMatchTheOneByteReference) {
  Random random(kSeed);
  std::size_t tokens = 0;
  std::size_t drops = 0;
  for (int i = 0; i < kCases; ++i) {
    const std::string alphabet = Alphabet(random);
    const std::string prefix = Marker(random, alphabet);
    const std::string suffix = Marker(random, alphabet);
    const std::string bytes = Bytes(random, alphabet);
    const Stream stream = Pieces(random, bytes);
    const std::size_t buffer = Chance(random, 25) ? 1 + Below(random, 7) : 1536;
    const std::vector<bool> interrupts = Interrupts(random, 2 * stream.size() + 2);
    const Passes expected = framing_reference::ReferencePasses(stream, prefix, suffix);
    const Passes actual =
        framing_reference::ReceiverPasses(stream, prefix, suffix, buffer, interrupts);
    ASSERT_EQ(actual, expected) << "case " << i << ", buffer " << buffer << ": "
                                << Describe(prefix, suffix, stream);
    for (const Tokens& pass : expected) {
      tokens += pass.size();
    }
    drops += bytes.size() >= StreamFraming::kDroppedFrameLength ? 1 : 0;
  }
  // The cases cut many tokens and reach the dropped length often.
  EXPECT_GT(tokens, static_cast<std::size_t>(kCases));
  EXPECT_GT(drops, static_cast<std::size_t>(kCases / 50));
}

TEST(FramingDifferential, DatagramsMatchTheReference) {
  Random random(kSeed + 1);
  std::size_t tokens = 0;
  for (int i = 0; i < kCases; ++i) {
    const std::string alphabet = Alphabet(random);
    const std::string prefix = Marker(random, alphabet);
    const std::string suffix = Marker(random, alphabet);
    std::string datagram = Bytes(random, alphabet).substr(0, 1536);
    if (datagram.empty()) {
      datagram = "A";
    }
    const Tokens expected = framing_reference::DatagramTokens(datagram, prefix, suffix);
    ASSERT_EQ(framing_reference::FramerDatagram(datagram, prefix, suffix), expected)
        << "case " << i << ": prefix " << Hex(prefix) << ", suffix " << Hex(suffix) << ", datagram "
        << Hex(datagram);
    tokens += expected.size();
  }
  EXPECT_GT(tokens, static_cast<std::size_t>(kCases));
}
