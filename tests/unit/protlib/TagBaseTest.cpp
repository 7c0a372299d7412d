// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/TagBase.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <limits>
#include <memory>
#include <string>
#include <vector>

#include "TestTagBase.h"
#include "protlib/DataTypes.h"

namespace {

using Bytes = std::vector<unsigned char>;

Bytes Le16(std::uint16_t value) {
  return {static_cast<unsigned char>(value & 0xFF), static_cast<unsigned char>(value >> 8)};
}

template <typename T>
Bytes BytesOf(const std::vector<T>& values) {
  Bytes bytes(values.size() * sizeof(T));
  std::memcpy(bytes.data(), values.data(), bytes.size());
  return bytes;
}

template <typename T>
std::vector<T> ValuesOf(const Bytes& bytes) {
  std::vector<T> values(bytes.size() / sizeof(T));
  std::memcpy(values.data(), bytes.data(), values.size() * sizeof(T));
  return values;
}

// Host to device with the tag's chain; dst starts as fill.
Bytes ToDevice(const TagBase& tag, const Bytes& host, unsigned char fill = 0xEE,
               bool* ok = nullptr) {
  Bytes device(static_cast<std::size_t>(tag.PackedLen()), fill);
  const bool converted = tag.ConvertVariable(host.data(), device.data(), true);
  if (ok != nullptr) {
    *ok = converted;
  }
  return device;
}

Bytes ToHost(const TagBase& tag, const Bytes& device, unsigned char fill = 0xEE,
             bool* ok = nullptr) {
  Bytes host(static_cast<std::size_t>(tag.GetVarLength()), fill);
  const bool converted = tag.ConvertVariable(device.data(), host.data(), false);
  if (ok != nullptr) {
    *ok = converted;
  }
  return host;
}

// A tag whose Convert is replaced, to see ConvertVariable go through it.
class RecordingConvertTag final : public TagBase {
 public:
  ITag* Clone() const override { return nullptr; }
  int GetByteOffset() const override { return 0; }
  int GetBitIndex() const override { return 0; }
  const char* GetVarName() const override { return "x"; }
  ICU_Type GetVarType() const override { return ICU_INT; }
  int GetVarLength() const override { return 4; }
  ICU_Type GetItemType() const override { return ICU_NONE; }
  bool Convert(const unsigned char* /*src*/, unsigned char* /*dst*/, bool toDevice) const override {
    ++calls;
    lastToDevice = toDevice;
    return false;
  }
  mutable int calls = 0;
  mutable bool lastToDevice = false;
};

// A tag whose DoConversion knows one extra name, to see Convert call the
// chain through the vtable.
class ExtraConversionTag final : public TagBase {
 public:
  explicit ExtraConversionTag(std::vector<std::string> names) { conversions = std::move(names); }
  ITag* Clone() const override { return nullptr; }
  int GetByteOffset() const override { return 0; }
  int GetBitIndex() const override { return 0; }
  const char* GetVarName() const override { return "x"; }
  ICU_Type GetVarType() const override { return ICU_UNSIGNED_BYTE; }
  int GetVarLength() const override { return 1; }
  ICU_Type GetItemType() const override { return ICU_NONE; }
  bool DoConversion(unsigned char* buffer, const char* name, bool toDevice) const override {
    if (std::strcmp(name, "plus1") == 0) {
      buffer[0] = static_cast<unsigned char>(toDevice ? buffer[0] + 1 : buffer[0] - 1);
      return true;
    }
    return TagBase::DoConversion(buffer, name, toDevice);
  }
};

}  // namespace

// --- the tag base's own answers ---

TEST(TagBase, StartsWithoutErrorAndAnswersNotReadOnlyNotWriteOnly) {
  const TestTagBase tag(ICU_INT, 4);
  EXPECT_EQ(tag.GetError(), "");
  EXPECT_FALSE(tag.IsReadOnly());
  EXPECT_FALSE(tag.IsWriteOnly());
  EXPECT_TRUE(tag.GetConversions().empty());
}

TEST(TagBase, SetErrorReplacesTheTextAndNullClearsIt) {
  const TestTagBase tag(ICU_INT, 4);
  tag.SetError("first");
  tag.SetError("second");
  EXPECT_EQ(tag.GetError(), "second");
  tag.SetError(nullptr);
  EXPECT_EQ(tag.GetError(), "");
}

