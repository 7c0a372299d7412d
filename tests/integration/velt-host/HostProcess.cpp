// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostProcess.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <thread>

#include "ChildEnvironment.h"

namespace {

using Clock = std::chrono::steady_clock;

int MillisecondsLeft(Clock::time_point deadline) {
  const auto left = std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now());
  return left.count() < 0 ? 0 : static_cast<int>(left.count());
}

bool Names(const std::vector<std::string>& environment, const std::string& name) {
  return std::any_of(environment.begin(), environment.end(), [&name](const std::string& change) {
    return change.rfind(name + "=", 0) == 0 || change == "-" + name;
  });
}

// Reads one chunk into text; false at the end of the pipe.
bool ReadInto(int fd, std::string& text) {
  char buffer[4096];
  ssize_t received = 0;
  do {
    received = ::read(fd, buffer, sizeof buffer);
  } while (received < 0 && errno == EINTR);
  if (received <= 0) {
    return false;
  }
  text.append(buffer, static_cast<std::size_t>(received));
  return true;
}

}  // namespace

HostProcess::HostProcess(const std::vector<std::string>& arguments,
                         const std::vector<std::string>& environment, const char* program) {
  // A child that has exited closes its end of the input pipe; writing to it
  // then must fail rather than end the test program.
  ::signal(SIGPIPE, SIG_IGN);
  int in[2] = {-1, -1};
  int out[2] = {-1, -1};
  int err[2] = {-1, -1};
  if (::pipe2(in, O_CLOEXEC) != 0) {
    return;
  }
  input_.Reset(in[1]);
  const veltpeer::FileDescriptor inRead(in[0]);
  if (::pipe2(out, O_CLOEXEC) != 0) {
    return;
  }
  output_.Reset(out[0]);
  const veltpeer::FileDescriptor outWrite(out[1]);
  if (::pipe2(err, O_CLOEXEC) != 0) {
    return;
  }
  errors_.Reset(err[0]);
  const veltpeer::FileDescriptor errWrite(err[1]);

  std::vector<std::string> changes = environment;
  if (!Names(environment, "XDG_STATE_HOME")) {
    changes.push_back("XDG_STATE_HOME=" + state_.Path());
  }
  ChildEnvironment childEnvironment(changes);
  std::vector<std::string> words;
  words.emplace_back(program);
  words.insert(words.end(), arguments.begin(), arguments.end());
  std::vector<char*> argv;
  for (std::string& word : words) {
    argv.push_back(word.data());
  }
  argv.push_back(nullptr);

  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, inRead.Get(), STDIN_FILENO);
  posix_spawn_file_actions_adddup2(&actions, outWrite.Get(), STDOUT_FILENO);
  posix_spawn_file_actions_adddup2(&actions, errWrite.Get(), STDERR_FILENO);
  pid_t pid = -1;
  if (posix_spawn(&pid, program, &actions, nullptr, argv.data(), childEnvironment.Get()) == 0) {
    pid_ = pid;
  }
  posix_spawn_file_actions_destroy(&actions);
}

HostProcess::~HostProcess() { Kill(); }

void HostProcess::Kill() {
  if (pid_ > 0) {
    ::kill(pid_, SIGKILL);
    int status = 0;
    ::waitpid(pid_, &status, 0);
    pid_ = -1;
  }
}

HostProcess::Result HostProcess::Run(const std::vector<std::string>& arguments,
                                     const std::string& input,
                                     const std::vector<std::string>& environment) {
  HostProcess process(arguments, environment);
  process.Send(input);
  process.CloseInput();
  Result result;
  result.out = process.ReadOutput();
  result.err = process.ReadErrors();
  result.status = process.Wait();
  return result;
}

void HostProcess::Send(const std::string& text) {
  std::size_t sent = 0;
  while (sent < text.size() && input_.Valid()) {
    const ssize_t written = ::write(input_.Get(), text.data() + sent, text.size() - sent);
    if (written < 0 && errno == EINTR) {
      continue;
    }
    if (written <= 0) {
      return;
    }
    sent += static_cast<std::size_t>(written);
  }
}

void HostProcess::CloseInput() { input_.Reset(); }

void HostProcess::Drain(Clock::time_point deadline, bool wantLine) {
  while (!(outEnded_ && errEnded_)) {
    if (wantLine && out_.find('\n') != std::string::npos) {
      return;
    }
    pollfd entries[2] = {{outEnded_ ? -1 : output_.Get(), POLLIN, 0},
                         {errEnded_ ? -1 : errors_.Get(), POLLIN, 0}};
    int ready = 0;
    do {
      ready = ::poll(entries, 2, MillisecondsLeft(deadline));
    } while (ready < 0 && errno == EINTR);
    if (ready <= 0) {
      return;
    }
    if (entries[0].revents != 0 && !ReadInto(output_.Get(), out_)) {
      outEnded_ = true;
    }
    if (entries[1].revents != 0 && !ReadInto(errors_.Get(), err_)) {
      errEnded_ = true;
    }
  }
}

std::optional<std::string> HostProcess::ReadLine(std::chrono::milliseconds timeout) {
  Drain(Clock::now() + timeout, true);
  const std::size_t newline = out_.find('\n');
  if (newline == std::string::npos) {
    return std::nullopt;
  }
  std::string line = out_.substr(0, newline);
  out_.erase(0, newline + 1);
  return line;
}

std::optional<std::string> HostProcess::Ask(const std::string& command) {
  Send(command + "\n");
  return ReadLine();
}

bool HostProcess::AskUntil(const std::string& command, const std::string& expected,
                           std::chrono::milliseconds timeout) {
  const Clock::time_point deadline = Clock::now() + timeout;
  for (;;) {
    const std::optional<std::string> reply = Ask(command);
    if (!reply) {
      return false;
    }
    if (*reply == expected) {
      return true;
    }
    if (Clock::now() >= deadline) {
      return false;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
  }
}

std::string HostProcess::ReadOutput(std::chrono::milliseconds timeout) {
  const Clock::time_point deadline = Clock::now() + timeout;
  while (!outEnded_ && Clock::now() < deadline) {
    Drain(deadline, false);
  }
  std::string text;
  text.swap(out_);
  return text;
}

std::string HostProcess::ReadErrors(std::chrono::milliseconds timeout) {
  const Clock::time_point deadline = Clock::now() + timeout;
  while (!errEnded_ && Clock::now() < deadline) {
    Drain(deadline, false);
  }
  std::string text;
  text.swap(err_);
  return text;
}

void HostProcess::Signal(int signal) {
  if (pid_ > 0) {
    ::kill(pid_, signal);
  }
}

std::optional<int> HostProcess::Wait(std::chrono::milliseconds timeout) {
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
      Kill();
      return std::nullopt;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
  }
  return std::nullopt;
}
