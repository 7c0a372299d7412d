// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "HostTypes.h"
#include "IInterface.h"
#include "ITag.h"

// The host's protocol interface, first generation. Later generations
// (IProtocol2 .. IProtocol7) each append their operations to this slot table.
// The slot order is ABI: a host calls by slot.
class IProtocol : public IInterface {
 public:
  virtual ~IProtocol() = default;
  // Returns this object for the interface names it answers, else null.
  virtual IInterface* ConvertTo(const char* name) = 0;
  virtual const char* GetImpName() const = 0;
  virtual int GetImpVersion() const = 0;
  virtual bool Config(const char* text) = 0;
  // Creates a tag from its address text; null on failure (see the last error).
  virtual ITag* CreateTag(const char* uri) = 0;
  virtual void FreeTag(ITag* tag) = 0;
  // Whether tag2 may be read in one block read together with tag1.
  virtual bool CanBeOptimized(const ITag* tag1, const ITag* tag2, bool flag) = 0;
  virtual bool Start() = 0;
  virtual bool Stop() = 0;
  virtual bool Read(const ITag* tag, unsigned char* dst) = 0;
  virtual bool Write(const ITag* tag, const unsigned char* data) = 0;
  virtual bool ReadBlock(const ITag* tag, unsigned char* buffer, int length) = 0;
  virtual bool WriteBlock(const ITag* tag, const unsigned char* buffer, int length) = 0;
  virtual int MaxDatagramItems(const ITag* tag) = 0;
  virtual int MaxDatagramLength(const ITag* tag) = 0;
  virtual bool CanCoexistInDatagram(const ITag* tag1, const ITag* tag2) = 0;
  virtual bool ReadDatagram(const ITag* const* tags, int count, unsigned char* buffer) = 0;
  virtual const char* GetName() const = 0;
  virtual const char* GetNextInstanceName() const = 0;
  virtual int GetLastError() const = 0;
  virtual const char* GetLastErrorString() const = 0;
  virtual int GetProtocolVersion() const = 0;
  virtual int GetProtocolType() const = 0;
  virtual const char* GetProtocolName() const = 0;
  // Writes the information text; returns the number of characters written,
  // without a terminator.
  virtual int GetInfo(char* out, int outSize) const = 0;
  // The embedded description block, positioned at its length line.
  virtual const char* GetXml() const = 0;
  virtual bool IsConverted() const = 0;
  virtual const char* GetIdent() const = 0;
  virtual void SetIdent(const char* ident) = 0;
  // Runs one console command; the reply goes into out (at most outSize
  // bytes).
  virtual bool DoCommand(const char* command, char* out, int outSize) = 0;
  virtual int Extend(int code, void* data) = 0;

 protected:
  IProtocol() = default;
  IProtocol(const IProtocol&) = default;
  IProtocol& operator=(const IProtocol&) = default;
  IProtocol(IProtocol&&) = default;
  IProtocol& operator=(IProtocol&&) = default;
};