TEST(TagBase, ConversionsKeepTheWrittenOrder) {
  TestTagBase tag(ICU_UNSIGNED_INT_ARRAY, 16, ICU_UNSIGNED_INT);
  ICU_Type type = ICU_NONE;
  ICU_Type item = ICU_NONE;
  int length = 0;
  ASSERT_TRUE(ProtUtilsN::GetTAVUType("unsignedInt-4(swap4, neg ,inv)", type, item, length,
                                      tag.conversionList()));
  EXPECT_EQ(tag.GetConversions(), (std::vector<std::string>{"swap4", "neg", "inv"}));
}

TEST(TagBase, PackedLengthOfAValueIsItsVariableLength) {
  EXPECT_EQ(TestTagBase(ICU_INT, 4).PackedLen(), 4);
  EXPECT_EQ(TestTagBase(ICU_STRING, 20, ICU_BYTE).PackedLen(), 20);
  EXPECT_EQ(TestTagBase(ICU_OBJECT, 0).PackedLen(), 0);
}

TEST(TagBase, PackedLengthOfBitsIsTheBytesTheyTouch) {
  TestTagBase bits(ICU_BOOLEAN_ARRAY, 3, ICU_BOOLEAN);
  bits.setBitIndex(6);
  EXPECT_EQ(bits.PackedLen(), 2);
  bits.setBitIndex(0);
  EXPECT_EQ(bits.PackedLen(), 1);
  TestTagBase one(ICU_BOOLEAN, 1);
  one.setBitIndex(7);
  EXPECT_EQ(one.PackedLen(), 1);
  TestTagBase nine(ICU_BOOLEAN_ARRAY, 9, ICU_BOOLEAN);
  nine.setBitIndex(7);  // bits 7 to 15
  EXPECT_EQ(nine.PackedLen(), 2);
  TestTagBase ten(ICU_BOOLEAN_ARRAY, 10, ICU_BOOLEAN);
  ten.setBitIndex(7);  // bits 7 to 16
  EXPECT_EQ(ten.PackedLen(), 3);
}

TEST(TagBase, ConvertVariableGoesThroughConvert) {
  const RecordingConvertTag tag;
  unsigned char src[4] = {};
  unsigned char dst[4] = {};
  EXPECT_FALSE(tag.ConvertVariable(src, dst, true));
  EXPECT_EQ(tag.calls, 1);
  EXPECT_TRUE(tag.lastToDevice);
  EXPECT_FALSE(tag.ConvertVariable(src, dst, false));
  EXPECT_EQ(tag.calls, 2);
  EXPECT_FALSE(tag.lastToDevice);
}

TEST(TagBase, ConvertCallsTheChainThroughDoConversion) {
  const ExtraConversionTag tag({"plus1", "inv"});
  bool ok = false;
  const Bytes device = ToDevice(tag, {0x10}, 0x00, &ok);
  EXPECT_TRUE(ok);
  EXPECT_EQ(device, Bytes{0xEE});  // 0x10 + 1 = 0x11, inverted 0xEE
  EXPECT_EQ(ToHost(tag, device, 0x00), Bytes{0x10});
}

// --- the chain ---

TEST(TagBaseConvert, WithoutConversionsCopiesTheValue) {
  const TestTagBase tag(ICU_INT, 4);
  EXPECT_EQ(ToDevice(tag, {1, 2, 3, 4}), (Bytes{1, 2, 3, 4}));
  EXPECT_EQ(ToHost(tag, {5, 6, 7, 8}), (Bytes{5, 6, 7, 8}));
}

TEST(TagBaseConvert, ChainRunsForwardToTheDeviceAndBackwardFromIt) {
  // swap2 then neg on the value 1: 0x0001 -> 0x0100 -> -256 (0xFF00).
  TestTagBase tag(ICU_SHORT, 2);
  tag.setConversions({"swap2", "neg"});
  const Bytes device = ToDevice(tag, Le16(1));
  EXPECT_EQ(device, (Bytes{0x00, 0xFF}));
  // Undone neg first (256), swap2 second (1). The other order would give -255.
  EXPECT_EQ(ToHost(tag, device), Le16(1));
}

