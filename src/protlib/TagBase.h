// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

#include "ITag.h"

// The base of every tag a driver creates. It answers the parts of the host's
// tag interface that do not depend on the address (the derived tag supplies
// Clone to GetItemType), and adds the tag's chain of value conversions between
// the host's representation of a value and the device's: byte swaps, nibble
// swap, packed BCD, negation and inversion, named in the parenthesised list of
// the tag's data-type text ("unsignedInt-4(swap4,neg)"), plus the packing of
// bit tags. Slots after ITag's: Convert, then DoConversion.
//
// A tag is used by one thread at a time; its error text is written by const
// operations and is not guarded.
class TagBase : public ITag {
 public:
  ~TagBase() override = default;

  // For a bit type the number of device bytes that the bits touch
  // (GetLenOfBits(GetBitIndex(), GetVarLength())), otherwise GetVarLength().
  int PackedLen() const override;
  // Convert with the same arguments.
  bool ConvertVariable(const unsigned char* src, unsigned char* dst, bool toDevice) const override;
  bool IsReadOnly() const override { return false; }
  bool IsWriteOnly() const override { return false; }

  // Runs the conversion chain. Towards the device: GetVarLength() host bytes
  // of src are converted front to back and written to dst as PackedLen()
  // bytes (bit types: only the tag's bits of dst change). From the device:
  // PackedLen() bytes of src (bit types: one host byte per bit) are converted
  // back to front and written to dst as GetVarLength() bytes. On failure the
  // error text becomes "Conversion error at: " plus the failing name, dst is
  // left as it was and the result is false.
  virtual bool Convert(const unsigned char* src, unsigned char* dst, bool toDevice) const;
  // Applies one named conversion in place to the first GetVarLength() bytes
  // of buffer: "swapnibble", "swap2", "swap4", "swap8", "bcd", "neg" or "inv".
  // False for an unknown name or a value the conversion cannot take; a failed
  // conversion leaves buffer unchanged.
  virtual bool DoConversion(unsigned char* buffer, const char* name, bool toDevice) const;

  // Replaces the error text (null clears it).
  void SetError(const char* text) const;
  // The text of the last failure of this tag; empty until one happens.
  const std::string& GetError() const { return errorText; }
  // The conversion names, in the order in which they were written.
  const std::vector<std::string>& GetConversions() const { return conversions; }

 protected:
  TagBase() = default;
  TagBase(const TagBase&) = default;
  TagBase& operator=(const TagBase&) = default;
  TagBase(TagBase&&) = default;
  TagBase& operator=(TagBase&&) = default;

  // Filled by the derived tag when it parses its data-type text: the
  // data-type decoder appends to it in place, so derived tags reach it
  // directly.
  // NOLINTNEXTLINE(cppcoreguidelines-non-private-member-variables-in-classes)
  std::vector<std::string> conversions;

 private:
  bool runChain(unsigned char* work, bool toDevice) const;

  mutable std::string errorText;
};
