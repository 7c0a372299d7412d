// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Tag value conversion (TagBase::Convert and DoConversion) with fuzzed types,
// lengths, bit positions, conversion lists and values, and the bit packing
// beneath it. Nothing may be written past a value, a failed conversion must
// leave its destination alone, a bit tag must change only its own bits, and
// converting to the device and back must give the value again.
//
// Input: a type row, a count, a bit index, a conversion list (a count, then
// one choice per name, a free name being a length byte and its bytes), a
// flag byte (bit 0: an item type that does not fit the type), then the host
// value and device bytes.

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "FuzzInput.h"
#include "Require.h"
#include "TestTagBase.h"
#include "protlib/BitUtils.h"
#include "protlib/DataTypes.h"

namespace {

using Bytes = std::vector<unsigned char>;

const char* const kConversions[] = {"swapnibble", "swap2", "swap4", "swap8",
                                    "bcd",        "neg",   "inv",   ""};
constexpr std::size_t kKnownChoices = sizeof kConversions / sizeof kConversions[0];
constexpr int kLongestCount = 300;
constexpr std::size_t kCanary = 16;
constexpr unsigned char kCanaryByte = 0xC3;

Bytes WithCanary(const std::string& value, std::size_t length) {
  Bytes bytes(length + kCanary, kCanaryByte);
  std::fill(bytes.begin(), bytes.begin() + static_cast<std::ptrdiff_t>(length), 0);
  std::memcpy(bytes.data(), value.data(), std::min(value.size(), length));
  return bytes;
}

bool CanaryIntact(const Bytes& bytes, std::size_t length) {
  return std::all_of(bytes.begin() + static_cast<std::ptrdiff_t>(length), bytes.end(),
                     [](unsigned char b) { return b == kCanaryByte; });
}

bool Bit(const Bytes& bytes, int bit) {
  return (bytes[static_cast<std::size_t>(bit / 8)] >> (bit % 8) & 1) != 0;
}

bool HasConversion(const TestTagBase& tag, const char* name) {
  const auto& list = tag.GetConversions();
  return std::find(list.begin(), list.end(), name) != list.end();
}

void ConfigureTag(FuzzInput& input, TestTagBase& tag, bool& consistent) {
  const ProtUtilsN::DataTypeEntry& row = ProtUtilsN::DataTypes[input.Byte() % 27];
  const int count = input.IntInRange(0, kLongestCount);
  const int length = row.length != 0 ? row.length : ProtUtilsN::GetDataLength(row.itemType) * count;
  tag.setBitIndex(input.Byte() % 8);
  const int names = input.Byte() % 5;
  for (int i = 0; i < names; ++i) {
    const std::size_t choice = input.Byte() % (kKnownChoices + 1);
    tag.conversionList().push_back(choice < kKnownChoices ? std::string(kConversions[choice])
                                                          : input.ShortText(8));
  }
  consistent = (input.Byte() & 1) == 0;
  const auto itemType = consistent ? row.itemType : static_cast<ICU_Type>(input.Byte() % 30);
  tag.setType(row.type, length, itemType);
}

// Towards the device. Returns the device bytes when the conversion
// succeeded, else an empty vector.
Bytes CheckToDevice(const TestTagBase& tag, const Bytes& host, const std::string& device) {
  const int n = tag.GetVarLength();
  const int p = tag.PackedLen();
  Bytes out = WithCanary(device, static_cast<std::size_t>(p));
  const Bytes before = out;
  const bool converted = tag.Convert(host.data(), out.data(), true);
  Require(CanaryIntact(out, static_cast<std::size_t>(p)),
          "a conversion to the device writes no more than the packed length");
  if (!converted) {
    Require(out == before, "a failed conversion leaves the device bytes alone");
    Require(tag.GetError().rfind("Conversion error", 0) == 0, "a failed conversion says so");
    return Bytes();
  }
  if (ProtUtilsN::IsBitType(tag.GetVarType())) {
    const int first = tag.GetBitIndex();
    for (int bit = 0; bit < p * 8; ++bit) {
      if (bit < first || bit >= first + n) {
        Require(Bit(out, bit) == Bit(before, bit), "a bit tag changes only its own bits");
      }
    }
  }
  out.resize(static_cast<std::size_t>(p));
  return out;
}

void CheckRoundTrip(const TestTagBase& tag, const Bytes& host, const Bytes& device) {
  const auto n = static_cast<std::size_t>(tag.GetVarLength());
  Bytes back = WithCanary(std::string(), n);
  const bool converted = tag.Convert(device.data(), back.data(), false);
  Require(CanaryIntact(back, n), "a conversion from the device writes no more than the length");
  Require(converted, "what converts to the device converts back");
  const bool bits = ProtUtilsN::IsBitType(tag.GetVarType());
  for (std::size_t i = 0; i < n; ++i) {
    const unsigned char expected = bits ? (host[i] != 0 ? 1 : 0) : host[i];
    Require(back[i] == expected, "converting to the device and back gives the value again");
  }
}

void CheckFromDevice(const TestTagBase& tag, const std::string& device) {
  const auto n = static_cast<std::size_t>(tag.GetVarLength());
  const auto p = static_cast<std::size_t>(tag.PackedLen());
  Bytes src(std::max<std::size_t>(p, 1), 0);
  std::memcpy(src.data(), device.data(), std::min(device.size(), p));
  Bytes out = WithCanary(std::string(), n);
  const Bytes before = out;
  const bool converted = tag.Convert(src.data(), out.data(), false);
  Require(CanaryIntact(out, n), "a conversion from the device writes no more than the length");
  if (!converted) {
    Require(out == before, "a failed conversion leaves the host value alone");
  }
}

void CheckEachConversion(const TestTagBase& tag, const Bytes& host) {
  const auto n = static_cast<std::size_t>(tag.GetVarLength());
  for (const char* name : kConversions) {
    for (const bool toDevice : {true, false}) {
      Bytes buffer = host;
      buffer.resize(n);
      buffer.insert(buffer.end(), kCanary, kCanaryByte);
      const Bytes before = buffer;
      const bool converted = tag.DoConversion(buffer.data(), name, toDevice);
      Require(CanaryIntact(buffer, n), "a conversion stays within the value");
      if (!converted) {
        Require(buffer == before, "a failed conversion leaves the buffer alone");
      }
    }
  }
}

void CheckBitPacking(FuzzInput& input) {
  const int start = input.Byte() % 64;
  const int count = input.Byte() % 128;
  const int bytes = ProtUtilsN::GetLenOfBits(start, count) + start / 8;
  Bytes packed =
      WithCanary(input.Bytes(static_cast<std::size_t>(bytes)), static_cast<std::size_t>(bytes));
  const Bytes before = packed;
  Bytes unpacked = WithCanary(std::string(), static_cast<std::size_t>(count));
  ProtUtilsN::UnpackBits(unpacked.data(), packed.data(), start, count);
  Require(CanaryIntact(unpacked, static_cast<std::size_t>(count)),
          "unpacking writes one byte per bit");
  ProtUtilsN::PackBits(packed.data(), unpacked.data(), start, count);
  Require(packed == before, "packing what was unpacked changes nothing");
  Bytes copy =
      WithCanary(std::string(), static_cast<std::size_t>(ProtUtilsN::GetLenOfBits(start, count)));
  ProtUtilsN::CopyBits(copy.data(), packed.data(), start, count);
  Require(CanaryIntact(copy, static_cast<std::size_t>(ProtUtilsN::GetLenOfBits(start, count))),
          "copying bits stays within the bytes they touch");
  Bytes shifted = WithCanary(std::string(), static_cast<std::size_t>(count / 8 + 1));
  ProtUtilsN::shiftBits(shifted.data(), 0, packed.data(), start, count);
  Require(CanaryIntact(shifted, static_cast<std::size_t>(count / 8 + 1)),
          "shifting bits stays within the destination");
  for (int i = 0; i < count; ++i) {
    Require(Bit(shifted, i) == Bit(packed, start + i), "shifted bits keep their values");
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzInput input(data, size);
  TestTagBase tag;
  bool consistent = true;
  ConfigureTag(input, tag, consistent);
  CheckBitPacking(input);
  const auto n = static_cast<std::size_t>(tag.GetVarLength());
  const auto p = static_cast<std::size_t>(tag.PackedLen());
  // Exactly the value's length, so that reading past it is caught.
  Bytes host(std::max<std::size_t>(n, 1), 0);
  const std::string value = input.Bytes(n);
  std::memcpy(host.data(), value.data(), value.size());
  const std::string device = input.Bytes(p);

  const Bytes converted = CheckToDevice(tag, host, device);
  // A bit tag keeps one bit of each host byte, so a nibble swap or a
  // negation of those bytes cannot be undone from the bits.
  const bool bits = ProtUtilsN::IsBitType(tag.GetVarType());
  const bool reversible =
      consistent && !(bits && (HasConversion(tag, "swapnibble") || HasConversion(tag, "neg")));
  if (!converted.empty() && reversible) {
    CheckRoundTrip(tag, host, converted);
  }
  CheckFromDevice(tag, device);
  CheckEachConversion(tag, host);
  return 0;
}
