// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <list>
#include <map>
#include <mutex>
#include <string>
#include <thread>

#include "IProtocol7.h"
#include "ITag.h"
#include "protlib/TagBase.h"

// The base of every protocol driver. It implements the host's protocol
// interface (IProtocol to IProtocol7, in their slot order) with defaults, so
// that a driver overrides only what its device supports: it owns the tags
// created through it, keeps the last error as a code and a text, turns a tag
// read into a block read plus the tag's conversion, and builds the datagram,
// array-item and time-stamp reads on the driver's own operations. Its own
// virtual operations follow IProtocol7's: CreateTagBase, GetMaxTm,
// tagUriNames.
//
// Threads: a driver's worker may record errors while the host's tag and
// console threads create, read and free tags and read the last error. The
// last error (code and text) and the tag list are therefore guarded by an
// internal mutex, which is never held while the driver or a tag is called.
class ProtocolBase : public IProtocol7 {
 public:
  ProtocolBase() = default;
  ProtocolBase(const ProtocolBase&) = delete;
  ProtocolBase& operator=(const ProtocolBase&) = delete;
  ProtocolBase(ProtocolBase&&) = delete;
  ProtocolBase& operator=(ProtocolBase&&) = delete;
  // Deletes the tags that the host did not free.
  ~ProtocolBase() override;

  // --- IProtocol ---
  // This object for "ProtocolBase", "IProtocol7" .. "IProtocol2" and
  // "IProtocol"; null for any other name.
  IInterface* ConvertTo(const char* name) override;
  // The driver's CreateTagBase; a tag it returns joins the tag list.
  ITag* CreateTag(const char* uri) override;
  // Removes every list entry equal to tag, then deletes the tag once, listed
  // or not. Null is ignored.
  void FreeTag(ITag* tag) override;
  bool Start() override { return true; }
  bool Stop() override { return true; }
  // A block read of the tag's PackedLen() device bytes (or a bit-block read
  // where the driver offers one), converted to the host's representation.
  // Conversion failure: error -9 "read conversion error".
  bool Read(const ITag* tag, unsigned char* dst) override;
  // Error -3 "Optimized writing not supported"; false.
  bool WriteBlock(const ITag* tag, const unsigned char* buffer, int length) override;

  // Optional driver operations. Several base paths (Read,
  // readBitBlockWithTimestamp, CanAddToDatagram, ReadDatagramWithStatus,
  // readDatagramWithTimestamp, readWithTimestamp) behave according to whether
  // the driver overrides one of these. No path asks that question directly:
  // the base body of each returns the answer of a driver that lacks the
  // operation, and the paths always call through the vtable, so a missing
  // override yields in every path exactly the result prescribed for it:
  // - CanReadBitBlock (base false): Read goes to ReadBlock, as it does when
  //   the operation is not offered.
  // - ReadBitBlock (base false, no side effect): a Read that the driver sends
  //   to a bit block fails at once without conversion, and
  //   readBitBlockWithTimestamp is false without a time stamp, which is what
  //   a driver without a bit-block read gets.
  // - CanCoexistInDatagram (base false): CanAddToDatagram is false, as
  //   prescribed for a driver that cannot group tags.
  // - MaxDatagramItems (base 0): the limit is 0, which is never greater than
  //   a count, so CanAddToDatagram is false, as with no item limit offered.
  // - MaxDatagramLength (base 0): "sum <= 0" is the prescribed "sum below 1"
  //   for an integer sum.
  // - ReadDatagram (base false): ReadDatagramWithStatus and
  //   readDatagramWithTimestamp fail without writing a status, as they must
  //   without a datagram read.
  // - ReadDatagramWithStatus (base: ReadDatagram, then status 1 per tag): the
  //   base body is itself the path prescribed for a driver that does not
  //   override it, so readDatagramWithTimestamp simply calls it.
  // - Read (base: the block read above): readWithTimestamp, readArrayItem,
  //   writeArrayItem and the console's "read" call it, so a driver's own Read
  //   takes its place everywhere.
  int MaxDatagramItems(const ITag* /*tag*/) override { return 0; }
  int MaxDatagramLength(const ITag* /*tag*/) override { return 0; }
  bool CanCoexistInDatagram(const ITag* /*tag1*/, const ITag* /*tag2*/) override { return false; }
  bool ReadDatagram(const ITag* const* /*tags*/, int /*count*/,
                    unsigned char* /*buffer*/) override {
    return false;
  }
  // GetName().
  const char* GetNextInstanceName() const override;
  int GetLastError() const override;
  // A copy of the last error text kept for the calling thread: the pointer
  // stays valid and unchanged until the same thread calls this again on this
  // protocol, or the protocol is deleted.
  const char* GetLastErrorString() const override;
  // The information text (see BaseConsole); returns the characters written,
  // without a terminator.
  int GetInfo(char* out, int outSize) const override;
  const char* GetXml() const override { return nullptr; }
  bool IsConverted() const override { return false; }
  // The identity text if one was set, else GetName().
  const char* GetIdent() const override;
  // Replaces the identity text (null clears it).
  void SetIdent(const char* ident) override;
  // The base console commands: help, info, xml, lasterror, read, write,
  // getmaxtm, deletetags. False, with out untouched, for anything else.
  bool DoCommand(const char* command, char* out, int outSize) override;
  int Extend(int /*code*/, void* /*data*/) override { return 0; }

