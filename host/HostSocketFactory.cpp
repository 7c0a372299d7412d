// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostSocketFactory.h"

#include <utility>

#include "AdapterLookup.h"

const char* HostSocketFactory::GetImpName() const { return "HostSocketFactory"; }

int HostSocketFactory::GetImpVersion() const { return 100; }

ISocket* HostSocketFactory::CreateSocket(unsigned short localPort, int tcp, int /*flags*/) {
  std::string error;
  std::unique_ptr<HostSocket> socket =
      HostSocket::Create(tcp != 0, localPort, timeouts_, shared_, error);
  const std::lock_guard<std::mutex> lock(mutex_);
  if (socket == nullptr) {
    lastError_ = error;
    return nullptr;
  }
  ISocket* const handle = socket.get();
  sockets_.emplace(handle, std::move(socket));
  return handle;
}

void HostSocketFactory::DeleteSocket(ISocket* socket, int /*flags*/) {
  std::unique_ptr<HostSocket> doomed;
  const std::lock_guard<std::mutex> lock(mutex_);
  const auto found = sockets_.find(socket);
  if (found != sockets_.end()) {
    doomed = std::move(found->second);
    sockets_.erase(found);
  }
}

int HostSocketFactory::GetAdapterInfo(unsigned int ip, unsigned int* address, unsigned int* mask,
                                      unsigned int* index) {
  return AdapterLookup::FindInto(ip, address, mask, index);
}

std::size_t HostSocketFactory::LiveSockets() const {
  const std::lock_guard<std::mutex> lock(mutex_);
  return sockets_.size();
}

std::string HostSocketFactory::LastError() const {
  const std::lock_guard<std::mutex> lock(mutex_);
  return lastError_;
}
