// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <map>
#include <string>
#include <vector>

#include "IInterfaceFactory.h"
#include "InertServices.h"

// A host interface factory that records every CreateInterface and
// ReleaseInterface call in order. By default it offers a binding-only double
// for each of the nine service names the module asks for; Offer replaces one,
// Refuse makes a name answer null.
class RecordingHostFactory final : public IInterfaceFactory {
 public:
  RecordingHostFactory();

  IInterface* CreateInterface(const char* name) override;
  void ReleaseInterface(IInterface* itf) override;

  void Offer(const std::string& name, IInterface* service);
  void Refuse(const std::string& name);

  // "create NAME" (with " -> null" when refused) and "release NAME" entries,
  // in call order; a release of a pointer this factory never handed out is
  // logged as "release ?".
  const std::vector<std::string>& Log() const { return log_; }
  // The names given back, in order.
  std::vector<std::string> Released() const;
  // The names requested, in order.
  std::vector<std::string> Requested() const;
  // Hand-outs not yet given back.
  int Held() const { return held_; }
  void ClearLog() { log_.clear(); }

 private:
  InertMultiTask multiTask_;
  InertSerialFactory serialFactory_{"InertSerialFactory"};
  InertSocketFactory socketFactory_;
  InertCDSBuffer cdsBuffer_{"InertCDSBuffer"};
  InertDiag diag_{"InertDiag"};
  InertPermanentStorage storage_;
  InertDriverInterface driverInterface_{"InertDriverInterface"};
  InertSmux smux_{"InertSmux"};
  InertFastTimer fastTimer_{"InertFastTimer"};

  std::map<std::string, IInterface*> offered_;
  std::vector<std::string> log_;
  int held_ = 0;
};
