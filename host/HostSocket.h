// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <netinet/in.h>

#include <atomic>
#include <cerrno>
#include <chrono>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "ConnectPacing.h"
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
// same configured local port behind, ready for the next attempt. Attempts
// are paced (ConnectPacing): inside the back-off window that follows a
// failure, Connect fails at once without a system call or a new descriptor.
// Nothing that arrived on a connection is lost to its end: a connection that
// the peer closed or reset before Connect saw it complete still counts as
// made when it delivered bytes, and IsBroken stays 0 while any byte that
// arrived is unread. Receive is buffered: one recv fills an internal buffer
// from which small receives are served without a system call. Send delivers
// the whole frame or fails.
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
    // The longest back-off window between connect attempts to a target that
    // refuses them; 0 makes every Connect a real attempt.
    std::chrono::milliseconds connectBackoff{ConnectPacing::kDefaultCeiling};
  };

  // What the sockets of one factory share: the connect pacing, so a socket
  // made again for the same target keeps its window, and a count of the
  // connect attempts that reached the network.
  struct Shared {
    explicit Shared(std::chrono::milliseconds backoffCeiling) : pacing(backoffCeiling) {}
    ConnectPacing pacing;
    std::atomic<std::uint64_t> connectAttempts{0};
  };

  // Opens and binds a socket; null with the reason in `error` on failure.
  // shared must outlive the socket.
  static std::unique_ptr<HostSocket> Create(bool tcp, unsigned short localPort, Timeouts timeouts,
                                            Shared& shared, std::string& error);

  HostSocket(const HostSocket&) = delete;
  HostSocket& operator=(const HostSocket&) = delete;
  HostSocket(HostSocket&&) = delete;
  HostSocket& operator=(HostSocket&&) = delete;
  virtual ~HostSocket() = default;

  // 0 on success, -1 on failure (bad address text, refused, timed out,
  // stopped, inside the back-off window). UDP: any IPv4 address and port are
  // accepted as the peer.
  int Connect(const char* ip, unsigned short port) override;
  // TCP: 1 once a connect attempt has failed, until the next successful
  // Connect; 1 once the connection has been closed, reset or has failed, but
  // only after every byte that arrived before has been received. A peer's
  // close is noticed without a running Receive. 0 for a fresh socket, a
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
  // One recv takes up to this much of a TCP stream, from which smaller
  // receives are then served.
  static constexpr std::size_t kReceiveBufferSize = 4096;

  enum class WaitResult { Ready, TimedOut, Stopped, Failed };
  // What a take answers when the descriptor turned out to hold nothing.
  static constexpr int kNothingYet = -2;
  // Takes what a readable descriptor holds into the caller's buffer: bytes
  // taken, -1 at the end or on an error, kNothingYet.
  using Take = int (HostSocket::*)(unsigned char* buffer, int maxLength);
  enum class Handshake { Made, Refused, Stopped };

  // A TCP connection as the receiving side sees it. Guarded by
  // receiveMutex_: Connect sets it, Receive and a peek of IsBroken end it,
  // and IsBroken answers by it in one switch.
  enum class Link {
    kIdle,    // no attempt was made on this socket yet
    kOpen,    // connected, and the incoming stream has not ended
    kEnded,   // the stream ended (closed, reset, failed); buffered bytes remain readable
    kFailed,  // the last attempt failed or fell inside the back-off window
  };

  HostSocket(FileDescriptor fd, bool tcp, unsigned short configuredPort, Timeouts timeouts,
             Shared& shared);

  static FileDescriptor Open(bool tcp, std::string& error);
  static bool Bind(int fd, unsigned short port, std::string& error);
  static bool ParseAddress(const char* ip, unsigned short port, sockaddr_in& address);
  static WaitResult WaitFor(int fd, short events, Clock::time_point deadline);
  int WaitAndTake(Take take, unsigned char* buffer, int maxLength, Clock::time_point deadline);
  static bool WouldBlock(int error) { return error == EAGAIN || error == EWOULDBLOCK; }

  // TCP, in HostSocketTcp.cpp.
  int ConnectTcp(const sockaddr_in& peer);
  Handshake Shake(const sockaddr_in& peer);
  void EndAttempt(Link link);
  bool Renew();
  bool Unread() const;
  bool Probe();
  int ReceiveTcp(unsigned char* buffer, int maxLength, Clock::time_point deadline);
  int Fill(unsigned char* buffer, int maxLength);
  void End();
  int SendTcp(const unsigned char* data, std::size_t length);
  void BreakSending();

  // UDP and both, in HostSocket.cpp.
  int ConnectUdp(const sockaddr_in& peer);
  void RecordLocalPort();
  int ServeBuffered(unsigned char* buffer, int maxLength);
  int TakeDatagram(unsigned char* buffer, int maxLength);
  int SendUdp(const unsigned char* data, std::size_t length);
  bool WaitWritable(Clock::time_point deadline);

  // The descriptor number never changes: a TCP socket is renewed by
  // duplicating a fresh socket onto it, so the sending thread never reads a
  // changing member.
  const FileDescriptor fd_;
  const bool tcp_;
  const unsigned short configuredPort_;
  const Timeouts timeouts_;
  Shared& shared_;
  std::atomic<unsigned short> localPort_{0};

  // Receiving side: Connect, IsBroken, Receive and the buffered bytes.
  std::mutex receiveMutex_;
  Link link_ = Link::kIdle;
  // The descriptor has carried an attempt, so the next one needs a fresh
  // one (a TCP socket connects once).
  bool needsRenewal_ = false;
  std::vector<unsigned char> rxBuffer_;
  std::size_t rxBegin_ = 0;
  std::size_t rxEnd_ = 0;

  // True while Send may use the TCP connection: it is open and neither side
  // has found it ended. The receiving side raises it; either side drops it.
  std::atomic<bool> sendable_{false};

  // Sending side: Send, the UDP peer, and the moment a TCP descriptor is
  // renewed (so a frame never straddles two connections).
  std::mutex sendMutex_;
  bool hasPeer_ = false;
  sockaddr_in peer_{};
};
