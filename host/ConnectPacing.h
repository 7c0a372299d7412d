// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <mutex>
#include <unordered_map>

// Paces TCP connect attempts to targets that refuse them, so that a channel
// whose peer is absent does not make a new socket and a system call every
// time its driver retries.
//
// Contract: after a failed attempt to a target, the target is closed for a
// back-off window; attempts inside the window are to be answered as failures
// without touching the network. The first window lasts 10 ms and each
// failure after a window doubles it, up to the ceiling. A success forgets
// the target, and every target has its own window, so a new target starts
// with none. A ceiling of 0 turns pacing off.
//
// A target is the peer's IPv4 address and port together with the socket's
// configured local port; one object serves every socket of a factory, so a
// socket made again for the same target keeps the target's window.
//
// Thread-safe. Nothing here waits: callers pass the time, which also lets
// tests drive the windows without a clock.
class ConnectPacing {
 public:
  using Clock = std::chrono::steady_clock;

  static constexpr std::chrono::milliseconds kFirstWindow{10};
  static constexpr std::chrono::milliseconds kDefaultCeiling{1000};

  struct Target {
    std::uint32_t address = 0;  // network byte order, as in sockaddr_in
    std::uint16_t port = 0;
    std::uint16_t localPort = 0;
  };

  explicit ConnectPacing(std::chrono::milliseconds ceiling = kDefaultCeiling);
  ConnectPacing(const ConnectPacing&) = delete;
  ConnectPacing& operator=(const ConnectPacing&) = delete;
  ConnectPacing(ConnectPacing&&) = delete;
  ConnectPacing& operator=(ConnectPacing&&) = delete;
  ~ConnectPacing() = default;

  // False while target's window lasts at now.
  bool MayAttempt(const Target& target, Clock::time_point now) const;
  // An attempt failed at now: opens the target's next window.
  void Failed(const Target& target, Clock::time_point now);
  // An attempt succeeded: the target has no window any more.
  void Succeeded(const Target& target);

  // The window the target is in at now, or zero when it is open.
  std::chrono::milliseconds WindowLeft(const Target& target, Clock::time_point now) const;
  // Targets with a window remembered (expired ones are dropped as the table
  // grows).
  std::size_t Remembered() const;
  std::chrono::milliseconds Ceiling() const { return ceiling_; }

 private:
  struct Window {
    std::chrono::milliseconds length{0};
    Clock::time_point end;
  };

  static std::uint64_t Key(const Target& target);
  void DropExpired(Clock::time_point now);

  const std::chrono::milliseconds ceiling_;
  mutable std::mutex mutex_;
  std::unordered_map<std::uint64_t, Window> windows_;
  // The table is swept of expired windows when it reaches this size, which
  // then doubles the size it had after the sweep: amortised constant time,
  // and a host that meets many targets keeps only the recent ones.
  std::size_t sweepAt_ = kFirstSweep;
  static constexpr std::size_t kFirstSweep = 64;
};
