// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The TCP side of HostSocket: connecting with pacing, the connection's link
// state, buffered receiving and whole-frame sending.
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cerrno>

#include "HostSocket.h"

int HostSocket::ConnectTcp(const sockaddr_in& peer) {
  const std::lock_guard<std::mutex> lock(receiveMutex_);
  const ConnectPacing::Target target{peer.sin_addr.s_addr, ntohs(peer.sin_port), configuredPort_};
  if (!shared_.pacing.MayAttempt(target, Clock::now())) {
    // Inside the back-off window the answer is the last attempt's, given
    // without a system call; the fresh descriptor that attempt left waits.
    EndAttempt(Link::kFailed);
    return -1;
  }
  if (needsRenewal_ && !Renew()) {
    EndAttempt(Link::kFailed);
    return -1;
  }
  needsRenewal_ = true;
  EndAttempt(Link::kIdle);
  shared_.connectAttempts.fetch_add(1, std::memory_order_relaxed);
  const Handshake handshake = Shake(peer);
  if (handshake == Handshake::Made) {
    link_ = Link::kOpen;
    sendable_.store(true);
    shared_.pacing.Succeeded(target);
    return 0;
  }
  // A stop request says nothing about the peer, so it opens no window.
  if (handshake == Handshake::Refused) {
    shared_.pacing.Failed(target, Clock::now());
  }
  EndAttempt(Link::kFailed);
  // Abandon the attempt now, so no late handshake completes a connection
  // nobody reads; the fresh descriptor is ready for the next Connect.
  Renew();
  return -1;
}

// One handshake on the current descriptor, bounded by the connect time-out
// and by a stop request of the calling task.
HostSocket::Handshake HostSocket::Shake(const sockaddr_in& peer) {
  if (::connect(fd_.Get(), reinterpret_cast<const sockaddr*>(&peer), sizeof peer) == 0) {
    return Handshake::Made;
  }
  if (errno != EINPROGRESS) {
    return Handshake::Refused;
  }
  const WaitResult wait = WaitFor(fd_.Get(), POLLOUT, Clock::now() + timeouts_.connect);
  if (wait == WaitResult::Stopped) {
    return Handshake::Stopped;
  }
  if (wait != WaitResult::Ready) {
    return Handshake::Refused;
  }
  int error = 0;
  socklen_t length = sizeof error;
  if (::getsockopt(fd_.Get(), SOL_SOCKET, SO_ERROR, &error, &length) != 0) {
    return Handshake::Refused;
  }
  // A peer may accept, send and close or reset before this poll returned:
  // the reset then shows as the pending error, but the connection was made
  // and what it carried waits in the kernel to be received.
  if (error == 0 || Unread()) {
    return Handshake::Made;
  }
  return Handshake::Refused;
}

// Leaves the receiving side in link with nothing buffered and nothing to
// send on.
void HostSocket::EndAttempt(Link link) {
  link_ = link;
  sendable_.store(false);
  rxBegin_ = rxEnd_ = 0;
}

bool HostSocket::Renew() {
  std::string error;
  FileDescriptor fresh = Open(tcp_, error);
  if (!fresh.Valid()) {
    return false;
  }
  {
    const std::lock_guard<std::mutex> lock(sendMutex_);
    sendable_.store(false);
    // dup2 closes the old socket (releasing its port) and puts the fresh one
    // under the same number in one step.
    if (::dup2(fresh.Get(), fd_.Get()) < 0) {
      return false;
    }
  }
  if (!Bind(fd_.Get(), configuredPort_, error)) {
    // Left unbound: the next Connect renews again rather than connect from
    // a port the system picks.
    needsRenewal_ = true;
    return false;
  }
  needsRenewal_ = false;
  RecordLocalPort();
  return true;
}

// True when bytes of the connection wait in the kernel. Peeking leaves them
// for Receive.
bool HostSocket::Unread() const {
  unsigned char probe = 0;
  return ::recv(fd_.Get(), &probe, 1, MSG_PEEK | MSG_DONTWAIT) > 0;
}

