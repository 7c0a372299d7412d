// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>

#include "driver/StreamFraming.h"
#include "driver/TokenSink.h"

class ISocket;

// Tells a pass that it should end before it waits for more bytes: a request
// waits for the worker, or the worker is asked to stop.
class PassGate {
 public:
  virtual bool Interrupted() const = 0;

 protected:
  PassGate() = default;
  PassGate(const PassGate&) = default;
  PassGate& operator=(const PassGate&) = default;
  PassGate(PassGate&&) = default;
  PassGate& operator=(PassGate&&) = default;
  ~PassGate() = default;
};

// The stream side of a channel's worker: receives up to a buffer of bytes at
// a time and pushes them through the stream framing. A pass ends where the
// framing ends it (a token with a suffix, a dropped frame) and the bytes
// after that point are carried to the next pass, which frames them before it
// receives again and starts, like every pass, with prefix synchronisation and
// an empty accumulator. So the tokens, their order and where each pass starts
// are those of a pass that receives one byte at a time.
//
// A pass also ends, before it would wait for bytes, when its gate says so;
// the framing then keeps its state, so the next pass goes on exactly where
// this one stopped.
class StreamReceiver {
 public:
  enum class End {
    // A token with a suffix, or a dropped frame.
    Framed,
    // A receive gave nothing (the gap elapsed or the connection failed).
    Silence,
    // The gate asked for it.
    Interrupted,
  };

  // buffer (size bytes, at least 1) is borrowed for the receiver's lifetime.
  StreamReceiver(unsigned char* buffer, std::size_t size) : buffer_(buffer), size_(size) {}

  // New markers: framing starts afresh; carried bytes are kept.
  void Frame(std::string prefix, std::string suffix);
  // Drops the carried bytes and any partial frame (the socket was renewed).
  void Discard();
  bool Carrying() const { return begin_ < end_; }

  // One pass: frames the carried bytes, then receives up to receiveSize
  // bytes at a time (at most the buffer's size) with the time-out
  // (milliseconds) while nothing ends the pass.
  End Pass(ISocket& socket, std::size_t receiveSize, int timeout, TokenSink& sink,
           const PassGate& gate);
  // Frames every carried byte, pass after pass, without receiving; a frame
  // still open at the end stays open.
  void Drain(TokenSink& sink);

 private:
  // Frames carried bytes until the pass ends or they run out; true when the
  // pass ended.
  bool FrameCarried(TokenSink& sink);

  unsigned char* buffer_;
  std::size_t size_;
  std::size_t begin_ = 0;
  std::size_t end_ = 0;
  StreamFraming framing_;
};
