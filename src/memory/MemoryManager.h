// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

#include "memory/Model.h"

// The registry of device models, filled once while the driver is built and
// only read afterwards (so look-ups from any thread need no lock). Models are
// stored by value in order of addition; returned pointers stay valid as long
// as no model is added.
class MemoryManager {
 public:
  // Appends a copy of model, memory types included, without looking at the
  // names already stored: of two models with one name the earlier is found.
  void addModel(const Model& model);

  // The first model of that exact name; when none has it, the first model of
  // the registry, so that a node with an unknown model still works with the
  // driver's one model. Null only for an empty registry.
  const Model* getModel(const std::string& modelName) const;

  // The first memory type of that name in the first model of that name. Null
  // when either is unknown: unlike getModel there is no fall-back, so a tag
  // on a node with an unknown model is refused here.
  const MemoryType* getMemoryType(const std::string& modelName,
                                  const std::string& memoryTypeName) const;

  const std::vector<Model>& getModels() const;

 private:
  const Model* findModel(const std::string& modelName) const;

  std::vector<Model> models;
};
