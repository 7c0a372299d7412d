// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostPermanentStorage.h"

#include <cstring>
#include <optional>
#include <utility>

#include "DurableFile.h"
#include "StorageError.h"
#include "StorageFormat.h"

namespace {

// Backs the pointers GetStringValue returns: one text per thread, reached
// only through this function.
std::string& LastStringRead() {
  thread_local std::string text;
  return text;
}

bool Same(const char* name, const char* expected) {
  return name != nullptr && std::strcmp(name, expected) == 0;
}

StoredSections Load(const std::string& path) {
  std::string contents;
  std::string error;
  switch (DurableFile::Read(path, contents, error)) {
    case DurableFile::ReadResult::Missing:
      return {};
    case DurableFile::ReadResult::Failed:
      throw StorageError(path, 0, error);
    case DurableFile::ReadResult::Read:
      break;
  }
  return StorageFormat::Parse(contents, path);
}

}  // namespace

HostPermanentStorage::HostPermanentStorage(std::string path)
    : path_(std::move(path)), sections_(Load(path_)) {}

IInterface* HostPermanentStorage::ConvertTo(const char* name) {
  if (Same(name, "IPermanentStorage") || Same(name, "IPermanentStorage2")) {
    return static_cast<IPermanentStorage2*>(this);
  }
  return nullptr;
}

void HostPermanentStorage::SetStringValue(const char* section, const char* name,
                                          const char* value) {
  if (value != nullptr) {
    Store(section, name, StoredValue::OfText(value));
  }
}

void HostPermanentStorage::SetBoolValue(const char* section, const char* name, bool value) {
  Store(section, name, StoredValue::OfBoolean(value));
}

void HostPermanentStorage::SetIntValue(const char* section, const char* name, int value) {
  Store(section, name, StoredValue::OfInteger(value));
}

const char* HostPermanentStorage::GetStringValue(const char* section, const char* name) {
  StoredValue value;
  std::string& text = LastStringRead();
  text = Find(section, name, value) ? value.AsText() : std::string();
  return text.c_str();
}

bool HostPermanentStorage::GetBoolValue(const char* section, const char* name) {
  StoredValue value;
  return Find(section, name, value) && value.AsBoolean();
}

int HostPermanentStorage::GetIntValue(const char* section, const char* name) {
  StoredValue value;
  return Find(section, name, value) ? value.AsInteger() : 0;
}

int HostPermanentStorage::HasValue(const char* section, const char* name) {
  StoredValue value;
  return Find(section, name, value) ? 1 : 0;
}

int HostPermanentStorage::GetStringValueInto(const char* section, const char* name, char* buffer,
                                             int size) {
  if (buffer == nullptr || size < 1) {
    return 0;
  }
  StoredValue value;
  if (!Find(section, name, value)) {
    buffer[0] = '\0';
    return 0;
  }
  const std::string text = value.AsText();
  if (text.size() + 1 > static_cast<std::size_t>(size)) {
    buffer[0] = '\0';
    return 0;
  }
  std::memcpy(buffer, text.c_str(), text.size() + 1);
  return 1;
}

std::string HostPermanentStorage::LastError() const {
  const std::lock_guard<std::mutex> lock(mutex_);
  return lastError_;
}

void HostPermanentStorage::Store(const char* section, const char* name, const StoredValue& value) {
  if (section == nullptr || name == nullptr) {
    return;
  }
  const std::lock_guard<std::mutex> lock(mutex_);
  StoredEntries& entries = sections_[section];
  const auto existing = entries.find(name);
  std::optional<StoredValue> previous;
  if (existing != entries.end()) {
    if (existing->second == value) {
      return;  // already on the disk
    }
    previous = existing->second;
  }
  entries[name] = value;
  std::string error;
  const bool replaced = DurableFile::Replace(path_, StorageFormat::Serialize(sections_), error);
  lastError_ = error;
  if (replaced) {
    return;
  }
  // Not on the disk, so not stored: memory keeps matching the file.
  if (previous.has_value()) {
    entries[name] = *previous;
  } else {
    entries.erase(name);
    if (entries.empty()) {
      sections_.erase(section);
    }
  }
}

bool HostPermanentStorage::Find(const char* section, const char* name, StoredValue& value) const {
  if (section == nullptr || name == nullptr) {
    return false;
  }
  const std::lock_guard<std::mutex> lock(mutex_);
  const auto entries = sections_.find(section);
  if (entries == sections_.end()) {
    return false;
  }
  const auto found = entries->second.find(name);
  if (found == entries->second.end()) {
    return false;
  }
  value = found->second;
  return true;
}