TEST(TagBaseConvert, SwapTwoOnAThreeByteStringFailsNamingIt) {
  TestTagBase tag(ICU_STRING, 3, ICU_BYTE);
  tag.setConversions({"swap2"});
  bool ok = true;
  EXPECT_EQ(ToDevice(tag, {'a', 'b', 'c'}, 0x55, &ok), (Bytes{0x55, 0x55, 0x55}));
  EXPECT_FALSE(ok);
  EXPECT_EQ(tag.GetError(), "Conversion error at: swap2");
  tag.SetError(nullptr);
  EXPECT_EQ(ToHost(tag, {'a', 'b', 'c'}, 0x55, &ok), (Bytes{0x55, 0x55, 0x55}));
  EXPECT_FALSE(ok);
  EXPECT_EQ(tag.GetError(), "Conversion error at: swap2");
}

TEST(TagBaseConvert, UnknownNameFailsNamingIt) {
  TestTagBase tag(ICU_INT, 4);
  tag.setConversions({"swap4", "swap3"});
  bool ok = true;
  EXPECT_EQ(ToDevice(tag, {1, 2, 3, 4}, 0x00, &ok), (Bytes{0, 0, 0, 0}));
  EXPECT_FALSE(ok);
  EXPECT_EQ(tag.GetError(), "Conversion error at: swap3");
}

TEST(TagBaseConvert, NamesAreCaseSensitive) {
  TestTagBase tag(ICU_SHORT, 2);
  tag.setConversions({"Swap2"});
  bool ok = true;
  EXPECT_EQ(ToDevice(tag, {1, 2}, 0, &ok), (Bytes{0, 0}));
  EXPECT_FALSE(ok);
  EXPECT_EQ(tag.GetError(), "Conversion error at: Swap2");
}

TEST(TagBaseConvert, FirstFailureStopsTheChain) {
  TestTagBase tag(ICU_STRING, 3, ICU_BYTE);
  tag.setConversions({"swap4", "swap2"});
  bool ok = true;
  EXPECT_EQ(ToDevice(tag, {1, 2, 3}, 0, &ok), (Bytes{0, 0, 0}));
  EXPECT_FALSE(ok);
  EXPECT_EQ(tag.GetError(), "Conversion error at: swap4");
}

TEST(TagBaseConvert, SuccessLeavesAnEarlierErrorText) {
  TestTagBase tag(ICU_SHORT, 2);
  tag.SetError("earlier");
  tag.setConversions({"swap2"});
  EXPECT_EQ(ToDevice(tag, {1, 2}), (Bytes{2, 1}));
  EXPECT_EQ(tag.GetError(), "earlier");
}

TEST(TagBaseConvert, NullBuffersFail) {
  const TestTagBase tag(ICU_INT, 4);
  unsigned char bytes[4] = {};
  EXPECT_FALSE(tag.Convert(nullptr, bytes, true));
  EXPECT_EQ(tag.GetError(), "Conversion error: no buffer");
  tag.SetError(nullptr);
  EXPECT_FALSE(tag.Convert(bytes, nullptr, false));
  EXPECT_EQ(tag.GetError(), "Conversion error: no buffer");
}

TEST(TagBaseConvert, NegativeLengthFails) {
  const TestTagBase tag(ICU_STRING, -2, ICU_BYTE);
  unsigned char bytes[4] = {};
  EXPECT_FALSE(tag.Convert(bytes, bytes, true));
  EXPECT_EQ(tag.GetError(), "Conversion error: invalid length");
}

TEST(TagBaseConvert, ValuesLongerThanTheFixedWorkBufferConvert) {
  TestTagBase tag(ICU_BINARY, 300, ICU_UNSIGNED_BYTE);
  tag.setConversions({"swap2", "inv"});
  Bytes host(300);
  for (std::size_t i = 0; i < host.size(); ++i) {
    host[i] = static_cast<unsigned char>(i * 7);
  }
  const Bytes device = ToDevice(tag, host);
  ASSERT_EQ(device.size(), 300U);
  for (std::size_t i = 0; i < host.size(); ++i) {
    EXPECT_EQ(device[i], static_cast<unsigned char>(~host[i ^ 1U])) << i;
  }
  EXPECT_EQ(ToHost(tag, device), host);
}

TEST(TagBaseConvert, LongValueFailureLeavesDestination) {
  TestTagBase tag(ICU_BINARY, 301, ICU_UNSIGNED_BYTE);
  tag.setConversions({"swap2"});
  bool ok = true;
  EXPECT_EQ(ToDevice(tag, Bytes(301, 1), 0x77, &ok), Bytes(301, 0x77));
  EXPECT_FALSE(ok);
}

// --- bit tags ---

