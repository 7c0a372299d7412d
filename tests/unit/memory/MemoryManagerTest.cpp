// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "memory/MemoryManager.h"

#include <gtest/gtest.h>

namespace {

Model ModelWith(const std::string& modelName, const std::string& memoryTypeName, int maxIndex) {
  Model model(modelName);
  MemoryType m;
  m.setName(memoryTypeName);
  m.setMaxIndex(maxIndex);
  model.addMemoryType(m);
  return model;
}

}  // namespace

TEST(MemoryManager, UnknownModelFallsBackToFirstButMemoryTypeDoesNot) {
  MemoryManager manager;
  manager.addModel(ModelWith("1", "rx_token", 0));
  const Model* const known = manager.getModel("1");
  ASSERT_NE(known, nullptr);
  EXPECT_EQ(known->getName(), "1");
  EXPECT_EQ(manager.getModel("7"), known);
  EXPECT_EQ(manager.getMemoryType("7", "rx_token"), nullptr);
  EXPECT_EQ(manager.getMemoryType("1", "unknown"), nullptr);
  const MemoryType* const found = manager.getMemoryType("1", "rx_token");
  ASSERT_NE(found, nullptr);
  EXPECT_EQ(found->getName(), "rx_token");
}

TEST(MemoryManager, MemoryTypeLookUpIsCaseSensitive) {
  MemoryManager manager;
  manager.addModel(ModelWith("1", "rx_token", 0));
  EXPECT_EQ(manager.getMemoryType("1", "RX_TOKEN"), nullptr);
  EXPECT_EQ(manager.getMemoryType("1 ", "rx_token"), nullptr);
}

TEST(MemoryManager, EmptyRegistryAnswersNullToBothLookUps) {
  const MemoryManager manager;
  EXPECT_EQ(manager.getModel("1"), nullptr);
  EXPECT_EQ(manager.getModel(""), nullptr);
  EXPECT_EQ(manager.getMemoryType("1", "rx_token"), nullptr);
}

TEST(MemoryManager, ModelsOfOneNameCoexistAndEarlierIsFound) {
  MemoryManager manager;
  manager.addModel(ModelWith("1", "a", 10));
  manager.addModel(ModelWith("1", "b", 20));
  EXPECT_EQ(manager.getModels().size(), 2U);
  EXPECT_EQ(manager.getModel("1"), &manager.getModels()[0]);
  ASSERT_NE(manager.getMemoryType("1", "a"), nullptr);
  EXPECT_EQ(manager.getMemoryType("1", "a")->getMaxIndex(), 10);
  EXPECT_EQ(manager.getMemoryType("1", "b"), nullptr);
}

TEST(MemoryManager, ExactModelMatchWinsOverFallBack) {
  MemoryManager manager;
  manager.addModel(ModelWith("1", "a", 1));
  manager.addModel(ModelWith("2", "b", 2));
  EXPECT_EQ(manager.getModel("2"), &manager.getModels()[1]);
  EXPECT_EQ(manager.getModel("3"), &manager.getModels()[0]);
  ASSERT_NE(manager.getMemoryType("2", "b"), nullptr);
  EXPECT_EQ(manager.getMemoryType("2", "b")->getMaxIndex(), 2);
  EXPECT_EQ(manager.getMemoryType("2", "a"), nullptr);
}

TEST(MemoryManager, StoredModelIsACopy) {
  MemoryManager manager;
  Model model = ModelWith("1", "a", 1);
  manager.addModel(model);
  MemoryType later;
  later.setName("late");
  model.addMemoryType(later);
  model.setMaxDatagramItems(8);
  EXPECT_EQ(manager.getMemoryType("1", "late"), nullptr);
  EXPECT_EQ(manager.getModel("1")->getMaxDatagramItems(), 0);
  EXPECT_EQ(manager.getModel("1")->getMemoryTypes().size(), 1U);
}
