// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "ISocketFactory.h"
#include "ScriptedSocket.h"

// A socket service that hands out scripted sockets and records every
// CreateSocket and DeleteSocket call ("create PORT TCP FLAGS -> #N",
// "create ... -> null", "delete #N"). Sockets stay alive until the factory is
// destroyed so tests can inspect them after the driver deleted them.
class ScriptedSocketFactory final : public ISocketFactory2 {
 public:
  const char* GetImpName() const override { return "ScriptedSocketFactory"; }
  int GetImpVersion() const override { return 3; }
  ISocket* CreateSocket(unsigned short localPort, int tcp, int flags) override;
  void DeleteSocket(ISocket* socket, int flags) override;
  int GetAdapterInfo(unsigned int ip, unsigned int* address, unsigned int* mask,
                     unsigned int* index) override;

  // The next count CreateSocket calls answer null.
  void FailCreates(int count);
  // Every socket created from now on answers this adapter for any address.
  void SetAdapter(unsigned int address, unsigned int mask);
  // Called with each new socket before it is handed out.
  void OnCreate(std::function<void(ScriptedSocket&)> hook);

  std::vector<std::string> Log() const;
  void ClearLog();
  // Every socket created, in order (#1 first).
  std::vector<ScriptedSocket*> Sockets() const;
  // The most recently created socket, or null.
  ScriptedSocket* Last() const;
  // Sockets created and not deleted.
  int Live() const;

 private:
  struct Entry {
    std::unique_ptr<ScriptedSocket> socket;
    bool deleted;
  };

  mutable std::mutex lock_;
  std::vector<Entry> sockets_;
  std::vector<std::string> log_;
  int failCreates_ = 0;
  bool hasAdapter_ = false;
  unsigned int adapterAddress_ = 0;
  unsigned int adapterMask_ = 0;
  std::function<void(ScriptedSocket&)> onCreate_;
};
