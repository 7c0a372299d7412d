// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ChildEnvironment.h"

#include <algorithm>

extern char** environ;

namespace {

std::string NameOf(const std::string& entry) { return entry.substr(0, entry.find('=')); }

}  // namespace

ChildEnvironment::ChildEnvironment(const std::vector<std::string>& changes) {
  for (char** entry = environ; *entry != nullptr; ++entry) {
    entries_.emplace_back(*entry);
  }
  for (const std::string& change : changes) {
    const bool remove = !change.empty() && change[0] == '-';
    const std::string name = remove ? change.substr(1) : NameOf(change);
    entries_.erase(
        std::remove_if(entries_.begin(), entries_.end(),
                       [&name](const std::string& entry) { return NameOf(entry) == name; }),
        entries_.end());
    if (!remove) {
      entries_.push_back(change);
    }
  }
}

char* const* ChildEnvironment::Get() {
  pointers_.clear();
  for (std::string& entry : entries_) {
    pointers_.push_back(entry.data());
  }
  pointers_.push_back(nullptr);
  return pointers_.data();
}
