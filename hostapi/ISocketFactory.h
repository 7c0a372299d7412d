// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"
#include "ISocket.h"

// The host's socket service ("ISocketFactory").
class ISocketFactory : public IInterface {
 public:
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;
  // A socket bound to localPort (0: any); tcp is 1 for TCP, 0 for UDP.
  // flags is reserved and 0. Null on failure.
  virtual ISocket* CreateSocket(unsigned short localPort, int tcp, int flags) = 0;
  // Closes and frees a socket; flags is reserved and 0.
  virtual void DeleteSocket(ISocket* socket, int flags) = 0;

 protected:
  ISocketFactory() = default;
  ISocketFactory(const ISocketFactory&) = default;
  ISocketFactory& operator=(const ISocketFactory&) = default;
  ISocketFactory(ISocketFactory&&) = default;
  ISocketFactory& operator=(ISocketFactory&&) = default;
  ~ISocketFactory() = default;
};

// Second generation of the socket service: the adapter look-up without a
// socket of the caller's own.
class ISocketFactory2 : public ISocketFactory {
 public:
  // As ISocket::GetAdapterInfo.
  virtual int GetAdapterInfo(unsigned int ip, unsigned int* address, unsigned int* mask,
                             unsigned int* index) = 0;

 protected:
  ISocketFactory2() = default;
  ISocketFactory2(const ISocketFactory2&) = default;
  ISocketFactory2& operator=(const ISocketFactory2&) = default;
  ISocketFactory2(ISocketFactory2&&) = default;
  ISocketFactory2& operator=(ISocketFactory2&&) = default;
  ~ISocketFactory2() = default;
};
