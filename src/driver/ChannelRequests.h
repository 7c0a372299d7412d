// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>
#include <string>

#include "driver/ChannelSettings.h"
#include "driver/TokenQueue.h"

// What the host's threads ask of a channel's worker: connect on or off, a
// new remote address, applied settings, a socket to renew. The requests live
// with the working settings under queueLock (each operation takes a
// TokenQueue::Guard as the proof that the lock is held); the worker takes
// them all at the start of its next pass. A pending flag, which the worker
// reads without the lock, says that something waits, so a pass can also end
// early for it.
class ChannelRequests {
 public:
  // What the worker learns when it takes the requests.
  struct Taken {
    bool connectRequested;
    // The socket must be re-created.
    bool reinitRequired;
    // The settings differ from the worker's copy, which now holds them.
    bool settingsChanged;
  };

  // A started channel: its working settings, the queue's rules, and neither
  // a connect nor a renewal requested. Nothing is pending: the worker is
  // given the same settings directly.
  void Start(TokenQueue::Guard& held, const ChannelSettings& settings);
  // The host's connect memory type or console command.
  void Connect(TokenQueue::Guard& held, bool on);
  // Points the channel at another peer (neither staged nor persisted).
  void SetRemote(TokenQueue::Guard& held, const std::string& ip, int port);
  // Applied settings; renew asks for a new socket. The queue's rules take
  // effect at once.
  void Apply(TokenQueue::Guard& held, const ChannelSettings& settings, bool renew);

  const ChannelSettings& Settings(const TokenQueue::Guard& held) const;
  bool ConnectRequested(const TokenQueue::Guard& held) const;

  // True when a request waits for the worker; read without queueLock.
  bool Pending() const { return pending_.load(std::memory_order_acquire); }
  // The worker takes every request made since it last took them; settings
  // and version are its own copy of the settings and their version.
  Taken Take(const TokenQueue::Guard& held, ChannelSettings& settings, unsigned int& version);

 private:
  void Post();

  ChannelSettings settings_;
  unsigned int version_ = 0;
  bool connectRequested_ = false;
  bool reinitRequired_ = false;
  std::atomic<bool> pending_{false};
};
