// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/TagBase.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>

#include "protlib/BitUtils.h"
#include "protlib/DataTypes.h"
#include "protlib/ScratchBuffer.h"

namespace {

// Values up to this many bytes are converted without an allocation.
constexpr std::size_t kWorkBytes = 256;
// The longest item that "bcd" takes apart (GetDataLength never exceeds 10).
constexpr int kLongestItem = 16;

void SwapNibbles(unsigned char* buffer, int n) {
  for (int i = 0; i < n; ++i) {
    buffer[i] = static_cast<unsigned char>((buffer[i] << 4) | (buffer[i] >> 4));
  }
}

// Reverses the byte order of each consecutive group; n must be a multiple of
// the group size.
bool ReverseGroups(unsigned char* buffer, int n, int group) {
  if (n % group != 0) {
    return false;
  }
  for (int start = 0; start < n; start += group) {
    std::reverse(buffer + start, buffer + start + group);
  }
  return true;
}

bool IsBcd(const unsigned char* bytes, int length) {
  for (int i = 0; i < length; ++i) {
    if ((bytes[i] >> 4) > 9 || (bytes[i] & 0x0F) > 9) {
      return false;
    }
  }
  return true;
}

// Packed BCD (lowest two digits in the first byte) to an unsigned
// little-endian integer of the same length. 100^L is below 256^L, so the
// value always fits its item; it is built exactly, byte by byte, from the
// most significant digit pair down.
void BcdToBinary(unsigned char* item, int length) {
  std::array<unsigned char, kLongestItem> value{};
  for (int i = length - 1; i >= 0; --i) {
    auto carry = static_cast<unsigned>((item[i] >> 4) * 10 + (item[i] & 0x0F));
    for (int k = 0; k < length; ++k) {
      const unsigned product = value[static_cast<std::size_t>(k)] * 100U + carry;
      value[static_cast<std::size_t>(k)] = static_cast<unsigned char>(product & 0xFFU);
      carry = product >> 8;
    }
  }
  std::memcpy(item, value.data(), static_cast<std::size_t>(length));
}

std::uint32_t LittleEndian(const unsigned char* item, int length) {
  std::uint32_t value = 0;
  for (int i = length - 1; i >= 0; --i) {
    value = (value << 8) | item[i];
  }
  return value;
}

// The largest value that length bytes of packed BCD hold (length 1 to 4).
std::uint32_t LargestBcd(int length) {
  std::uint32_t limit = 1;
  for (int i = 0; i < length; ++i) {
    limit *= 100;
  }
  return limit - 1;
}

void BinaryToBcd(unsigned char* item, int length) {
  std::uint32_t value = LittleEndian(item, length);
  for (int i = 0; i < length; ++i) {
    const std::uint32_t units = value % 10;
    value /= 10;
    const std::uint32_t tens = value % 10;
    value /= 10;
    item[i] = static_cast<unsigned char>((tens << 4) | units);
  }
}

// "bcd" on every whole item of the n bytes. Every item is checked before any
// is changed, so a failure leaves the buffer as it was.
bool Bcd(unsigned char* buffer, int n, int itemLength, bool toDevice) {
  if (itemLength < 1 || n / itemLength < 1) {
    return true;
  }
  if (itemLength > kLongestItem || (toDevice && itemLength > 4)) {
    return false;
  }
  const int items = n / itemLength;
  for (int i = 0; i < items; ++i) {
    const unsigned char* item = buffer + static_cast<std::ptrdiff_t>(i) * itemLength;
    const bool fits = toDevice ? LittleEndian(item, itemLength) <= LargestBcd(itemLength)
                               : IsBcd(item, itemLength);
    if (!fits) {
      return false;
    }
  }
  for (int i = 0; i < items; ++i) {
    unsigned char* item = buffer + static_cast<std::ptrdiff_t>(i) * itemLength;
    if (toDevice) {
      BinaryToBcd(item, itemLength);
    } else {
      BcdToBinary(item, itemLength);
    }
  }
  return true;
}

template <typename Bits>
void NegateInteger(unsigned char* item) {
  Bits value;
  std::memcpy(&value, item, sizeof value);
  value = static_cast<Bits>(Bits{0} - value);
  std::memcpy(item, &value, sizeof value);
}

template <typename Bits>
void FlipSign(unsigned char* item) {
  Bits value;
  std::memcpy(&value, item, sizeof value);
  value ^= static_cast<Bits>(Bits{1} << (8 * sizeof(Bits) - 1));
  std::memcpy(item, &value, sizeof value);
}

// The size of one item that "neg" negates; 0 for a type it does not take.
int NegatedItemSize(ICU_Type basic) {
  switch (basic) {
    case ICU_BYTE:
      return 1;
    case ICU_SHORT:
      return 2;
    case ICU_INT:
    case ICU_FLOAT:
      return 4;
    case ICU_DOUBLE:
    case ICU_INT64:
      return 8;
    default:
      return 0;
  }
}

void NegateItem(ICU_Type basic, unsigned char* item) {
  switch (basic) {
    case ICU_BYTE:
      NegateInteger<std::uint8_t>(item);
      break;
    case ICU_SHORT:
      NegateInteger<std::uint16_t>(item);
      break;
    case ICU_INT:
      NegateInteger<std::uint32_t>(item);
      break;
    case ICU_INT64:
      NegateInteger<std::uint64_t>(item);
      break;
    case ICU_FLOAT:
      FlipSign<std::uint32_t>(item);
      break;
    case ICU_DOUBLE:
      FlipSign<std::uint64_t>(item);
      break;
    default:
      break;
  }
}

// "neg": byte negates each of count bytes. The wider types negate the item at
// byte position 0 and step the position by the item size while it stays below
// the item count, so an array of N items has only the items at byte positions
// below N negated (of 8 ints, the first two). That bound is deliberate and
// kept. Integers negate in two's complement, floating values by their sign
// bit. An item that would reach past the n bytes fails the conversion.
bool Negate(unsigned char* buffer, int n, ICU_Type basic, int count) {
  const int size = NegatedItemSize(basic);
  if (size == 0) {
    return false;
  }
  if (count < 1) {
    return true;
  }
  // The last position negated is the largest multiple of the size below
  // count (for byte: count - 1).
  const long long last = (static_cast<long long>(count) - 1) / size * size;
  if (last + size > n) {
    return false;
  }
  for (long long position = 0; position <= last; position += size) {
    NegateItem(basic, buffer + position);
  }
  return true;
}

bool TakesBitwiseInversion(ICU_Type basic) {
  return basic == ICU_UNSIGNED_BYTE || basic == ICU_UNSIGNED_SHORT || basic == ICU_UNSIGNED_INT ||
         basic == ICU_BINARY || basic == ICU_UINT64;
}

}  // namespace

