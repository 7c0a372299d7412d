// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ChildRun.h"

#include <fcntl.h>
#include <poll.h>
#include <pty.h>
#include <signal.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdio>
#include <thread>

extern char** environ;

namespace {

using Clock = std::chrono::steady_clock;

int MillisecondsLeft(Clock::time_point deadline) {
  const auto left = std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now());
  return left.count() < 0 ? 0 : static_cast<int>(left.count());
}

std::vector<char*> Pointers(std::vector<std::string>& words) {
  std::vector<char*> pointers;
  for (std::string& word : words) {
    pointers.push_back(word.data());
  }
  pointers.push_back(nullptr);
  return pointers;
}

// Appends what fd has to text; false once it is closed.
bool Take(int fd, std::string& text) {
  std::array<char, 65536> chunk{};
  const ssize_t n = ::read(fd, chunk.data(), chunk.size());
  if (n > 0) {
    text.append(chunk.data(), static_cast<std::size_t>(n));
    return true;
  }
  return n < 0 && (errno == EINTR || errno == EAGAIN);
}

// Writes all of text to fd, whatever it takes; stops when the reader is gone.
void Give(int fd, const std::string& text) {
  std::size_t done = 0;
  while (done < text.size()) {
    const ssize_t n = ::write(fd, text.data() + done, text.size() - done);
    if (n < 0 && errno == EINTR) {
      continue;
    }
    if (n <= 0) {
      return;
    }
    done += static_cast<std::size_t>(n);
  }
}

constexpr const char* kPeakLine = "velt-faults: peak resident ";

// Runs through the measurer, when there is one.
std::vector<std::string> Measured(const std::vector<std::string>& argv,
                                  const std::string& measurer) {
  if (measurer.empty()) {
    return argv;
  }
  std::vector<std::string> measured{measurer, "--measure"};
  measured.insert(measured.end(), argv.begin(), argv.end());
  return measured;
}

// Takes the measurer's line off text and returns its figure.
long TakePeak(std::string& text) {
  const std::size_t line = text.rfind(kPeakLine);
  if (line == std::string::npos) {
    return 0;
  }
  const long kib = std::stol(text.substr(line + std::string(kPeakLine).size()));
  text.erase(line, text.find('\n', line) == std::string::npos ? std::string::npos
                                                              : text.find('\n', line) + 1 - line);
  return kib;
}

// Reaps the child (killing it at the deadline) and fills in how it ended.
void Reap(pid_t child, Clock::time_point started, Clock::time_point deadline, ChildRun& run) {
  int status = 0;
  for (;;) {
    const pid_t done = ::waitpid(child, &status, WNOHANG);
    if (done == child) {
      break;
    }
    if (Clock::now() > deadline) {
      ::kill(child, SIGKILL);
      ::waitpid(child, &status, 0);
      break;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
  }
  run.seconds = std::chrono::duration<double>(Clock::now() - started).count();
  if (WIFEXITED(status)) {
    run.status = WEXITSTATUS(status);
  }
}

}  // namespace

