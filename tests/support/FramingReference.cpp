// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "FramingReference.h"

namespace framing_reference {

namespace {

constexpr std::size_t kDroppedFrameLength = 1001;

bool EndsWith(const std::string& text, const std::string& tail) {
  return text.size() >= tail.size() &&
         text.compare(text.size() - tail.size(), tail.size(), tail) == 0;
}

// Step 1: synchronise on the prefix. False when a receive gave nothing.
bool Synchronise(ByteReader& reader, const std::string& prefix, std::string& accumulator,
                 std::size_t& i) {
  while (i < prefix.size()) {
    unsigned char byte = 0;
    if (reader.Receive(byte) < 1) {
      return false;
    }
    const auto c = static_cast<char>(byte);
    if (c == prefix[i]) {
      accumulator.push_back(c);
      i += 1;
    } else {
      accumulator.clear();
      if (c == prefix[0]) {
        accumulator.push_back(c);
        i = 1;
      } else {
        i = 0;
      }
    }
  }
  return true;
}

// Step 2.3 for a byte just taken; true when the pass ends.
bool EndTest(const std::string& prefix, const std::string& suffix, std::string& accumulator,
             std::size_t i, Tokens& tokens) {
  if (i < prefix.size() + suffix.size()) {
    return false;
  }
  if (!suffix.empty()) {
    if (!EndsWith(accumulator, suffix)) {
      return false;
    }
    tokens.push_back(
        accumulator.substr(prefix.size(), accumulator.size() - prefix.size() - suffix.size()));
    return true;
  }
  // A trailing prefix ends a token only when it does not overlap the
  // leading one.
  if (!prefix.empty() && accumulator.size() >= 2 * prefix.size() && EndsWith(accumulator, prefix)) {
    tokens.push_back(accumulator.substr(prefix.size(), accumulator.size() - 2 * prefix.size()));
    accumulator = prefix;
  }
  return false;
}

// Whether marker lies whole in data at q, before limit.
bool MatchesAt(const std::string& data, std::size_t q, std::size_t limit,
               const std::string& marker) {
  if (q + marker.size() > limit) {
    return false;
  }
  for (std::size_t k = 0; k < marker.size(); ++k) {
    if (data[q + k] != marker[k]) {
      return false;
    }
  }
  return true;
}

// The first match of marker from p that sees only the bytes before the
// first zero byte at or after p; npos when none fits.
std::size_t Search(const std::string& data, std::size_t p, const std::string& marker) {
  std::size_t limit = p;
  while (limit < data.size() && data[limit] != '\0') {
    ++limit;
  }
  for (std::size_t q = p; q < limit; ++q) {
    if (MatchesAt(data, q, limit, marker)) {
      return q;
    }
  }
  return std::string::npos;
}

std::string UpToZero(const std::string& marker) {
  std::string cut;
  for (const char c : marker) {
    if (c == '\0') {
      break;
    }
    cut.push_back(c);
  }
  return cut;
}

}  // namespace

int ByteReader::Receive(unsigned char& byte) {
  while (!Done()) {
    const Piece& piece = stream_[piece_];
    if (piece.silence) {
      ++piece_;
      return 0;
    }
    if (offset_ < piece.bytes.size()) {
      byte = static_cast<unsigned char>(piece.bytes[offset_++]);
      if (offset_ == piece.bytes.size()) {
        ++piece_;
        offset_ = 0;
      }
      return 1;
    }
    // An empty piece delivers nothing.
    ++piece_;
    offset_ = 0;
  }
  return 0;
}

void StreamPass(ByteReader& reader, const std::string& prefix, const std::string& suffix,
                Tokens& tokens) {
  std::string accumulator;
  std::size_t i = 0;
  if (!prefix.empty() && !Synchronise(reader, prefix, accumulator, i)) {
    return;
  }
  do {
    unsigned char byte = 0;
    if (reader.Receive(byte) < 1) {
      if (suffix.empty() && accumulator.size() > prefix.size()) {
        tokens.push_back(accumulator.substr(prefix.size()));
      }
      return;
    }
    accumulator.push_back(static_cast<char>(byte));
    i += 1;
    if (EndTest(prefix, suffix, accumulator, i, tokens)) {
      return;
    }
  } while (accumulator.size() < kDroppedFrameLength);
}

Tokens DatagramTokens(const std::string& datagram, const std::string& rawPrefix,
                      const std::string& rawSuffix) {
  const std::string prefix = UpToZero(rawPrefix);
  const std::string suffix = UpToZero(rawSuffix);
  const std::size_t end = datagram.size();
  Tokens tokens;
  std::size_t p = 0;
  do {
    if (!prefix.empty()) {
      const std::size_t q = Search(datagram, p, prefix);
      if (q == std::string::npos) {
        return tokens;
      }
      p = q + prefix.size();
    }
    std::size_t e = end;
    if (!suffix.empty()) {
      e = Search(datagram, p, suffix);
      if (e == std::string::npos) {
        return tokens;
      }
    }
    if (p < e) {
      tokens.push_back(datagram.substr(p, e - p));
    }
    p = e + suffix.size();
  } while (p + prefix.size() + suffix.size() < end);
  return tokens;
}

}  // namespace framing_reference
