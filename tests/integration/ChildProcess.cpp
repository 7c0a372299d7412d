// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ChildProcess.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <thread>

#include "velt-peer/FileDescriptor.h"

extern char** environ;

namespace {

using Clock = std::chrono::steady_clock;
using veltpeer::FileDescriptor;

int MillisecondsLeft(Clock::time_point deadline) {
  const auto left = std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now());
  return left.count() < 0 ? 0 : static_cast<int>(left.count());
}

// Reads both pipes until each is closed or the deadline passes.
void Collect(FileDescriptor& out, FileDescriptor& err, ChildProcess::Result& result,
             Clock::time_point deadline) {
  while (out.Valid() || err.Valid()) {
    std::array<pollfd, 2> entries{{{out.Get(), POLLIN, 0}, {err.Get(), POLLIN, 0}}};
    const int ready = ::poll(entries.data(), entries.size(), MillisecondsLeft(deadline));
    if (ready < 0 && errno == EINTR) {
      continue;
    }
    if (ready <= 0) {
      return;
    }
    FileDescriptor* const pipes[2] = {&out, &err};
    std::string* const texts[2] = {&result.out, &result.err};
    for (std::size_t i = 0; i < entries.size(); ++i) {
      if (!pipes[i]->Valid() || (entries[i].revents & (POLLIN | POLLHUP | POLLERR)) == 0) {
        continue;
      }
      char buffer[4096];
      const ssize_t got = ::read(pipes[i]->Get(), buffer, sizeof buffer);
      if (got > 0) {
        texts[i]->append(buffer, static_cast<std::size_t>(got));
      } else if (got == 0 || errno != EINTR) {
        pipes[i]->Reset();
      }
    }
  }
}

}  // namespace

ChildProcess::Result ChildProcess::Run(const std::vector<std::string>& argv,
                                       std::chrono::milliseconds limit) {
  Result result;
  int outPipe[2] = {-1, -1};
  int errPipe[2] = {-1, -1};
  if (argv.empty() || ::pipe2(outPipe, O_CLOEXEC) != 0) {
    return result;
  }
  FileDescriptor out(outPipe[0]);
  FileDescriptor outWrite(outPipe[1]);
  if (::pipe2(errPipe, O_CLOEXEC) != 0) {
    return result;
  }
  FileDescriptor err(errPipe[0]);
  FileDescriptor errWrite(errPipe[1]);

  std::vector<std::string> words = argv;
  std::vector<char*> pointers;
  for (std::string& word : words) {
    pointers.push_back(word.data());
  }
  pointers.push_back(nullptr);
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, outWrite.Get(), STDOUT_FILENO);
  posix_spawn_file_actions_adddup2(&actions, errWrite.Get(), STDERR_FILENO);
  pid_t pid = -1;
  const int spawned = posix_spawn(&pid, pointers[0], &actions, nullptr, pointers.data(), environ);
  posix_spawn_file_actions_destroy(&actions);
  // Only the child keeps the writing ends, so the pipes close when it ends.
  outWrite.Reset();
  errWrite.Reset();
  if (spawned != 0) {
    return result;
  }

  const Clock::time_point deadline = Clock::now() + limit;
  Collect(out, err, result, deadline);
  int status = 0;
  for (;;) {
    const pid_t done = ::waitpid(pid, &status, WNOHANG);
    if (done == pid) {
      if (WIFEXITED(status)) {
        result.status = WEXITSTATUS(status);
      }
      return result;
    }
    if (Clock::now() >= deadline) {
      ::kill(pid, SIGKILL);
      ::waitpid(pid, &status, 0);
      return result;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
  }
}
