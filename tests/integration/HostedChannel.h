// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <gtest/gtest.h>

#include <chrono>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "HostInterfaceFactory.h"
#include "IProtocol.h"
#include "PluginLoader.h"
#include "TempDirectory.h"

// The built plug-in loaded into the reference host, as a panel loads it, with
// a storage file in a fresh folder. Channels are made through the plug-in's
// protocol factory and driven through the host's protocol interface only.
class HostedChannel : public ::testing::Test {
 protected:
  HostedChannel();
  HostedChannel(const HostedChannel&) = delete;
  HostedChannel& operator=(const HostedChannel&) = delete;
  HostedChannel(HostedChannel&&) = delete;
  HostedChannel& operator=(HostedChannel&&) = delete;
  ~HostedChannel() override;

  // Loads the plug-in into a new host over the same storage file.
  void Load();
  // Closes every channel, unloads the plug-in and drops the host.
  void Unload();
  // A configured and started channel named ident.
  IProtocol* Open(const std::string& config, const std::string& ident = "VELT");
  // Stops and deletes the channel.
  void Close();

  ITag* Tag(const std::string& uri);
  bool WriteText(const std::string& uri, const std::string& text);
  bool WriteInt(const std::string& uri, int value);
  bool WriteShort(const std::string& uri, int value);
  bool WriteBool(const std::string& uri, bool value);
  std::string ReadText(const std::string& uri);
  int ReadInt(const std::string& uri);
  int ReadShort(const std::string& uri);
  bool ReadBool(const std::string& uri);
  std::string Console(const std::string& command);

  // The oldest token (read through rx_token sized by rx_token_len), then
  // acknowledged; false when the queue is empty.
  bool TakeToken(std::string& token);
  // Polls condition every few milliseconds; false when it never held within
  // timeout.
  static bool WaitFor(const std::function<bool()>& condition,
                      std::chrono::milliseconds timeout = std::chrono::milliseconds(5000));
  // Waits for count tokens and takes them.
  std::vector<std::string> Tokens(std::size_t count);

  TempDirectory folder;
  std::unique_ptr<HostInterfaceFactory> host;
  std::unique_ptr<PluginLoader> plugin;
  IProtocol* channel = nullptr;

 private:
  std::vector<ITag*> tags_;
};
