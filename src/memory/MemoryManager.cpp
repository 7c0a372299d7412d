// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "memory/MemoryManager.h"

void MemoryManager::addModel(const Model& model) { models.push_back(model); }

const Model* MemoryManager::getModel(const std::string& modelName) const {
  const Model* const found = findModel(modelName);
  if (found != nullptr || models.empty()) {
    return found;
  }
  return &models.front();
}

const MemoryType* MemoryManager::getMemoryType(const std::string& modelName,
                                               const std::string& memoryTypeName) const {
  const Model* const model = findModel(modelName);
  return model == nullptr ? nullptr : model->findMemoryType(memoryTypeName);
}

const std::vector<Model>& MemoryManager::getModels() const { return models; }

const Model* MemoryManager::findModel(const std::string& modelName) const {
  for (const Model& model : models) {
    if (model.getName() == modelName) {
      return &model;
    }
  }
  return nullptr;
}
