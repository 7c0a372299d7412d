// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>
#include <vector>

// The channel's framing steps carried out literally, one received byte at a
// time, as a reference for differential tests of the framers: a stream pass
// that receives single bytes, and the cutting of one datagram. Deliberately
// plain: no scanning ahead, no buffers beyond the accumulator.
namespace framing_reference {

using Tokens = std::vector<std::string>;

// A received stream: pieces of bytes, each as one receive may deliver it,
// and silences (a receive that gives nothing) between them.
struct Piece {
  bool silence;
  std::string bytes;
};
using Stream = std::vector<Piece>;

// Reads a stream one byte at a time. Past its end every receive is a
// silence.
class ByteReader {
 public:
  explicit ByteReader(const Stream& stream) : stream_(stream) {}

  // 1 and the next byte; 0 for a silence.
  int Receive(unsigned char& byte);
  // True once every byte and silence has been received.
  bool Done() const { return piece_ >= stream_.size(); }

 private:
  const Stream& stream_;
  std::size_t piece_ = 0;
  std::size_t offset_ = 0;
};

// One pass of the stream framing; the tokens it completes are appended.
void StreamPass(ByteReader& reader, const std::string& prefix, const std::string& suffix,
                Tokens& tokens);

// The tokens cut out of one datagram. The markers are matched as
// zero-terminated texts.
Tokens DatagramTokens(const std::string& datagram, const std::string& prefix,
                      const std::string& suffix);

}  // namespace framing_reference
