// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <map>
#include <mutex>
#include <string>

// The live runtime parameter set: the value in force for each runtime
// parameter, keyed by full name (base name plus node number). The first get
// of a name fixes its value, taken from the host's permanent storage
// (piPermanentStorage) under this set's section when stored there, else from
// the caller's default; from then on the set answers without touching storage
// until an apply of the staging set (GroupParameterReplacer::activate)
// replaces the value. Values applied with persist are written to storage, so
// a later set with the same section starts from them.
//
// Every operation is atomic: the driver reads and applies from the host's tag
// threads, so the set guards its map with a mutex of its own.
class ParameterReplacer {
 public:
  // Value codings of Variant::type.
  static constexpr std::int32_t kBoolean = 0;
  static constexpr std::int32_t kInteger = 1;
  static constexpr std::int32_t kString = 2;

  // A typed value. Only the member named by type is meaningful; the others
  // keep whatever they held.
  struct Variant {
    std::int32_t type = kBoolean;
    bool boolValue = false;
    std::int32_t intValue = 0;
    std::string stringValue;
  };

  ParameterReplacer() = default;
  ParameterReplacer(const ParameterReplacer&) = delete;
  ParameterReplacer& operator=(const ParameterReplacer&) = delete;
  ParameterReplacer(ParameterReplacer&&) = delete;
  ParameterReplacer& operator=(ParameterReplacer&&) = delete;
  ~ParameterReplacer() = default;

  // The name itself for node -1, else the name directly followed by the node
  // number in decimal ("gap" and 2 give "gap2").
  static std::string makeFullName(const std::string& name, int node);

  // The storage section under which values are read and persisted; the
  // driver names it after its instance at each start. Set it before other
  // threads use the set: the reference getSection returns is not guarded.
  void setSection(const std::string& section);
  const std::string& getSection() const;

  // The live value of the full name in out, loaded first when the set does
  // not hold the name yet (see the class comment). Once held, the value is
  // returned whatever default is passed. For a name held under another type,
  // out receives the held entry's member of the requested type unchanged.
  void get(const std::string& name, int node, const std::string& def, std::string& out);
  void get(const std::string& name, int node, int def, int& out);
  void get(const std::string& name, int node, bool def, bool& out);
  // The default must have the type of out: a text, number or flag would
  // otherwise convert silently into another form (a string literal into
  // true, 1 into true, true into 1).
  void get(const std::string& name, int node, const char* def, bool& out) = delete;
  void get(const std::string& name, int node, int def, bool& out) = delete;
  void get(const std::string& name, int node, bool def, int& out) = delete;

  // Sets the entry under fullName to value's type and the member of that
  // type, creating it when missing; the entry's other members keep what they
  // held. False, and nothing changed, for a type other than the three codings.
  bool set(const std::string& fullName, const Variant& value);

  // Writes value under this set's section and fullName to the host's
  // permanent storage with the setter of its type. Nothing happens without a
  // storage service or for a type other than the three codings.
  void persist(const std::string& fullName, const Variant& value) const;

  // The entry held under fullName copied to out; false (out untouched) when
  // the set does not hold it.
  bool find(const std::string& fullName, Variant& out) const;
  // A copy of every entry, in full-name order.
  std::map<std::string, Variant> entries() const;

 private:
  // The entry under fullName, inserted from storage or def (whose type is
  // the requested one) when missing. Called with the mutex held.
  const Variant& load(const std::string& fullName, const Variant& def);
  Variant readStored(const std::string& fullName, const Variant& def) const;
  std::string readStoredText(const std::string& fullName) const;

  mutable std::mutex mutex;
  std::string section;
  std::map<std::string, Variant> values;
};
