#pragma once

#include <string>

#include "ITag.h"

// A tag whose every property is set directly by the test. The packed length
// follows the framework's rule (bit type: the bytes that the bits touch, else
// the variable length) until setPackedLen fixes it. ConvertVariable copies
// PackedLen() bytes unchanged in either direction.
class TestTag final : public ITag {
 public:
  TestTag() = default;
  TestTag(ICU_Type type, int varLength, ICU_Type itemType = ICU_NONE);

  ITag* Clone() const override;
  int GetByteOffset() const override { return byteOffset_; }
  int GetBitIndex() const override { return bitIndex_; }
  const char* GetVarName() const override { return varName_.c_str(); }
  ICU_Type GetVarType() const override { return varType_; }
  int GetVarLength() const override { return varLength_; }
  ICU_Type GetItemType() const override { return itemType_; }
  int PackedLen() const override;
  bool ConvertVariable(const unsigned char* src, unsigned char* dst, bool toDevice) const override;
  bool IsReadOnly() const override { return readOnly_; }
  bool IsWriteOnly() const override { return writeOnly_; }

  void setVarName(const std::string& name) { varName_ = name; }
  void setVarType(ICU_Type type) { varType_ = type; }
  void setVarLength(int length) { varLength_ = length; }
  void setItemType(ICU_Type type) { itemType_ = type; }
  void setByteOffset(int offset) { byteOffset_ = offset; }
  void setBitIndex(int index) { bitIndex_ = index; }
  void setPackedLen(int length);
  // Returns PackedLen to the derived rule.
  void clearPackedLen() { packedLenSet_ = false; }
  void setReadOnly(bool readOnly) { readOnly_ = readOnly; }
  void setWriteOnly(bool writeOnly) { writeOnly_ = writeOnly; }

  // How many times ConvertVariable ran, and the direction of the last run.
  int conversions() const { return conversions_; }
  bool lastToDevice() const { return lastToDevice_; }

 private:
  std::string varName_;
  ICU_Type varType_ = ICU_NONE;
  int varLength_ = 0;
  ICU_Type itemType_ = ICU_NONE;
  int byteOffset_ = 0;
  int bitIndex_ = 0;
  int packedLen_ = 0;
  bool packedLenSet_ = false;
  bool readOnly_ = false;
  bool writeOnly_ = false;
  mutable int conversions_ = 0;
  mutable bool lastToDevice_ = false;
};
