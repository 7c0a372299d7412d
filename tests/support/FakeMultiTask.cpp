// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "FakeMultiTask.h"

#include <algorithm>

class FakeMultiTask::Mutex final : public IMutex {
 public:
  void Lock() override {
    mutex_.lock();
    ++HeldByThisThread();
  }
  void Unlock() override {
    --HeldByThisThread();
    mutex_.unlock();
  }

 private:
  std::mutex mutex_;
};

class FakeMultiTask::Task final : public ITask {
 public:
  explicit Task(ITaskRunner* runner) : runner_(runner) {}
  Task(const Task&) = delete;
  Task& operator=(const Task&) = delete;
  Task(Task&&) = delete;
  Task& operator=(Task&&) = delete;
  ~Task() { Join(); }

  int IsStopping() const override { return stopping_.load() ? 1 : 0; }
  void Start() {
    thread_ = std::thread([this] { runner_->Task(); });
  }
  void Stop() { stopping_.store(true); }
  void Join() {
    if (thread_.joinable()) {
      thread_.join();
    }
  }

 private:
  ITaskRunner* runner_;
  std::atomic<bool> stopping_{false};
  std::thread thread_;
};

int& FakeMultiTask::HeldByThisThread() {
  thread_local int held = 0;
  return held;
}

FakeMultiTask::FakeMultiTask() = default;

FakeMultiTask::~FakeMultiTask() {
  for (auto& task : tasks_) {
    task->Stop();
    task->Join();
  }
}

void FakeMultiTask::Sleep(int milliseconds) {
  if (threads_.load()) {
    // Threaded runs loop for as long as the test lets them: sleep for real
    // and keep no record, which would grow without bound.
    std::this_thread::sleep_for(std::chrono::milliseconds(milliseconds));
    return;
  }
  const std::lock_guard<std::mutex> guard(lock_);
  sleeps_.push_back(milliseconds);
}

IMutex* FakeMultiTask::CreateMutex() {
  const std::lock_guard<std::mutex> guard(lock_);
  mutexes_.push_back(std::make_unique<Mutex>());
  return mutexes_.back().get();
}

void FakeMultiTask::DeleteMutex(IMutex* mutex) {
  const std::lock_guard<std::mutex> guard(lock_);
  mutexes_.erase(std::remove_if(mutexes_.begin(), mutexes_.end(),
                                [mutex](const auto& m) { return m.get() == mutex; }),
                 mutexes_.end());
}

ITask* FakeMultiTask::CreateTask(ITaskRunner* runner, int setting) {
  const std::lock_guard<std::mutex> guard(lock_);
  ++tasksCreated_;
  lastSetting_ = setting;
  lastRunner_ = runner;
  tasks_.push_back(std::make_unique<Task>(runner));
  return tasks_.back().get();
}

int FakeMultiTask::StartTask(ITask* task) {
  if (onStart_) {
    onStart_();
  }
  if (threads_.load()) {
    static_cast<Task*>(task)->Start();
  }
  return 1;
}

int FakeMultiTask::DeleteTask(ITask* task, int waitMilliseconds) {
  std::unique_ptr<Task> ended;
  {
    const std::lock_guard<std::mutex> guard(lock_);
    deleteWaits_.push_back(waitMilliseconds);
    auto* const fake = static_cast<Task*>(task);
    fake->Stop();
    if (deleteFailures_ > 0) {
      --deleteFailures_;
      return 0;
    }
    const auto found = std::find_if(tasks_.begin(), tasks_.end(),
                                    [fake](const auto& t) { return t.get() == fake; });
    if (found == tasks_.end()) {
      return 0;
    }
    ended = std::move(*found);
    tasks_.erase(found);
  }
  ended->Join();
  return 1;
}

int FakeMultiTask::LiveMutexes() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return static_cast<int>(mutexes_.size());
}

int FakeMultiTask::LiveTasks() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return static_cast<int>(tasks_.size());
}

void FakeMultiTask::ClearSleeps() {
  const std::lock_guard<std::mutex> guard(lock_);
  sleeps_.clear();
}

std::vector<int> FakeMultiTask::Sleeps() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return sleeps_;
}

std::vector<int> FakeMultiTask::DeleteWaits() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return deleteWaits_;
}
