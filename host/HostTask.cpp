// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostTask.h"

#include <pthread.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <exception>
#include <system_error>
#include <utility>

namespace {

// The task running on this thread; set for the lifetime of the task's thread
// only, so socket calls can find their task's stop descriptor. Reached only
// through this function.
HostTask*& CurrentTask() {
  // A false positive: the pointer is local to this function, which is the
  // only way to it; the check's rule for pointers does not exclude
  // function-local variables as its rule for other types does.
  // NOLINTNEXTLINE(cppcoreguidelines-avoid-non-const-global-variables)
  thread_local HostTask* task = nullptr;
  return task;
}

FileDescriptor OpenStopSignal() {
  FileDescriptor fd(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK));
  if (!fd.Valid()) {
    throw std::system_error(errno, std::generic_category(), "eventfd for a task stop signal");
  }
  return fd;
}

// Owns a set of thread attributes.
class ThreadAttributes {
 public:
  ThreadAttributes() : ok_(::pthread_attr_init(&attributes_) == 0) {}
  ThreadAttributes(const ThreadAttributes&) = delete;
  ThreadAttributes& operator=(const ThreadAttributes&) = delete;
  ThreadAttributes(ThreadAttributes&&) = delete;
  ThreadAttributes& operator=(ThreadAttributes&&) = delete;
  ~ThreadAttributes() {
    if (ok_) {
      ::pthread_attr_destroy(&attributes_);
    }
  }

  // A stack of stackBytes, raised to the system's minimum; 0 keeps the
  // default.
  bool SetStack(std::size_t stackBytes) {
    if (!ok_ || stackBytes == 0) {
      return ok_;
    }
    const long minimum = ::sysconf(_SC_THREAD_STACK_MIN);
    const std::size_t size =
        std::max(stackBytes, minimum > 0 ? static_cast<std::size_t>(minimum) : stackBytes);
    return ::pthread_attr_setstacksize(&attributes_, size) == 0;
  }
  const pthread_attr_t* Get() const { return &attributes_; }

 private:
  pthread_attr_t attributes_{};
  bool ok_;
};

}  // namespace

HostTask::HostTask(ITaskRunner* runner, int setting, std::string name, std::size_t stackBytes)
    : runner_(runner),
      setting_(setting),
      name_(std::move(name)),
      stackBytes_(stackBytes),
      stopSignal_(OpenStopSignal()) {}

HostTask::~HostTask() {
  RequestStop();
  bool join = false;
  {
    const std::lock_guard<std::mutex> lock(stateMutex_);
    join = std::exchange(joinable_, false);
  }
  if (join) {
    ::pthread_join(thread_, nullptr);
  }
}

int HostTask::IsStopping() const { return stopping_.load() ? 1 : 0; }

bool HostTask::Start() {
  const std::lock_guard<std::mutex> lock(stateMutex_);
  if (started_) {
    return false;
  }
  ThreadAttributes attributes;
  if (!attributes.SetStack(stackBytes_) ||
      ::pthread_create(&thread_, attributes.Get(), &HostTask::Enter, this) != 0) {
    return false;
  }
  started_ = true;
  joinable_ = true;
  return true;
}

void* HostTask::Enter(void* task) noexcept {
  static_cast<HostTask*>(task)->Run();
  return nullptr;
}

void HostTask::RequestStop() {
  if (stopping_.exchange(true)) {
    return;
  }
  // The counter is never read back: the descriptor stays readable, so every
  // later poll on it wakes too.
  const std::uint64_t one = 1;
  ssize_t written = 0;
  do {
    written = ::write(stopSignal_.Get(), &one, sizeof one);
  } while (written < 0 && errno == EINTR);
}

bool HostTask::WaitEnded(std::chrono::milliseconds wait) {
  std::unique_lock<std::mutex> lock(stateMutex_);
  if (!started_) {
    return true;
  }
  if (wait.count() < 0) {
    wait = std::chrono::milliseconds(0);
  }
  return endedChanged_.wait_for(lock, wait, [this] { return ended_; });
}

bool HostTask::IsCurrentThread() const { return CurrentTask() == this; }

HostTask* HostTask::Current() { return CurrentTask(); }

int HostTask::CurrentStopDescriptor() {
  const HostTask* const task = CurrentTask();
  return task == nullptr ? -1 : task->stopSignal_.Get();
}

void HostTask::Run() noexcept {
  CurrentTask() = this;
  // Debuggers show the name; the kernel keeps at most 15 characters.
  const std::string shortName = name_.substr(0, 15);
  ::pthread_setname_np(::pthread_self(), shortName.c_str());
  try {
    runner_->Task();
  } catch (const std::exception& e) {
    // A failed write to standard error has nowhere left to be reported.
    (void)std::fprintf(stderr, "velt host: task %s ended by an exception: %s\n", name_.c_str(),
                       e.what());
  } catch (...) {
    (void)std::fprintf(stderr, "velt host: task %s ended by an unknown exception\n", name_.c_str());
  }
  CurrentTask() = nullptr;
  {
    const std::lock_guard<std::mutex> lock(stateMutex_);
    ended_ = true;
  }
  endedChanged_.notify_all();
}
