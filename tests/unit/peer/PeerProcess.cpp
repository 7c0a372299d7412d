// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "PeerProcess.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <thread>

extern char** environ;

namespace {

using Clock = std::chrono::steady_clock;

int MillisecondsLeft(Clock::time_point deadline) {
  const auto left = std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now());
  return left.count() < 0 ? 0 : static_cast<int>(left.count());
}

// Reads one chunk from fd before the deadline; 0 at the end or on time-out.
ssize_t ReadSome(int fd, char* buffer, std::size_t size, Clock::time_point deadline) {
  pollfd entry{fd, POLLIN, 0};
  int ready = 0;
  do {
    ready = ::poll(&entry, 1, MillisecondsLeft(deadline));
  } while (ready < 0 && errno == EINTR);
  if (ready <= 0) {
    return 0;
  }
  ssize_t received = 0;
  do {
    received = ::read(fd, buffer, size);
  } while (received < 0 && errno == EINTR);
  return received < 0 ? 0 : received;
}

}  // namespace

PeerProcess::PeerProcess(const std::vector<std::string>& arguments) {
  int out[2] = {-1, -1};
  int err[2] = {-1, -1};
  if (::pipe2(out, O_CLOEXEC) != 0) {
    return;
  }
  stdout_.Reset(out[0]);
  const veltpeer::FileDescriptor outWrite(out[1]);
  if (::pipe2(err, O_CLOEXEC) != 0) {
    return;
  }
  stderr_.Reset(err[0]);
  const veltpeer::FileDescriptor errWrite(err[1]);

  std::vector<std::string> words;
  words.emplace_back(VELT_PEER_PROGRAM);
  words.insert(words.end(), arguments.begin(), arguments.end());
  std::vector<char*> argv;
  for (std::string& word : words) {
    argv.push_back(word.data());
  }
  argv.push_back(nullptr);

  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, outWrite.Get(), STDOUT_FILENO);
  posix_spawn_file_actions_adddup2(&actions, errWrite.Get(), STDERR_FILENO);
  pid_t pid = -1;
  if (posix_spawn(&pid, VELT_PEER_PROGRAM, &actions, nullptr, argv.data(), environ) == 0) {
    pid_ = pid;
  }
  posix_spawn_file_actions_destroy(&actions);
}

PeerProcess::~PeerProcess() {
  if (pid_ > 0) {
    ::kill(pid_, SIGKILL);
    int status = 0;
    ::waitpid(pid_, &status, 0);
  }
}

std::optional<std::string> PeerProcess::ReadLine(std::chrono::milliseconds timeout) {
  const Clock::time_point deadline = Clock::now() + timeout;
  for (;;) {
    const std::size_t newline = pending_.find('\n');
    if (newline != std::string::npos) {
      std::string line = pending_.substr(0, newline);
      pending_.erase(0, newline + 1);
      return line;
    }
    char buffer[1024];
    const ssize_t received = ReadSome(stdout_.Get(), buffer, sizeof buffer, deadline);
    if (received <= 0) {
      return std::nullopt;
    }
    pending_.append(buffer, static_cast<std::size_t>(received));
  }
}

std::string PeerProcess::ReadStderr(std::chrono::milliseconds timeout) {
  const Clock::time_point deadline = Clock::now() + timeout;
  std::string text;
  char buffer[1024];
  for (;;) {
    const ssize_t received = ReadSome(stderr_.Get(), buffer, sizeof buffer, deadline);
    if (received <= 0) {
      return text;
    }
    text.append(buffer, static_cast<std::size_t>(received));
  }
}

void PeerProcess::Signal(int signal) {
  if (pid_ > 0) {
    ::kill(pid_, signal);
  }
}

std::optional<int> PeerProcess::Wait(std::chrono::milliseconds timeout) {
  const Clock::time_point deadline = Clock::now() + timeout;
  while (pid_ > 0) {
    int status = 0;
    const pid_t done = ::waitpid(pid_, &status, WNOHANG);
    if (done == pid_) {
      pid_ = -1;
      if (WIFEXITED(status)) {
        return WEXITSTATUS(status);
      }
      return std::nullopt;
    }
    if (Clock::now() >= deadline) {
      return std::nullopt;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
  }
  return std::nullopt;
}
