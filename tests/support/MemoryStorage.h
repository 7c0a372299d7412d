// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <functional>
#include <map>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "IPermanentStorage.h"
#include "StorageCall.h"

// An in-memory permanent storage that records every call made on it, in
// order, for tests that assert exactly what was read and written.
//
// Generation::Second answers ConvertTo("IPermanentStorage2") with itself and
// serves GetStringValueInto; Generation::First answers that name with null,
// like a host that offers only the first interface, so texts can only be read
// through GetStringValue.
//
// Each section and name holds one typed value. A getter of another type than
// the one stored answers the zero value of its type (false, 0, "") and a
// getter of an absent name answers the same. The preset and inspection
// operations are not part of the interface and are not logged. Safe to use
// from several threads.
class MemoryStorage final : public IPermanentStorage2 {
 public:
  enum class Generation { First, Second };

  explicit MemoryStorage(Generation generation = Generation::Second);

  IInterface* ConvertTo(const char* name) override;
  void SetStringValue(const char* section, const char* name, const char* value) override;
  void SetBoolValue(const char* section, const char* name, bool value) override;
  void SetIntValue(const char* section, const char* name, int value) override;
  const char* GetStringValue(const char* section, const char* name) override;
  bool GetBoolValue(const char* section, const char* name) override;
  int GetIntValue(const char* section, const char* name) override;
  int HasValue(const char* section, const char* name) override;
  // Copies the stored text and its terminator when they fit in size bytes;
  // 0 (buffer untouched) when absent, too long or failing.
  int GetStringValueInto(const char* section, const char* name, char* buffer, int size) override;

  // Stored values set up before a test, without a log entry.
  void presetText(const std::string& section, const std::string& name, const std::string& value);
  void presetBool(const std::string& section, const std::string& name, bool value);
  void presetInt(const std::string& section, const std::string& name, int value);
  // While set, every text read fails: GetStringValueInto answers 0 and
  // GetStringValue answers null.
  void failStringReads(bool fail);
  // Called after each value is written, outside the storage's lock, on the
  // writing thread (as a slow store would keep its caller meanwhile).
  void onWrite(std::function<void(const std::string& name)> hook);

  // What is stored (not logged). Empty when absent or stored with another
  // type.
  bool contains(const std::string& section, const std::string& name) const;
  std::optional<std::string> textValue(const std::string& section, const std::string& name) const;
  std::optional<bool> boolValue(const std::string& section, const std::string& name) const;
  std::optional<int> intValue(const std::string& section, const std::string& name) const;
  std::size_t size() const;

  // The call log.
  std::vector<StorageCall> calls() const;
  // The calls of one operation.
  int count(const std::string& operation) const;
  // The setter calls only, in order.
  std::vector<StorageCall> writes() const;
  void clearCalls();

 private:
  enum class Kind { Text, Flag, Number };
  struct Stored {
    Kind kind = Kind::Text;
    std::string text;
    bool flag = false;
    int number = 0;

    static Stored OfText(std::string value);
    static Stored OfFlag(bool value);
    static Stored OfNumber(int value);
  };
  using Key = std::pair<std::string, std::string>;

  static std::string Text(const char* value);
  void record(const char* operation, const char* section, const char* name, std::string value);
  // Runs the write hook, if any, for name.
  void written(const char* name);
  const Stored* lookup(const char* section, const char* name) const;
  void store(const std::string& section, const std::string& name, Stored value);
  // The member of the value stored under section and name, when it is of
  // that kind.
  template <typename T>
  std::optional<T> storedAs(const std::string& section, const std::string& name, Kind kind,
                            T Stored::*member) const;

  const Generation generation_;
  mutable std::mutex mutex_;
  std::map<Key, Stored> values_;
  std::vector<StorageCall> log_;
  bool failStringReads_ = false;
  std::function<void(const std::string& name)> onWrite_;
  // GetStringValue's answer stays valid until the calling thread's next call,
  // so each thread gets its own text.
  std::map<std::thread::id, std::string> answered_;
};
