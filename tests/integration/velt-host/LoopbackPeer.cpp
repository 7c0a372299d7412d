// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "LoopbackPeer.h"

#include <algorithm>

namespace {

veltpeer::PeerOptions OptionsFor(const LoopbackPeer::Setup& setup) {
  veltpeer::PeerOptions options;
  options.transport = setup.transport;
  options.bindAddress = "127.0.0.1";
  options.echo = setup.echo;
  options.rxPrefix = "\x02";
  options.rxSuffix = "\x03";
  options.emitCount = setup.emit;
  if (setup.emit != 0) {
    options.rate = 0;
    options.txPrefix = "\x02";
    options.txSuffix = "\x03";
    options.payload = setup.payload;
    options.payloadCounter = setup.numbered;
  }
  return options;
}

}  // namespace

LoopbackPeer::LoopbackPeer(const Setup& setup)
    : transport_(setup.transport), peer_([this, &setup] {
        veltpeer::PeerOptions options = OptionsFor(setup);
        options.onEvent = [this](const veltpeer::PeerEvent& event) { Record(event); };
        return options;
      }()) {
  const veltpeer::Peer::Started started = peer_.Start();
  if (started.Ok()) {
    port_ = started.port;
  } else {
    error_ = started.error;
  }
}

LoopbackPeer::~LoopbackPeer() { peer_.Stop(); }

std::string LoopbackPeer::Config() const {
  return std::string("CfgVer=1 model=1 socketType=") +
         (transport_ == veltpeer::Transport::kTcp ? "TCP" : "UDP") +
         " remoteIpAddress=127.0.0.1 remotePort=" + std::to_string(port_) +
         " rx_prefix=02 rx_suffix=03 tx_prefix=02 tx_suffix=03";
}

void LoopbackPeer::Record(const veltpeer::PeerEvent& event) {
  const std::lock_guard<std::mutex> hold(lock_);
  if (event.kind == veltpeer::PeerEvent::Kind::kReceived) {
    received_.push_back(event.bytes);
  } else if (event.kind == veltpeer::PeerEvent::Kind::kClosed) {
    ++closed_;
  }
  changed_.notify_all();
}

bool LoopbackPeer::WaitReceived(const std::string& frame, std::chrono::milliseconds timeout) {
  std::unique_lock<std::mutex> hold(lock_);
  return changed_.wait_for(hold, timeout, [this, &frame] {
    return std::find(received_.begin(), received_.end(), frame) != received_.end();
  });
}

bool LoopbackPeer::WaitClosed(std::chrono::milliseconds timeout) {
  std::unique_lock<std::mutex> hold(lock_);
  return changed_.wait_for(hold, timeout, [this] { return closed_ > 0; });
}