int TagBase::PackedLen() const {
  if (ProtUtilsN::IsBitType(GetVarType())) {
    return ProtUtilsN::GetLenOfBits(GetBitIndex(), GetVarLength());
  }
  return GetVarLength();
}

bool TagBase::ConvertVariable(const unsigned char* src, unsigned char* dst, bool toDevice) const {
  return Convert(src, dst, toDevice);
}

bool TagBase::Convert(const unsigned char* src, unsigned char* dst, bool toDevice) const {
  const int n = GetVarLength();
  const int p = PackedLen();
  if (src == nullptr || dst == nullptr) {
    SetError("Conversion error: no buffer");
    return false;
  }
  if (n < 0 || p < 0) {
    SetError("Conversion error: invalid length");
    return false;
  }
  ScratchBuffer<kWorkBytes> work(std::max(n, p));
  const bool bits = ProtUtilsN::IsBitType(GetVarType());
  if (toDevice) {
    std::memcpy(work.data(), src, static_cast<std::size_t>(n));
    if (!runChain(work.data(), true)) {
      return false;
    }
    if (bits) {
      ProtUtilsN::PackBits(dst, work.data(), GetBitIndex(), n);
    } else {
      std::memcpy(dst, work.data(), static_cast<std::size_t>(p));
    }
    return true;
  }
  if (bits) {
    ProtUtilsN::UnpackBits(work.data(), src, GetBitIndex(), n);
  } else {
    std::memcpy(work.data(), src, static_cast<std::size_t>(p));
  }
  if (!runChain(work.data(), false)) {
    return false;
  }
  std::memcpy(dst, work.data(), static_cast<std::size_t>(n));
  return true;
}

// Towards the device the conversions run in the order written; from the
// device they are undone in the reverse order.
bool TagBase::runChain(unsigned char* work, bool toDevice) const {
  const auto apply = [&](const std::string& name) {
    if (DoConversion(work, name.c_str(), toDevice)) {
      return true;
    }
    SetError(("Conversion error at: " + name).c_str());
    return false;
  };
  if (toDevice) {
    return std::all_of(conversions.begin(), conversions.end(), apply);
  }
  return std::all_of(conversions.rbegin(), conversions.rend(), apply);
}

bool TagBase::DoConversion(unsigned char* buffer, const char* name, bool toDevice) const {
  const int n = GetVarLength();
  if (buffer == nullptr || name == nullptr || n < 0) {
    return false;
  }
  const auto is = [name](const char* known) { return std::strcmp(name, known) == 0; };
  if (is("swapnibble")) {
    SwapNibbles(buffer, n);
    return true;
  }
  if (is("swap2")) {
    return ReverseGroups(buffer, n, 2);
  }
  if (is("swap4")) {
    return ReverseGroups(buffer, n, 4);
  }
  if (is("swap8")) {
    return ReverseGroups(buffer, n, 8);
  }
  if (is("bcd")) {
    return Bcd(buffer, n, ProtUtilsN::GetBasicLength(this), toDevice);
  }
  if (is("neg")) {
    return Negate(buffer, n, ProtUtilsN::GetBasicType(this), ProtUtilsN::GetItemCount(this));
  }
  if (is("inv")) {
    if (ProtUtilsN::IsBitType(GetVarType())) {
      std::transform(buffer, buffer + n, buffer,
                     [](unsigned char b) { return static_cast<unsigned char>(b == 0 ? 1 : 0); });
      return true;
    }
    if (TakesBitwiseInversion(ProtUtilsN::GetBasicType(this))) {
      std::transform(buffer, buffer + n, buffer,
                     [](unsigned char b) { return static_cast<unsigned char>(~b); });
      return true;
    }
    return false;
  }
  return false;
}

void TagBase::SetError(const char* text) const { errorText = text == nullptr ? "" : text; }
