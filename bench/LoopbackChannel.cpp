// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "LoopbackChannel.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <stdexcept>
#include <thread>
#include <vector>

std::string LoopbackChannel::PluginPath() {
  const char* const chosen = std::getenv("VELT_BENCH_PLUGIN");
  return chosen != nullptr && *chosen != '\0' ? chosen : VELT_PLUGIN_PATH;
}

LoopbackChannel::LoopbackChannel(const std::string& pluginPath, const std::string& config,
                                 const std::string& storagePath)
    : host_(storagePath) {
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

bool LoopbackChannel::WriteInt(ITag* tag, int value) {
  unsigned char bytes[4] = {};
  std::memcpy(bytes, &value, sizeof value);
  return protocol_->Write(tag, bytes);
}

bool LoopbackChannel::WriteBool(ITag* tag, bool value) {
  const unsigned char byte = value ? 1 : 0;
  return protocol_->Write(tag, &byte);
}

bool LoopbackChannel::WriteText(ITag* tag, const std::string& text) {
  std::vector<unsigned char> bytes(static_cast<std::size_t>(tag->GetVarLength()) + 1, 0);
  std::memcpy(bytes.data(), text.data(), std::min(text.size(), bytes.size() - 1));
  return protocol_->Write(tag, bytes.data());
}

bool LoopbackChannel::SetQueueBound(int bound) {
  return WriteInt(Tag("?SP_TokenQueueSize?unsignedInt"), bound) &&
         WriteBool(Tag("?SP_Done?boolean"), true);
}
