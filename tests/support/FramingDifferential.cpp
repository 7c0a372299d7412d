// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "FramingDifferential.h"

#include <algorithm>
#include <cstring>

#include "ISocket.h"
#include "driver/DatagramFraming.h"
#include "driver/StreamReceiver.h"
#include "driver/TokenSink.h"

namespace framing_reference {

namespace {

// Serves a stream piece by piece as receives of up to the caller's maximum.
class PieceSocket final : public ISocket {
 public:
  explicit PieceSocket(const Stream& stream) : stream_(stream) {}

  bool Done() const { return piece_ >= stream_.size(); }

  int Receive(unsigned char* buffer, int maxLength, int /*timeout*/) override {
    if (Done()) {
      return 0;
    }
    const Piece& piece = stream_[piece_];
    if (piece.silence || piece.bytes.empty()) {
      ++piece_;
      return piece.silence ? 0 : Receive(buffer, maxLength, 0);
    }
    const std::size_t count =
        std::min(piece.bytes.size() - offset_, static_cast<std::size_t>(maxLength));
    std::memcpy(buffer, piece.bytes.data() + offset_, count);
    offset_ += count;
    if (offset_ == piece.bytes.size()) {
      ++piece_;
      offset_ = 0;
    }
    return static_cast<int>(count);
  }
  int Connect(const char* /*ip*/, unsigned short /*port*/) override { return 0; }
  int IsBroken() override { return 0; }
  int GetAdapterInfo(unsigned int /*ip*/, unsigned int* /*address*/, unsigned int* /*mask*/,
                     unsigned int* /*index*/) override {
    return 0;
  }
  int Send(const unsigned char* /*data*/, int length) override { return length; }

 private:
  const Stream& stream_;
  std::size_t piece_ = 0;
  std::size_t offset_ = 0;
};

class Collector final : public TokenSink {
 public:
  explicit Collector(Tokens& tokens) : tokens_(tokens) {}
  void Token(const char* data, std::size_t length) override { tokens_.emplace_back(data, length); }

 private:
  Tokens& tokens_;
};

class ScriptedGate final : public PassGate {
 public:
  explicit ScriptedGate(const std::vector<bool>& answers) : answers_(answers) {}
  bool Interrupted() const override { return next_ < answers_.size() && answers_[next_++]; }

 private:
  const std::vector<bool>& answers_;
  mutable std::size_t next_ = 0;
};

}  // namespace

Passes ReferencePasses(const Stream& stream, const std::string& prefix, const std::string& suffix) {
  ByteReader reader(stream);
  Passes passes;
  while (!reader.Done()) {
    passes.emplace_back();
    StreamPass(reader, prefix, suffix, passes.back());
  }
  return passes;
}

Passes ReceiverPasses(const Stream& stream, const std::string& prefix, const std::string& suffix,
                      std::size_t bufferSize, const std::vector<bool>& interrupts) {
  std::vector<unsigned char> buffer(std::max<std::size_t>(bufferSize, 1));
  StreamReceiver receiver(buffer.data(), buffer.size());
  receiver.Frame(prefix, suffix);
  PieceSocket socket(stream);
  const ScriptedGate gate(interrupts);
  Passes passes;
  Tokens current;
  Collector collector(current);
  // A pass that was interrupted goes on until it ends, as a reference pass
  // runs to its end.
  bool suspended = false;
  while (suspended || !socket.Done() || receiver.Carrying()) {
    suspended = receiver.Pass(socket, buffer.size(), 0, collector, gate) ==
                StreamReceiver::End::Interrupted;
    if (!suspended) {
      passes.push_back(std::move(current));
      current.clear();
    }
  }
  return passes;
}

Tokens FramerDatagram(const std::string& datagram, const std::string& prefix,
                      const std::string& suffix) {
  const DatagramFraming framing(prefix, suffix);
  Tokens tokens;
  Collector collector(tokens);
  framing.Feed(reinterpret_cast<const unsigned char*>(datagram.data()), datagram.size(), collector);
  return tokens;
}

}  // namespace framing_reference
