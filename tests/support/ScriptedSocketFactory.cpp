// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ScriptedSocketFactory.h"

ISocket* ScriptedSocketFactory::CreateSocket(unsigned short localPort, int tcp, int flags) {
  const std::lock_guard<std::mutex> guard(lock_);
  std::string entry = "create " + std::to_string(localPort) + " " + std::to_string(tcp) + " " +
                      std::to_string(flags);
  if (failCreates_ > 0) {
    --failCreates_;
    log_.push_back(entry + " -> null");
    return nullptr;
  }
  auto socket = std::make_unique<ScriptedSocket>(localPort, tcp);
  if (hasAdapter_) {
    socket->SetAdapter(adapterAddress_, adapterMask_);
  }
  if (onCreate_) {
    onCreate_(*socket);
  }
  sockets_.push_back({std::move(socket), false});
  log_.push_back(entry + " -> #" + std::to_string(sockets_.size()));
  return sockets_.back().socket.get();
}

void ScriptedSocketFactory::DeleteSocket(ISocket* socket, int flags) {
  const std::lock_guard<std::mutex> guard(lock_);
  for (std::size_t i = 0; i < sockets_.size(); ++i) {
    if (sockets_[i].socket.get() == socket) {
      log_.push_back((sockets_[i].deleted ? "delete again #" : "delete #") + std::to_string(i + 1) +
                     " " + std::to_string(flags));
      sockets_[i].deleted = true;
      return;
    }
  }
  log_.push_back("delete unknown");
}

int ScriptedSocketFactory::GetAdapterInfo(unsigned int /*ip*/, unsigned int* address,
                                          unsigned int* mask, unsigned int* index) {
  const std::lock_guard<std::mutex> guard(lock_);
  if (!hasAdapter_) {
    return 0;
  }
  *address = adapterAddress_;
  *mask = adapterMask_;
  *index = 1;
  return 1;
}

void ScriptedSocketFactory::FailCreates(int count) {
  const std::lock_guard<std::mutex> guard(lock_);
  failCreates_ = count;
}

void ScriptedSocketFactory::SetAdapter(unsigned int address, unsigned int mask) {
  const std::lock_guard<std::mutex> guard(lock_);
  hasAdapter_ = true;
  adapterAddress_ = address;
  adapterMask_ = mask;
}

void ScriptedSocketFactory::OnCreate(std::function<void(ScriptedSocket&)> hook) {
  const std::lock_guard<std::mutex> guard(lock_);
  onCreate_ = std::move(hook);
}

std::vector<std::string> ScriptedSocketFactory::Log() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return log_;
}

void ScriptedSocketFactory::ClearLog() {
  const std::lock_guard<std::mutex> guard(lock_);
  log_.clear();
}

std::vector<ScriptedSocket*> ScriptedSocketFactory::Sockets() const {
  const std::lock_guard<std::mutex> guard(lock_);
  std::vector<ScriptedSocket*> all;
  all.reserve(sockets_.size());
  for (const auto& entry : sockets_) {
    all.push_back(entry.socket.get());
  }
  return all;
}

ScriptedSocket* ScriptedSocketFactory::Last() const {
  const std::lock_guard<std::mutex> guard(lock_);
  return sockets_.empty() ? nullptr : sockets_.back().socket.get();
}

int ScriptedSocketFactory::Live() const {
  const std::lock_guard<std::mutex> guard(lock_);
  int live = 0;
  for (const auto& entry : sockets_) {
    live += entry.deleted ? 0 : 1;
  }
  return live;
}
