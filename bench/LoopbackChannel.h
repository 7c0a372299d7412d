// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <memory>
#include <string>
#include <vector>

#include "HostInterfaceFactory.h"
#include "IProtocol.h"
#include "ITag.h"
#include "PluginLoader.h"

// The built plug-in loaded into the reference host (without permanent
// storage) as a panel loads it, with one channel configured and started.
// Everything goes through the host's protocol interface.
class LoopbackChannel {
 public:
  // Throws std::runtime_error when the plug-in does not load or the channel
  // refuses its configuration.
  LoopbackChannel(const std::string& pluginPath, const std::string& config);
  LoopbackChannel(const LoopbackChannel&) = delete;
  LoopbackChannel& operator=(const LoopbackChannel&) = delete;
  LoopbackChannel(LoopbackChannel&&) = delete;
  LoopbackChannel& operator=(LoopbackChannel&&) = delete;
  // Stops the channel, frees its tags, deletes it and unloads the plug-in.
  ~LoopbackChannel();

  IProtocol& Protocol() { return *protocol_; }
  // A tag of the channel, freed with the channel; throws when refused.
  ITag* Tag(const std::string& uri);
  // Writes 1 to connect and waits until conn_stat reads 1; false after the
  // time-out.
  bool Connect(std::chrono::milliseconds timeout);
  // The tag's value read as a 32-bit integer (0 when the read fails).
  int ReadInt(ITag* tag);
  // The channel's last error text.
  std::string LastError() const;

 private:
  HostInterfaceFactory host_;
  std::unique_ptr<PluginLoader> plugin_;
  IProtocol* protocol_ = nullptr;
  std::vector<ITag*> tags_;
};