ChildRun ChildRun::Run(const std::vector<std::string>& argv, const std::string& input,
                       std::chrono::milliseconds limit, const std::string& measurer) {
  ChildRun run;
  std::array<int, 2> in{};
  std::array<int, 2> out{};
  std::array<int, 2> err{};
  if (::pipe2(in.data(), O_CLOEXEC) != 0 || ::pipe2(out.data(), O_CLOEXEC) != 0 ||
      ::pipe2(err.data(), O_CLOEXEC) != 0) {
    return run;
  }
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, in[0], STDIN_FILENO);
  posix_spawn_file_actions_adddup2(&actions, out[1], STDOUT_FILENO);
  posix_spawn_file_actions_adddup2(&actions, err[1], STDERR_FILENO);
  std::vector<std::string> words = Measured(argv, measurer);
  std::vector<char*> pointers = Pointers(words);
  const Clock::time_point started = Clock::now();
  pid_t child = -1;
  const int spawned =
      ::posix_spawn(&child, words[0].c_str(), &actions, nullptr, pointers.data(), environ);
  posix_spawn_file_actions_destroy(&actions);
  ::close(in[0]);
  ::close(out[1]);
  ::close(err[1]);
  if (spawned != 0) {
    ::close(in[1]);
    ::close(out[0]);
    ::close(err[0]);
    return run;
  }
  std::thread writer([fd = in[1], &input] {
    Give(fd, input);
    ::close(fd);
  });
  const Clock::time_point deadline = started + limit;
  bool outOpen = true;
  bool errOpen = true;
  while ((outOpen || errOpen) && Clock::now() < deadline) {
    std::array<pollfd, 2> ends{
        {{outOpen ? out[0] : -1, POLLIN, 0}, {errOpen ? err[0] : -1, POLLIN, 0}}};
    if (::poll(ends.data(), ends.size(), MillisecondsLeft(deadline)) <= 0) {
      continue;
    }
    if (outOpen && ends[0].revents != 0) {
      outOpen = Take(out[0], run.out);
    }
    if (errOpen && ends[1].revents != 0) {
      errOpen = Take(err[0], run.err);
    }
  }
  Reap(child, started, deadline, run);
  ::close(out[0]);
  ::close(err[0]);
  writer.join();
  run.peakResidentKiB = TakePeak(run.err);
  return run;
}

ChildRun ChildRun::OnTerminal(const std::vector<std::string>& argv, const std::string& prompt,
                              const std::string& input, std::chrono::milliseconds limit,
                              const std::string& measurer) {
  ChildRun run;
  std::vector<std::string> words = Measured(argv, measurer);
  std::vector<char*> pointers = Pointers(words);
  const Clock::time_point started = Clock::now();
  int terminal = -1;
  const pid_t child = ::forkpty(&terminal, nullptr, nullptr, nullptr);
  if (child < 0) {
    return run;
  }
  if (child == 0) {
    ::execv(pointers[0], pointers.data());
    ::_exit(127);
  }
  const Clock::time_point deadline = started + limit;
  std::thread writer;
  bool open = true;
  while (open && Clock::now() < deadline) {
    pollfd end{terminal, POLLIN, 0};
    if (::poll(&end, 1, MillisecondsLeft(deadline)) <= 0) {
      continue;
    }
    // A terminal whose program ended reads as an error (EIO).
    open = Take(terminal, run.out);
    if (!writer.joinable() && run.out.find(prompt) != std::string::npos) {
      writer = std::thread([terminal, &input] { Give(terminal, input); });
    }
  }
  Reap(child, started, deadline, run);
  if (writer.joinable()) {
    writer.join();
  }
  ::close(terminal);
  run.peakResidentKiB = TakePeak(run.out);
  return run;
}

int ChildRun::Start(const std::vector<std::string>& argv) {
  std::vector<std::string> words = argv;
  std::vector<char*> pointers = Pointers(words);
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, "/dev/null", O_WRONLY, 0);
  pid_t child = -1;
  const int spawned =
      ::posix_spawn(&child, words[0].c_str(), &actions, nullptr, pointers.data(), environ);
  posix_spawn_file_actions_destroy(&actions);
  return spawned == 0 ? child : -1;
}

int ChildRun::Measure(const std::vector<std::string>& argv) {
  std::vector<std::string> words = argv;
  std::vector<char*> pointers = Pointers(words);
  pid_t child = -1;
  if (words.empty() ||
      ::posix_spawn(&child, words[0].c_str(), nullptr, nullptr, pointers.data(), environ) != 0) {
    return 127;
  }
  int status = 0;
  rusage usage{};
  while (::wait4(child, &status, 0, &usage) < 0 && errno == EINTR) {
  }
  std::fprintf(stderr, "%s%ld KiB\n", kPeakLine, usage.ru_maxrss);
  return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}
