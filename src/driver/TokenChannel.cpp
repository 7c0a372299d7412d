// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/TokenChannel.h"

#include <algorithm>
#include <array>

#include "ISocketFactory.h"
#include "binding/HostServices.h"
#include "config/IPParser.h"
#include "driver/DriverErrors.h"
#include "driver/TaskRunner_VELT.h"
#include "protlib/HexText.h"

namespace {

constexpr int kIdleSleep = 10;
constexpr int kDatagramTimeout = 20;
constexpr int kDefaultGap = 500;
constexpr int kMaxFailedConnects = 100;
constexpr const char* kGlobalBroadcast = "255.255.255.255";

}  // namespace

TokenChannel::TokenChannel(ProtocolBase& protocol, TokenQueue& tokenQueue,
                           ChannelRequests& requests, const TaskRunner_VELT& runner)
    : protocol_(protocol),
      tokenQueue_(tokenQueue),
      requests_(requests),
      runner_(runner),
      rxBuffer(kRxBufferSize),
      stream_(rxBuffer.data(), rxBuffer.size()) {}

TokenChannel::~TokenChannel() {
  const std::lock_guard<std::mutex> guard(socketLock);
  deleteSocket();
}

void TokenChannel::Reset(const TokenQueue::Guard& held) {
  requests_.Take(held, settings_, settingsVersion_);
  adoptSettings();
  connectRequested = false;
  state_ = State::Idle;
  connected.store(false);
}

void TokenChannel::Token(const char* data, std::size_t length) {
  TokenQueue::Guard held(tokenQueue_);
  held.addToken(data, length);
}

bool TokenChannel::Interrupted() const { return requests_.Pending() || runner_.stopRequested(); }

void TokenChannel::Task() {
  takeRequests();
  supervise();
  // The states that end the pass return; the others lead on to one that
  // does.
  for (;;) {
    switch (state_) {
      case State::Renewing:
        renew();
        continue;
      case State::Idle:
        if (!connectRequested || !connect()) {
          sleep(kIdleSleep);
          return;
        }
        continue;
      case State::Unusable:
        sleep(kIdleSleep);
        return;
      case State::Connected:
        receive();
        return;
    }
  }
}

void TokenChannel::takeRequests() {
  if (!requests_.Pending()) {
    return;
  }
  // Bytes received before the request are framed as they arrived.
  stream_.Drain(*this);
  ChannelRequests::Taken taken{};
  {
    const TokenQueue::Guard held(tokenQueue_);
    taken = requests_.Take(held, settings_, settingsVersion_);
  }
  connectRequested = taken.connectRequested;
  if (taken.settingsChanged) {
    adoptSettings();
  }
  if (taken.reinitRequired) {
    state_ = State::Renewing;
  }
}

void TokenChannel::adoptSettings() {
  std::string prefix = fromHex(settings_.text(Setting::RxPrefix));
  std::string suffix = fromHex(settings_.text(Setting::RxSuffix));
  if (prefix != framedPrefix_ || suffix != framedSuffix_) {
    datagramFraming_ = DatagramFraming(prefix, suffix);
    stream_.Frame(prefix, suffix);
    framedPrefix_ = std::move(prefix);
    framedSuffix_ = std::move(suffix);
  }
  // Only "UDP" frames datagrams: any other socket type is framed as a
  // stream, even one that makes a UDP socket (only "TCP" makes a TCP one).
  // Such a socket is asked for one byte at a time, as the stream steps
  // receive: each receive then takes one datagram and keeps its first byte.
  const std::string& socketType = settings_.text(Setting::SocketType);
  datagrams_ = socketType == "UDP";
  streamReceiveSize_ = socketType == "TCP" ? kRxBufferSize : 1;
  const int gap = settings_.number(Setting::Gap);
  timeout_ = gap == 0 ? kDefaultGap : gap;
}

void TokenChannel::supervise() {
  // A connection that broke or is no longer wanted, or a socket made for
  // another remote address, is replaced.
  const bool dropped = state_ == State::Connected && (linkBroken() || !connectRequested);
  if (dropped || settings_.text(Setting::RemoteIp) != lastRemoteIp ||
      settings_.number(Setting::RemotePort) != lastRemotePort) {
    state_ = State::Renewing;
  }
}

bool TokenChannel::linkBroken() {
  // While received bytes wait to be framed the connection is not asked: the
  // bytes come first, as a host socket reports a closed stream only once
  // every byte that arrived before the close has been taken.
  return !stream_.Carrying() && socket != nullptr && socket->IsBroken() != 0;
}