TEST(TagBaseBits, ThreeBitsAtBitSixChangeOnlyTheirBits) {
  TestTagBase tag(ICU_BOOLEAN_ARRAY, 3, ICU_BOOLEAN);
  tag.setBitIndex(6);
  EXPECT_EQ(tag.PackedLen(), 2);
  Bytes device{0x00, 0x00};
  ASSERT_TRUE(tag.ConvertVariable(Bytes{1, 1, 1}.data(), device.data(), true));
  EXPECT_EQ(device, (Bytes{0xC0, 0x01}));
  device = {0xFF, 0xFF};
  ASSERT_TRUE(tag.ConvertVariable(Bytes{0, 0, 0}.data(), device.data(), true));
  EXPECT_EQ(device, (Bytes{0x3F, 0xFE}));
  device = {0x2A, 0xF0};
  ASSERT_TRUE(tag.ConvertVariable(Bytes{0, 1, 0}.data(), device.data(), true));
  EXPECT_EQ(device, (Bytes{0xAA, 0xF0}));
}

TEST(TagBaseBits, ReadingUnpacksOneHostBytePerBit) {
  TestTagBase tag(ICU_BOOLEAN_ARRAY, 3, ICU_BOOLEAN);
  tag.setBitIndex(6);
  EXPECT_EQ(ToHost(tag, {0x80, 0x01}), (Bytes{0, 1, 1}));
  EXPECT_EQ(ToHost(tag, {0x7F, 0xFE}), (Bytes{1, 0, 0}));
}

TEST(TagBaseBits, InvertedBitIsStoredInverted) {
  TestTagBase tag(ICU_BOOLEAN, 1);
  tag.setBitIndex(3);
  tag.setConversions({"inv"});
  Bytes device{0x00};
  ASSERT_TRUE(tag.ConvertVariable(Bytes{0}.data(), device.data(), true));
  EXPECT_EQ(device, Bytes{0x08});
  EXPECT_EQ(ToHost(tag, {0x08}), Bytes{0});
  EXPECT_EQ(ToHost(tag, {0xF7}), Bytes{1});
}

// --- the single conversions ---

TEST(DoConversion, SwapNibbleExchangesTheNibblesOfEveryByte) {
  const TestTagBase tag(ICU_BINARY, 3, ICU_UNSIGNED_BYTE);
  Bytes value{0x12, 0xAB, 0xF0, 0x99};
  EXPECT_TRUE(tag.DoConversion(value.data(), "swapnibble", true));
  EXPECT_EQ(value, (Bytes{0x21, 0xBA, 0x0F, 0x99}));
}

TEST(DoConversion, SwapTwoExchangesEachPair) {
  const TestTagBase tag(ICU_SHORT_ARRAY, 4, ICU_SHORT);
  Bytes value{1, 2, 3, 4};
  EXPECT_TRUE(tag.DoConversion(value.data(), "swap2", false));
  EXPECT_EQ(value, (Bytes{2, 1, 4, 3}));
}

TEST(DoConversion, SwapFourReversesEachGroupOfFour) {
  const TestTagBase tag(ICU_INT_ARRAY, 8, ICU_INT);
  Bytes value{1, 2, 3, 4, 5, 6, 7, 8};
  EXPECT_TRUE(tag.DoConversion(value.data(), "swap4", true));
  EXPECT_EQ(value, (Bytes{4, 3, 2, 1, 8, 7, 6, 5}));
  const TestTagBase six(ICU_SHORT_ARRAY, 6, ICU_SHORT);
  Bytes odd{1, 2, 3, 4, 5, 6};
  EXPECT_FALSE(six.DoConversion(odd.data(), "swap4", true));
  EXPECT_EQ(odd, (Bytes{1, 2, 3, 4, 5, 6}));
}

TEST(DoConversion, SwapEightReversesEachGroupOfEight) {
  const TestTagBase tag(ICU_DOUBLE, 8);
  Bytes value{1, 2, 3, 4, 5, 6, 7, 8};
  EXPECT_TRUE(tag.DoConversion(value.data(), "swap8", true));
  EXPECT_EQ(value, (Bytes{8, 7, 6, 5, 4, 3, 2, 1}));
  const TestTagBase four(ICU_INT, 4);
  Bytes short4{1, 2, 3, 4};
  EXPECT_FALSE(four.DoConversion(short4.data(), "swap8", true));
  EXPECT_EQ(short4, (Bytes{1, 2, 3, 4}));
}