  // --- IProtocol2 ---
  // Whether newTag may join the count tags of a datagram; see the comment on
  // the optional operations above. False for a count of 0 (tags is not read).
  bool CanAddToDatagram(const ITag* const* tags, int count, const ITag* newTag) override;
  // ReadDatagram, then status 1 for each of the count tags on success.
  bool ReadDatagramWithStatus(const ITag* const* tags, int count, unsigned char* buffer,
                              idal_error_t* status) override;

  // --- IProtocol3 ---
  bool MultipleReadSupported(const ITag* /*tag*/) override { return false; }
  int MultipleRead(const ITag* const* /*tags*/, int /*count*/, unsigned char* const* /*buffers*/,
                   idal_error_t* /*status*/) override {
    return 0;
  }
  bool MultipleWriteSupported(const ITag* /*tag*/) override { return false; }
  int MultipleWrite(const ITag* const* /*tags*/, int /*count*/,
                    const unsigned char* const* /*buffers*/, idal_error_t* /*status*/) override {
    return 0;
  }

  // --- IProtocol4 ---
  bool CanReadBitBlock(const ITag* /*tag*/) override { return false; }
  bool ReadBitBlock(const ITag* /*tag*/, unsigned char* /*buffer*/, int /*bits*/) override {
    return false;
  }
  IInterface* GetInterface(const char* /*name*/) override { return nullptr; }
  int MaxUnusedGap(const ITag* /*tag*/) override { return 0xFFFFFF; }
  // Whether a's byte offset is below b's, compared unsigned.
  bool IsBefore(const ITag* a, const ITag* b) override;
  // Whether a begins at the bit right after b ends (getEndingBit(b) ==
  // getStartingBit(a)); the argument order is deliberate.
  bool IsAdjacent(const ITag* a, const ITag* b) override;

  // --- IProtocol5 ---
  bool NeedsReadBeforeWrite(const ITag* /*tag*/) override { return false; }
  bool CanWriteDatagrams(const ITag* /*tag*/) override { return false; }
  bool CanAddToWriteDatagram(const ITag* const* /*tags*/, int /*count*/,
                             const ITag* /*newTag*/) override {
    return false;
  }
  bool WriteDatagramWithStatus(const ITag* const* /*tags*/, int /*count*/,
                               const unsigned char* /*buffer*/, idal_error_t* /*status*/) override {
    return false;
  }
  bool CanWriteBitBlock(const ITag* /*tag*/) override { return false; }
  bool WriteBitBlock(const ITag* /*tag*/, const unsigned char* /*buffer*/, int /*bits*/) override {
    return false;
  }

