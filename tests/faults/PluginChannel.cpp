// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "PluginChannel.h"

#include <cstring>
#include <stdexcept>
#include <thread>
#include <vector>

PluginChannel::PluginChannel(const std::string& plugin, const std::string& storagePath,
                             const std::string& config, const std::string& ident)
    : host_(std::make_unique<HostInterfaceFactory>(storagePath)),
      plugin_(std::make_unique<PluginLoader>(plugin, *host_)),
      protocol_(plugin_->Protocols().CreateProtocol("VELT")) {
  protocol_->SetIdent(ident.c_str());
  if (!protocol_->Config(config.c_str()) || !protocol_->Start()) {
    const std::string error = LastError();
    plugin_->Protocols().DeleteProtocol(protocol_);
    throw std::runtime_error("the channel refused its configuration: " + error);
  }
}

PluginChannel::~PluginChannel() {
  protocol_->Stop();
  for (const auto& entry : tags_) {
    protocol_->FreeTag(entry.second);
  }
  plugin_->Protocols().DeleteProtocol(protocol_);
}

ITag* PluginChannel::Tag(const std::string& uri) {
  const std::lock_guard<std::mutex> lock(tagsLock_);
  ITag*& tag = tags_[uri];
  if (tag == nullptr) {
    tag = protocol_->CreateTag(uri.c_str());
    if (tag == nullptr) {
      tags_.erase(uri);
      throw std::runtime_error("tag " + uri + " refused: " + LastError());
    }
  }
  return tag;
}

bool PluginChannel::WriteText(const std::string& uri, const std::string& text) {
  ITag* const tag = Tag(uri);
  std::vector<unsigned char> value(static_cast<std::size_t>(tag->GetVarLength()) + 1, 0);
  std::memcpy(value.data(), text.data(), std::min(text.size(), value.size() - 1));
  return protocol_->Write(tag, value.data());
}

bool PluginChannel::WriteNumber(const std::string& uri, unsigned value) {
  ITag* const tag = Tag(uri);
  std::vector<unsigned char> bytes(8, 0);
  const int length = tag->GetVarLength();
  if (length == 1) {
    bytes[0] = static_cast<unsigned char>(value);
  } else if (length == 2) {
    const auto half = static_cast<unsigned short>(value);
    std::memcpy(bytes.data(), &half, sizeof half);
  } else {
    std::memcpy(bytes.data(), &value, sizeof value);
  }
  return protocol_->Write(tag, bytes.data());
}

std::string PluginChannel::ReadText(const std::string& uri) {
  ITag* const tag = Tag(uri);
  std::vector<char> value(static_cast<std::size_t>(tag->GetVarLength()) + 1, 0);
  if (!protocol_->Read(tag, reinterpret_cast<unsigned char*>(value.data()))) {
    return {};
  }
  return value.data();
}

unsigned PluginChannel::ReadNumber(const std::string& uri) {
  ITag* const tag = Tag(uri);
  std::vector<unsigned char> bytes(8, 0);
  if (!protocol_->Read(tag, bytes.data())) {
    return 0;
  }
  const int length = tag->GetVarLength();
  if (length == 1) {
    return bytes[0];
  }
  if (length == 2) {
    unsigned short half = 0;
    std::memcpy(&half, bytes.data(), sizeof half);
    return half;
  }
  unsigned value = 0;
  std::memcpy(&value, bytes.data(), sizeof value);
  return value;
}

bool PluginChannel::Connect(std::chrono::milliseconds timeout) {
  if (!WriteNumber("?connect?boolean", 1)) {
    return false;
  }
  const auto deadline = std::chrono::steady_clock::now() + timeout;
  while (ReadNumber("?conn_stat?boolean") != 1) {
    if (std::chrono::steady_clock::now() > deadline) {
      return false;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(2));
  }
  return true;
}

bool PluginChannel::TakeToken(std::string& token) {
  if (ReadNumber("?tokens_available?unsignedInt") == 0) {
    return false;
  }
  const unsigned length = ReadNumber("?rx_token_len?unsignedInt");
  ITag* const tag = Tag("?rx_token?string-" + std::to_string(length + 1));
  std::vector<unsigned char> value(length + 2, 0);
  if (!protocol_->Read(tag, value.data())) {
    return false;
  }
  token.assign(reinterpret_cast<const char*>(value.data()), length);
  return WriteNumber("?token_ack?boolean", 1);
}

bool PluginChannel::ApplyGap(unsigned gap) {
  return WriteNumber("?SP_Gap?unsignedInt", gap) && WriteNumber("?SP_Done?boolean", 1);
}

std::string PluginChannel::LastError() const {
  const char* const text = protocol_->GetLastErrorString();
  return text == nullptr ? std::string() : text;
}
