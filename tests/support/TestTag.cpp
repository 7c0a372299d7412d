#include "TestTag.h"

#include <cstring>

#include "protlib/BitUtils.h"
#include "protlib/DataTypes.h"

TestTag::TestTag(ICU_Type type, int varLength, ICU_Type itemType)
    : varType_(type), varLength_(varLength), itemType_(itemType) {}

ITag* TestTag::Clone() const { return new TestTag(*this); }

int TestTag::PackedLen() const {
  if (packedLenSet_) {
    return packedLen_;
  }
  if (ProtUtilsN::IsBitType(varType_)) {
    return ProtUtilsN::GetLenOfBits(bitIndex_, varLength_);
  }
  return varLength_;
}

void TestTag::setPackedLen(int length) {
  packedLen_ = length;
  packedLenSet_ = true;
}

bool TestTag::ConvertVariable(const unsigned char* src, unsigned char* dst, bool toDevice) const {
  ++conversions_;
  lastToDevice_ = toDevice;
  const int length = PackedLen();
  if (src == nullptr || dst == nullptr || length < 0) {
    return false;
  }
  if (length > 0) {
    std::memmove(dst, src, static_cast<std::size_t>(length));
  }
  return true;
}