TEST(DoConversion, EverySwapOfNothingSucceeds) {
  const TestTagBase tag(ICU_STRING, 0, ICU_BYTE);
  unsigned char canary = 0x5A;
  for (const char* name : {"swapnibble", "swap2", "swap4", "swap8"}) {
    EXPECT_TRUE(tag.DoConversion(&canary, name, true)) << name;
  }
  EXPECT_EQ(canary, 0x5A);
}

TEST(DoConversion, UnknownNameFailsAndLeavesTheBuffer) {
  const TestTagBase tag(ICU_INT, 4);
  Bytes value{1, 2, 3, 4};
  EXPECT_FALSE(tag.DoConversion(value.data(), "swap3", true));
  EXPECT_FALSE(tag.DoConversion(value.data(), "", true));
  EXPECT_FALSE(tag.DoConversion(value.data(), "swap2 ", true));
  EXPECT_FALSE(tag.DoConversion(value.data(), nullptr, true));
  EXPECT_EQ(value, (Bytes{1, 2, 3, 4}));
}

TEST(DoConversionBcd, TwelveThirtyFourAsTwoBytes) {
  TestTagBase tag(ICU_UNSIGNED_SHORT, 2);
  tag.setConversions({"bcd"});
  const Bytes device = ToDevice(tag, Le16(1234));
  EXPECT_EQ(device, (Bytes{0x34, 0x12}));
  EXPECT_EQ(ToHost(tag, device), Le16(1234));
}

TEST(DoConversionBcd, NibbleAboveNineFailsOnReading) {
  TestTagBase tag(ICU_UNSIGNED_BYTE, 1);
  tag.setConversions({"bcd"});
  bool ok = true;
  EXPECT_EQ(ToHost(tag, {0x1A}, 0x33, &ok), Bytes{0x33});
  EXPECT_FALSE(ok);
  EXPECT_EQ(tag.GetError(), "Conversion error at: bcd");
  EXPECT_EQ(ToHost(tag, {0xA1}, 0x33, &ok), Bytes{0x33});
  EXPECT_FALSE(ok);
  EXPECT_EQ(ToHost(tag, {0x99}, 0x33, &ok), Bytes{99});
  EXPECT_TRUE(ok);
}

TEST(DoConversionBcd, TenThousandInTwoBytesFailsOnWriting) {
  TestTagBase tag(ICU_UNSIGNED_SHORT, 2);
  tag.setConversions({"bcd"});
  bool ok = true;
  EXPECT_EQ(ToDevice(tag, Le16(10000), 0x44, &ok), (Bytes{0x44, 0x44}));
  EXPECT_FALSE(ok);
  EXPECT_EQ(tag.GetError(), "Conversion error at: bcd");
  EXPECT_EQ(ToDevice(tag, Le16(9999), 0x44, &ok), (Bytes{0x99, 0x99}));
  EXPECT_TRUE(ok);
}

TEST(DoConversionBcd, LimitsOfOneThreeAndFourBytes) {
  const TestTagBase one(ICU_UNSIGNED_BYTE, 1);
  Bytes value{99};
  EXPECT_TRUE(one.DoConversion(value.data(), "bcd", true));
  EXPECT_EQ(value, Bytes{0x99});
  value = {100};
  EXPECT_FALSE(one.DoConversion(value.data(), "bcd", true));
  EXPECT_EQ(value, Bytes{100});

  const TestTagBase four(ICU_UNSIGNED_INT, 4);
  value = {78, 97, 188, 0};  // 12345678
  EXPECT_TRUE(four.DoConversion(value.data(), "bcd", true));
  EXPECT_EQ(value, (Bytes{0x78, 0x56, 0x34, 0x12}));
  EXPECT_TRUE(four.DoConversion(value.data(), "bcd", false));
  EXPECT_EQ(value, (Bytes{78, 97, 188, 0}));
  value = {0xFF, 0xE0, 0xF5, 0x05};  // 99999999
  EXPECT_TRUE(four.DoConversion(value.data(), "bcd", true));
  EXPECT_EQ(value, (Bytes{0x99, 0x99, 0x99, 0x99}));
  value = {0x00, 0xE1, 0xF5, 0x05};  // 100000000
  EXPECT_FALSE(four.DoConversion(value.data(), "bcd", true));
  EXPECT_EQ(value, (Bytes{0x00, 0xE1, 0xF5, 0x05}));
}

