// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "TerminalProcess.h"

#include <poll.h>
#include <pty.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <thread>

#include "ChildEnvironment.h"

namespace {

using Clock = std::chrono::steady_clock;

int MillisecondsLeft(Clock::time_point deadline) {
  const auto left = std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now());
  return left.count() < 0 ? 0 : static_cast<int>(left.count());
}

}  // namespace

TerminalProcess::TerminalProcess(const std::vector<std::string>& arguments) {
  // Everything the child needs is made before the fork: between fork and
  // exec it only calls execve and _exit.
  ChildEnvironment environment(
      {"TERM=xterm", "XDG_STATE_HOME=" + state_.Path(), "-LC_ALL", "-EDITRC", "-INPUTRC"});
  std::vector<std::string> words;
  words.emplace_back(VELT_HOST_PROGRAM);
  words.insert(words.end(), arguments.begin(), arguments.end());
  std::vector<char*> argv;
  for (std::string& word : words) {
    argv.push_back(word.data());
  }
  argv.push_back(nullptr);
  char* const* const envp = environment.Get();

  winsize window{};
  window.ws_row = 24;
  window.ws_col = 80;
  int master = -1;
  const pid_t pid = ::forkpty(&master, nullptr, nullptr, &window);
  if (pid == 0) {
    ::execve(VELT_HOST_PROGRAM, argv.data(), envp);
    ::_exit(127);
  }
  if (pid > 0) {
    pid_ = pid;
    terminal_.Reset(master);
  }
}

TerminalProcess::~TerminalProcess() { Kill(); }

void TerminalProcess::Kill() {
  if (pid_ > 0) {
    ::kill(pid_, SIGKILL);
    int status = 0;
    ::waitpid(pid_, &status, 0);
    pid_ = -1;
  }
}

void TerminalProcess::Type(const std::string& text) {
  std::size_t sent = 0;
  while (sent < text.size()) {
    const ssize_t written = ::write(terminal_.Get(), text.data() + sent, text.size() - sent);
    if (written < 0 && errno == EINTR) {
      continue;
    }
    if (written <= 0) {
      return;
    }
    sent += static_cast<std::size_t>(written);
  }
}

bool TerminalProcess::ReadSome(Clock::time_point deadline) {
  pollfd entry{terminal_.Get(), POLLIN, 0};
  int ready = 0;
  do {
    ready = ::poll(&entry, 1, MillisecondsLeft(deadline));
  } while (ready < 0 && errno == EINTR);
  if (ready <= 0) {
    return false;
  }
  char buffer[4096];
  ssize_t received = 0;
  do {
    received = ::read(terminal_.Get(), buffer, sizeof buffer);
  } while (received < 0 && errno == EINTR);
  // EIO: the child closed its side of the terminal.
  if (received <= 0) {
    return false;
  }
  shown_.append(buffer, static_cast<std::size_t>(received));
  return true;
}

bool TerminalProcess::WaitFor(const std::string& text, std::chrono::milliseconds timeout) {
  const Clock::time_point deadline = Clock::now() + timeout;
  for (;;) {
    const std::size_t found = shown_.find(text, searched_);
    if (found != std::string::npos) {
      searched_ = found + text.size();
      return true;
    }
    if (!ReadSome(deadline)) {
      return false;
    }
  }
}

std::optional<int> TerminalProcess::Wait(std::chrono::milliseconds timeout) {
  const Clock::time_point deadline = Clock::now() + timeout;
  while (pid_ > 0) {
    // Keep the terminal drained so that the child never blocks writing.
    ReadSome(Clock::now() + std::chrono::milliseconds(5));
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
  }
  return std::nullopt;
}