void TokenChannel::renew() {
  stream_.Drain(*this);
  lastRemoteIp = settings_.text(Setting::RemoteIp);
  lastRemotePort = settings_.number(Setting::RemotePort);
  initSocket();
}

bool TokenChannel::initSocket() {
  {
    const std::lock_guard<std::mutex> guard(socketLock);
    deleteSocket();
  }
  stream_.Discard();
  connected.store(false);
  state_ = State::Idle;
  localBroadcastAddress = kGlobalBroadcast;
  ISocketFactory2* const factory = piSocketFactory;
  if (factory == nullptr ||
      (settings_.text(Setting::BroadcastType) == "Local" && !findBroadcastAddress(*factory))) {
    return false;
  }
  ISocket* const made =
      factory->CreateSocket(static_cast<unsigned short>(settings_.number(Setting::LocalPort)),
                            settings_.text(Setting::SocketType) == "TCP" ? 1 : 0, 0);
  const std::lock_guard<std::mutex> guard(socketLock);
  socket = made;
  return true;
}

bool TokenChannel::findBroadcastAddress(ISocketFactory2& factory) {
  // A public address only picks the adapter that routes to the outside;
  // nothing is ever sent to it.
  const std::string& localIp = settings_.text(Setting::LocalIp);
  const std::string address = localIp.empty() ? "8.8.8.8" : localIp;
  ISocket* const probe = factory.CreateSocket(0, 0, 0);
  if (probe == nullptr) {
    Fail(protocol_, kProbeSocketFailed);
    return false;
  }
  unsigned int ip = 0;
  if (!parseIpAddress(address.c_str(), ip)) {
    // The probe is deliberately left to the host: it is never used again.
    // Making the socket again cannot succeed before the settings change.
    state_ = State::Unusable;
    Fail(protocol_, kBadAdapterAddress);
    return false;
  }
  unsigned int adapter = 0;
  unsigned int mask = 0;
  unsigned int unused = 0;
  if (probe->GetAdapterInfo(ip, &adapter, &mask, &unused) == 0) {
    factory.DeleteSocket(probe, 0);
    Fail(protocol_, kAdapterLookupFailed);
    return false;
  }
  std::array<char, 16> text{};
  ipToString(adapter | ~mask, text.data());
  localBroadcastAddress = text.data();
  factory.DeleteSocket(probe, 0);
  return true;
}

bool TokenChannel::connect() {
  const std::string& remoteIp = settings_.text(Setting::RemoteIp);
  const bool toSubnet =
      settings_.text(Setting::BroadcastType) == "Local" && remoteIp == kGlobalBroadcast;
  const std::string& target = toSubnet ? localBroadcastAddress : remoteIp;
  // Without a socket the attempt counts as failed, so the socket is made
  // again after the usual number of attempts.
  const int result =
      socket == nullptr
          ? -1
          : socket->Connect(target.c_str(),
                            static_cast<unsigned short>(settings_.number(Setting::RemotePort)));
  if (result != 0) {
    if (++failedConnects > kMaxFailedConnects) {
      state_ = State::Renewing;
      failedConnects = 0;
    }
    return false;
  }
  failedConnects = 0;
  state_ = State::Connected;
  connected.store(true);
  return true;
}

void TokenChannel::receive() {
  if (datagrams_) {
    receiveDatagrams();
  } else {
    stream_.Pass(*socket, streamReceiveSize_, timeout_, *this, *this);
  }
}

void TokenChannel::receiveDatagrams() {
  while (!Interrupted()) {
    const int received = socket->Receive(rxBuffer.data(), kRxBufferSize, kDatagramTimeout);
    if (received < 1) {
      return;
    }
    datagramFraming_.Feed(rxBuffer.data(),
                          static_cast<std::size_t>(std::min(received, kRxBufferSize)), *this);
  }
}

void TokenChannel::Close() {
  stream_.Drain(*this);
  const std::lock_guard<std::mutex> guard(socketLock);
  deleteSocket();
}

void TokenChannel::Send(const std::string& frame) {
  const std::lock_guard<std::mutex> guard(socketLock);
  if (socket != nullptr) {
    socket->Send(reinterpret_cast<const unsigned char*>(frame.data()),
                 static_cast<int>(frame.size()));
  }
}

void TokenChannel::deleteSocket() {
  ISocket* const old = socket;
  socket = nullptr;
  if (old != nullptr && piSocketFactory != nullptr) {
    piSocketFactory->DeleteSocket(old, 0);
  }
}

void TokenChannel::sleep(int milliseconds) {
  if (IMultiTask2* const multiTask = runner_.getMultiTask(); multiTask != nullptr) {
    multiTask->Sleep(milliseconds);
  }
}