TEST(DoConversionBcd, ItemsLongerThanFourBytesFailOnWritingOnly) {
  const TestTagBase tag(ICU_UINT64, 8);
  Bytes value(8, 0);
  value[0] = 5;
  EXPECT_FALSE(tag.DoConversion(value.data(), "bcd", true));
  EXPECT_EQ(value, (Bytes{5, 0, 0, 0, 0, 0, 0, 0}));
  value = Bytes(8, 0x99);  // 9999999999999999
  EXPECT_TRUE(tag.DoConversion(value.data(), "bcd", false));
  EXPECT_EQ(value, (Bytes{255, 255, 192, 111, 242, 134, 35, 0}));
}

TEST(DoConversionBcd, TenByteItemReadsExactly) {
  const TestTagBase tag(ICU_TIME, 10);
  Bytes value(10, 0x99);  // 10^20 - 1 needs 67 bits
  EXPECT_TRUE(tag.DoConversion(value.data(), "bcd", false));
  EXPECT_EQ(value, (Bytes{255, 255, 15, 99, 45, 94, 199, 107, 5, 0}));
}

TEST(DoConversionBcd, WorksItemByItem) {
  TestTagBase tag(ICU_UNSIGNED_SHORT_ARRAY, 6, ICU_UNSIGNED_SHORT);
  tag.setConversions({"bcd"});
  Bytes host;
  for (std::uint16_t v : {1U, 42U, 9876U}) {
    const Bytes item = Le16(v);
    host.insert(host.end(), item.begin(), item.end());
  }
  const Bytes device = ToDevice(tag, host);
  EXPECT_EQ(device, (Bytes{0x01, 0x00, 0x42, 0x00, 0x76, 0x98}));
  EXPECT_EQ(ToHost(tag, device), host);
}

TEST(DoConversionBcd, FailingItemLeavesEveryItem) {
  const TestTagBase tag(ICU_UNSIGNED_BYTE_ARRAY, 3, ICU_UNSIGNED_BYTE);
  Bytes value{0x12, 0x34, 0x5F};
  EXPECT_FALSE(tag.DoConversion(value.data(), "bcd", false));
  EXPECT_EQ(value, (Bytes{0x12, 0x34, 0x5F}));
}

TEST(DoConversionBcd, NoWholeItemSucceedsAtOnce) {
  // A 3-byte string of 1-byte items has three; an int array counted by a
  // shorter length has none.
  const TestTagBase none(ICU_INT_ARRAY, 3, ICU_INT);
  Bytes value{0xFF, 0xFF, 0xFF};
  EXPECT_TRUE(none.DoConversion(value.data(), "bcd", true));
  EXPECT_EQ(value, (Bytes{0xFF, 0xFF, 0xFF}));
  const TestTagBase object(ICU_OBJECT, 4);
  EXPECT_TRUE(object.DoConversion(value.data(), "bcd", false));
  EXPECT_EQ(value, (Bytes{0xFF, 0xFF, 0xFF}));
}

TEST(DoConversionInv, BooleanTurnsZeroIntoOneAndNonZeroIntoZero) {
  const TestTagBase tag(ICU_BOOLEAN, 1);
  Bytes value{0};
  EXPECT_TRUE(tag.DoConversion(value.data(), "inv", true));
  EXPECT_EQ(value, Bytes{1});
  value = {5};
  EXPECT_TRUE(tag.DoConversion(value.data(), "inv", false));
  EXPECT_EQ(value, Bytes{0});
  const TestTagBase bits(ICU_BOOLEAN_ARRAY, 3, ICU_BOOLEAN);
  value = {0, 1, 7};
  EXPECT_TRUE(bits.DoConversion(value.data(), "inv", true));
  EXPECT_EQ(value, (Bytes{1, 0, 0}));
}

TEST(DoConversionInv, IntFails) {
  TestTagBase tag(ICU_INT, 4);
  Bytes value{1, 2, 3, 4};
  EXPECT_FALSE(tag.DoConversion(value.data(), "inv", true));
  EXPECT_EQ(value, (Bytes{1, 2, 3, 4}));
  tag.setConversions({"inv"});
  bool ok = true;
  EXPECT_EQ(ToDevice(tag, value, 0, &ok), (Bytes{0, 0, 0, 0}));
  EXPECT_FALSE(ok);
  EXPECT_EQ(tag.GetError(), "Conversion error at: inv");
}

