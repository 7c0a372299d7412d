// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// One UDP or TCP socket bound to a local port, created by ISocketFactory.
// One receiving thread (the worker: Connect, IsBroken, Receive, and the
// adapter look-up) and one sending thread (a tag or console thread: Send) may
// use it at once; the plug-in never deletes it while either is inside a
// call. A call that blocks should return early when the calling task is
// asked to stop, so that Stop is prompt.
class ISocket {
 public:
  // TCP: opens a new connection to the address text ip and port. UDP: only
  // records the default peer for Send. 0 on success, non-zero on failure.
  virtual int Connect(const char* ip, unsigned short port) = 0;
  // TCP: non-zero once the connection has failed or been closed by the
  // peer. UDP: always 0.
  virtual int IsBroken() = 0;
  // Waits up to timeoutMilliseconds for data and copies at most maxLength
  // bytes into buffer (UDP: one datagram). Returns the bytes received; below
  // 1 for a time-out or an error, which are not told apart. A negative
  // time-out (a negative configured gap) means what the host makes it mean.
  virtual int Receive(unsigned char* buffer, int maxLength, int timeoutMilliseconds) = 0;
  // Looks up the local adapter for ip (first octet most significant) and
  // returns its address and net mask in the same order; *index receives the
  // adapter's interface index. Non-zero on success. Called on a temporary
  // UDP socket, from Start or the worker.
  virtual int GetAdapterInfo(unsigned int ip, unsigned int* address, unsigned int* mask,
                             unsigned int* index) = 0;
  // Sends length bytes as one frame (TCP: on the connection; UDP: one
  // datagram to the Connect peer). Returns length, or a negative value when
  // the frame was not sent; the plug-in does not look at the result.
  virtual int Send(const unsigned char* data, int length) = 0;

 protected:
  ISocket() = default;
  ISocket(const ISocket&) = default;
  ISocket& operator=(const ISocket&) = default;
  ISocket(ISocket&&) = default;
  ISocket& operator=(ISocket&&) = default;
  ~ISocket() = default;
};
