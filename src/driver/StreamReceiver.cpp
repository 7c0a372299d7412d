// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/StreamReceiver.h"

#include <algorithm>
#include <utility>

#include "ISocket.h"

void StreamReceiver::Frame(std::string prefix, std::string suffix) {
  framing_ = StreamFraming(std::move(prefix), std::move(suffix));
}

void StreamReceiver::Discard() {
  begin_ = 0;
  end_ = 0;
  framing_.Restart();
}

bool StreamReceiver::FrameCarried(TokenSink& sink) {
  const StreamFraming::Fed fed = framing_.Feed(buffer_ + begin_, end_ - begin_, sink);
  begin_ += fed.taken;
  return fed.passEnded;
}

StreamReceiver::End StreamReceiver::Pass(ISocket& socket, std::size_t receiveSize, int timeout,
                                         TokenSink& sink, const PassGate& gate) {
  const int most = static_cast<int>(std::min(std::max<std::size_t>(receiveSize, 1), size_));
  for (;;) {
    if (Carrying() && FrameCarried(sink)) {
      return End::Framed;
    }
    if (gate.Interrupted()) {
      return End::Interrupted;
    }
    const int received = socket.Receive(buffer_, most, timeout);
    if (received < 1) {
      framing_.Gap(sink);
      return End::Silence;
    }
    begin_ = 0;
    end_ = std::min(received, most);
  }
}

void StreamReceiver::Drain(TokenSink& sink) {
  while (Carrying()) {
    FrameCarried(sink);
  }
}
