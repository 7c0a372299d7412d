// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"
#include "ITaskRunner.h"

// A mutex handle created by IMultiTask2::CreateMutex.
class IMutex {
 public:
  virtual void Lock() = 0;
  virtual void Unlock() = 0;

 protected:
  IMutex() = default;
  IMutex(const IMutex&) = default;
  IMutex& operator=(const IMutex&) = default;
  IMutex(IMutex&&) = default;
  IMutex& operator=(IMutex&&) = default;
  ~IMutex() = default;
};

// A task handle created by IMultiTask2::CreateTask.
class ITask {
 public:
  // Non-zero once the task has been asked to end.
  virtual int IsStopping() const = 0;

 protected:
  ITask() = default;
  ITask(const ITask&) = default;
  ITask& operator=(const ITask&) = default;
  ITask(ITask&&) = default;
  ITask& operator=(ITask&&) = default;
  ~ITask() = default;
};

// The host's multitasking service ("IMultiTask2").
class IMultiTask2 : public IInterface {
 public:
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;
  // Sleeps the calling thread; 0 yields.
  virtual void Sleep(int milliseconds) = 0;
  virtual IMutex* CreateMutex() = 0;
  virtual void DeleteMutex(IMutex* mutex) = 0;
  // Creates a task that will run runner->Task() once started; setting is the
  // host's task setting. Null on failure.
  virtual ITask* CreateTask(ITaskRunner* runner, int setting) = 0;
  // Non-zero when the task was started.
  virtual int StartTask(ITask* task) = 0;
  // Asks the task to end and waits up to waitMilliseconds for it. Non-zero
  // when the task has ended: the handle is then deleted. Zero leaves the task
  // and its handle in place, and the call may be repeated.
  virtual int DeleteTask(ITask* task, int waitMilliseconds) = 0;

 protected:
  IMultiTask2() = default;
  IMultiTask2(const IMultiTask2&) = default;
  IMultiTask2& operator=(const IMultiTask2&) = default;
  IMultiTask2(IMultiTask2&&) = default;
  IMultiTask2& operator=(IMultiTask2&&) = default;
  ~IMultiTask2() = default;
};
