// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <thread>

#include "IPermanentStorage.h"
#include "StorageFailure.h"
#include "StoredValue.h"

// The permanent storage ("IPermanentStorage" and "IPermanentStorage2"):
// typed values by section and name, kept in one readable file (format:
// StorageFormat) that only this object writes. Thread-safe.
//
// An apply is written whole. The values a thread sets while it holds a host
// mutex (HeldHostLocks; the token driver persists an apply under its queue
// lock) are kept aside and written in one replacement of the file
// (DurableFile::Replace) when the thread releases its last host mutex,
// before the plug-in's write returns. A value set outside any host mutex is
// written at once, on its own. So after a kill or a power cut at any
// instant the file holds every value of an apply or none of them.
//
// Reads always give the newest value set, written or not. A write that
// fails (full disk, read-only file, I/O error) keeps the values in memory,
// sets LastError and is reported once to the failure hook; the next write
// saves the whole storage again, those values included.
class HostPermanentStorage final : public IPermanentStorage2 {
 public:
  // The largest storage file read or written.
  static constexpr std::size_t kLargestFile = std::size_t{16} * 1024 * 1024;

  // Replaces the file at path with contents, or returns false with the
  // reason in error (DurableFile::Replace's contract).
  using FileWriter =
      std::function<bool(const std::string& path, const std::string& contents, std::string& error)>;
  // Told of each failed write, on the thread that set the values. It must
  // not destroy the storage.
  using FailureHook = std::function<void(const StorageFailure&)>;

  // Removes the temporary files that killed writes left beside the file,
  // then loads it. A missing file starts empty (the file appears with the
  // first write). A file that cannot be read, is not a regular file, is
  // larger than kLargestFile or does not parse throws StorageError with the
  // path (and the line); the file is left as it is. writer replaces the file;
  // tests give one that fails.
  explicit HostPermanentStorage(std::string path, FileWriter writer = DefaultWriter());
  HostPermanentStorage(const HostPermanentStorage&) = delete;
  HostPermanentStorage& operator=(const HostPermanentStorage&) = delete;
  HostPermanentStorage(HostPermanentStorage&&) = delete;
  HostPermanentStorage& operator=(HostPermanentStorage&&) = delete;
  // Writes what a thread set under a host mutex it has not released yet
  // (normally nothing: the plug-in's writes have returned).
  virtual ~HostPermanentStorage();

  // Itself for "IPermanentStorage" and "IPermanentStorage2", else null.
  IInterface* ConvertTo(const char* name) override;
  // Null section, name or value texts are ignored.
  void SetStringValue(const char* section, const char* name, const char* value) override;
  void SetBoolValue(const char* section, const char* name, bool value) override;
  void SetIntValue(const char* section, const char* name, int value) override;
  // The stored text (other types converted, StoredValue::AsText), or "" when
  // absent. The pointer stays valid until the calling thread's next
  // GetStringValue on any storage.
  const char* GetStringValue(const char* section, const char* name) override;
  // The stored value converted to boolean; false when absent.
  bool GetBoolValue(const char* section, const char* name) override;
  // The stored value converted to integer; 0 when absent.
  int GetIntValue(const char* section, const char* name) override;
  int HasValue(const char* section, const char* name) override;
  // 1 with the text and its terminator in buffer when they fit in size
  // bytes; 0 when absent, when they do not fit, or for a null buffer or a
  // size below 1. On 0 a usable buffer holds the empty text.
  int GetStringValueInto(const char* section, const char* name, char* buffer, int size) override;

  const std::string& Path() const { return path_; }
  // Why the last write of the file failed (or could not be flushed); empty
  // when the last write succeeded.
  std::string LastError() const;
  // Replaces the failure hook (none at first).
  void SetFailureHook(FailureHook hook);
  // How many temporary files the load removed.
  int SweptTemporaries() const { return swept_; }

  static FileWriter DefaultWriter();

 private:
  // Lets a thread's release of its last host mutex reach this object only
  // while it lives.
  struct Owner {
    std::mutex mutex;
    HostPermanentStorage* storage = nullptr;
  };

  void Store(const char* section, const char* name, const StoredValue& value);
  bool Find(const char* section, const char* name, StoredValue& value) const;
  void FinishGroup();
  // Adds group to what the file holds and writes the file when that
  // changed (or the last write failed); reports a failure after releasing
  // lock.
  void Save(std::unique_lock<std::mutex>& lock, const StoredSections& group);

  const std::string path_;
  const FileWriter writer_;
  const int swept_;
  mutable std::mutex mutex_;
  // The newest values, which reads give.
  StoredSections sections_;
  // The values the file holds, or is to hold once a failed write is redone.
  StoredSections saved_;
  bool fileCurrent_ = true;
  // Values set under host mutexes, by thread, until its last release.
  std::map<std::thread::id, StoredSections> open_;
  std::string lastError_;
  FailureHook hook_;
  std::shared_ptr<Owner> owner_;
};
