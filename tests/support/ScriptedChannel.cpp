// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ScriptedChannel.h"

ScriptedChannel::ScriptedChannel(const std::string& config, bool start) {
  host_.Offer("IMultiTask2", &tasks_);
  host_.Offer("ISocketFactory", &sockets_);
  host_.Offer("IPermanentStorage", &storage_);
  bound_ = module_.Init(&host_) == 1;
  protocol_ = std::make_unique<Protocol_VELT>();
  configured_ = protocol_->Config(config.c_str());
  if (configured_ && start) {
    protocol_->Start();
  }
}

ScriptedChannel::~ScriptedChannel() {
  protocol_->Stop();
  protocol_.reset();
  module_.Close();
}

void ScriptedChannel::Receive(const std::string& token) {
  TokenQueue::Guard held(protocol_->getTokenQueue());
  held.addToken(token);
}

ScriptedSocket& ScriptedChannel::Connect() {
  protocol_->Task();
  std::string reply(64, '\0');
  protocol_->DoCommand("connect ON", reply.data(), static_cast<int>(reply.size()));
  protocol_->Task();
  ScriptedSocket& socket = *sockets_.Last();
  socket.KeepRecords(false);
  return socket;
}
