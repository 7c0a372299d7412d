// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "HostTypes.h"
#include "IInterface.h"

// A tag: one addressed value of a protocol instance, made by the protocol's
// CreateTag from an address text and owned by the protocol until FreeTag (or
// until the protocol is deleted). A tag is used by one thread at a time, any
// of the host's tag threads; it must not be used after its protocol is
// deleted. The host reads the values below to size its buffers.
// Slots: two destructor slots, Clone, GetByteOffset, GetBitIndex, GetVarName,
// GetVarType, GetVarLength, GetItemType, PackedLen, ConvertVariable,
// IsReadOnly, IsWriteOnly. The framework's tag base appends Convert and
// DoConversion after these.
class ITag : public IInterface {
 public:
  // Deleting a tag directly is for clones only; a tag from CreateTag goes
  // back through FreeTag.
  virtual ~ITag() = default;
  // A copy of the tag, owned by the caller (delete it, or give it to
  // FreeTag); it is not in the protocol's tag list but still belongs to that
  // protocol's lifetime. Allocation failure throws std::bad_alloc.
  virtual ITag* Clone() const = 0;
  // Byte offset of the tag's first byte in its memory type.
  virtual int GetByteOffset() const = 0;
  // Bit number within the first byte, for bit tags; 0 otherwise.
  virtual int GetBitIndex() const = 0;
  // The address text the tag was created from; valid for the tag's life.
  virtual const char* GetVarName() const = 0;
  // The tag's host data type.
  virtual ICU_Type GetVarType() const = 0;
  // Length of the value in the host's buffer, in bytes (one byte per bit for
  // bit types): what Read writes and Write takes.
  virtual int GetVarLength() const = 0;
  // Element type of an array, ICU_NONE for a scalar.
  virtual ICU_Type GetItemType() const = 0;
  // Length of the value in the device's buffer, in bytes: what ReadBlock
  // reads for the tag.
  virtual int PackedLen() const = 0;
  // Converts one value between the host's representation (GetVarLength()
  // bytes) and the device's (PackedLen() bytes): src to dst, toward the
  // device when toDevice is set. False on a failed conversion, with dst left
  // as it was.
  virtual bool ConvertVariable(const unsigned char* src, unsigned char* dst,
                               bool toDevice) const = 0;
  // Whether the tag may only be read: a write fails.
  virtual bool IsReadOnly() const = 0;
  // Whether the tag is only for writing: a read gives no device value (this
  // driver reads zeros), so the host should not poll it.
  virtual bool IsWriteOnly() const = 0;

 protected:
  ITag() = default;
  ITag(const ITag&) = default;
  ITag& operator=(const ITag&) = default;
  ITag(ITag&&) = default;
  ITag& operator=(ITag&&) = default;
};
