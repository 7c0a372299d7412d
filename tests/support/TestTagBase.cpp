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