  // --- IProtocol6 ---
  // Error -1 "read object not supported"; false.
  bool readObject(const ITag* tag, IObjectString* object) override;
  // Error -1 "write object not supported"; false.
  bool writeObject(const ITag* tag, const IObjectString* object) override;
  int vcsGetCapability(int /*capability*/) override { return 0; }
  int vcsGetComParams(char* /*out*/, int /*outSize*/) override { return 0; }
  int vcsActivateInterleaved(int /*enable*/) override { return 0; }
  // Both: error -1 "protocol does not support event channel"; null.
  void* createEventChannel(int queueSize) override;
  void* createEventChannel(IEventProcessor* processor) override;
  void deleteEventChannel(void* /*channel*/) override {}
  // Both: error -1 "protocol does not support event channel"; false.
  bool addEventSource(void* channel, const ITag* tag) override;
  bool addAlarmEvents(void* channel, void* alarm) override;
  const void* frontEvent(void* /*channel*/) override { return nullptr; }
  void popEvent(void* /*channel*/) override {}
  // Error -1 "protocol does not support alarms"; null.
  void* createAlarm(const char* definition) override;
  void deleteAlarm(void* /*alarm*/) override {}
  int listAlarms(void* /*alarm*/, char* /*out*/, int /*outSize*/) override { return 0; }
  int quitAlarm(void* /*alarm*/, int /*id*/) override { return 0; }
  // Error -1 "protocol does not support trends"; null.
  void* createTrend(const char* definition) override;
  void deleteTrend(void* /*trend*/) override {}
  int readTrend(void* /*trend*/, unsigned long long /*from*/, unsigned long long /*to*/,
                unsigned char* /*buffer*/, int /*size*/) override {
    return 0;
  }

  // --- IProtocol7 ---
  // Time stamps are currentTimeStamp(), taken after a successful read; a null
  // ts is allowed and left alone.
  bool hasPlcTimestamp(const ITag* /*tag*/) override { return false; }
  // Read (the driver's own if it has one), then the time stamp.
  bool readWithTimestamp(const ITag* tag, unsigned char* dst, unsigned long long* ts) override;
  // ReadBlock, then the time stamp.
  bool readBlockWithTimestamp(const ITag* tag, unsigned char* buffer, int length,
                              unsigned long long* ts) override;
  // ReadDatagramWithStatus, then one time stamp written for each tag.
  bool readDatagramWithTimestamp(const ITag* const* tags, int count, unsigned char* buffer,
                                 idal_error_t* status, unsigned long long* ts) override;
  // The number of names of tagUriNames() before its terminator.
  int getTagUriFieldCount() override;
  // The index-th name; null for an index below 0 or not below the count.
  const char* getTagUriFieldName(int index) override;
  // The index of the first name equal to name, -1 if none.
  int getTagUriFieldPosition(const char* name) override;
  // Field index of the tag's address text, fields separated by "?".
  const char* getTagUriField(const ITag* tag, int index, int* length) override;
  // One item of an array tag, read with Read.
  bool readArrayItem(const ITag* tag, int index, unsigned char* dst) override;
  // Reads the whole array with Read, replaces one item and writes the whole
  // array back with Write.
  bool writeArrayItem(const ITag* tag, int index, const unsigned char* src) override;
  // ReadBitBlock, then the time stamp.
  bool readBitBlockWithTimestamp(const ITag* tag, unsigned char* buffer, int bits,
                                 unsigned long long* ts) override;

  // --- the framework's own operations, after IProtocol7's ---
  // Creates the driver's tag from its address text; null (with the last error
  // set, usually through SetTagError) when the address is not valid.
  virtual TagBase* CreateTagBase(const char* uri) = 0;
  // The longest time, in milliseconds, that one read or write may take.
  virtual int GetMaxTm(const ITag* tag) = 0;
  // The names of the fields of a tag's address text, ended by a null entry.
  // The base has no fields.
  virtual const char* const* tagUriNames() const;

  // Sets the last error, code and text (null: empty text).
  void SetError(int code, const char* text);
  // Error -1, "Tag URI error: " + the tag's address + " - " + its error text.
  void SetTagError(const TagBase* tag);
  // Deletes every listed tag and empties the list.
  void DeleteTags();

 private:
  // The bit count of a bit-block read of a tag whose device value is
  // packedLength bytes.
  static int BitBlockBits(const ITag* tag, int packedLength);
  bool accessArrayItem(const ITag* tag, int index, const unsigned char* src, unsigned char* dst);

  mutable std::mutex stateLock;
  std::list<ITag*> tagList;
  std::int32_t lastErrorCode = 1;
  std::string lastErrorText;
  // The copies GetLastErrorString handed out, one per calling thread. They
  // live in the protocol rather than in thread-local storage: a thread-local
  // object with a destructor would keep the plug-in loaded until its thread
  // ends, so a host could not unload it.
  mutable std::map<std::thread::id, std::string> errorCopies;
  std::string identText;
};
