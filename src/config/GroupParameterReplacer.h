// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <map>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

#include "config/ParameterReplacer.h"

// The staging set of runtime parameters: values written by the running
// project collect here, keyed by full name, without affecting the driver
// until activate copies those of one node into the live set (and, with
// persist, into the host's permanent storage). An apply leaves the staged
// values in place, so a second apply re-applies them.
//
// Every operation is atomic: staging writes and reads come from the host's
// tag threads, so the set guards its map with a mutex of its own. activate
// holds it while it calls into the live set, never the other way round.
class GroupParameterReplacer {
 public:
  // A staged value: the member named by type (codings of
  // ParameterReplacer::Variant) is meaningful, the other value members are
  // not. name is the base name, node its node (-1 for protocol-wide).
  struct Variant {
    std::int32_t type = ParameterReplacer::kBoolean;
    std::string name;
    bool boolValue = false;
    std::int32_t intValue = 0;
    std::string stringValue;
    std::int32_t node = -1;
  };

  GroupParameterReplacer() = default;
  GroupParameterReplacer(const GroupParameterReplacer&) = delete;
  GroupParameterReplacer& operator=(const GroupParameterReplacer&) = delete;
  GroupParameterReplacer(GroupParameterReplacer&&) = delete;
  GroupParameterReplacer& operator=(GroupParameterReplacer&&) = delete;
  ~GroupParameterReplacer() = default;

  // Same rule as ParameterReplacer::makeFullName.
  static std::string makeFullName(const std::string& name, int node);

  // Stages value under the full name, replacing any earlier entry of that
  // name whatever its type: text (a null pointer stages the empty text),
  // boolean or integer.
  void set(const std::string& name, int node, const char* value);
  void set(const std::string& name, int node, bool value);
  void set(const std::string& name, int node, int value);

  // True and the staged value in out when an entry of the requested type is
  // staged under the full name. False with out untouched when nothing is
  // staged there or the entry holds another type, so the caller falls back
  // to the live value.
  bool get(const std::string& name, int node, std::string& out) const;
  bool get(const std::string& name, int node, int& out) const;
  bool get(const std::string& name, int node, bool& out) const;

  // What an apply copied into the live set, in the order it copied it: each
  // live full name with its value.
  using Applied = std::vector<std::pair<std::string, ParameterReplacer::Variant>>;

  // Copies every staged entry of node, in full-name order, into live and,
  // when persist is true, into permanent storage under live's section.
  void activate(ParameterReplacer& live, int node, bool persist) const;
  // activate in two steps, so that a caller can change the live set under
  // its own lock and write to storage after releasing it: apply copies the
  // staged entries of node into live and answers what it copied; persist
  // then writes that to permanent storage under live's section, in the same
  // order. Entries of an unknown type are neither applied nor persisted.
  Applied apply(ParameterReplacer& live, int node) const;
  static void persist(const ParameterReplacer& live, const Applied& applied);

  // A copy of every staged entry, in full-name order.
  std::map<std::string, Variant> entries() const;

 private:
  void stage(const std::string& name, int node, Variant entry);
  // The member of the entry staged under the full name, when that entry has
  // the given type.
  template <typename T>
  bool getTyped(const std::string& name, int node, std::int32_t type, T Variant::*member,
                T& out) const;

  mutable std::mutex mutex;
  std::map<std::string, Variant> values;
};
