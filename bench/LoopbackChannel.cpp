// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "LoopbackChannel.h"

#include <cstring>
#include <stdexcept>
#include <thread>

LoopbackChannel::LoopbackChannel(const std::string& pluginPath, const std::string& config)
    : host_("") {
  plugin_ = std::make_unique<PluginLoader>(pluginPath, host_);
  protocol_ = plugin_->Protocols().CreateProtocol("VELT");
  if (protocol_ == nullptr) {
    throw std::runtime_error("the plug-in made no VELT channel");
  }
  if (!protocol_->Config(config.c_str())) {
    const std::string reason = LastError();
    plugin_->Protocols().DeleteProtocol(protocol_);
    throw std::runtime_error("configuration refused: " + reason);
  }
  protocol_->Start();
}

LoopbackChannel::~LoopbackChannel() {
  protocol_->Stop();
  for (ITag* tag : tags_) {
    protocol_->FreeTag(tag);
  }
  plugin_->Protocols().DeleteProtocol(protocol_);
}

ITag* LoopbackChannel::Tag(const std::string& uri) {
  ITag* const tag = protocol_->CreateTag(uri.c_str());
  if (tag == nullptr) {
    throw std::runtime_error(uri + ": " + LastError());
  }
  tags_.push_back(tag);
  return tag;
}

bool LoopbackChannel::Connect(std::chrono::milliseconds timeout) {
  const unsigned char on = 1;
  if (!protocol_->Write(Tag("?connect?boolean"), &on)) {
    return false;
  }
  ITag* const status = Tag("?conn_stat?boolean");
  const auto deadline = std::chrono::steady_clock::now() + timeout;
  unsigned char connected = 0;
  while (!protocol_->Read(status, &connected) || connected == 0) {
    if (std::chrono::steady_clock::now() >= deadline) {
      return false;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
  }
  return true;
}

int LoopbackChannel::ReadInt(ITag* tag) {
  unsigned char bytes[4] = {};
  if (!protocol_->Read(tag, bytes)) {
    return 0;
  }
  int value = 0;
  std::memcpy(&value, bytes, sizeof value);
  return value;
}

std::string LoopbackChannel::LastError() const { return protocol_->GetLastErrorString(); }
