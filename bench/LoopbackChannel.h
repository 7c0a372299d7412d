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

// The plug-in loaded into the reference host as a panel loads it, with one
// channel configured and started. Everything goes through the host's
// protocol interface.
class LoopbackChannel {
 public:
  // The plug-in the benchmarks load: the one named by the environment
  // variable VELT_BENCH_PLUGIN when it is set (so one build of the
  // benchmarks can measure another build of the plug-in, such as the one
  // before a change), else the one built with them.
  static std::string PluginPath();

  // storagePath is the host's permanent storage file; empty for a host
  // without one. Throws std::runtime_error when the plug-in does not load or
  // the channel refuses its configuration.
  LoopbackChannel(const std::string& pluginPath, const std::string& config,
                  const std::string& storagePath = "");
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
  bool WriteInt(ITag* tag, int value);
  bool WriteBool(ITag* tag, bool value);
  // Writes text, zero-terminated, to a text tag.
  bool WriteText(ITag* tag, const std::string& text);
  // Stages the token queue's bound and applies it (the configuration allows
  // at most 10000).
  bool SetQueueBound(int bound);
  // The channel's last error text.
  std::string LastError() const;

 private:
  HostInterfaceFactory host_;
  std::unique_ptr<PluginLoader> plugin_;
  IProtocol* protocol_ = nullptr;
  std::vector<ITag*> tags_;
};
