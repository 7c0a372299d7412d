// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>
#include <pthread.h>
#include <unistd.h>

#include <atomic>
#include <chrono>
#include <cstring>
#include <functional>
#include <stdexcept>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "HostMultiTask.h"
#include "HostTask.h"

namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

// A runner whose body is a function; counts its calls.
class FunctionRunner final : public ITaskRunner {
 public:
  explicit FunctionRunner(std::function<void()> body) : body_(std::move(body)) {}
  void Task() override {
    calls.fetch_add(1);
    body_();
  }
  std::atomic<int> calls{0};

 private:
  std::function<void()> body_;
};

// Waits (bounded) until flag is set.
bool WaitFor(const std::atomic<bool>& flag, milliseconds limit = milliseconds(5000)) {
  const auto deadline = Clock::now() + limit;
  while (!flag.load() && Clock::now() < deadline) {
    std::this_thread::sleep_for(milliseconds(1));
  }
  return flag.load();
}

}  // namespace

TEST(HostMultiTask, Identity) {
  HostMultiTask tasks;
  EXPECT_STREQ(tasks.GetImpName(), "HostMultiTask");
  EXPECT_EQ(tasks.GetImpVersion(), 100);
}

TEST(HostMultiTask, SleepWaitsAtLeastTheGivenTime) {
  HostMultiTask tasks;
  const auto start = Clock::now();
  tasks.Sleep(30);
  EXPECT_GE(Clock::now() - start, milliseconds(30));
}

TEST(HostMultiTask, SleepOfZeroOrLessOnlyYields) {
  HostMultiTask tasks;
  const auto start = Clock::now();
  for (int i = 0; i < 100; ++i) {
    tasks.Sleep(0);
    tasks.Sleep(-5);
  }
  EXPECT_LT(Clock::now() - start, milliseconds(1000));
}

TEST(HostMultiTask, TaskDoesNotRunBeforeStartTask) {
  HostMultiTask tasks;
  std::atomic<bool> ran{false};
  FunctionRunner runner([&] { ran = true; });
  ITask* const task = tasks.CreateTask(&runner, 3);
  ASSERT_NE(task, nullptr);
  std::this_thread::sleep_for(milliseconds(50));
  EXPECT_FALSE(ran.load());
  EXPECT_EQ(tasks.StartTask(task), 1);
  EXPECT_TRUE(WaitFor(ran));
  EXPECT_EQ(tasks.DeleteTask(task, 1000), 1);
  EXPECT_EQ(runner.calls.load(), 1);
}

TEST(HostMultiTask, CreateTaskKeepsTheSetting) {
  HostMultiTask tasks;
  FunctionRunner runner([] {});
  ITask* const task = tasks.CreateTask(&runner, 3);
  ASSERT_NE(task, nullptr);
  EXPECT_EQ(static_cast<HostTask*>(task)->Setting(), 3);
  EXPECT_EQ(tasks.DeleteTask(task, 0), 1);
}

TEST(HostMultiTask, CreateTaskWithoutRunnerGivesNull) {
  HostMultiTask tasks;
  EXPECT_EQ(tasks.CreateTask(nullptr, 3), nullptr);
  EXPECT_EQ(tasks.LiveTasks(), 0U);
}

TEST(HostMultiTask, StartTaskTwiceStartsOnce) {
  HostMultiTask tasks;
  FunctionRunner runner([] {});
  ITask* const task = tasks.CreateTask(&runner, 3);
  EXPECT_EQ(tasks.StartTask(task), 1);
  EXPECT_EQ(tasks.StartTask(task), 0);
  EXPECT_EQ(tasks.DeleteTask(task, 1000), 1);
  EXPECT_EQ(runner.calls.load(), 1);
}

TEST(HostMultiTask, StartAndDeleteRefuseNullAndUnknownHandles) {
  HostMultiTask tasks;
  HostMultiTask other;
  FunctionRunner runner([] {});
  ITask* const foreign = other.CreateTask(&runner, 0);
  EXPECT_EQ(tasks.StartTask(nullptr), 0);
  EXPECT_EQ(tasks.StartTask(foreign), 0);
  EXPECT_EQ(tasks.DeleteTask(nullptr, 0), 0);
  EXPECT_EQ(tasks.DeleteTask(foreign, 0), 0);
  EXPECT_EQ(other.DeleteTask(foreign, 0), 1);
  EXPECT_EQ(runner.calls.load(), 0);
}