// An open connection without buffered bytes: false once its stream has
// ended with nothing left to receive (the link is then ended), or once a
// failed send broke it and nothing more waits.
bool HostSocket::Probe() {
  unsigned char probe = 0;
  const ssize_t n = ::recv(fd_.Get(), &probe, 1, MSG_PEEK | MSG_DONTWAIT);
  if (n > 0) {
    return true;
  }
  const bool quiet = n < 0 && (WouldBlock(errno) || errno == EINTR);
  if (quiet && sendable_.load()) {
    return true;
  }
  // 0: the peer closed after everything it sent was taken; an error: reset
  // or failed; quiet but unsendable: a send broke the connection.
  End();
  return false;
}

int HostSocket::IsBroken() {
  if (!tcp_) {
    return 0;
  }
  const std::lock_guard<std::mutex> lock(receiveMutex_);
  const bool buffered = rxBegin_ < rxEnd_;
  switch (link_) {
    case Link::kIdle:
      return 0;
    case Link::kOpen:
      return buffered || Probe() ? 0 : 1;
    case Link::kEnded:
      return buffered ? 0 : 1;
    case Link::kFailed:
      return 1;
  }
  return 1;
}

void HostSocket::End() {
  link_ = Link::kEnded;
  sendable_.store(false);
}

int HostSocket::ReceiveTcp(unsigned char* buffer, int maxLength, Clock::time_point deadline) {
  if (rxBegin_ < rxEnd_) {
    return ServeBuffered(buffer, maxLength);
  }
  if (link_ != Link::kOpen) {
    return -1;
  }
  return WaitAndTake(&HostSocket::Fill, buffer, maxLength, deadline);
}

// One recv: straight into a caller's buffer that is at least as large as
// the internal one, else into the internal one. Bytes taken, kNothingYet
// when nothing was there after all, -1 at the end of the stream.
int HostSocket::Fill(unsigned char* buffer, int maxLength) {
  const bool direct = static_cast<std::size_t>(maxLength) >= rxBuffer_.size();
  unsigned char* const target = direct ? buffer : rxBuffer_.data();
  const std::size_t room = direct ? static_cast<std::size_t>(maxLength) : rxBuffer_.size();
  const ssize_t n = ::recv(fd_.Get(), target, room, MSG_DONTWAIT);
  if (n > 0) {
    if (direct) {
      return static_cast<int>(n);
    }
    rxBegin_ = 0;
    rxEnd_ = static_cast<std::size_t>(n);
    return ServeBuffered(buffer, maxLength);
  }
  if (n < 0 && (WouldBlock(errno) || errno == EINTR)) {
    return kNothingYet;
  }
  // 0: the peer closed; otherwise reset or failed. Everything before the end
  // has been received.
  End();
  return -1;
}

int HostSocket::SendTcp(const unsigned char* data, std::size_t length) {
  if (!sendable_.load()) {
    return -1;
  }
  const Clock::time_point deadline = Clock::now() + timeouts_.send;
  std::size_t sent = 0;
  while (sent < length) {
    const ssize_t n = ::send(fd_.Get(), data + sent, length - sent, MSG_NOSIGNAL | MSG_DONTWAIT);
    if (n > 0) {
      sent += static_cast<std::size_t>(n);
      continue;
    }
    if (n < 0 && errno == EINTR) {
      continue;
    }
    const bool full = n < 0 && WouldBlock(errno);
    if (full && WaitWritable(deadline)) {
      continue;
    }
    if (!full || sent > 0) {
      BreakSending();
    }
    return -1;
  }
  return static_cast<int>(length);
}

// A failed connection, or a frame cut in two: either way the stream can
// carry nothing more. The write side is shut, so the peer sees the end right
// after the torn frame; the read side stays, so what the peer sent before is
// still received before the connection counts as broken.
void HostSocket::BreakSending() {
  sendable_.store(false);
  ::shutdown(fd_.Get(), SHUT_WR);
}