TEST(DoConversionInv, UnsignedTypesInvertEveryBit) {
  const TestTagBase types[] = {
      TestTagBase(ICU_UNSIGNED_BYTE, 1),
      TestTagBase(ICU_UNSIGNED_SHORT, 2),
      TestTagBase(ICU_UNSIGNED_INT, 4),
      TestTagBase(ICU_UINT64, 8),
      TestTagBase(ICU_BINARY, 3, ICU_UNSIGNED_BYTE),
      TestTagBase(ICU_BINARY, 3),
      TestTagBase(ICU_UNSIGNED_SHORT_ARRAY, 4, ICU_UNSIGNED_SHORT),
  };
  for (const TestTagBase& tag : types) {
    Bytes value(static_cast<std::size_t>(tag.GetVarLength()), 0x0F);
    value.push_back(0x0F);  // one byte beyond the value stays
    EXPECT_TRUE(tag.DoConversion(value.data(), "inv", true)) << tag.GetVarType();
    Bytes expected(static_cast<std::size_t>(tag.GetVarLength()), 0xF0);
    expected.push_back(0x0F);
    EXPECT_EQ(value, expected) << tag.GetVarType();
  }
}

TEST(DoConversionInv, OtherTypesFail) {
  for (const ICU_Type type : {ICU_BYTE, ICU_SHORT, ICU_FLOAT, ICU_DOUBLE, ICU_INT64, ICU_TIME}) {
    const TestTagBase tag(type, ProtUtilsN::GetDataLength(type));
    Bytes value(16, 0x0F);
    EXPECT_FALSE(tag.DoConversion(value.data(), "inv", true)) << type;
    EXPECT_EQ(value, Bytes(16, 0x0F));
  }
  const TestTagBase text(ICU_STRING, 4, ICU_BYTE);
  Bytes value(4, 0x0F);
  EXPECT_FALSE(text.DoConversion(value.data(), "inv", true));
  EXPECT_EQ(value, Bytes(4, 0x0F));
}

TEST(DoConversionNeg, ScalarIntFiveBecomesMinusFive) {
  TestTagBase tag(ICU_INT, 4);
  tag.setConversions({"neg"});
  const Bytes device = ToDevice(tag, BytesOf<std::int32_t>({5}));
  EXPECT_EQ(ValuesOf<std::int32_t>(device), std::vector<std::int32_t>{-5});
  EXPECT_EQ(ValuesOf<std::int32_t>(ToHost(tag, device)), std::vector<std::int32_t>{5});
}

TEST(DoConversionNeg, IntArrayOfEightChangesOnlyTheFirstTwo) {
  // Positions 0 and 4 are below the item count 8; position 8 is not.
  const TestTagBase tag(ICU_INT_ARRAY, 32, ICU_INT);
  Bytes value = BytesOf<std::int32_t>({1, 2, 3, 4, 5, 6, 7, 8});
  EXPECT_TRUE(tag.DoConversion(value.data(), "neg", true));
  EXPECT_EQ(ValuesOf<std::int32_t>(value), (std::vector<std::int32_t>{-1, -2, 3, 4, 5, 6, 7, 8}));
}

TEST(DoConversionNeg, ShortArrayBoundIsTheItemCountAsABytePosition) {
  // Three shorts: positions 0 and 2 are below 3, so items 0 and 1 change.
  const TestTagBase tag(ICU_SHORT_ARRAY, 6, ICU_SHORT);
  Bytes value = BytesOf<std::int16_t>({10, 20, 30});
  EXPECT_TRUE(tag.DoConversion(value.data(), "neg", false));
  EXPECT_EQ(ValuesOf<std::int16_t>(value), (std::vector<std::int16_t>{-10, -20, 30}));
  // Two doubles: only position 0 is below 2.
  const TestTagBase doubles(ICU_DOUBLE_ARRAY, 16, ICU_DOUBLE);
  value = BytesOf<double>({1.5, 2.5});
  EXPECT_TRUE(doubles.DoConversion(value.data(), "neg", false));
  EXPECT_EQ(ValuesOf<double>(value), (std::vector<double>{-1.5, 2.5}));
}

TEST(DoConversionNeg, ByteNegatesEveryItem) {
  const TestTagBase tag(ICU_BYTE_ARRAY, 4, ICU_BYTE);
  Bytes value = BytesOf<std::int8_t>({1, -2, 127, -128});
  EXPECT_TRUE(tag.DoConversion(value.data(), "neg", true));
  EXPECT_EQ(ValuesOf<std::int8_t>(value), (std::vector<std::int8_t>{-1, 2, -127, -128}));
}

