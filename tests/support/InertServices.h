// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "ICDSBuffer.h"
#include "IDiag.h"
#include "IDriverInterface.h"
#include "IFastTimer.h"
#include "IMultiTask2.h"
#include "IPermanentStorage.h"
#include "ISerialFactory.h"
#include "ISmux.h"
#include "ISocketFactory.h"

// Binding-only doubles of the host's services: real objects of each interface
// type, for tests of module binding that never use a service. Every operation
// answers "nothing there": no mutex, no task, no socket, no stored value.
class InertMultiTask final : public IMultiTask2 {
 public:
  const char* GetImpName() const override { return "InertMultiTask"; }
  int GetImpVersion() const override { return 1; }
  void Sleep(int /*milliseconds*/) override {}
  IMutex* CreateMutex() override { return nullptr; }
  void DeleteMutex(IMutex* /*mutex*/) override {}
  ITask* CreateTask(ITaskRunner* /*runner*/, int /*setting*/) override { return nullptr; }
  int StartTask(ITask* /*task*/) override { return 0; }
  int DeleteTask(ITask* /*task*/, int /*waitMilliseconds*/) override { return 1; }
};

class InertSocketFactory final : public ISocketFactory2 {
 public:
  const char* GetImpName() const override { return "InertSocketFactory"; }
  int GetImpVersion() const override { return 1; }
  ISocket* CreateSocket(unsigned short /*localPort*/, int /*tcp*/, int /*flags*/) override {
    return nullptr;
  }
  void DeleteSocket(ISocket* /*socket*/, int /*flags*/) override {}
  int GetAdapterInfo(unsigned int /*ip*/, unsigned int* /*address*/, unsigned int* /*mask*/,
                     unsigned int* /*index*/) override {
    return 0;
  }
};

class InertPermanentStorage final : public IPermanentStorage {
 public:
  IInterface* ConvertTo(const char* /*name*/) override { return nullptr; }
  void SetStringValue(const char* /*section*/, const char* /*name*/,
                      const char* /*value*/) override {}
  void SetBoolValue(const char* /*section*/, const char* /*name*/, bool /*value*/) override {}
  void SetIntValue(const char* /*section*/, const char* /*name*/, int /*value*/) override {}
  const char* GetStringValue(const char* /*section*/, const char* /*name*/) override { return ""; }
  bool GetBoolValue(const char* /*section*/, const char* /*name*/) override { return false; }
  int GetIntValue(const char* /*section*/, const char* /*name*/) override { return 0; }
  int HasValue(const char* /*section*/, const char* /*name*/) override { return 0; }
};

// The identity-only services share one shape.
template <typename Interface>
class InertIdentity final : public Interface {
 public:
  explicit InertIdentity(const char* name) : name_(name) {}
  const char* GetImpName() const override { return name_; }
  int GetImpVersion() const override { return 1; }

 private:
  const char* name_;
};

using InertSerialFactory = InertIdentity<ISerialFactory>;
using InertCDSBuffer = InertIdentity<ICDSBuffer>;
using InertDiag = InertIdentity<IDiag>;
using InertDriverInterface = InertIdentity<IDriverInterface>;
using InertSmux = InertIdentity<ISmux>;
using InertFastTimer = InertIdentity<IFastTimer>;
