// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <map>
#include <memory>
#include <mutex>

#include "HostMutex.h"
#include "HostTask.h"
#include "IMultiTask2.h"

// The multitasking service ("IMultiTask2") on POSIX threads. It owns every
// task and mutex it creates until they are deleted through it; handles it
// did not create are refused.
class HostMultiTask final : public IMultiTask2 {
 public:
  // The stack of each task thread. A driver's worker needs a few KiB; the
  // system's default (8 MiB) would cost a 32-bit panel 2 GiB of address
  // space for 256 channels.
  static constexpr std::size_t kDefaultTaskStackBytes = std::size_t{256} * 1024;

  explicit HostMultiTask(std::size_t taskStackBytes = kDefaultTaskStackBytes)
      : taskStackBytes_(taskStackBytes) {}
  HostMultiTask(const HostMultiTask&) = delete;
  HostMultiTask& operator=(const HostMultiTask&) = delete;
  HostMultiTask(HostMultiTask&&) = delete;
  HostMultiTask& operator=(HostMultiTask&&) = delete;
  // Asks every task not yet deleted to stop and waits for each runner to
  // return, then frees the remaining mutexes.
  virtual ~HostMultiTask();

  // "HostMultiTask".
  const char* GetImpName() const override;
  // 100.
  int GetImpVersion() const override;
  // Sleeps the calling thread; 0 or less yields.
  void Sleep(int milliseconds) override;
  IMutex* CreateMutex() override;
  // Frees a mutex made by CreateMutex; null and unknown handles are ignored.
  void DeleteMutex(IMutex* mutex) override;
  // A task that will run runner->Task() once started; its thread does not
  // exist yet. The setting is kept (HostTask::Setting) and has no other
  // effect on this host. Null for a null runner or when no task can be made.
  ITask* CreateTask(ITaskRunner* runner, int setting) override;
  // 1 when the thread was started; 0 for a null or unknown handle, a task
  // already started, or a thread that cannot be created.
  int StartTask(ITask* task) override;
  // Asks the task to stop and waits up to waitMilliseconds (negative counts
  // as 0) for its runner to return. 1 once it has ended (or was never
  // started): the handle is then freed. 0 when it has not ended within the
  // wait (the call may be repeated), for a null or unknown handle, and when
  // called on the task's own thread (a task cannot wait for itself).
  int DeleteTask(ITask* task, int waitMilliseconds) override;

  // Tasks created and not yet deleted.
  std::size_t LiveTasks() const;
  // Mutexes created and not yet deleted.
  std::size_t LiveMutexes() const;
  std::size_t TaskStackBytes() const { return taskStackBytes_; }

 private:
  std::shared_ptr<HostTask> FindTask(const ITask* task) const;

  const std::size_t taskStackBytes_;
  mutable std::mutex registryMutex_;
  std::map<const ITask*, std::shared_ptr<HostTask>> tasks_;
  std::map<const IMutex*, std::unique_ptr<HostMutex>> mutexes_;
  unsigned taskCounter_ = 0;
};
