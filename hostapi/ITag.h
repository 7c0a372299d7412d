// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "HostTypes.h"
#include "IInterface.h"

// A tag: one addressed value of a protocol instance.
// Slots: two destructor slots, Clone, GetByteOffset, GetBitIndex, GetVarName,
// GetVarType, GetVarLength, GetItemType, PackedLen, ConvertVariable,
// IsReadOnly, IsWriteOnly. The framework's tag base appends Convert and
// DoConversion after these.
class ITag : public IInterface {
 public:
  virtual ~ITag() = default;
  virtual ITag* Clone() const = 0;
  // Byte offset of the tag's first byte in its memory type.
  virtual int GetByteOffset() const = 0;
  // Bit number within the first byte, for bit tags.
  virtual int GetBitIndex() const = 0;
  // The address text the tag was created from.
  virtual const char* GetVarName() const = 0;
  virtual ICU_Type GetVarType() const = 0;
  // Length of the value in the host's buffer, in bytes (one byte per bit for
  // bit types).
  virtual int GetVarLength() const = 0;
  // Element type of an array, ICU_NONE for a scalar.
  virtual ICU_Type GetItemType() const = 0;
  // Length of the value in the device's buffer, in bytes.
  virtual int PackedLen() const = 0;
  // Converts between the host's representation and the device's.
  virtual bool ConvertVariable(const unsigned char* src, unsigned char* dst,
                               bool toDevice) const = 0;
  virtual bool IsReadOnly() const = 0;
  virtual bool IsWriteOnly() const = 0;

 protected:
  ITag() = default;
  ITag(const ITag&) = default;
  ITag& operator=(const ITag&) = default;
  ITag(ITag&&) = default;
  ITag& operator=(ITag&&) = default;
};
