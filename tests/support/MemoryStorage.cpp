// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "MemoryStorage.h"

#include <algorithm>
#include <cstring>
#include <iterator>
#include <string>

namespace {

const char* FlagText(bool value) { return value ? "true" : "false"; }

}  // namespace

MemoryStorage::MemoryStorage(Generation generation) : generation_(generation) {}

IInterface* MemoryStorage::ConvertTo(const char* name) {
  const std::lock_guard<std::mutex> lock(mutex_);
  record("ConvertTo", "", name, "");
  const std::string asked = Text(name);
  if (asked == "IPermanentStorage") {
    return static_cast<IPermanentStorage*>(this);
  }
  if (asked == "IPermanentStorage2" && generation_ == Generation::Second) {
    return static_cast<IPermanentStorage2*>(this);
  }
  return nullptr;
}

void MemoryStorage::SetStringValue(const char* section, const char* name, const char* value) {
  {
    const std::lock_guard<std::mutex> lock(mutex_);
    record("SetStringValue", section, name, value == nullptr ? "(null)" : value);
    store(Text(section), Text(name), Stored::OfText(Text(value)));
  }
  written(name);
}

void MemoryStorage::SetBoolValue(const char* section, const char* name, bool value) {
  {
    const std::lock_guard<std::mutex> lock(mutex_);
    record("SetBoolValue", section, name, FlagText(value));
    store(Text(section), Text(name), Stored::OfFlag(value));
  }
  written(name);
}

void MemoryStorage::SetIntValue(const char* section, const char* name, int value) {
  {
    const std::lock_guard<std::mutex> lock(mutex_);
    record("SetIntValue", section, name, std::to_string(value));
    store(Text(section), Text(name), Stored::OfNumber(value));
  }
  written(name);
}

const char* MemoryStorage::GetStringValue(const char* section, const char* name) {
  const std::lock_guard<std::mutex> lock(mutex_);
  if (failStringReads_) {
    record("GetStringValue", section, name, "(null)");
    return nullptr;
  }
  const Stored* const stored = lookup(section, name);
  std::string& answer = answered_[std::this_thread::get_id()];
  answer = stored != nullptr && stored->kind == Kind::Text ? stored->text : std::string();
  record("GetStringValue", section, name, answer);
  return answer.c_str();
}

bool MemoryStorage::GetBoolValue(const char* section, const char* name) {
  const std::lock_guard<std::mutex> lock(mutex_);
  const Stored* const stored = lookup(section, name);
  const bool answer = stored != nullptr && stored->kind == Kind::Flag && stored->flag;
  record("GetBoolValue", section, name, FlagText(answer));
  return answer;
}

int MemoryStorage::GetIntValue(const char* section, const char* name) {
  const std::lock_guard<std::mutex> lock(mutex_);
  const Stored* const stored = lookup(section, name);
  const int answer = stored != nullptr && stored->kind == Kind::Number ? stored->number : 0;
  record("GetIntValue", section, name, std::to_string(answer));
  return answer;
}

int MemoryStorage::HasValue(const char* section, const char* name) {
  const std::lock_guard<std::mutex> lock(mutex_);
  const int answer = lookup(section, name) != nullptr ? 1 : 0;
  record("HasValue", section, name, std::to_string(answer));
  return answer;
}

int MemoryStorage::GetStringValueInto(const char* section, const char* name, char* buffer,
                                      int size) {
  const std::lock_guard<std::mutex> lock(mutex_);
  record("GetStringValueInto", section, name, std::to_string(size));
  const Stored* const stored = lookup(section, name);
  if (failStringReads_ || stored == nullptr || buffer == nullptr || size <= 0) {
    return 0;
  }
  const std::string text = stored->kind == Kind::Text ? stored->text : std::string();
  if (text.size() + 1 > static_cast<std::size_t>(size)) {
    return 0;
  }
  std::memcpy(buffer, text.c_str(), text.size() + 1);
  return 1;
}

void MemoryStorage::presetText(const std::string& section, const std::string& name,
                               const std::string& value) {
  const std::lock_guard<std::mutex> lock(mutex_);
  store(section, name, Stored::OfText(value));
}

