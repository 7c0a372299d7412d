// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// One UDP or TCP socket bound to a local port, created by ISocketFactory.
// One receiving thread and one sending thread may use it at once.
class ISocket {
 public:
  // 0 on success, non-zero on failure. On UDP it fixes the default peer.
  virtual int Connect(const char* ip, unsigned short port) = 0;
  // Non-zero when the connection has failed or been closed.
  virtual int IsBroken() = 0;
  // Bytes received; below 1 for a time-out or an error.
  virtual int Receive(unsigned char* buffer, int maxLength, int timeoutMilliseconds) = 0;
  // Looks up the local adapter for ip (first octet most significant) and
  // returns its address and net mask in the same order; *index receives the
  // adapter's interface index. Non-zero on success.
  virtual int GetAdapterInfo(unsigned int ip, unsigned int* address, unsigned int* mask,
                             unsigned int* index) = 0;
  // Bytes sent; the whole frame or a negative value.
  virtual int Send(const unsigned char* data, int length) = 0;

 protected:
  ISocket() = default;
  ISocket(const ISocket&) = default;
  ISocket& operator=(const ISocket&) = default;
  ISocket(ISocket&&) = default;
  ISocket& operator=(ISocket&&) = default;
  ~ISocket() = default;
};
