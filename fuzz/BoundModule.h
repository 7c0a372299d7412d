// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "FakeMultiTask.h"
#include "IPermanentStorage.h"
#include "RecordingHostFactory.h"
#include "ScriptedSocketFactory.h"
#include "factory/ProtModule.h"

// The plug-in's module bound to test doubles of the host's services: a fake
// multitasking service (real mutexes, a worker task that never runs),
// scripted sockets and the permanent storage given. Channels made while the
// object lives use them; the module is closed when it goes.
class BoundModule {
 public:
  explicit BoundModule(IPermanentStorage& storage);
  BoundModule(const BoundModule&) = delete;
  BoundModule& operator=(const BoundModule&) = delete;
  BoundModule(BoundModule&&) = delete;
  BoundModule& operator=(BoundModule&&) = delete;
  ~BoundModule();

 private:
  FakeMultiTask tasks_;
  ScriptedSocketFactory sockets_;
  RecordingHostFactory host_;
  ProtModule module_;
};
