// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/ChannelRequests.h"

void ChannelRequests::Start(TokenQueue::Guard& held, const ChannelSettings& settings) {
  settings_ = settings;
  ++version_;
  connectRequested_ = false;
  reinitRequired_ = false;
  held.setRules(settings.number(Setting::TokenQueueSize), settings.flag(Setting::HexTokens));
  pending_.store(false, std::memory_order_release);
}

void ChannelRequests::Connect(TokenQueue::Guard& /*held*/, bool on) {
  connectRequested_ = on;
  Post();
}

void ChannelRequests::SetRemote(TokenQueue::Guard& /*held*/, const std::string& ip, int port) {
  settings_.setText(Setting::RemoteIp, ip);
  settings_.setNumber(Setting::RemotePort, port);
  ++version_;
  Post();
}

void ChannelRequests::Apply(TokenQueue::Guard& held, const ChannelSettings& settings, bool renew) {
  settings_ = settings;
  ++version_;
  reinitRequired_ = reinitRequired_ || renew;
  held.setRules(settings.number(Setting::TokenQueueSize), settings.flag(Setting::HexTokens));
  Post();
}

const ChannelSettings& ChannelRequests::Settings(const TokenQueue::Guard& /*held*/) const {
  return settings_;
}

bool ChannelRequests::ConnectRequested(const TokenQueue::Guard& /*held*/) const {
  return connectRequested_;
}

ChannelRequests::Taken ChannelRequests::Take(const TokenQueue::Guard& /*held*/,
                                             ChannelSettings& settings, unsigned int& version) {
  const bool changed = version != version_;
  if (changed) {
    settings = settings_;
    version = version_;
  }
  const Taken taken{connectRequested_, reinitRequired_, changed};
  reinitRequired_ = false;
  pending_.store(false, std::memory_order_release);
  return taken;
}

void ChannelRequests::Post() { pending_.store(true, std::memory_order_release); }
