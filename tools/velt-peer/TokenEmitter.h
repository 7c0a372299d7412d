// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <cstdint>
#include <string>

#include "velt-peer/PeerOptions.h"

namespace veltpeer {

// The tokens the simulator emits and when: tx prefix + payload + tx suffix,
// numbered from 1, paced at a fixed rate from the moment emission begins.
class TokenEmitter {
 public:
  using Clock = std::chrono::steady_clock;

  explicit TokenEmitter(const PeerOptions& options);

  // True while tokens are left to emit.
  bool Active() const { return emitted_ < count_; }
  // Starts (or restarts, for a new connection) the schedule: the next token
  // is due at once, the following ones one period apart.
  void Begin(Clock::time_point now);
  bool Begun() const { return begun_; }
  // Forgets the schedule until the next Begin.
  void Pause() { begun_ = false; }
  // When the next token is due; max() while not begun or when none is left.
  Clock::time_point Due() const;
  // The next token's bytes; advances the number and the schedule.
  std::string Next();
  std::uint64_t Emitted() const { return emitted_; }

 private:
  std::string Payload(std::uint64_t number) const;

  const std::uint64_t count_;
  const Clock::duration period_;
  const std::string prefix_;
  const std::string suffix_;
  const std::string payload_;
  const bool counter_;
  std::uint64_t emitted_ = 0;
  bool begun_ = false;
  Clock::time_point due_{};
};

}  // namespace veltpeer