TEST(HostMultiTask, IsStoppingTurnsOnWithDeleteTask) {
  HostMultiTask tasks;
  std::atomic<bool> sawRunning{false};
  ITask* task = nullptr;
  std::atomic<ITask*> handle{nullptr};
  FunctionRunner runner([&] {
    ITask* const self = handle.load();
    sawRunning = self->IsStopping() == 0;
    while (self->IsStopping() == 0) {
      tasks.Sleep(1);
    }
  });
  task = tasks.CreateTask(&runner, 3);
  handle = task;
  EXPECT_EQ(task->IsStopping(), 0);
  ASSERT_EQ(tasks.StartTask(task), 1);
  ASSERT_TRUE(WaitFor(sawRunning));
  EXPECT_EQ(tasks.DeleteTask(task, 1000), 1);
  EXPECT_EQ(tasks.LiveTasks(), 0U);
}

TEST(HostMultiTask, DeleteTaskReportsZeroWhileTheTaskIgnoresTheStopThenOne) {
  HostMultiTask tasks;
  std::atomic<bool> release{false};
  std::atomic<bool> running{false};
  FunctionRunner runner([&] {
    running = true;
    WaitFor(release);
  });
  ITask* const task = tasks.CreateTask(&runner, 3);
  ASSERT_EQ(tasks.StartTask(task), 1);
  ASSERT_TRUE(WaitFor(running));

  const auto start = Clock::now();
  EXPECT_EQ(tasks.DeleteTask(task, 50), 0);
  EXPECT_GE(Clock::now() - start, milliseconds(50));
  // The handle stays valid after a zero result.
  EXPECT_EQ(task->IsStopping(), 1);
  EXPECT_EQ(tasks.LiveTasks(), 1U);
  EXPECT_EQ(tasks.DeleteTask(task, 0), 0);

  release = true;
  EXPECT_EQ(tasks.DeleteTask(task, 2000), 1);
  EXPECT_EQ(tasks.LiveTasks(), 0U);
}

TEST(HostMultiTask, DeleteTaskOfATaskNeverStartedFreesItAtOnce) {
  HostMultiTask tasks;
  FunctionRunner runner([] {});
  ITask* const task = tasks.CreateTask(&runner, 3);
  EXPECT_EQ(tasks.DeleteTask(task, 0), 1);
  EXPECT_EQ(tasks.LiveTasks(), 0U);
  EXPECT_EQ(runner.calls.load(), 0);
}

TEST(HostMultiTask, DeleteTaskAfterTheRunnerReturnedOnItsOwn) {
  HostMultiTask tasks;
  std::atomic<bool> done{false};
  FunctionRunner runner([&] { done = true; });
  ITask* const task = tasks.CreateTask(&runner, 3);
  ASSERT_EQ(tasks.StartTask(task), 1);
  ASSERT_TRUE(WaitFor(done));
  EXPECT_EQ(tasks.DeleteTask(task, 1000), 1);
}

TEST(HostMultiTask, ATaskCannotDeleteItself) {
  HostMultiTask tasks;
  std::atomic<ITask*> handle{nullptr};
  std::atomic<int> result{-1};
  std::atomic<bool> done{false};
  FunctionRunner runner([&] {
    result = tasks.DeleteTask(handle.load(), 100);
    done = true;
  });
  ITask* const task = tasks.CreateTask(&runner, 3);
  handle = task;
  ASSERT_EQ(tasks.StartTask(task), 1);
  ASSERT_TRUE(WaitFor(done));
  EXPECT_EQ(result.load(), 0);
  EXPECT_EQ(task->IsStopping(), 1);
  EXPECT_EQ(tasks.DeleteTask(task, 1000), 1);
}

