// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <string>

#include "HostSocket.h"
#include "ISocketFactory.h"

// The socket service ("ISocketFactory", second generation) on BSD sockets.
// It owns every socket it creates until DeleteSocket; sockets still open
// when the factory is destroyed are closed then. Its TCP sockets share one
// connect pacing (HostSocket, ConnectPacing), so a socket made again for a
// target that refuses connections keeps the target's back-off window.
class HostSocketFactory final : public ISocketFactory2 {
 public:
  // Sockets with the default time-outs of HostSocket::Timeouts.
  HostSocketFactory() : HostSocketFactory(HostSocket::Timeouts()) {}
  explicit HostSocketFactory(HostSocket::Timeouts timeouts)
      : timeouts_(timeouts), shared_(timeouts.connectBackoff) {}
  HostSocketFactory(const HostSocketFactory&) = delete;
  HostSocketFactory& operator=(const HostSocketFactory&) = delete;
  HostSocketFactory(HostSocketFactory&&) = delete;
  HostSocketFactory& operator=(HostSocketFactory&&) = delete;
  virtual ~HostSocketFactory() = default;

  // "HostSocketFactory".
  const char* GetImpName() const override;
  // 100.
  int GetImpVersion() const override;
  // A socket bound to localPort (0: any) on every local address; tcp non-zero
  // for TCP, 0 for UDP; flags are reserved and ignored. Null on failure
  // (LastError tells why).
  ISocket* CreateSocket(unsigned short localPort, int tcp, int flags) override;
  // Closes and frees a socket made here; null and unknown sockets are
  // ignored.
  void DeleteSocket(ISocket* socket, int flags) override;
  // As HostSocket::GetAdapterInfo, without a socket.
  int GetAdapterInfo(unsigned int ip, unsigned int* address, unsigned int* mask,
                     unsigned int* index) override;

  // Sockets created and not yet deleted.
  std::size_t LiveSockets() const;
  // Why the last CreateSocket failed; empty if none failed.
  std::string LastError() const;
  HostSocket::Timeouts Timeouts() const { return timeouts_; }
  // TCP connect attempts that reached the network (those refused inside a
  // back-off window are not counted), over every socket made here.
  std::uint64_t ConnectAttempts() const { return shared_.connectAttempts.load(); }
  const ConnectPacing& Pacing() const { return shared_.pacing; }

 private:
  const HostSocket::Timeouts timeouts_{};
  HostSocket::Shared shared_;
  mutable std::mutex mutex_;
  std::map<const ISocket*, std::unique_ptr<HostSocket>> sockets_;
  std::string lastError_;
};
