// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>
#include <cstdint>
#include <mutex>
#include <string>
#include <vector>

#include "driver/ChannelRequests.h"
#include "driver/ChannelSettings.h"
#include "driver/DatagramFraming.h"
#include "driver/StreamReceiver.h"
#include "driver/TokenQueue.h"
#include "driver/TokenSink.h"

class ISocket;
class ISocketFactory2;
class ProtocolBase;
class TaskRunner_VELT;

// The channel engine: everything that the worker task owns and drives, one
// pass at a time (Task): the socket, the framing, the connection state and
// its counters, the remote address the socket was made for, and the bytes
// received but not yet framed.
//
// The host's threads reach it through two seams only: the token queue under
// queueLock, into which the worker appends tokens, and the requests
// (ChannelRequests), which the worker takes at the start of a pass. A pass
// also ends, before it would wait for more bytes, while a request is pending
// or the worker is asked to stop, so every request takes effect within one
// receive time-out even under continuous traffic. Bytes already received are
// framed before a request is taken, so no token that arrived is lost to it.
//
// Besides the worker, only Send runs on other threads (the host's writers);
// socketLock serialises it with the replacement of the socket. Start and
// Stop use Reset, initSocket and Close while no worker runs.
class TokenChannel final : private TokenSink, private PassGate {
 public:
  // The size of the receive buffer: one datagram, or the stream bytes of
  // one receive.
  static constexpr int kRxBufferSize = 1536;

  // Errors of socket set-up are recorded as protocol's last error.
  TokenChannel(ProtocolBase& protocol, TokenQueue& tokenQueue, ChannelRequests& requests,
               const TaskRunner_VELT& runner);
  TokenChannel(const TokenChannel&) = delete;
  TokenChannel& operator=(const TokenChannel&) = delete;
  TokenChannel(TokenChannel&&) = delete;
  TokenChannel& operator=(TokenChannel&&) = delete;
  // Deletes a socket that Stop did not.
  virtual ~TokenChannel();

  // Start, before the worker runs: takes the settings and requests as they
  // stand; not connected.
  void Reset(const TokenQueue::Guard& held);
  // Replaces the socket with one made for the current settings; false, with
  // the protocol's last error set, when none could be made. Carried bytes are
  // dropped with the old socket.
  bool initSocket();
  // One pass of the worker.
  void Task();
  // Stop, once the worker has ended: frames what was received, then deletes
  // the socket.
  void Close();
  // Sends a frame on the current socket, if any; the outcome is not the
  // writer's concern.
  void Send(const std::string& frame);
  // The connection state (conn_stat); any thread.
  bool isConnected() const { return connected.load(); }

 private:
  enum class State : std::uint8_t {
    // The socket is to be made again before anything else happens.
    Renewing,
    // Not connected; with connect requested, one attempt per pass.
    Idle,
    Connected,
    // The local address is no address: no socket can be made until the
    // settings change.
    Unusable,
  };

  // TokenSink: queues a token under queueLock, for that token only.
  void Token(const char* data, std::size_t length) override;
  // PassGate: a request waits, or the worker is asked to stop.
  bool Interrupted() const override;

  void takeRequests();
  void adoptSettings();
  void supervise();
  bool linkBroken();
  void renew();
  bool findBroadcastAddress(ISocketFactory2& factory);
  bool connect();
  void receive();
  void receiveDatagrams();
  void deleteSocket();
  void sleep(int milliseconds);

  ProtocolBase& protocol_;
  TokenQueue& tokenQueue_;
  ChannelRequests& requests_;
  const TaskRunner_VELT& runner_;

  std::mutex socketLock;
  // Written under socketLock by the worker (or by Start and Stop while no
  // worker runs); the worker reads it without the lock, since only it
  // replaces the socket.
  ISocket* socket = nullptr;

  State state_ = State::Idle;
  std::atomic<bool> connected{false};
  bool connectRequested = false;
  ChannelSettings settings_;
  unsigned int settingsVersion_ = 0;
  std::string lastRemoteIp;
  int lastRemotePort = 0;
  int failedConnects = 0;
  std::string localBroadcastAddress{"255.255.255.255"};

  // What the framing was built for, and how the pass receives.
  std::string framedPrefix_;
  std::string framedSuffix_;
  bool datagrams_ = false;
  std::size_t streamReceiveSize_ = kRxBufferSize;
  int timeout_ = 0;

  std::vector<unsigned char> rxBuffer;
  StreamReceiver stream_;
  DatagramFraming datagramFraming_;
};
