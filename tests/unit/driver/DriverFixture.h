// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "FakeMultiTask.h"
#include "MemoryStorage.h"
#include "RecordingHostFactory.h"
#include "ScriptedSocket.h"
#include "ScriptedSocketFactory.h"
#include "driver/Protocol_VELT.h"
#include "factory/ProtModule.h"

// A channel over scripted host services: the module is bound to a recording
// host factory that offers a fake multitasking service (real mutexes, tasks
// that never run), a scripted socket service and an in-memory storage. Tests
// run the worker's passes themselves with Pass().
class DriverFixture : public ::testing::Test {
 protected:
  static const char* const kUdpConfig;
  static const char* const kTcpConfig;

  DriverFixture();
  DriverFixture(const DriverFixture&) = delete;
  DriverFixture& operator=(const DriverFixture&) = delete;
  DriverFixture(DriverFixture&&) = delete;
  DriverFixture& operator=(DriverFixture&&) = delete;
  ~DriverFixture() override;

  // A new channel, configured with text (the configuration must parse).
  Protocol_VELT& Create(const std::string& text);
  // Create, then Start.
  Protocol_VELT& Started(const std::string& text);
  // Started, one pass (the worker makes its socket), connect written and one
  // more pass: the channel is connected and its socket is Sock().
  Protocol_VELT& Connected(const std::string& text);
  // Destroys the channel (stopping it first).
  void Destroy();

  // A tag of the channel; fails the test when it cannot be created.
  ITag* Tag(const std::string& uri);

  bool WriteText(ITag* tag, const std::string& text);
  bool WriteInt(ITag* tag, int value);
  bool WriteShort(ITag* tag, int value);
  bool WriteBool(ITag* tag, bool value);
  // The tag's value through Read; ok receives the result.
  std::vector<unsigned char> ReadBytes(ITag* tag, bool* ok = nullptr);
  std::string ReadText(ITag* tag, bool* ok = nullptr);
  int ReadInt(ITag* tag, bool* ok = nullptr);
  int ReadShort(ITag* tag, bool* ok = nullptr);
  bool ReadBool(ITag* tag, bool* ok = nullptr);

  // Runs count worker passes.
  void Pass(int count = 1);
  // The channel's current (most recently created) socket.
  ScriptedSocket& Sock();
  // The bytes of a hex text, for scripts.
  static std::string Bytes(const std::string& hex);
  // The driver console's reply and result.
  std::string Command(const std::string& command, bool* ok = nullptr, int outputSize = 4096);

  FakeMultiTask tasks;
  ScriptedSocketFactory sockets;
  MemoryStorage storage;
  RecordingHostFactory host;
  ProtModule module;
  std::unique_ptr<Protocol_VELT> protocol;
};
