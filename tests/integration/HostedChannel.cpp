// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostedChannel.h"

#include <cstdint>
#include <cstring>
#include <thread>

HostedChannel::HostedChannel() { Load(); }

HostedChannel::~HostedChannel() { Unload(); }

void HostedChannel::Load() {
  host = std::make_unique<HostInterfaceFactory>(folder.File("storage.ini"));
  plugin = std::make_unique<PluginLoader>(VELT_PLUGIN_PATH, *host);
}

void HostedChannel::Unload() {
  Close();
  plugin.reset();
  if (host) {
    EXPECT_EQ(host->HeldTotal(), 0);
  }
  host.reset();
}

IProtocol* HostedChannel::Open(const std::string& config, const std::string& ident) {
  Close();
  channel = plugin->Protocols().CreateProtocol("VELT");
  EXPECT_NE(channel, nullptr);
  channel->SetIdent(ident.c_str());
  EXPECT_TRUE(channel->Config(config.c_str())) << channel->GetLastErrorString();
  EXPECT_TRUE(channel->Start());
  return channel;
}

void HostedChannel::Close() {
  if (channel == nullptr) {
    return;
  }
  EXPECT_TRUE(channel->Stop());
  for (ITag* tag : tags_) {
    channel->FreeTag(tag);
  }
  tags_.clear();
  plugin->Protocols().DeleteProtocol(channel);
  channel = nullptr;
}

ITag* HostedChannel::Tag(const std::string& uri) {
  ITag* const tag = channel->CreateTag(uri.c_str());
  EXPECT_NE(tag, nullptr) << uri << ": " << channel->GetLastErrorString();
  if (tag != nullptr) {
    tags_.push_back(tag);
  }
  return tag;
}

bool HostedChannel::WriteText(const std::string& uri, const std::string& text) {
  ITag* const tag = Tag(uri);
  std::vector<unsigned char> value(static_cast<std::size_t>(tag->GetVarLength()) + 1, 0);
  std::memcpy(value.data(), text.data(), std::min(text.size(), value.size() - 1));
  return channel->Write(tag, value.data());
}

bool HostedChannel::WriteInt(const std::string& uri, int value) {
  unsigned char bytes[sizeof value];
  std::memcpy(bytes, &value, sizeof value);
  return channel->Write(Tag(uri), bytes);
}

bool HostedChannel::WriteShort(const std::string& uri, int value) {
  const auto half = static_cast<std::uint16_t>(value);
  unsigned char bytes[sizeof half];
  std::memcpy(bytes, &half, sizeof half);
  return channel->Write(Tag(uri), bytes);
}

bool HostedChannel::WriteBool(const std::string& uri, bool value) {
  const unsigned char byte = value ? 1 : 0;
  return channel->Write(Tag(uri), &byte);
}

std::string HostedChannel::ReadText(const std::string& uri) {
  ITag* const tag = Tag(uri);
  std::vector<char> value(static_cast<std::size_t>(tag->GetVarLength()) + 1, 0);
  EXPECT_TRUE(channel->Read(tag, reinterpret_cast<unsigned char*>(value.data())))
      << uri << ": " << channel->GetLastErrorString();
  return value.data();
}

int HostedChannel::ReadInt(const std::string& uri) {
  unsigned char bytes[4] = {};
  EXPECT_TRUE(channel->Read(Tag(uri), bytes)) << uri << ": " << channel->GetLastErrorString();
  int value = 0;
  std::memcpy(&value, bytes, sizeof value);
  return value;
}

int HostedChannel::ReadShort(const std::string& uri) {
  unsigned char bytes[2] = {};
  EXPECT_TRUE(channel->Read(Tag(uri), bytes)) << uri << ": " << channel->GetLastErrorString();
  std::uint16_t value = 0;
  std::memcpy(&value, bytes, sizeof value);
  return value;
}

bool HostedChannel::ReadBool(const std::string& uri) {
  unsigned char byte = 0;
  EXPECT_TRUE(channel->Read(Tag(uri), &byte)) << uri << ": " << channel->GetLastErrorString();
  return byte != 0;
}

std::string HostedChannel::Console(const std::string& command) {
  std::vector<char> reply(4096, 0);
  channel->DoCommand(command.c_str(), reply.data(), static_cast<int>(reply.size()) - 1);
  return reply.data();
}

bool HostedChannel::TakeToken(std::string& token) {
  ITag* const length = Tag("?rx_token_len?unsignedInt");
  unsigned char bytes[4] = {};
  if (!channel->Read(length, bytes)) {
    return false;
  }
  int size = 0;
  std::memcpy(&size, bytes, sizeof size);
  if (Console("tokens_available") == "0") {
    return false;
  }
  ITag* const rx = Tag("?rx_token?string-" + std::to_string(size + 1));
  std::vector<char> value(static_cast<std::size_t>(size) + 2, 0);
  if (!channel->Read(rx, reinterpret_cast<unsigned char*>(value.data()))) {
    return false;
  }
  token.assign(value.data(), static_cast<std::size_t>(size));
  const unsigned char ack = 1;
  return channel->Write(Tag("?token_ack?boolean"), &ack);
}

bool HostedChannel::WaitFor(const std::function<bool()>& condition,
                            std::chrono::milliseconds timeout) {
  const auto deadline = std::chrono::steady_clock::now() + timeout;
  while (!condition()) {
    if (std::chrono::steady_clock::now() >= deadline) {
      return false;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
  }
  return true;
}

std::vector<std::string> HostedChannel::Tokens(std::size_t count) {
  EXPECT_TRUE(WaitFor([&] { return Console("tokens_available") == std::to_string(count); }))
      << "tokens available: " << Console("tokens_available");
  std::vector<std::string> tokens;
  std::string token;
  while (tokens.size() < count && TakeToken(token)) {
    tokens.push_back(token);
  }
  return tokens;
}