void MemoryStorage::presetBool(const std::string& section, const std::string& name, bool value) {
  const std::lock_guard<std::mutex> lock(mutex_);
  store(section, name, Stored::OfFlag(value));
}

void MemoryStorage::presetInt(const std::string& section, const std::string& name, int value) {
  const std::lock_guard<std::mutex> lock(mutex_);
  store(section, name, Stored::OfNumber(value));
}

void MemoryStorage::failStringReads(bool fail) {
  const std::lock_guard<std::mutex> lock(mutex_);
  failStringReads_ = fail;
}

bool MemoryStorage::contains(const std::string& section, const std::string& name) const {
  const std::lock_guard<std::mutex> lock(mutex_);
  return values_.count(Key(section, name)) != 0;
}

template <typename T>
std::optional<T> MemoryStorage::storedAs(const std::string& section, const std::string& name,
                                         Kind kind, T Stored::*member) const {
  const std::lock_guard<std::mutex> lock(mutex_);
  const auto found = values_.find(Key(section, name));
  if (found == values_.end() || found->second.kind != kind) {
    return std::nullopt;
  }
  return found->second.*member;
}

std::optional<std::string> MemoryStorage::textValue(const std::string& section,
                                                    const std::string& name) const {
  return storedAs(section, name, Kind::Text, &Stored::text);
}

std::optional<bool> MemoryStorage::boolValue(const std::string& section,
                                             const std::string& name) const {
  return storedAs(section, name, Kind::Flag, &Stored::flag);
}

std::optional<int> MemoryStorage::intValue(const std::string& section,
                                           const std::string& name) const {
  return storedAs(section, name, Kind::Number, &Stored::number);
}

std::size_t MemoryStorage::size() const {
  const std::lock_guard<std::mutex> lock(mutex_);
  return values_.size();
}

std::vector<StorageCall> MemoryStorage::calls() const {
  const std::lock_guard<std::mutex> lock(mutex_);
  return log_;
}

int MemoryStorage::count(const std::string& operation) const {
  const std::lock_guard<std::mutex> lock(mutex_);
  return static_cast<int>(std::count_if(log_.begin(), log_.end(), [&](const StorageCall& call) {
    return call.operation == operation;
  }));
}

std::vector<StorageCall> MemoryStorage::writes() const {
  const std::lock_guard<std::mutex> lock(mutex_);
  std::vector<StorageCall> result;
  std::copy_if(log_.begin(), log_.end(), std::back_inserter(result),
               [](const StorageCall& call) { return call.operation.rfind("Set", 0) == 0; });
  return result;
}

void MemoryStorage::clearCalls() {
  const std::lock_guard<std::mutex> lock(mutex_);
  log_.clear();
}

std::string MemoryStorage::Text(const char* value) {
  return value == nullptr ? std::string() : std::string(value);
}

void MemoryStorage::record(const char* operation, const char* section, const char* name,
                           std::string value) {
  log_.emplace_back(operation, Text(section), Text(name), std::move(value));
}

void MemoryStorage::onWrite(std::function<void(const std::string& name)> hook) {
  const std::lock_guard<std::mutex> lock(mutex_);
  onWrite_ = std::move(hook);
}

void MemoryStorage::written(const char* name) {
  std::function<void(const std::string& name)> hook;
  {
    const std::lock_guard<std::mutex> lock(mutex_);
    hook = onWrite_;
  }
  if (hook) {
    hook(Text(name));
  }
}

const MemoryStorage::Stored* MemoryStorage::lookup(const char* section, const char* name) const {
  const auto found = values_.find(Key(Text(section), Text(name)));
  return found == values_.end() ? nullptr : &found->second;
}

void MemoryStorage::store(const std::string& section, const std::string& name, Stored value) {
  values_[Key(section, name)] = std::move(value);
}

MemoryStorage::Stored MemoryStorage::Stored::OfText(std::string value) {
  Stored stored;
  stored.text = std::move(value);
  return stored;
}

MemoryStorage::Stored MemoryStorage::Stored::OfFlag(bool value) {
  Stored stored;
  stored.kind = Kind::Flag;
  stored.flag = value;
  return stored;
}

MemoryStorage::Stored MemoryStorage::Stored::OfNumber(int value) {
  Stored stored;
  stored.kind = Kind::Number;
  stored.number = value;
  return stored;
}
