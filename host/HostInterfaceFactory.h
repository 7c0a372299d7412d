// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

#include "HostCDSBuffer.h"
#include "HostMultiTask.h"
#include "HostPermanentStorage.h"
#include "HostSerialFactory.h"
#include "HostSocket.h"
#include "HostSocketFactory.h"
#include "IInterfaceFactory.h"

// The host's interface factory, given to the plug-in module's Init. It owns
// one object per service and hands it out by name: "IMultiTask2",
// "ISerialFactory", "ISocketFactory" (second generation), "ICDSBuffer" and
// "IPermanentStorage" (which also converts to "IPermanentStorage2"). Other
// names give null. It counts every hand-out and every release per name, so
// an embedding program or a test can prove the plug-in gave everything back.
class HostInterfaceFactory final : public IInterfaceFactory {
 public:
  // storagePath is the permanent storage file; an empty path makes a host
  // without permanent storage ("IPermanentStorage" then gives null, which
  // the plug-in accepts). Throws StorageError when the file cannot be read
  // or does not parse.
  explicit HostInterfaceFactory(const std::string& storagePath,
                                HostSocket::Timeouts socketTimeouts = HostSocket::Timeouts());
  HostInterfaceFactory(const HostInterfaceFactory&) = delete;
  HostInterfaceFactory& operator=(const HostInterfaceFactory&) = delete;
  HostInterfaceFactory(HostInterfaceFactory&&) = delete;
  HostInterfaceFactory& operator=(HostInterfaceFactory&&) = delete;
  // Tasks still running are stopped and joined first, then sockets closed.
  virtual ~HostInterfaceFactory() = default;

  IInterface* CreateInterface(const char* name) override;
  // Gives back one hand-out. Null is ignored; a pointer this factory did not
  // hand out, or one given back more often than handed out, is counted as an
  // unmatched release.
  void ReleaseInterface(IInterface* itf) override;

  // Hand-outs of name not yet given back.
  int Held(const std::string& name) const;
  // Hand-outs of all names not yet given back.
  int HeldTotal() const;
  // The names still held, with their counts.
  std::map<std::string, int> HeldInterfaces() const;
  // Releases that matched no hand-out.
  int UnmatchedReleases() const;

  HostMultiTask& MultiTask() { return multiTask_; }
  HostSocketFactory& SocketFactory() { return socketFactory_; }
  // Null for a host without permanent storage.
  HostPermanentStorage* Storage() { return storage_.get(); }
  HostSerialFactory& SerialFactory() { return serialFactory_; }
  HostCDSBuffer& CDSBuffer() { return cdsBuffer_; }

 private:
  IInterface* Find(const char* name) const;

  // Destroyed in reverse order: the tasks end before the sockets they may
  // use are closed.
  std::unique_ptr<HostPermanentStorage> storage_;
  HostCDSBuffer cdsBuffer_;
  HostSerialFactory serialFactory_;
  HostSocketFactory socketFactory_;
  HostMultiTask multiTask_;

  std::vector<std::pair<std::string, IInterface*>> offered_;
  mutable std::mutex countMutex_;
  std::map<std::string, int> held_;
  int unmatchedReleases_ = 0;
};
