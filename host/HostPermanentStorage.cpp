// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostPermanentStorage.h"

#include <cstring>
#include <utility>

#include "DurableFile.h"
#include "HeldHostLocks.h"
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
  switch (DurableFile::Read(path, HostPermanentStorage::kLargestFile, contents, error)) {
    case DurableFile::ReadResult::Missing:
      return {};
    case DurableFile::ReadResult::Failed:
      throw StorageError(path, 0, error);
    case DurableFile::ReadResult::Read:
      break;
  }
  return StorageFormat::Parse(contents, path);
}

// Sets every value of group in into; returns how many were new or
// different.
int Merge(StoredSections& into, const StoredSections& group) {
  int changed = 0;
  for (const auto& [section, entries] : group) {
    StoredEntries& target = into[section];
    for (const auto& [name, value] : entries) {
      const auto [slot, added] = target.try_emplace(name, value);
      if (!added && slot->second != value) {
        slot->second = value;
        ++changed;
      }
      changed += added ? 1 : 0;
    }
  }
  return changed;
}

int CountValues(const StoredSections& group) {
  int count = 0;
  for (const auto& entries : group) {
    count += static_cast<int>(entries.second.size());
  }
  return count;
}

}  // namespace

HostPermanentStorage::HostPermanentStorage(std::string path, FileWriter writer)
    : path_(std::move(path)),
      writer_(std::move(writer)),
      swept_(DurableFile::SweepTemporaries(path_)),
      sections_(Load(path_)),
      saved_(sections_),
      owner_(std::make_shared<Owner>()) {
  owner_->storage = this;
}

HostPermanentStorage::~HostPermanentStorage() {
  {
    const std::lock_guard<std::mutex> detach(owner_->mutex);
    owner_->storage = nullptr;
  }
  std::unique_lock<std::mutex> lock(mutex_);
  StoredSections unfinished;
  for (const auto& entry : open_) {
    Merge(unfinished, entry.second);
  }
  open_.clear();
  if (!unfinished.empty()) {
    Save(lock, unfinished);
  }
}

HostPermanentStorage::FileWriter HostPermanentStorage::DefaultWriter() {
  return &DurableFile::Replace;
}

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

void HostPermanentStorage::SetFailureHook(FailureHook hook) {
  const std::lock_guard<std::mutex> lock(mutex_);
  hook_ = std::move(hook);
}

void HostPermanentStorage::Store(const char* section, const char* name, const StoredValue& value) {
  if (section == nullptr || name == nullptr) {
    return;
  }
  std::unique_lock<std::mutex> lock(mutex_);
  sections_[section][name] = value;
  if (!HeldHostLocks::Any()) {
    StoredSections single;
    single[section][name] = value;
    Save(lock, single);
    return;
  }
  const auto [group, opened] = open_.try_emplace(std::this_thread::get_id());
  group->second[section][name] = value;
  if (opened) {
    HeldHostLocks::AtLastUnlock([owner = owner_] {
      const std::lock_guard<std::mutex> alive(owner->mutex);
      if (owner->storage != nullptr) {
        owner->storage->FinishGroup();
      }
    });
  }
}

void HostPermanentStorage::FinishGroup() {
  std::unique_lock<std::mutex> lock(mutex_);
  const auto group = open_.find(std::this_thread::get_id());
  if (group == open_.end()) {
    return;
  }
  const StoredSections values = std::move(group->second);
  open_.erase(group);
  Save(lock, values);
}

void HostPermanentStorage::Save(std::unique_lock<std::mutex>& lock, const StoredSections& group) {
  if (Merge(saved_, group) == 0 && fileCurrent_) {
    return;  // already in the file
  }
  const std::string contents = StorageFormat::Serialize(saved_);
  std::string error;
  bool written = false;
  if (contents.size() > kLargestFile) {
    error =
        "cannot write: the file would be larger than " + std::to_string(kLargestFile) + " bytes";
  } else {
    written = writer_(path_, contents, error);
  }
  lastError_ = error;
  fileCurrent_ = written;
  if (written) {
    return;
  }
  const StorageFailure failure{path_, error, CountValues(group)};
  const FailureHook hook = hook_;
  lock.unlock();
  if (hook) {
    hook(failure);
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
