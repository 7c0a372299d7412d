// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The token framers with fuzzed markers: the datagram framer over datagrams
// of up to 1536 bytes and the stream framer fed byte by byte with silences.
// Each is compared with a plain model of the framing rules, token for token.
//
// Input: the receive prefix and suffix (a length byte below 6, then the
// bytes), a byte that places a silence after every n-th stream byte (0: none
// but at the end), then the received bytes.

#include <cstdint>
#include <string>
#include <vector>

#include "FuzzInput.h"
#include "Require.h"
#include "driver/DatagramFraming.h"
#include "driver/StreamFraming.h"

namespace {

using Tokens = std::vector<std::string>;

constexpr std::size_t kDatagramSize = 1536;
constexpr std::size_t kDroppedFrameLength = 1001;
constexpr int kSilence = -1;

// --- datagrams -------------------------------------------------------------

std::string UpToZero(const std::string& marker) { return marker.substr(0, marker.find('\0')); }

// Where marker first matches in data at or after from, matching stopping at
// the first zero byte; npos when it does not.
std::size_t FindMarker(const std::string& data, const std::string& marker, std::size_t from) {
  std::size_t limit = data.find('\0', from);
  if (limit == std::string::npos) {
    limit = data.size();
  }
  for (std::size_t at = from; at + marker.size() <= limit; ++at) {
    if (data.compare(at, marker.size(), marker) == 0) {
      return at;
    }
  }
  return std::string::npos;
}

Tokens ModelDatagram(const std::string& data, const std::string& rawPrefix,
                     const std::string& rawSuffix) {
  const std::string prefix = UpToZero(rawPrefix);
  const std::string suffix = UpToZero(rawSuffix);
  Tokens tokens;
  std::size_t p = 0;
  for (;;) {
    if (!prefix.empty()) {
      const std::size_t q = FindMarker(data, prefix, p);
      if (q == std::string::npos) {
        return tokens;
      }
      p = q + prefix.size();
    }
    std::size_t e = data.size();
    if (!suffix.empty()) {
      e = FindMarker(data, suffix, p);
      if (e == std::string::npos) {
        return tokens;
      }
    }
    if (p < e) {
      tokens.push_back(data.substr(p, e - p));
    }
    p = e + suffix.size();
    if (p + prefix.size() + suffix.size() >= data.size()) {
      return tokens;
    }
  }
}

void CheckDatagrams(const std::string& bytes, const std::string& prefix,
                    const std::string& suffix) {
  const DatagramFraming framing(prefix, suffix);
  for (std::size_t start = 0; start < bytes.size(); start += kDatagramSize) {
    const std::string datagram = bytes.substr(start, kDatagramSize);
    Tokens tokens;
    framing.Split(reinterpret_cast<const unsigned char*>(datagram.data()), datagram.size(),
                  [&tokens](const std::string& token) { tokens.push_back(token); });
    Require(tokens == ModelDatagram(datagram, prefix, suffix),
            "the datagram framer cuts the tokens of the framing rules");
  }
}

// --- streams ---------------------------------------------------------------

// The received bytes with silences; each receive takes the next entry, and
// past the end every receive is a silence.
class Script {
 public:
  Script(const std::string& bytes, unsigned silenceEvery) {
    for (std::size_t i = 0; i < bytes.size(); ++i) {
      entries_.push_back(static_cast<unsigned char>(bytes[i]));
      if (silenceEvery != 0 && (i + 1) % silenceEvery == 0) {
        entries_.push_back(kSilence);
      }
    }
  }
  bool Done() const { return next_ >= entries_.size(); }
  std::size_t Position() const { return next_; }
  int Receive(unsigned char& byte) {
    if (Done()) {
      return 0;
    }
    const int entry = entries_[next_++];
    if (entry == kSilence) {
      return 0;
    }
    byte = static_cast<unsigned char>(entry);
    return 1;
  }

 private:
  std::vector<int> entries_;
  std::size_t next_ = 0;
};

bool EndsWith(const std::string& text, const std::string& tail) {
  return text.size() >= tail.size() &&
         text.compare(text.size() - tail.size(), tail.size(), tail) == 0;
}

// One pass of the stream framing rules.
void ModelPass(Script& script, const std::string& prefix, const std::string& suffix,
               Tokens& tokens) {
  std::string accumulator;
  std::size_t i = 0;
  unsigned char byte = 0;
  while (i < prefix.size()) {
    if (script.Receive(byte) < 1) {
      return;
    }
    if (static_cast<char>(byte) == prefix[i]) {
      accumulator.push_back(static_cast<char>(byte));
      ++i;
    } else {
      accumulator.clear();
      i = 0;
      if (static_cast<char>(byte) == prefix[0]) {
        accumulator.push_back(static_cast<char>(byte));
        i = 1;
      }
    }
  }
  do {
    if (script.Receive(byte) < 1) {
      if (suffix.empty() && accumulator.size() > prefix.size()) {
        tokens.push_back(accumulator.substr(prefix.size()));
      }
      return;
    }
    accumulator.push_back(static_cast<char>(byte));
    ++i;
    if (i >= prefix.size() + suffix.size()) {
      if (!suffix.empty()) {
        if (EndsWith(accumulator, suffix)) {
          tokens.push_back(accumulator.substr(prefix.size(),
                                              accumulator.size() - prefix.size() - suffix.size()));
          return;
        }
      } else if (!prefix.empty() && accumulator.size() >= 2 * prefix.size() &&
                 EndsWith(accumulator, prefix)) {
        // The prefix that closes a token opens the next; a closing prefix
        // never overlaps the opening one.
        tokens.push_back(accumulator.substr(prefix.size(), accumulator.size() - 2 * prefix.size()));
        accumulator = prefix;
      }
    }
  } while (accumulator.size() < kDroppedFrameLength);
}

void CheckStream(const std::string& bytes, unsigned silenceEvery, const std::string& prefix,
                 const std::string& suffix) {
  const StreamFraming framing(prefix, suffix);
  Script real(bytes, silenceEvery);
  Script model(bytes, silenceEvery);
  Tokens realTokens;
  Tokens modelTokens;
  while (!real.Done()) {
    framing.Pass([&real](unsigned char& byte) { return real.Receive(byte); },
                 [&realTokens](const std::string& token) { realTokens.push_back(token); });
    ModelPass(model, prefix, suffix, modelTokens);
    Require(real.Position() == model.Position(),
            "a stream pass takes the bytes of the framing rules");
    Require(realTokens == modelTokens, "the stream framer cuts the tokens of the framing rules");
  }
  for (const std::string& token : realTokens) {
    Require(token.size() < kDroppedFrameLength, "no stream token reaches the dropped length");
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzInput input(data, size);
  const std::string prefix = input.ShortText(6);
  const std::string suffix = input.ShortText(6);
  const unsigned silenceEvery = input.Byte();
  const std::string bytes = input.Rest();
  CheckDatagrams(bytes, prefix, suffix);
  CheckStream(bytes, silenceEvery, prefix, suffix);
  return 0;
}
