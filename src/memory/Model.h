// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

#include "memory/MemoryType.h"

// A device model: a named set of memory types, in order of addition and with
// unique names, plus the limits of one datagram.
class Model {
 public:
  // Datagram limits 0, no memory types.
  explicit Model(std::string modelName);

  void setMaxDatagramLength(int value);
  void setMaxDatagramItems(int value);
  // Appends a copy of memoryType and returns true, or returns false and
  // leaves the model unchanged when it already holds a memory type of that
  // name: the first registration of a name wins.
  bool addMemoryType(const MemoryType& memoryType);

  const std::string& getName() const;
  int getMaxDatagramItems() const;
  int getMaxDatagramLength() const;
  const std::vector<MemoryType>& getMemoryTypes() const;
  // The first memory type of that exact name, or null. Valid until the next
  // addMemoryType.
  const MemoryType* findMemoryType(const std::string& memoryTypeName) const;

 private:
  std::string name;
  int maxDatagramItems = 0;
  int maxDatagramLength = 0;
  std::vector<MemoryType> memoryTypes;
};
