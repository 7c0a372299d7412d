// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/TaskRunner_VELT.h"

#include "driver/Protocol_VELT.h"

void TaskRunner_VELT::Task() {
  for (;;) {
    ITask* const task = workerTask.load();
    if (task == nullptr || task->IsStopping() != 0) {
      return;
    }
    protocol->Task();
    multiTask->Sleep(0);
  }
}

bool TaskRunner_VELT::stopRequested() const {
  const ITask* const task = workerTask.load();
  return task != nullptr && task->IsStopping() != 0;
}
