// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <pthread.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <mutex>
#include <string>

#include "FileDescriptor.h"
#include "IMultiTask2.h"

// One host task: a thread that calls its runner's Task() once. The thread
// does not exist before Start. A stop request sets the flag that IsStopping
// reports and signals the task's stop descriptor, an eventfd that stays
// readable from then on, so that a socket call blocked on the task's own
// thread can wake at once (HostSocket polls it beside the socket).
class HostTask final : public ITask {
 public:
  // The thread gets stackBytes of stack (at least the system's minimum); 0
  // keeps the system's default. Throws std::system_error when the stop
  // descriptor cannot be created.
  HostTask(ITaskRunner* runner, int setting, std::string name, std::size_t stackBytes = 0);
  HostTask(const HostTask&) = delete;
  HostTask& operator=(const HostTask&) = delete;
  HostTask(HostTask&&) = delete;
  HostTask& operator=(HostTask&&) = delete;
  // Asks the task to stop and waits until its runner has returned.
  virtual ~HostTask();

  // Non-zero once a stop has been requested.
  int IsStopping() const override;

  // Starts the thread; false when already started or when the thread cannot
  // be created.
  bool Start();
  void RequestStop();
  // True once the runner has returned, or when the task was never started;
  // waits at most `wait` for that.
  bool WaitEnded(std::chrono::milliseconds wait);
  // True when called on this task's own thread.
  bool IsCurrentThread() const;

  int Setting() const { return setting_; }
  const std::string& Name() const { return name_; }
  std::size_t StackBytes() const { return stackBytes_; }

  // The task whose thread is calling, or null on a thread that is no host
  // task.
  static HostTask* Current();
  // The calling task's stop descriptor, -1 on a thread that is no host task.
  static int CurrentStopDescriptor();

 private:
  static void* Enter(void* task) noexcept;
  void Run() noexcept;

  ITaskRunner* const runner_;
  const int setting_;
  const std::string name_;
  const std::size_t stackBytes_;
  FileDescriptor stopSignal_;
  std::atomic<bool> stopping_{false};

  mutable std::mutex stateMutex_;
  std::condition_variable endedChanged_;
  bool started_ = false;
  bool ended_ = false;
  // Set while a started thread waits to be joined.
  bool joinable_ = false;
  pthread_t thread_{};
};
