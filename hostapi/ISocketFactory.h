// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"
#include "ISocket.h"

// The host's socket service ("ISocketFactory", mandatory; the object must
// also implement ISocketFactory2). The plug-in creates and deletes sockets in
// Start and Stop on the control thread and on the worker thread when it
// renews a socket; calls for different protocols may overlap.
class ISocketFactory : public IInterface {
 public:
  // The implementation's name and version, shown in a protocol's
  // information text (any thread).
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;
  // A socket bound to localPort (0: any) on every local address; tcp is 1
  // for a TCP client, 0 for UDP. flags is reserved and 0. Null on failure;
  // the protocol then stays unconnected until it makes the socket again.
  virtual ISocket* CreateSocket(unsigned short localPort, int tcp, int flags) = 0;
  // Closes and frees a socket made by CreateSocket; flags is reserved and 0.
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
  // As ISocket::GetAdapterInfo; any thread. (The plug-in asks a temporary
  // socket instead.)
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
