// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <map>
#include <memory>
#include <mutex>
#include <string>

#include "HostInterfaceFactory.h"
#include "IProtocol.h"
#include "ITag.h"
#include "PluginLoader.h"

// The built plug-in in the reference host, as a panel runs it, with one
// channel configured and started, for the fault suite's cases. Tags are
// made on first use and kept; every operation may be called from any
// thread, as a panel's tag threads do.
class PluginChannel {
 public:
  // storagePath empty: no permanent storage. Throws std::runtime_error when
  // the plug-in does not load or the channel refuses its configuration.
  PluginChannel(const std::string& plugin, const std::string& storagePath,
                const std::string& config, const std::string& ident = "VELT");
  PluginChannel(const PluginChannel&) = delete;
  PluginChannel& operator=(const PluginChannel&) = delete;
  PluginChannel(PluginChannel&&) = delete;
  PluginChannel& operator=(PluginChannel&&) = delete;
  // Stops and deletes the channel and unloads the plug-in.
  ~PluginChannel();

  HostInterfaceFactory& Host() { return *host_; }
  IProtocol& Protocol() { return *protocol_; }

  // A text tag: the text and zero bytes after it.
  bool WriteText(const std::string& uri, const std::string& text);
  // A number tag of 1, 2 or 4 bytes, in the host's byte order.
  bool WriteNumber(const std::string& uri, unsigned value);
  // A text tag's value up to its first zero byte (empty when the read fails).
  std::string ReadText(const std::string& uri);
  // The tag read as an unsigned number of its length (0 when the read fails).
  unsigned ReadNumber(const std::string& uri);
  // Writes connect 1 and waits until conn_stat reads 1.
  bool Connect(std::chrono::milliseconds timeout);
  // The oldest token, read through rx_token sized by rx_token_len, then
  // acknowledged; false when none waits.
  bool TakeToken(std::string& token);
  // Stages gap and applies with SP_Done.
  bool ApplyGap(unsigned gap);
  std::string LastError() const;

 private:
  ITag* Tag(const std::string& uri);

  std::unique_ptr<HostInterfaceFactory> host_;
  std::unique_ptr<PluginLoader> plugin_;
  IProtocol* protocol_ = nullptr;
  std::mutex tagsLock_;
  std::map<std::string, ITag*> tags_;
};
