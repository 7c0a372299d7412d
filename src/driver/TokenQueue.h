// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>
#include <vector>

class IMutex;

// The received tokens of one channel, oldest first, with the two rules that
// decide how a token is queued (the bound and the hex form), and the
// channel's one host mutex, queueLock, that guards them. Every access is made
// through a Guard, which holds queueLock for its lifetime; other state that
// queueLock guards takes a Guard as the proof that it is held.
//
// The tokens live in a ring of strings that keep their storage when a token
// is removed (up to kKeptCapacity bytes each), so a channel whose reader
// keeps up queues tokens without allocating. A ring that grew in a burst is
// given back once it is empty again, and its memory, like that of the tokens
// Clear removes, is freed after queueLock is released.
class TokenQueue {
 public:
  // A slot keeps the storage of a removed token up to this many bytes.
  static constexpr std::size_t kKeptCapacity = 64;

  // Takes a host mutex (may be null when the module offered no multitasking
  // service; the queue is then unguarded and the driver cannot run).
  explicit TokenQueue(IMutex* queueLock) : queueLock_(queueLock) {}

  class Guard {
   public:
    explicit Guard(TokenQueue& queue);
    Guard(const Guard&) = delete;
    Guard& operator=(const Guard&) = delete;
    Guard(Guard&&) = delete;
    Guard& operator=(Guard&&) = delete;
    ~Guard();

    // Appends a token; at the bound the oldest one is dropped first (an
    // empty queue drops nothing, so a bound of 0 keeps just the newest
    // token, and the bound is compared unsigned, so a negative one leaves
    // the queue unbounded). With hex tokens set the bytes are queued as
    // upper-case hexadecimal text, two digits per byte.
    void addToken(const char* data, std::size_t length);
    void addToken(const std::string& token) { addToken(token.data(), token.size()); }
    // The rules for tokens queued from now on.
    void setRules(int tokenQueueSize, bool hexTokens);

    bool Empty() const { return queue_.count_ == 0; }
    std::size_t Size() const { return queue_.count_; }
    // The oldest token; the queue must not be empty.
    const std::string& Front() const { return queue_.slots_[queue_.head_]; }
    // Removes the oldest token if there is one.
    void PopFront();
    // Removes every token.
    void Clear();

   private:
    // Takes the whole ring out of the queue, leaving it empty; its memory is
    // freed after queueLock is released.
    void Discard();

    TokenQueue& queue_;
    // Declared last, so destroyed after the destructor has unlocked.
    std::vector<std::string> discarded_;
  };

  IMutex* Lock() const { return queueLock_; }

 private:
  // The slot after the newest token, the ring grown when it is full.
  std::string& NextSlot();

  IMutex* queueLock_;
  // A ring whose size is 0 or a power of two.
  std::vector<std::string> slots_;
  std::size_t head_ = 0;
  std::size_t count_ = 0;
  unsigned int bound_ = 100;
  bool hex_ = false;
};
