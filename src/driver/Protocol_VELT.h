// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>
#include <mutex>
#include <string>
#include <vector>

#include "config/GroupParameterReplacer.h"
#include "config/ParamManager.h"
#include "config/ParameterReplacer.h"
#include "driver/ChannelSettings.h"
#include "driver/DatagramFraming.h"
#include "driver/SettingsStore.h"
#include "driver/StreamFraming.h"
#include "driver/TaskRunner_VELT.h"
#include "driver/TokenQueue.h"
#include "memory/MemoryManager.h"
#include "protlib/ProtocolBase.h"

class ISocket;
class Tag_VELT;
struct RuntimeParameter;

// The token socket driver: one instance per channel. It owns one UDP or TCP
// socket, a worker task that frames what arrives into tokens, the bounded
// token queue, and the runtime parameters that a running project may stage,
// apply and persist.
//
// Threads: the host's control thread configures, starts and stops; the
// worker runs Task(); the host's tag threads read and write; the console
// thread runs DoCommand. The token queue and the connect flag are guarded by
// the channel's host mutex (queueLock), the working settings by their own
// store, the parameter sets by parametersLock, and the socket pointer by
// socketLock so that a send never reaches a socket being replaced. Lock order:
// queueLock, then parametersLock, then the settings store, then socketLock.
class Protocol_VELT final : public ProtocolBase {
 public:
  // The size of the datagram receive buffer.
  static constexpr int kRxBufferSize = 1536;

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

  // One pass of the worker: supervises the connection, then receives and
  // frames what arrives.
  void Task();
  // Replaces the socket with a new one made for the given settings; false
  // (with the protocol's last error set) when none could be made.
  bool initSocket(const ChannelSettings& current);
  // Appends a token under the queue's lock, held by the caller.
  void addToken(TokenQueue::Guard& held, std::string token);

  // Answers one memory type into data (at most the room of count items).
  bool doReadBlock(const Tag_VELT* tag, int index, unsigned char* data, int count);
  // Gives one memory type the value at the start of data.
  bool doWrite(const Tag_VELT* tag, int index, const unsigned char* data, int count);

  const _VELT::ParamManager& getParamManager() const { return paramManager; }
  const MemoryManager& getMemoryManager() const { return memoryManager; }

  // Used by the console.
  // The working settings, as a consistent copy.
  ChannelSettings getSettings() const { return settings.Get(); }
  bool isConnected() const { return connected.load(); }
  bool isConnectRequested() const { return connectRequested.load(); }
  void setConnectRequested(bool on);
  // Points the channel at another peer without staging or persisting it.
  void setRemote(const std::string& ip, int port);
  // Frames text with the transmit markers and sends it; false (with error
  // set to the reason) when hex tokens are on and the text is not hex.
  bool sendToken(const std::string& text, std::string& error);
  TokenQueue& getTokenQueue() { return tokenQueue; }

 private:
  void refreshWorkerSettings();
  void supervise();
  bool connect();
  // Appends a received token, taking the queue's lock for that one token.
  void queueToken(std::string token);
  void receiveDatagrams(ISocket* sock);
  void receiveStream(ISocket* sock);
  void sendFrame(const std::string& frame);
  void sleep(int milliseconds);

  bool readBlock(const Tag_VELT* tag, unsigned char* buffer, int length);
  bool writeBlock(const Tag_VELT* tag, const unsigned char* data);
  bool readChannel(TokenQueue::Guard& held, const Tag_VELT* tag, unsigned char* data, int room);
  bool readParameter(const Tag_VELT* tag, const RuntimeParameter& parameter, unsigned char* data,
                     int room);
  bool writeChannel(TokenQueue::Guard& held, const Tag_VELT* tag, const unsigned char* data,
                    int room);
  bool writeParameter(const Tag_VELT* tag, const RuntimeParameter& parameter,
                      const unsigned char* data, int room);
  // The value of a runtime parameter in force: the staged one when there is
  // one, else the live one (which falls back to working). The caller holds
  // parametersLock.
  template <typename Value>
  Value valueInForce(const RuntimeParameter& parameter, const Value& working);
  // Sets a working setting to its value in force; true when it changed.
  template <typename Value>
  bool reload(const RuntimeParameter& parameter, Value& setting);
  bool applyParameters();
  static int roomOf(const Tag_VELT* tag, int count);

  TaskRunner_VELT runner;
  std::atomic<bool> running{false};
  _VELT::ParamManager paramManager;
  MemoryManager memoryManager;
  // The live and staged runtime parameters; parametersLock guards both.
  ParameterReplacer liveParams;
  GroupParameterReplacer stagedParams;
  std::mutex parametersLock;

  std::mutex socketLock;
  std::atomic<ISocket*> socket{nullptr};
  SettingsStore settings;
  TokenQueue tokenQueue;
  std::string localBroadcastAddress{"255.255.255.255"};
  std::vector<unsigned char> rxBuffer;
  std::atomic<bool> reinitRequired{false};
  std::atomic<bool> connected{false};
  std::atomic<bool> connectRequested{false};

  // Set when the socket could not be made because the local address is not
  // an address: retrying cannot help until the settings change.
  std::atomic<bool> socketSettingsUnusable{false};

  // The worker's own state.
  std::string lastRemoteIp;
  int lastRemotePort = 0;
  int failedConnects = 0;
  ChannelSettings workerSettings;
  unsigned int workerSettingsVersion = 0;
  // The framers for the current receive markers, made again only when the
  // settings change, not on every pass.
  DatagramFraming workerDatagrams{"", ""};
  StreamFraming workerStream{"", ""};
};
