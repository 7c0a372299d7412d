// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "IMultiTask2.h"

// A multitasking service for deterministic tests. Mutexes are real (so the
// race detector sees the locking); tasks are handles that never run unless the
// test asks for threads: the test calls the driver's pass itself. Every call
// is recorded.
class FakeMultiTask final : public IMultiTask2 {
 public:
  FakeMultiTask();
  FakeMultiTask(const FakeMultiTask&) = delete;
  FakeMultiTask& operator=(const FakeMultiTask&) = delete;
  FakeMultiTask(FakeMultiTask&&) = delete;
  FakeMultiTask& operator=(FakeMultiTask&&) = delete;
  ~FakeMultiTask();

  const char* GetImpName() const override { return "FakeMultiTask"; }
  int GetImpVersion() const override { return 7; }
  void Sleep(int milliseconds) override;
  IMutex* CreateMutex() override;
  void DeleteMutex(IMutex* mutex) override;
  ITask* CreateTask(ITaskRunner* runner, int setting) override;
  int StartTask(ITask* task) override;
  int DeleteTask(ITask* task, int waitMilliseconds) override;

  // Test controls.
  // When set, StartTask runs the runner on a real thread and DeleteTask asks
  // it to stop and joins it.
  void RunTasksOnThreads(bool on) { threads_ = on; }
  // The next count DeleteTask calls answer 0 (task still running).
  void DeleteTaskFailures(int count) { deleteFailures_ = count; }
  // Called by StartTask before the task runs, to observe what the task would
  // see first.
  void OnStartTask(std::function<void()> hook) { onStart_ = std::move(hook); }

  // Records.
  int LiveMutexes() const;
  // How many of the fake's mutexes the calling thread holds now.
  static int MutexesHeldHere() { return HeldByThisThread(); }
  int LiveTasks() const;
  int TasksCreated() const { return tasksCreated_; }
  int LastTaskSetting() const { return lastSetting_; }
  // Sleeps asked for since the last ClearSleeps (not recorded when tasks run
  // on threads).
  std::vector<int> Sleeps() const;
  void ClearSleeps();
  std::vector<int> DeleteWaits() const;
  // The runner of the most recently created task.
  ITaskRunner* LastRunner() const { return lastRunner_; }

 private:
  class Mutex;
  static int& HeldByThisThread();
  class Task;

  mutable std::mutex lock_;
  std::vector<std::unique_ptr<Mutex>> mutexes_;
  std::vector<std::unique_ptr<Task>> tasks_;
  std::vector<int> sleeps_;
  std::vector<int> deleteWaits_;
  std::atomic<bool> threads_{false};
  int deleteFailures_ = 0;
  int tasksCreated_ = 0;
  int lastSetting_ = -1;
  ITaskRunner* lastRunner_ = nullptr;
  std::function<void()> onStart_;
};
