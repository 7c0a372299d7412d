// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostMultiTask.h"

#include <poll.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <string>
#include <system_error>
#include <thread>
#include <utility>
#include <vector>

namespace {

// Worker threads are named "velt-task-N" (at most 15 characters, the limit
// of a Linux thread name).
std::string TaskName(unsigned number) { return "velt-task-" + std::to_string(number % 100000U); }

}  // namespace

HostMultiTask::~HostMultiTask() {
  std::vector<std::shared_ptr<HostTask>> remaining;
  {
    const std::lock_guard<std::mutex> lock(registryMutex_);
    for (auto& entry : tasks_) {
      remaining.push_back(std::move(entry.second));
    }
    tasks_.clear();
  }
  // Ask them all first, so they end in parallel; each destructor then joins.
  for (const auto& task : remaining) {
    task->RequestStop();
  }
  remaining.clear();
}

const char* HostMultiTask::GetImpName() const { return "HostMultiTask"; }

int HostMultiTask::GetImpVersion() const { return 100; }

void HostMultiTask::Sleep(int milliseconds) {
  if (milliseconds <= 0) {
    std::this_thread::yield();
    return;
  }
  // On a host task the sleep also ends when the task is asked to stop, so a
  // driver that idles between passes leaves as promptly as one that waits on
  // its socket.
  const int stopFd = HostTask::CurrentStopDescriptor();
  if (stopFd < 0) {
    std::this_thread::sleep_for(std::chrono::milliseconds(milliseconds));
    return;
  }
  pollfd stop{stopFd, POLLIN, 0};
  const auto deadline = std::chrono::steady_clock::now() + std::chrono::milliseconds(milliseconds);
  int left = milliseconds;
  while (::poll(&stop, 1, left) < 0 && errno == EINTR) {
    const auto remaining =
        std::chrono::ceil<std::chrono::milliseconds>(deadline - std::chrono::steady_clock::now());
    left = static_cast<int>(std::max<std::chrono::milliseconds::rep>(remaining.count(), 0));
  }
}

IMutex* HostMultiTask::CreateMutex() {
  auto mutex = std::make_unique<HostMutex>();
  IMutex* const handle = mutex.get();
  const std::lock_guard<std::mutex> lock(registryMutex_);
  mutexes_.emplace(handle, std::move(mutex));
  return handle;
}

void HostMultiTask::DeleteMutex(IMutex* mutex) {
  std::unique_ptr<HostMutex> doomed;
  const std::lock_guard<std::mutex> lock(registryMutex_);
  const auto found = mutexes_.find(mutex);
  if (found != mutexes_.end()) {
    doomed = std::move(found->second);
    mutexes_.erase(found);
  }
}

ITask* HostMultiTask::CreateTask(ITaskRunner* runner, int setting) {
  if (runner == nullptr) {
    return nullptr;
  }
  const std::lock_guard<std::mutex> lock(registryMutex_);
  std::shared_ptr<HostTask> task;
  try {
    task = std::make_shared<HostTask>(runner, setting, TaskName(++taskCounter_), taskStackBytes_);
  } catch (const std::system_error&) {
    return nullptr;
  }
  ITask* const handle = task.get();
  tasks_.emplace(handle, std::move(task));
  return handle;
}

int HostMultiTask::StartTask(ITask* task) {
  const std::shared_ptr<HostTask> found = FindTask(task);
  return found != nullptr && found->Start() ? 1 : 0;
}

int HostMultiTask::DeleteTask(ITask* task, int waitMilliseconds) {
  std::shared_ptr<HostTask> found = FindTask(task);
  if (found == nullptr) {
    return 0;
  }
  found->RequestStop();
  if (found->IsCurrentThread() || !found->WaitEnded(std::chrono::milliseconds(waitMilliseconds))) {
    return 0;
  }
  {
    const std::lock_guard<std::mutex> lock(registryMutex_);
    if (tasks_.erase(task) == 0) {
      // Another thread deleted it meanwhile; that call reported the end.
      return 0;
    }
  }
  // The last reference goes here: the destructor joins the finished thread.
  found.reset();
  return 1;
}

std::size_t HostMultiTask::LiveTasks() const {
  const std::lock_guard<std::mutex> lock(registryMutex_);
  return tasks_.size();
}

std::size_t HostMultiTask::LiveMutexes() const {
  const std::lock_guard<std::mutex> lock(registryMutex_);
  return mutexes_.size();
}

std::shared_ptr<HostTask> HostMultiTask::FindTask(const ITask* task) const {
  const std::lock_guard<std::mutex> lock(registryMutex_);
  const auto found = tasks_.find(task);
  return found == tasks_.end() ? nullptr : found->second;
}