TEST(HostMultiTask, WorkerThreadsCarryAReadableName) {
  HostMultiTask tasks;
  std::string name;
  std::atomic<bool> done{false};
  FunctionRunner runner([&] {
    char buffer[32] = {};
    ::pthread_getname_np(::pthread_self(), buffer, sizeof buffer);
    name = buffer;
    done = true;
  });
  ITask* const task = tasks.CreateTask(&runner, 3);
  ASSERT_EQ(tasks.StartTask(task), 1);
  ASSERT_TRUE(WaitFor(done));
  ASSERT_EQ(tasks.DeleteTask(task, 1000), 1);
  EXPECT_EQ(name, "velt-task-1");
  EXPECT_EQ(static_cast<std::size_t>(15), std::strlen("velt-task-99999"));
}

// The stack a task's thread was given, as the thread sees it.
std::size_t StackOfATask(HostMultiTask& tasks) {
  std::size_t stack = 0;
  std::atomic<bool> done{false};
  FunctionRunner runner([&] {
    pthread_attr_t attributes;
    if (::pthread_getattr_np(::pthread_self(), &attributes) == 0) {
      ::pthread_attr_getstacksize(&attributes, &stack);
      ::pthread_attr_destroy(&attributes);
    }
    done = true;
  });
  ITask* const task = tasks.CreateTask(&runner, 3);
  EXPECT_EQ(tasks.StartTask(task), 1);
  EXPECT_TRUE(WaitFor(done));
  EXPECT_EQ(tasks.DeleteTask(task, 1000), 1);
  return stack;
}

// The stack the system gives a thread by default.
std::size_t DefaultStack() {
  std::size_t stack = 0;
  std::thread([&stack] {
    pthread_attr_t attributes;
    if (::pthread_getattr_np(::pthread_self(), &attributes) == 0) {
      ::pthread_attr_getstacksize(&attributes, &stack);
      ::pthread_attr_destroy(&attributes);
    }
  }).join();
  return stack;
}

// The C library (or a sanitizer's runtime) may hand a thread the cached,
// larger stack of a finished one; never less than asked, and never the
// system's default.
void ExpectStackOf(std::size_t stack, std::size_t asked) {
  EXPECT_GE(stack, asked);
  EXPECT_LT(stack, DefaultStack());
}

TEST(HostMultiTask, TaskThreadsGetAQuarterMebibyteOfStack) {
  HostMultiTask tasks;
  EXPECT_EQ(tasks.TaskStackBytes(), 256U * 1024U);
  ExpectStackOf(StackOfATask(tasks), 256U * 1024U);
}

TEST(HostMultiTask, TaskStackIsChosenAtConstruction) {
  HostMultiTask large(1024 * 1024);
  ExpectStackOf(StackOfATask(large), 1024U * 1024U);
  // Below the system's minimum the minimum is taken.
  HostMultiTask tiny(1);
  ExpectStackOf(StackOfATask(tiny), static_cast<std::size_t>(::sysconf(_SC_THREAD_STACK_MIN)));
}

TEST(HostMultiTask, SleepOnATaskEndsWhenTheTaskIsAskedToStop) {
  HostMultiTask tasks;
  std::atomic<bool> entered{false};
  std::atomic<bool> slept{false};
  FunctionRunner runner([&] {
    entered = true;
    tasks.Sleep(60000);
    slept = true;
  });
  ITask* const task = tasks.CreateTask(&runner, 3);
  ASSERT_EQ(tasks.StartTask(task), 1);
  ASSERT_TRUE(WaitFor(entered));
  std::this_thread::sleep_for(milliseconds(20));
  EXPECT_FALSE(slept.load());
  const auto start = Clock::now();
  EXPECT_EQ(tasks.DeleteTask(task, 5000), 1);
  EXPECT_LT(Clock::now() - start, milliseconds(1000));
  EXPECT_TRUE(slept.load());
}

TEST(HostMultiTask, SleepOnATaskLastsTheGivenTime) {
  HostMultiTask tasks;
  std::atomic<bool> done{false};
  Clock::duration slept{};
  FunctionRunner runner([&] {
    const auto start = Clock::now();
    tasks.Sleep(30);
    slept = Clock::now() - start;
    done = true;
  });
  ITask* const task = tasks.CreateTask(&runner, 3);
  ASSERT_EQ(tasks.StartTask(task), 1);
  ASSERT_TRUE(WaitFor(done));
  EXPECT_EQ(tasks.DeleteTask(task, 1000), 1);
  EXPECT_GE(slept, milliseconds(30));
}

