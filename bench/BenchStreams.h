// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "LoopbackIo.h"

// Token payloads and framed streams for the loopback benchmarks.
namespace BenchStreams {

// A payload of size bytes: the index in decimal, then 'p's.
std::string Payload(std::size_t index, std::size_t size);
// count payloads, numbered from first.
std::vector<std::string> Payloads(std::size_t count, std::size_t size, std::size_t first = 0);
// Each payload between the prefix and suffix bytes.
LoopbackIo::Bytes Framed(const std::vector<std::string>& payloads, const std::string& prefix,
                         const std::string& suffix);

}  // namespace BenchStreams

// A thread that is joined when the object goes, so a benchmark that leaves
// early never leaves a thread running.
class JoiningThread {
 public:
  template <typename Body>
  explicit JoiningThread(Body&& body) : thread_(std::forward<Body>(body)) {}
  JoiningThread(const JoiningThread&) = delete;
  JoiningThread& operator=(const JoiningThread&) = delete;
  JoiningThread(JoiningThread&&) = delete;
  JoiningThread& operator=(JoiningThread&&) = delete;
  ~JoiningThread() { Join(); }

  void Join() {
    if (thread_.joinable()) {
      thread_.join();
    }
  }

 private:
  std::thread thread_;
};
