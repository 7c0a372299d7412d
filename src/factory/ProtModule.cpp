// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "factory/ProtModule.h"

#include "binding/CompareInterface.h"
#include "binding/HostServices.h"

namespace {

template <typename T>
T* Acquire(IInterfaceFactory* host, const char* name) {
  return static_cast<T*>(host->CreateInterface(name));
}

// Gives an optional service back and clears its pointer.
template <typename T>
void ReleaseOptional(IInterfaceFactory* host, T*& service) {
  if (service != nullptr) {
    host->ReleaseInterface(service);
    service = nullptr;
  }
}

// Gives a mandatory service back and clears its pointer; a bound module always
// holds all four.
template <typename T>
void ReleaseMandatory(IInterfaceFactory* host, T*& service) {
  host->ReleaseInterface(service);
  service = nullptr;
}

// Takes the four mandatory services in their fixed order. When one is
// missing, gives back those already taken, in the order taken, and answers
// the error text that names it; answers null when all four are held.
const char* AcquireMandatory(IInterfaceFactory* host) {
  piMultiTask = Acquire<IMultiTask2>(host, "IMultiTask2");
  if (piMultiTask == nullptr) {
    return "IMultiTask2 not created";
  }
  piSerialFactory = Acquire<ISerialFactory>(host, "ISerialFactory");
  if (piSerialFactory == nullptr) {
    ReleaseMandatory(host, piMultiTask);
    return "ISerialFactory not created";
  }
  piSocketFactory = Acquire<ISocketFactory2>(host, "ISocketFactory");
  if (piSocketFactory == nullptr) {
    ReleaseMandatory(host, piMultiTask);
    ReleaseMandatory(host, piSerialFactory);
    return "ISocketFactory not created";
  }
  piCDSBuffer = Acquire<ICDSBuffer>(host, "ICDSBuffer");
  if (piCDSBuffer == nullptr) {
    ReleaseMandatory(host, piMultiTask);
    ReleaseMandatory(host, piSerialFactory);
    ReleaseMandatory(host, piSocketFactory);
    // The text names the pointer, not the interface, as hosts expect it.
    return "piCDSBuffer not created";
  }
  return nullptr;
}

}  // namespace

ProtModule::~ProtModule() { Close(); }

IInterface* ProtModule::ConvertTo(const char* name) {
  if (CompareInterface(name, "ProtModule") != 0 || CompareInterface(name, "IProtModule") != 0) {
    return this;
  }
  return nullptr;
}

const char* ProtModule::GetImpName() const { return "ProtModule"; }

int ProtModule::GetImpVersion() const { return 100; }

int ProtModule::Init(IInterfaceFactory* host) {
  if (initCount != 0) {
    ++initCount;
    return 1;
  }
  if (host == nullptr) {
    lastError = "IMultiTask2 not created";
    return 0;
  }
  const char* const missing = AcquireMandatory(host);
  if (missing != nullptr) {
    lastError = missing;
    return 0;
  }
  piDiag = Acquire<IDiag>(host, "IDiag");
  piPermanentStorage = Acquire<IPermanentStorage>(host, "IPermanentStorage");
  piDriverInterface = Acquire<IDriverInterface>(host, "IDriverInterface");
  piSmux = Acquire<ISmux>(host, "ISmux");
  piFastTimer = Acquire<IFastTimer>(host, "IFastTimer");
  hostFactory = host;
  initCount = 1;
  return 1;
}

void ProtModule::Close() {
  if (initCount == 1) {
    ReleaseOptional(hostFactory, piFastTimer);
    ReleaseOptional(hostFactory, piSmux);
    ReleaseOptional(hostFactory, piDriverInterface);
    ReleaseOptional(hostFactory, piDiag);
    ReleaseOptional(hostFactory, piPermanentStorage);
    ReleaseMandatory(hostFactory, piMultiTask);
    ReleaseMandatory(hostFactory, piSerialFactory);
    ReleaseMandatory(hostFactory, piSocketFactory);
    ReleaseMandatory(hostFactory, piCDSBuffer);
    hostFactory = nullptr;
  }
  if (initCount != 0) {
    --initCount;
  }
}

const char* ProtModule::GetLastError() const { return lastError.c_str(); }
