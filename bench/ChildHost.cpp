// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ChildHost.h"

#include <dirent.h>
#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>
#include <time.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <thread>

namespace {

// Owns the file actions of one posix_spawn.
class SpawnActions {
 public:
  SpawnActions() { ::posix_spawn_file_actions_init(&actions_); }
  SpawnActions(const SpawnActions&) = delete;
  SpawnActions& operator=(const SpawnActions&) = delete;
  SpawnActions(SpawnActions&&) = delete;
  SpawnActions& operator=(SpawnActions&&) = delete;
  ~SpawnActions() { ::posix_spawn_file_actions_destroy(&actions_); }
  posix_spawn_file_actions_t* Get() { return &actions_; }

 private:
  posix_spawn_file_actions_t actions_{};
};

}  // namespace

ChildHost::ChildHost(const std::string& program, const std::vector<std::string>& arguments) {
  int fds[2] = {-1, -1};
  if (::pipe2(fds, O_CLOEXEC) != 0) {
    throw std::runtime_error("pipe: " + std::string(std::strerror(errno)));
  }
  FileDescriptor readEnd(fds[0]);
  input_ = FileDescriptor(fds[1]);
  SpawnActions actions;
  ::posix_spawn_file_actions_adddup2(actions.Get(), readEnd.Get(), STDIN_FILENO);
  ::posix_spawn_file_actions_addopen(actions.Get(), STDOUT_FILENO, "/dev/null", O_WRONLY, 0);
  ::posix_spawn_file_actions_addopen(actions.Get(), STDERR_FILENO, "/dev/null", O_WRONLY, 0);
  std::vector<std::string> words{program};
  words.insert(words.end(), arguments.begin(), arguments.end());
  std::vector<char*> argv;
  for (std::string& word : words) {
    argv.push_back(word.data());
  }
  argv.push_back(nullptr);
  const int rc =
      ::posix_spawn(&pid_, program.c_str(), actions.Get(), nullptr, argv.data(), environ);
  if (rc != 0) {
    throw std::runtime_error("cannot start " + program + ": " + std::strerror(rc));
  }
  if (::clock_getcpuclockid(pid_, &clock_) != 0) {
    Finish(std::chrono::milliseconds(0));
    throw std::runtime_error("no CPU clock for process " + std::to_string(pid_));
  }
}

ChildHost::~ChildHost() {
  if (pid_ > 0) {
    Finish(std::chrono::milliseconds(5000));
  }
}

bool ChildHost::Send(const std::vector<std::string>& lines) {
  std::string text;
  for (const std::string& line : lines) {
    text += line + "\n";
  }
  std::size_t written = 0;
  while (written < text.size()) {
    const ssize_t n = ::write(input_.Get(), text.data() + written, text.size() - written);
    if (n < 0 && errno == EINTR) {
      continue;
    }
    if (n <= 0) {
      return false;
    }
    written += static_cast<std::size_t>(n);
  }
  return true;
}

std::chrono::nanoseconds ChildHost::CpuTime() const {
  timespec now{};
  if (::clock_gettime(clock_, &now) != 0) {
    return std::chrono::nanoseconds(0);
  }
  return std::chrono::seconds(now.tv_sec) + std::chrono::nanoseconds(now.tv_nsec);
}

std::uint64_t ChildHost::Status(const char* field) const {
  return Field("/proc/" + std::to_string(pid_) + "/status", field);
}

std::uint64_t ChildHost::ContextSwitches() const {
  const std::string tasks = "/proc/" + std::to_string(pid_) + "/task";
  DIR* const folder = ::opendir(tasks.c_str());
  if (folder == nullptr) {
    return 0;
  }
  std::uint64_t total = 0;
  while (const dirent* entry = ::readdir(folder)) {
    if (entry->d_name[0] == '.') {
      continue;
    }
    const std::string status = tasks + "/" + entry->d_name + "/status";
    total +=
        Field(status, "voluntary_ctxt_switches:") + Field(status, "nonvoluntary_ctxt_switches:");
  }
  ::closedir(folder);
  return total;
}

std::uint64_t ChildHost::Field(const std::string& path, const char* field) {
  std::ifstream status(path);
  std::string line;
  const std::size_t length = std::strlen(field);
  while (std::getline(status, line)) {
    if (line.compare(0, length, field) == 0) {
      std::istringstream value(line.substr(length));
      std::uint64_t number = 0;
      value >> number;
      return number;
    }
  }
  return 0;
}

bool ChildHost::Finish(std::chrono::milliseconds limit) {
  if (pid_ <= 0) {
    return false;
  }
  input_.Close();
  const auto deadline = std::chrono::steady_clock::now() + limit;
  int status = 0;
  for (;;) {
    const pid_t done = ::waitpid(pid_, &status, WNOHANG);
    if (done == pid_) {
      break;
    }
    if (done < 0 && errno != EINTR) {
      pid_ = -1;
      return false;
    }
    if (std::chrono::steady_clock::now() >= deadline) {
      ::kill(pid_, SIGKILL);
      ::waitpid(pid_, &status, 0);
      pid_ = -1;
      return false;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
  }
  pid_ = -1;
  return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}
