// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"
#include "ITaskRunner.h"

// A mutex handle created by IMultiTask2::CreateMutex. The plug-in makes one
// per protocol instance and locks it from the worker, tag and console
// threads, for one operation at a time; it never locks it twice from one
// thread, so a plain, non-recursive mutex is enough.
class IMutex {
 public:
  // Blocks until the calling thread holds the mutex.
  virtual void Lock() = 0;
  // Releases the mutex; only the holding thread calls it.
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
  // Non-zero once the task has been asked to end (by DeleteTask). The
  // task's runner polls it on the task's own thread, once per pass.
  virtual int IsStopping() const = 0;

 protected:
  ITask() = default;
  ITask(const ITask&) = default;
  ITask& operator=(const ITask&) = default;
  ITask(ITask&&) = default;
  ITask& operator=(ITask&&) = default;
  ~ITask() = default;
};

// The host's multitasking service ("IMultiTask2", mandatory). The plug-in
// makes a protocol's mutex when the protocol is created and deletes it with
// the protocol; it makes, starts and deletes the worker task in Start and
// Stop on the control thread, and sleeps on the worker thread.
class IMultiTask2 : public IInterface {
 public:
  // The implementation's name and version, shown in a protocol's
  // information text (any thread).
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;
  // Sleeps the calling thread for milliseconds; 0 yields. The worker sleeps
  // 0 between passes and 10 when idle or retrying.
  virtual void Sleep(int milliseconds) = 0;
  // A new unlocked mutex, owned by the host until DeleteMutex. It must not
  // fail: a protocol given null has no lock around its token queue.
  virtual IMutex* CreateMutex() = 0;
  // Frees a mutex made by CreateMutex; no thread holds or waits for it.
  virtual void DeleteMutex(IMutex* mutex) = 0;
  // Creates a task that will run runner->Task() once, on its own thread,
  // after StartTask; setting is the host's task setting (the plug-in asks
  // for 3). Null on failure: the protocol then has no worker.
  virtual ITask* CreateTask(ITaskRunner* runner, int setting) = 0;
  // Non-zero when the task was started.
  virtual int StartTask(ITask* task) = 0;
  // Asks the task to end (IsStopping turns non-zero) and waits up to
  // waitMilliseconds for its runner to return. Non-zero when it has ended:
  // the handle is then deleted. Zero leaves the task and its handle in
  // place, and the call may be repeated (the plug-in repeats it with 1000).
  virtual int DeleteTask(ITask* task, int waitMilliseconds) = 0;

 protected:
  IMultiTask2() = default;
  IMultiTask2(const IMultiTask2&) = default;
  IMultiTask2& operator=(const IMultiTask2&) = default;
  IMultiTask2(IMultiTask2&&) = default;
  IMultiTask2& operator=(IMultiTask2&&) = default;
  ~IMultiTask2() = default;
};
