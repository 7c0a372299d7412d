// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <mutex>
#include <string>

#include "IPermanentStorage.h"
#include "StoredValue.h"

// The permanent storage ("IPermanentStorage" and "IPermanentStorage2"):
// typed values by section and name, kept in one readable file (format:
// StorageFormat). Every set that changes something rewrites the file
// durably before it returns (DurableFile::Replace); a set whose file cannot
// be written is not applied, and LastError tells why. Thread-safe.
class HostPermanentStorage final : public IPermanentStorage2 {
 public:
  // Loads the file at path. A missing file starts empty (the file appears
  // with the first set). An unreadable or corrupt file throws StorageError
  // with the path (and the line); the file is left as it is.
  explicit HostPermanentStorage(std::string path);
  HostPermanentStorage(const HostPermanentStorage&) = delete;
  HostPermanentStorage& operator=(const HostPermanentStorage&) = delete;
  HostPermanentStorage(HostPermanentStorage&&) = delete;
  HostPermanentStorage& operator=(HostPermanentStorage&&) = delete;
  virtual ~HostPermanentStorage() = default;

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

 private:
  void Store(const char* section, const char* name, const StoredValue& value);
  bool Find(const char* section, const char* name, StoredValue& value) const;

  const std::string path_;
  mutable std::mutex mutex_;
  StoredSections sections_;
  std::string lastError_;
};
