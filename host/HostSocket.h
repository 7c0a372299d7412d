// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <netinet/in.h>

#include <atomic>
#include <chrono>
#include <cstddef>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "FileDescriptor.h"
#include "ISocket.h"

// One IPv4 UDP or TCP socket bound to a local port on every local address.
//
// Threads: one receiving thread (Connect, IsBroken, Receive) and one sending
// thread (Send) may use it at once; calls of each side are serialised.
// A Connect or Receive that blocks on a host task's thread also wakes when the
// task is asked to stop (its stop descriptor is polled beside the socket) and
// then fails at once, so a driver's Stop never waits for a time-out.
//
// TCP: Connect opens a new connection each time and gives up after the
// connect time-out; a failed attempt leaves a fresh descriptor bound to the
// same configured local port behind, ready for the next attempt. Receive is
// buffered: one recv fills an internal buffer from which single-byte receives
// are served without a system call. Send delivers the whole frame or fails.
//
// UDP: Connect only records the default peer for Send; Receive returns one
// datagram per call from any sender, before and after Connect (the socket is
// bound from creation, so what arrives earlier waits in the kernel). A
// datagram longer than the caller's buffer is truncated and the rest
// discarded.
class HostSocket final : public ISocket {
 public:
  using Clock = std::chrono::steady_clock;

  struct Timeouts {
    // How long one TCP connect attempt may wait for an absent or silent
    // peer, so a driver never hangs on a dead network.
    std::chrono::milliseconds connect{3000};
    // How long a Send may wait for room in the kernel's send buffer.
    std::chrono::milliseconds send{3000};
  };

  // Opens and binds a socket; null with the reason in `error` on failure.
  static std::unique_ptr<HostSocket> Create(bool tcp, unsigned short localPort, Timeouts timeouts,
                                            std::string& error);

  HostSocket(const HostSocket&) = delete;
  HostSocket& operator=(const HostSocket&) = delete;
  HostSocket(HostSocket&&) = delete;
  HostSocket& operator=(HostSocket&&) = delete;
  virtual ~HostSocket() = default;

  // 0 on success, -1 on failure (bad address text, refused, timed out,
  // stopped). UDP: any IPv4 address and port are accepted as the peer.
  int Connect(const char* ip, unsigned short port) override;
  // TCP: 1 once a connect attempt has failed or the connection has been
  // closed, reset or has failed, until the next successful Connect; a peer's
  // close is noticed without a running Receive, but only after every byte
  // that arrived before it has been received. 0 for a fresh socket, a
  // healthy connection and any UDP socket.
  int IsBroken() override;
  // Bytes received (at most maxLength); 0 when the time-out elapsed or the
  // calling task was asked to stop; -1 on an error, a closed or absent TCP
  // connection, or a bad argument. A time-out of 0 only takes what is
  // already there; a negative one waits without limit (until data, an error
  // or a stop request).
  int Receive(unsigned char* buffer, int maxLength, int timeoutMilliseconds) override;
  // As AdapterLookup::Find; null out-pointers are skipped. 1 on success.
  int GetAdapterInfo(unsigned int ip, unsigned int* address, unsigned int* mask,
                     unsigned int* index) override;
  // length on success, -1 otherwise: no TCP connection, no UDP peer, the
  // send time-out elapsed, or an error. A TCP frame that fails after part of
  // it left also breaks the connection, so the peer never sees a torn frame
  // followed by more data. Never raises SIGPIPE.
  int Send(const unsigned char* data, int length) override;

  bool IsTcp() const { return tcp_; }
  // The local port the descriptor is bound to now (for a configured port 0,
  // the one the system chose).
  unsigned short LocalPort() const { return localPort_.load(); }

 private:
  enum class WaitResult { Ready, TimedOut, Stopped, Failed };

  HostSocket(FileDescriptor fd, bool tcp, unsigned short configuredPort, Timeouts timeouts);

  static FileDescriptor Open(bool tcp, std::string& error);
  static bool Bind(int fd, unsigned short port, std::string& error);
  static bool ParseAddress(const char* ip, unsigned short port, sockaddr_in& address);
  static WaitResult WaitFor(int fd, short events, Clock::time_point deadline);

  int ConnectTcp(const sockaddr_in& peer);
  int ConnectUdp(const sockaddr_in& peer);
  bool Renew();
  void RecordLocalPort();
  int ServeBuffered(unsigned char* buffer, int maxLength);
  int ReceiveTcp(unsigned char* buffer, int maxLength, Clock::time_point deadline);
  int ReceiveUdp(unsigned char* buffer, int maxLength, Clock::time_point deadline);
  int SendTcp(const unsigned char* data, std::size_t length);
  int SendUdp(const unsigned char* data, std::size_t length);
  bool WaitWritable(Clock::time_point deadline);

  // The descriptor number never changes: a TCP socket is renewed by
  // duplicating a fresh socket onto it, so the sending thread never reads a
  // changing member.
  const FileDescriptor fd_;
  const bool tcp_;
  const unsigned short configuredPort_;
  const Timeouts timeouts_;
  std::atomic<unsigned short> localPort_{0};

  std::atomic<bool> connected_{false};
  std::atomic<bool> broken_{false};

  // Receiving side: Connect, IsBroken, Receive and the buffered bytes.
  std::mutex receiveMutex_;
  bool needsRenewal_ = false;
  std::vector<unsigned char> rxBuffer_;
  std::size_t rxBegin_ = 0;
  std::size_t rxEnd_ = 0;

  // Sending side: Send, the UDP peer, and the moment a TCP descriptor is
  // renewed (so a frame never straddles two connections).
  std::mutex sendMutex_;
  bool hasPeer_ = false;
  sockaddr_in peer_{};
};
