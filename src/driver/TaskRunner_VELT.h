// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>

#include "IMultiTask2.h"
#include "ITaskRunner.h"

class Protocol_VELT;

// The body of a channel's worker task: runs the protocol's passes until the
// host asks the task to end.
class TaskRunner_VELT final : public MultiTaskN::TaskRunner {
 public:
  TaskRunner_VELT(IMultiTask2* service, Protocol_VELT* owner)
      : multiTask(service), protocol(owner) {}

  // While the task exists and is not asked to stop: one pass, then a yield.
  void Task() override;

  IMultiTask2* getMultiTask() const { return multiTask; }
  // True once the host asked the running task to end.
  bool stopRequested() const;
  ITask* getWorkerTask() const { return workerTask.load(); }
  void setWorkerTask(ITask* task) { workerTask.store(task); }

 private:
  IMultiTask2* multiTask;
  // Written by the control thread before the task starts and after it ended;
  // read by the task itself.
  std::atomic<ITask*> workerTask{nullptr};
  Protocol_VELT* protocol;
};
