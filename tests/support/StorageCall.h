// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <ostream>
#include <string>
#include <utility>

// One call made on a MemoryStorage, as recorded in its call log.
//   operation: the interface operation's name ("HasValue", "GetIntValue",
//              "SetStringValue", "ConvertTo", ...).
//   section, name: its section and name arguments ("ConvertTo" records the
//              interface name asked for as name, with an empty section).
//   value: for a setter the value written; for a getter and HasValue the
//              value answered; for GetStringValueInto the buffer size passed.
//              Flags read "true"/"false", HasValue "1"/"0", integers decimal,
//              a null text "(null)"; ConvertTo records "".
struct StorageCall {
  std::string operation;
  std::string section;
  std::string name;
  std::string value;

  StorageCall() = default;
  StorageCall(std::string op, std::string sec, std::string nm, std::string val)
      : operation(std::move(op)),
        section(std::move(sec)),
        name(std::move(nm)),
        value(std::move(val)) {}

  friend bool operator==(const StorageCall& a, const StorageCall& b) {
    return a.operation == b.operation && a.section == b.section && a.name == b.name &&
           a.value == b.value;
  }
  friend bool operator!=(const StorageCall& a, const StorageCall& b) { return !(a == b); }

  // Readable failure output in tests.
  friend void PrintTo(const StorageCall& call, std::ostream* os) {
    *os << call.operation << "(" << call.section << ", " << call.name << ", " << call.value << ")";
  }
};
