// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "memory/Model.h"

#include <utility>

Model::Model(std::string modelName) : name(std::move(modelName)) {}

void Model::setMaxDatagramLength(int value) { maxDatagramLength = value; }

void Model::setMaxDatagramItems(int value) { maxDatagramItems = value; }

bool Model::addMemoryType(const MemoryType& memoryType) {
  if (findMemoryType(memoryType.getName()) != nullptr) {
    return false;
  }
  memoryTypes.push_back(memoryType);
  return true;
}

const std::string& Model::getName() const { return name; }

int Model::getMaxDatagramItems() const { return maxDatagramItems; }

int Model::getMaxDatagramLength() const { return maxDatagramLength; }

const std::vector<MemoryType>& Model::getMemoryTypes() const { return memoryTypes; }

const MemoryType* Model::findMemoryType(const std::string& memoryTypeName) const {
  for (const MemoryType& memoryType : memoryTypes) {
    if (memoryType.hasName(memoryTypeName)) {
      return &memoryType;
    }
  }
  return nullptr;
}
