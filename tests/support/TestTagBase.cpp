// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "TestTagBase.h"

TestTagBase::TestTagBase(ICU_Type type, int length, ICU_Type item)
    : varType(type), varLength(length), itemType(item) {}

TestTagBase::~TestTagBase() {
  if (deletions != nullptr) {
    ++*deletions;
  }
}

ITag* TestTagBase::Clone() const { return new TestTagBase(*this); }

void TestTagBase::setType(ICU_Type type, int length, ICU_Type item) {
  varType = type;
  varLength = length;
  itemType = item;
}

int TestTagBase::PackedLen() const {
  return packedLengthFixed ? packedLength : TagBase::PackedLen();
}

void TestTagBase::setPackedLen(int length) {
  packedLength = length;
  packedLengthFixed = true;
}
