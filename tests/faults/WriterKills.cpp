// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "WriterKills.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <filesystem>
#include <random>
#include <set>
#include <thread>

#include "ApplyRound.h"
#include "HostPermanentStorage.h"
#include "StorageError.h"

extern char** environ;

namespace {

constexpr int kReadyMilliseconds = 30000;

int CountTemporaries(const std::string& folder) {
  int count = 0;
  for (const auto& entry : std::filesystem::directory_iterator(folder)) {
    if (entry.path().filename().string().rfind("storage.ini.tmp-", 0) == 0) {
      ++count;
    }
  }
  return count;
}

// Starts the writer with its standard output on a pipe; waits until it
// says "ready". Returns its process id, or -1 with error set.
pid_t StartWriter(const WriterKills::Setup& setup, const std::string& storage, int first,
                  std::string& error) {
  std::array<int, 2> out{};
  if (::pipe2(out.data(), O_CLOEXEC) != 0) {
    error = "no pipe";
    return -1;
  }
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, out[1], STDOUT_FILENO);
  std::vector<std::string> words = {setup.writer, setup.plugin, storage,
                                    std::to_string(setup.count), std::to_string(first)};
  std::vector<char*> argv;
  for (std::string& word : words) {
    argv.push_back(word.data());
  }
  argv.push_back(nullptr);
  pid_t child = -1;
  const int spawned =
      ::posix_spawn(&child, setup.writer.c_str(), &actions, nullptr, argv.data(), environ);
  posix_spawn_file_actions_destroy(&actions);
  ::close(out[1]);
  std::string said;
  pollfd entry{out[0], POLLIN, 0};
  while (spawned == 0 && said.find("ready\n") == std::string::npos &&
         ::poll(&entry, 1, kReadyMilliseconds) == 1) {
    std::array<char, 64> chunk{};
    const ssize_t n = ::read(out[0], chunk.data(), chunk.size());
    if (n <= 0) {
      break;
    }
    said.append(chunk.data(), static_cast<std::size_t>(n));
  }
  ::close(out[0]);
  if (spawned != 0 || said.find("ready\n") == std::string::npos) {
    error = "the writer did not get ready (round " + std::to_string(first) + ")";
    if (spawned == 0) {
      ::kill(child, SIGKILL);
      ::waitpid(child, nullptr, 0);
    }
    return -1;
  }
  return child;
}

}  // namespace

WriterKills WriterKills::Run(const Setup& setup) {
  WriterKills result;
  const std::string storage = setup.folder + "/storage.ini";
  std::mt19937 random(setup.seed);
  std::uniform_int_distribution<long> delay(0, setup.longestDelay.count());
  std::set<int> rounds;
  int first = 0;
  for (int kill = 0; kill < setup.kills; ++kill) {
    const pid_t child = StartWriter(setup, storage, first, result.error);
    if (child < 0) {
      return result;
    }
    std::this_thread::sleep_for(std::chrono::microseconds(delay(random)));
    ::kill(child, SIGKILL);
    ::waitpid(child, nullptr, 0);
    ++result.kills;
    result.temporariesFound += CountTemporaries(setup.folder);
    int round = -1;
    std::string mix;
    try {
      HostPermanentStorage stored(storage);
      if (!ApplyRound::Whole(stored, setup.count, round, mix)) {
        ++result.mixed;
        if (result.mixes.size() < 5) {
          result.mixes.push_back("kill " + std::to_string(kill) + ": " + mix);
        }
      }
    } catch (const StorageError& e) {
      result.error = e.what();
      return result;
    }
    result.temporariesLeft += CountTemporaries(setup.folder);
    // The writer said "ready" only once its first round was applied, and an
    // apply is in the file when its write returns.
    if (round < first || round < result.lastRound) {
      ++result.wentBack;
    }
    rounds.insert(round);
    result.lastRound = round;
    first = round + 1;
  }
  result.roundsSeen = static_cast<int>(rounds.size());
  return result;
}
