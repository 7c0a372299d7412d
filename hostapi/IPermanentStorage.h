// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterface.h"

// The host's permanent storage ("IPermanentStorage", optional): typed values
// by section and name that survive a restart. The plug-in's section is a
// protocol's identity (IProtocol::GetIdent), its names those of the runtime
// parameters. It reads at a protocol's first Start on the control thread and
// writes when a tag thread applies staged parameters, for several protocols
// at once: the storage must be thread-safe. Null section, name or value
// texts are never passed.
class IPermanentStorage : public IInterface {
 public:
  // This object for the interface names it answers ("IPermanentStorage",
  // and "IPermanentStorage2" where offered), else null.
  virtual IInterface* ConvertTo(const char* name) = 0;
  // Store value under section and name, replacing any earlier value of any
  // type. No result: a failed write is the host's to report.
  virtual void SetStringValue(const char* section, const char* name, const char* value) = 0;
  virtual void SetBoolValue(const char* section, const char* name, bool value) = 0;
  virtual void SetIntValue(const char* section, const char* name, int value) = 0;
  // The stored text; valid until the calling thread's next call on this
  // storage. Asked only after HasValue.
  virtual const char* GetStringValue(const char* section, const char* name) = 0;
  // The stored boolean; asked only after HasValue.
  virtual bool GetBoolValue(const char* section, const char* name) = 0;
  // The stored integer; asked only after HasValue.
  virtual int GetIntValue(const char* section, const char* name) = 0;
  // Non-zero when a value is stored under section and name.
  virtual int HasValue(const char* section, const char* name) = 0;

 protected:
  IPermanentStorage() = default;
  IPermanentStorage(const IPermanentStorage&) = default;
  IPermanentStorage& operator=(const IPermanentStorage&) = default;
  IPermanentStorage(IPermanentStorage&&) = default;
  IPermanentStorage& operator=(IPermanentStorage&&) = default;
  ~IPermanentStorage() = default;
};

// Second generation ("IPermanentStorage2", reached through ConvertTo):
// strings read into the caller's buffer. When offered, the plug-in reads
// every text through it, with a 256-byte buffer.
class IPermanentStorage2 : public IPermanentStorage {
 public:
  // Copies the stored text, terminated, into buffer (at most size bytes).
  // Non-zero on success; zero when the name is absent or does not fit (the
  // plug-in then takes the empty text).
  virtual int GetStringValueInto(const char* section, const char* name, char* buffer, int size) = 0;

 protected:
  IPermanentStorage2() = default;
  IPermanentStorage2(const IPermanentStorage2&) = default;
  IPermanentStorage2& operator=(const IPermanentStorage2&) = default;
  IPermanentStorage2(IPermanentStorage2&&) = default;
  IPermanentStorage2& operator=(IPermanentStorage2&&) = default;
  ~IPermanentStorage2() = default;
};
