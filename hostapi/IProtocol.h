// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "HostTypes.h"
#include "IInterface.h"
#include "ITag.h"

// The host's protocol interface, first generation: one protocol instance per
// channel, made by IProtocolFactory::CreateProtocol. Later generations
// (IProtocol2 .. IProtocol7) each append their operations to this slot table.
// The slot order is ABI: a host calls by slot.
//
// Failures: a bool or pointer result reports success; a failing call records
// its reason as the instance's last error (GetLastError, GetLastErrorString),
// which stays until the next failure. Codes: 1 none yet; -1 configuration,
// address, unsupported operation and most driver errors; -3 for
// "Protocol not started" and "Optimized writing not supported"; -6 socket
// set-up; -9 for "read conversion error" and "write conversion error".
//
// Threads: Config, Start, Stop and SetIdent on the control thread; the tag
// operations on any number of tag threads at once (one tag per thread at a
// time); DoCommand on the console thread, alongside the tag threads; the
// identity operations and the last error on any thread.
class IProtocol : public IInterface {
 public:
  // Through IProtocolFactory::DeleteProtocol only.
  virtual ~IProtocol() = default;
  // This object for the interface names it answers ("IProtocol" to
  // "IProtocol7", and the implementation's own names), else null.
  virtual IInterface* ConvertTo(const char* name) = 0;
  // The implementation's name ("Protocol_VELT").
  virtual const char* GetImpName() const = 0;
  // The implementation's version (100).
  virtual int GetImpVersion() const = 0;
  // Parses the configuration string text (null counts as empty). False when
  // it is rejected, or the module is not bound: error -1 with the reason.
  virtual bool Config(const char* text) = 0;
  // Creates a tag from its address text; the protocol owns it until FreeTag.
  // Null on a bad address: error -1, "Tag URI error: " + address + " - " +
  // reason.
  virtual ITag* CreateTag(const char* uri) = 0;
  // Deletes a tag of this protocol (listed or a clone); null is ignored. The
  // tag must not be in use on another thread.
  virtual void FreeTag(ITag* tag) = 0;
  // Whether tag2 may be read in one block read together with tag1 (same
  // node and memory type, within the memory type's block read count); false
  // when flag is set.
  virtual bool CanBeOptimized(const ITag* tag1, const ITag* tag2, bool flag) = 0;
  // Starts the channel after a successful Config: the socket and the worker
  // task. True, also when already running, and when the socket cannot be
  // made: the channel then stays unconnected (error -6 for a failed
  // broadcast-address look-up).
  virtual bool Start() = 0;
  // Ends the worker (waiting for it) and closes the socket; true, also when
  // not running. No send may run on the channel meanwhile.
  virtual bool Stop() = 0;
  // Reads the tag's value into dst, GetVarLength() bytes in the host's
  // representation. False with the last error (-3 when not started).
  virtual bool Read(const ITag* tag, unsigned char* dst) = 0;
  // Writes GetVarLength() bytes from data, in the host's representation.
  // False with the last error (-3 when not started).
  virtual bool Write(const ITag* tag, const unsigned char* data) = 0;
  // Reads length device bytes of the tag's memory type, from the tag's
  // position, into buffer without conversion. False with the last error.
  virtual bool ReadBlock(const ITag* tag, unsigned char* buffer, int length) = 0;
  // Writes length device bytes. Not offered here: false, error -3 with
  // "Optimized writing not supported".
  virtual bool WriteBlock(const ITag* tag, const unsigned char* buffer, int length) = 0;
  // Most tags one datagram read may hold; 0: no datagrams.
  virtual int MaxDatagramItems(const ITag* tag) = 0;
  // Most device bytes one datagram read may hold; 0: no datagrams.
  virtual int MaxDatagramLength(const ITag* tag) = 0;
  // Whether tag2 may share a datagram read with tag1.
  virtual bool CanCoexistInDatagram(const ITag* tag1, const ITag* tag2) = 0;
  // Reads count tags in one request into buffer, their device bytes in the
  // protocol's layout. False when it failed or datagrams are not supported.
  virtual bool ReadDatagram(const ITag* const* tags, int count, unsigned char* buffer) = 0;
  // The protocol's short name ("VELT").
  virtual const char* GetName() const = 0;
  // The name for a further instance of this protocol (GetName()).
  virtual const char* GetNextInstanceName() const = 0;
  // The last error code (see above); 1 until a call fails.
  virtual int GetLastError() const = 0;
  // The last error text, empty until a call fails. The pointer is a copy
  // for the calling thread, valid until that thread calls this again on
  // this instance or the instance is deleted.
  virtual const char* GetLastErrorString() const = 0;
  // The protocol's version (112).
  virtual int GetProtocolVersion() const = 0;
  // The protocol's type code (472).
  virtual int GetProtocolType() const = 0;
  // The protocol's display name ("Velt Conduit").
  virtual const char* GetProtocolName() const = 0;
  // Writes the information text into out, cut at outSize characters; returns
  // the number of characters written, without a terminator.
  virtual int GetInfo(char* out, int outSize) const = 0;
  // The embedded description block, positioned at its length line; null
  // when the protocol carries none. Constant, the same pointer every time.
  virtual const char* GetXml() const = 0;
  // Whether this is a converted protocol; when false the information text
  // also names the host's multitasking, serial and socket services.
  virtual bool IsConverted() const = 0;
  // The instance's identity: the SetIdent text, or GetName() when none was
  // set. It names the instance's section in permanent storage. Valid until
  // the next SetIdent.
  virtual const char* GetIdent() const = 0;
  // Sets the identity text (null clears it); on the control thread, before
  // Start and while no other thread uses the instance.
  virtual void SetIdent(const char* ident) = 0;
  // Runs one console command; the reply goes into out, at most outSize
  // bytes, and is not terminated when it fills them. True when the command
  // was recognised, whatever its outcome (errors are reply text); false
  // leaves out untouched.
  virtual bool DoCommand(const char* command, char* out, int outSize) = 0;
  // A host extension by code, with a record of the host's: code 0 fills the
  // capability record and returns 1, code 3 returns its byte at offset 68;
  // other codes (and a null record) return 0.
  virtual int Extend(int code, void* data) = 0;

 protected:
  IProtocol() = default;
  IProtocol(const IProtocol&) = default;
  IProtocol& operator=(const IProtocol&) = default;
  IProtocol(IProtocol&&) = default;
  IProtocol& operator=(IProtocol&&) = default;
};
