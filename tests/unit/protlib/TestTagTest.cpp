#include "TestTag.h"

#include <gtest/gtest.h>

#include <memory>

TEST(TestTag, PackedLengthFollowsBitRuleUntilSet) {
  TestTag tag(ICU_BOOLEAN_ARRAY, 3, ICU_BOOLEAN);
  tag.setBitIndex(6);
  EXPECT_EQ(tag.PackedLen(), 2);
  tag.setVarType(ICU_BYTE_ARRAY);
  EXPECT_EQ(tag.PackedLen(), 3);
  tag.setPackedLen(9);
  EXPECT_EQ(tag.PackedLen(), 9);
  tag.clearPackedLen();
  EXPECT_EQ(tag.PackedLen(), 3);
}

TEST(TestTag, ConvertVariableCopiesPackedLengthBytes) {
  TestTag tag(ICU_INT, 4);
  tag.setPackedLen(2);
  const unsigned char src[4] = {1, 2, 3, 4};
  unsigned char dst[4] = {9, 9, 9, 9};
  EXPECT_TRUE(tag.ConvertVariable(src, dst, true));
  EXPECT_EQ(dst[0], 1);
  EXPECT_EQ(dst[1], 2);
  EXPECT_EQ(dst[2], 9);
  EXPECT_EQ(tag.conversions(), 1);
  EXPECT_TRUE(tag.lastToDevice());
}

TEST(TestTag, CloneCopiesEveryProperty) {
  TestTag tag(ICU_STRING, 20, ICU_BYTE);
  tag.setVarName("1?tx_token?string-20");
  tag.setByteOffset(7);
  tag.setReadOnly(true);
  const std::unique_ptr<ITag> copy(tag.Clone());
  EXPECT_STREQ(copy->GetVarName(), "1?tx_token?string-20");
  EXPECT_EQ(copy->GetVarType(), ICU_STRING);
  EXPECT_EQ(copy->GetItemType(), ICU_BYTE);
  EXPECT_EQ(copy->GetVarLength(), 20);
  EXPECT_EQ(copy->GetByteOffset(), 7);
  EXPECT_TRUE(copy->IsReadOnly());
  EXPECT_FALSE(copy->IsWriteOnly());
}
