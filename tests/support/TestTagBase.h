// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <initializer_list>
#include <string>
#include <vector>

#include "protlib/TagBase.h"

// A tag on the framework's tag base whose address properties are set directly
// by the test; conversion and the conversion chain are TagBase's own, and so
// is the packed length until setPackedLen fixes it (as a driver's tag may
// answer its own). An optional counter records each destruction, so tests can
// see how often a tag was deleted.
class TestTagBase final : public TagBase {
 public:
  TestTagBase() = default;
  TestTagBase(ICU_Type type, int varLength, ICU_Type itemType = ICU_NONE);
  TestTagBase(const TestTagBase&) = default;
  TestTagBase& operator=(const TestTagBase&) = delete;
  TestTagBase(TestTagBase&&) = delete;
  TestTagBase& operator=(TestTagBase&&) = delete;
  ~TestTagBase() override;

  ITag* Clone() const override;
  int GetByteOffset() const override { return byteOffset; }
  int GetBitIndex() const override { return bitIndex; }
  const char* GetVarName() const override { return varName.c_str(); }
  ICU_Type GetVarType() const override { return varType; }
  int GetVarLength() const override { return varLength; }
  ICU_Type GetItemType() const override { return itemType; }
  int PackedLen() const override;

  void setVarName(const std::string& name) { varName = name; }
  void setType(ICU_Type type, int length, ICU_Type item = ICU_NONE);
  void setByteOffset(int offset) { byteOffset = offset; }
  void setBitIndex(int index) { bitIndex = index; }
  // Fixes the packed length that PackedLen answers.
  void setPackedLen(int length);
  void setConversions(std::initializer_list<std::string> names) { conversions = names; }
  // The list that a data-type text's parameters are appended to.
  std::vector<std::string>& conversionList() { return conversions; }
  // Incremented by the destructor; null stops counting.
  void countDeletionsIn(int* counter) { deletions = counter; }

 private:
  std::string varName;
  ICU_Type varType = ICU_NONE;
  int varLength = 0;
  ICU_Type itemType = ICU_NONE;
  int byteOffset = 0;
  int bitIndex = 0;
  int packedLength = 0;
  bool packedLengthFixed = false;
  int* deletions = nullptr;
};
