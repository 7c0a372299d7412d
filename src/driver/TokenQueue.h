// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <deque>
#include <string>

class IMutex;

// The received tokens of one channel, oldest first, and the channel's one host
// mutex that guards them. Every access is made through a Guard, which holds
// the mutex for its lifetime.
class TokenQueue {
 public:
  // Takes a host mutex (may be null when the module offered no multitasking
  // service; the queue is then unguarded and the driver cannot run).
  explicit TokenQueue(IMutex* lock) : lock_(lock) {}

  class Guard {
   public:
    explicit Guard(TokenQueue& queue);
    Guard(const Guard&) = delete;
    Guard& operator=(const Guard&) = delete;
    Guard(Guard&&) = delete;
    Guard& operator=(Guard&&) = delete;
    ~Guard();

    // Appends a token; at the bound the oldest one is dropped first (an empty
    // queue drops nothing, so a bound of 0 keeps just the newest token). With
    // hex set the bytes are queued as upper-case hexadecimal text.
    void Add(std::string token, unsigned int bound, bool hex);
    bool Empty() const { return queue_.tokens_.empty(); }
    std::size_t Size() const { return queue_.tokens_.size(); }
    // The oldest token; the queue must not be empty.
    const std::string& Front() const { return queue_.tokens_.front(); }
    // Removes the oldest token if there is one.
    void PopFront();
    void Clear() { queue_.tokens_.clear(); }

   private:
    TokenQueue& queue_;
  };

  IMutex* Lock() const { return lock_; }

 private:
  IMutex* lock_;
  std::deque<std::string> tokens_;
};
