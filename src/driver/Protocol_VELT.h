// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>

#include "config/ParamManager.h"
#include "driver/ChannelRequests.h"
#include "driver/ChannelSettings.h"
#include "driver/MemoryAccess.h"
#include "driver/RuntimeParameters.h"
#include "driver/TaskRunner_VELT.h"
#include "driver/TokenChannel.h"
#include "driver/TokenQueue.h"
#include "memory/MemoryManager.h"
#include "protlib/ProtocolBase.h"

class Tag_VELT;

// The token socket driver: one instance per channel, the host's protocol
// object. It adapts the host's protocol interface to the channel's parts:
// the channel engine (TokenChannel), which the worker task drives pass by
// pass; the token queue and the requests, through which the host's threads
// reach the engine; the runtime parameters; and the memory types' meanings
// (MemoryAccess).
//
// Threads: the host's control thread configures, starts and stops; the
// worker runs Task(); the host's tag threads read and write; the console
// thread runs DoCommand. The lock the host's threads share with the worker
// is queueLock (in tokenQueue), which also covers a whole apply; the engine
// serialises sends with the replacement of its socket (socketLock). Lock
// order: queueLock, then the parameter sets' and the socket's own.
class Protocol_VELT final : public ProtocolBase {
 public:
  Protocol_VELT();
  Protocol_VELT(const Protocol_VELT&) = delete;
  Protocol_VELT& operator=(const Protocol_VELT&) = delete;
  Protocol_VELT(Protocol_VELT&&) = delete;
  Protocol_VELT& operator=(Protocol_VELT&&) = delete;
  ~Protocol_VELT() override;

  // Identity.
  IInterface* ConvertTo(const char* name) override;
  const char* GetImpName() const override;
  int GetImpVersion() const override;
  const char* GetName() const override;
  int GetProtocolVersion() const override;
  int GetProtocolType() const override;
  const char* GetProtocolName() const override;
  int GetMaxTm(const ITag* tag) override;
  int GetNodeID(const ITag* tag) override;
  const char* GetXml() const override;
  const char* const* tagUriNames() const override;

  bool Config(const char* text) override;
  bool Start() override;
  bool Stop() override;
  TagBase* CreateTagBase(const char* uri) override;
  bool CanBeOptimized(const ITag* tag1, const ITag* tag2, bool flag) override;
  bool ReadBlock(const ITag* tag, unsigned char* buffer, int length) override;
  bool Write(const ITag* tag, const unsigned char* data) override;
  bool DoCommand(const char* command, char* output, int outputSize) override;
  int Extend(int code, void* data) override;

  // Copies src with its terminator into dst; returns dst.
  static char* _jstrcpy(char* dst, const char* src);

  // One pass of the worker.
  void Task();

  // Answers one memory type into data (at most the room of count items).
  bool doReadBlock(const Tag_VELT* tag, int index, unsigned char* data, int count);
  // Gives one memory type the value at the start of data.
  bool doWrite(const Tag_VELT* tag, int index, const unsigned char* data, int count);

  const _VELT::ParamManager& getParamManager() const { return paramManager; }
  const MemoryManager& getMemoryManager() const { return memoryManager; }

  // The channel's seams and state, for the console and for tests.
  TokenQueue& getTokenQueue() { return tokenQueue; }
  ChannelRequests& getRequests() { return requests; }
  MemoryAccess& getAccess() { return access; }
  // A copy of the working settings.
  ChannelSettings getSettings() { return access.Working(); }
  bool isConnected() const { return channel.isConnected(); }
  bool isConnectRequested();

 private:
  TaskRunner_VELT runner;
  std::atomic<bool> running{false};
  _VELT::ParamManager paramManager;
  MemoryManager memoryManager;
  RuntimeParameters parameters;
  TokenQueue tokenQueue;
  ChannelRequests requests;
  TokenChannel channel;
  MemoryAccess access;
};
