// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// The body of a host task: the host's task calls Task() once on its own
// thread, after IMultiTask2::StartTask. The plug-in's runner loops in Task(),
// one pass at a time, and returns once the task's IsStopping() turns
// non-zero. The runner belongs to its creator and outlives the task.
// Slots: two destructor slots, Task.
class ITaskRunner {
 public:
  virtual ~ITaskRunner() = default;
  // Runs the task's work on the task's thread; returning ends the task.
  virtual void Task() = 0;

 protected:
  ITaskRunner() = default;
  ITaskRunner(const ITaskRunner&) = default;
  ITaskRunner& operator=(const ITaskRunner&) = default;
  ITaskRunner(ITaskRunner&&) = default;
  ITaskRunner& operator=(ITaskRunner&&) = default;
};

namespace MultiTaskN {

// Convenience base that task runners derive from.
class TaskRunner : public ITaskRunner {
 public:
  ~TaskRunner() override = default;

 protected:
  TaskRunner() = default;
  TaskRunner(const TaskRunner&) = default;
  TaskRunner& operator=(const TaskRunner&) = default;
  TaskRunner(TaskRunner&&) = default;
  TaskRunner& operator=(TaskRunner&&) = default;
};

}  // namespace MultiTaskN
