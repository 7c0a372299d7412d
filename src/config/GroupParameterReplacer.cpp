// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/GroupParameterReplacer.h"

#include <utility>

namespace {

// The live form of a staged entry: its type and the member of that type.
ParameterReplacer::Variant ToLive(const GroupParameterReplacer::Variant& staged) {
  ParameterReplacer::Variant live;
  live.type = staged.type;
  live.boolValue = staged.boolValue;
  live.intValue = staged.intValue;
  live.stringValue = staged.stringValue;
  return live;
}

}  // namespace

std::string GroupParameterReplacer::makeFullName(const std::string& name, int node) {
  return ParameterReplacer::makeFullName(name, node);
}

void GroupParameterReplacer::set(const std::string& name, int node, const char* value) {
  Variant entry;
  entry.type = ParameterReplacer::kString;
  entry.stringValue = value == nullptr ? std::string() : std::string(value);
  stage(name, node, std::move(entry));
}

void GroupParameterReplacer::set(const std::string& name, int node, bool value) {
  Variant entry;
  entry.type = ParameterReplacer::kBoolean;
  entry.boolValue = value;
  stage(name, node, std::move(entry));
}

void GroupParameterReplacer::set(const std::string& name, int node, int value) {
  Variant entry;
  entry.type = ParameterReplacer::kInteger;
  entry.intValue = value;
  stage(name, node, std::move(entry));
}

template <typename T>
bool GroupParameterReplacer::getTyped(const std::string& name, int node, std::int32_t type,
                                      T Variant::*member, T& out) const {
  const std::lock_guard<std::mutex> lock(mutex);
  const auto found = values.find(makeFullName(name, node));
  if (found == values.end() || found->second.type != type) {
    return false;
  }
  out = found->second.*member;
  return true;
}

bool GroupParameterReplacer::get(const std::string& name, int node, std::string& out) const {
  return getTyped(name, node, ParameterReplacer::kString, &Variant::stringValue, out);
}

bool GroupParameterReplacer::get(const std::string& name, int node, int& out) const {
  return getTyped(name, node, ParameterReplacer::kInteger, &Variant::intValue, out);
}

bool GroupParameterReplacer::get(const std::string& name, int node, bool& out) const {
  return getTyped(name, node, ParameterReplacer::kBoolean, &Variant::boolValue, out);
}

void GroupParameterReplacer::activate(ParameterReplacer& live, int node, bool persist) const {
  const Applied applied = apply(live, node);
  if (persist) {
    GroupParameterReplacer::persist(live, applied);
  }
}

GroupParameterReplacer::Applied GroupParameterReplacer::apply(ParameterReplacer& live,
                                                              int node) const {
  Applied applied;
  const std::lock_guard<std::mutex> lock(mutex);
  for (const auto& [fullName, entry] : values) {
    if (entry.node != node) {
      continue;
    }
    std::string liveName = ParameterReplacer::makeFullName(entry.name, node);
    ParameterReplacer::Variant value = ToLive(entry);
    // The live set refuses an entry of an unknown type.
    if (live.set(liveName, value)) {
      applied.emplace_back(std::move(liveName), std::move(value));
    }
  }
  return applied;
}

void GroupParameterReplacer::persist(const ParameterReplacer& live, const Applied& applied) {
  for (const auto& [liveName, value] : applied) {
    live.persist(liveName, value);
  }
}

std::map<std::string, GroupParameterReplacer::Variant> GroupParameterReplacer::entries() const {
  const std::lock_guard<std::mutex> lock(mutex);
  return values;
}

void GroupParameterReplacer::stage(const std::string& name, int node, Variant entry) {
  entry.name = name;
  entry.node = node;
  const std::string fullName = makeFullName(name, node);
  const std::lock_guard<std::mutex> lock(mutex);
  values[fullName] = std::move(entry);
}