TEST(DoConversionNeg, EveryNegatableScalarType) {
  Bytes value = BytesOf<std::int16_t>({-300});
  EXPECT_TRUE(TestTagBase(ICU_SHORT, 2).DoConversion(value.data(), "neg", true));
  EXPECT_EQ(ValuesOf<std::int16_t>(value), std::vector<std::int16_t>{300});

  value = BytesOf<std::int32_t>({std::numeric_limits<std::int32_t>::min()});
  EXPECT_TRUE(TestTagBase(ICU_INT, 4).DoConversion(value.data(), "neg", true));
  EXPECT_EQ(ValuesOf<std::int32_t>(value),
            std::vector<std::int32_t>{std::numeric_limits<std::int32_t>::min()});

  value = BytesOf<std::int64_t>({1234567890123LL});
  EXPECT_TRUE(TestTagBase(ICU_INT64, 8).DoConversion(value.data(), "neg", true));
  EXPECT_EQ(ValuesOf<std::int64_t>(value), std::vector<std::int64_t>{-1234567890123LL});

  value = BytesOf<float>({2.25F});
  EXPECT_TRUE(TestTagBase(ICU_FLOAT, 4).DoConversion(value.data(), "neg", true));
  EXPECT_EQ(ValuesOf<float>(value), std::vector<float>{-2.25F});

  value = BytesOf<double>({0.0});
  EXPECT_TRUE(TestTagBase(ICU_DOUBLE, 8).DoConversion(value.data(), "neg", true));
  EXPECT_EQ(value, (Bytes{0, 0, 0, 0, 0, 0, 0, 0x80}));  // -0.0: the sign bit only
}

TEST(DoConversionNeg, UnsignedAndOtherTypesFail) {
  for (const ICU_Type type : {ICU_UNSIGNED_BYTE, ICU_UNSIGNED_SHORT, ICU_UNSIGNED_INT, ICU_UINT64,
                              ICU_BOOLEAN, ICU_TIME}) {
    const TestTagBase tag(type, ProtUtilsN::GetDataLength(type));
    Bytes value(16, 3);
    EXPECT_FALSE(tag.DoConversion(value.data(), "neg", true)) << type;
    EXPECT_EQ(value, Bytes(16, 3));
  }
}

TEST(DoConversionNeg, ItemReachingPastTheValueFails) {
  // A scalar int that claims two bytes cannot be negated inside them.
  const TestTagBase tag(ICU_INT, 2);
  Bytes value{5, 0, 0x11, 0x22};
  EXPECT_FALSE(tag.DoConversion(value.data(), "neg", true));
  EXPECT_EQ(value, (Bytes{5, 0, 0x11, 0x22}));
}

TEST(TestTagBaseDouble, CloneCopiesEveryPropertyConversionsAndErrorText) {
  TestTagBase tag(ICU_SHORT_ARRAY, 6, ICU_SHORT);
  tag.setVarName("7?short-3(swap2)?2");
  tag.setByteOffset(7);
  tag.setBitIndex(2);
  tag.setPackedLen(9);
  tag.setConversions({"swap2"});
  tag.SetError("old");
  const std::unique_ptr<ITag> copy(tag.Clone());
  const auto* base = dynamic_cast<const TagBase*>(copy.get());
  ASSERT_NE(base, nullptr);
  EXPECT_EQ(base->GetConversions(), std::vector<std::string>{"swap2"});
  EXPECT_EQ(base->GetError(), "old");
  EXPECT_STREQ(base->GetVarName(), "7?short-3(swap2)?2");
  EXPECT_EQ(base->GetVarType(), ICU_SHORT_ARRAY);
  EXPECT_EQ(base->GetItemType(), ICU_SHORT);
  EXPECT_EQ(base->GetVarLength(), 6);
  EXPECT_EQ(base->GetByteOffset(), 7);
  EXPECT_EQ(base->GetBitIndex(), 2);
  EXPECT_EQ(base->PackedLen(), 9);
}

TEST(TestTagBaseDouble, PackedLengthIsTheTagBasesUntilFixed) {
  TestTagBase tag(ICU_BOOLEAN_ARRAY, 3, ICU_BOOLEAN);
  tag.setBitIndex(6);
  EXPECT_EQ(tag.PackedLen(), 2);
  tag.setType(ICU_BYTE_ARRAY, 3, ICU_BYTE);
  EXPECT_EQ(tag.PackedLen(), 3);
  tag.setPackedLen(9);
  EXPECT_EQ(tag.PackedLen(), 9);
}