TEST(HostMultiTask, RunnerRunsOnItsOwnThreadAsTheCurrentTask) {
  HostMultiTask tasks;
  std::thread::id runnerThread;
  HostTask* current = nullptr;
  std::atomic<bool> done{false};
  FunctionRunner runner([&] {
    runnerThread = std::this_thread::get_id();
    current = HostTask::Current();
    done = true;
  });
  ITask* const task = tasks.CreateTask(&runner, 3);
  ASSERT_EQ(tasks.StartTask(task), 1);
  ASSERT_TRUE(WaitFor(done));
  EXPECT_NE(runnerThread, std::this_thread::get_id());
  EXPECT_EQ(current, static_cast<HostTask*>(task));
  EXPECT_EQ(HostTask::Current(), nullptr);
  EXPECT_EQ(HostTask::CurrentStopDescriptor(), -1);
  EXPECT_EQ(tasks.DeleteTask(task, 1000), 1);
}

TEST(HostMultiTask, ARunnerThatThrowsEndsItsTask) {
  HostMultiTask tasks;
  FunctionRunner runner([] { throw std::runtime_error("runner failure"); });
  ITask* const task = tasks.CreateTask(&runner, 3);
  ASSERT_EQ(tasks.StartTask(task), 1);
  EXPECT_EQ(tasks.DeleteTask(task, 2000), 1);
  EXPECT_EQ(runner.calls.load(), 1);
}

TEST(HostMultiTask, DestructionStopsAndJoinsTasksNotDeleted) {
  std::atomic<bool> sawStop{false};
  std::atomic<ITask*> handle{nullptr};
  std::atomic<bool> running{false};
  FunctionRunner runner([&] {
    running = true;
    while (handle.load()->IsStopping() == 0) {
      std::this_thread::sleep_for(milliseconds(1));
    }
    sawStop = true;
  });
  {
    HostMultiTask tasks;
    ITask* const task = tasks.CreateTask(&runner, 3);
    handle = task;
    ASSERT_EQ(tasks.StartTask(task), 1);
    ASSERT_TRUE(WaitFor(running));
  }
  EXPECT_TRUE(sawStop.load());
}

TEST(HostMultiTask, MutexGivesMutualExclusion) {
  HostMultiTask tasks;
  IMutex* const mutex = tasks.CreateMutex();
  ASSERT_NE(mutex, nullptr);
  long counter = 0;  // deliberately plain: only the host mutex guards it
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&] {
      for (int i = 0; i < 5000; ++i) {
        mutex->Lock();
        counter = counter + 1;
        mutex->Unlock();
      }
    });
  }
  for (auto& thread : threads) {
    thread.join();
  }
  EXPECT_EQ(counter, 20000);
  tasks.DeleteMutex(mutex);
}

TEST(HostMultiTask, LockWaitsForTheHolder) {
  HostMultiTask tasks;
  IMutex* const mutex = tasks.CreateMutex();
  mutex->Lock();
  std::atomic<bool> acquired{false};
  std::thread other([&] {
    mutex->Lock();
    acquired = true;
    mutex->Unlock();
  });
  std::this_thread::sleep_for(milliseconds(50));
  EXPECT_FALSE(acquired.load());
  mutex->Unlock();
  other.join();
  EXPECT_TRUE(acquired.load());
  tasks.DeleteMutex(mutex);
}

TEST(HostMultiTask, MutexesAreCountedUntilDeleted) {
  HostMultiTask tasks;
  IMutex* const first = tasks.CreateMutex();
  IMutex* const second = tasks.CreateMutex();
  EXPECT_NE(first, second);
  EXPECT_EQ(tasks.LiveMutexes(), 2U);
  tasks.DeleteMutex(first);
  tasks.DeleteMutex(nullptr);
  tasks.DeleteMutex(first);  // already gone: ignored
  EXPECT_EQ(tasks.LiveMutexes(), 1U);
  tasks.DeleteMutex(second);
  EXPECT_EQ(tasks.LiveMutexes(), 0U);
}
