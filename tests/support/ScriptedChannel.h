// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <memory>
#include <string>

#include "FakeMultiTask.h"
#include "MemoryStorage.h"
#include "RecordingHostFactory.h"
#include "ScriptedSocketFactory.h"
#include "driver/Protocol_VELT.h"
#include "factory/ProtModule.h"

// One token channel over the test doubles of the host's services, for
// programs that are not gtest fixtures (fuzz targets, benchmarks): a module
// bound to a fake multitasking service (real mutexes, a worker task that
// never runs), a scripted socket service and an in-memory storage. The
// caller runs the worker's passes itself with Protocol().Task().
class ScriptedChannel {
 public:
  // Binds the module and configures a channel with config; starts it when
  // start is set and the configuration was accepted.
  ScriptedChannel(const std::string& config, bool start);
  ScriptedChannel(const ScriptedChannel&) = delete;
  ScriptedChannel& operator=(const ScriptedChannel&) = delete;
  ScriptedChannel(ScriptedChannel&&) = delete;
  ScriptedChannel& operator=(ScriptedChannel&&) = delete;
  // Stops and deletes the channel, then gives the services back.
  ~ScriptedChannel();

  // Whether the module accepted the services.
  bool Bound() const { return bound_; }
  // Whether the channel accepted its configuration.
  bool Configured() const { return configured_; }
  Protocol_VELT& Protocol() { return *protocol_; }
  ScriptedSocketFactory& Sockets() { return sockets_; }
  // Queues a received token as the worker does (hex text when hex tokens
  // are on, dropping the oldest at the bound).
  void Receive(const std::string& token);
  // Connects the started channel as a host would: one pass (the worker
  // makes its socket), connect switched on, one more pass (it connects).
  // Answers the channel's socket, which then keeps no records, so long runs
  // on it do not allocate.
  ScriptedSocket& Connect();

 private:
  FakeMultiTask tasks_;
  ScriptedSocketFactory sockets_;
  MemoryStorage storage_;
  RecordingHostFactory host_;
  ProtModule module_;
  std::unique_ptr<Protocol_VELT> protocol_;
  bool bound_ = false;
  bool configured_ = false;
};
