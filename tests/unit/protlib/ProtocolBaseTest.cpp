// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/ProtocolBase.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdint>
#include <cstring>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "MemoryProtocol.h"
#include "MemoryProtocolWithOverrides.h"
#include "TestTagBase.h"
#include "protlib/TimeStamp.h"

namespace {

using Bytes = std::vector<unsigned char>;

// Creates tags of the memory protocol and checks they exist.
ITag* MustCreate(ProtocolBase& protocol, const char* uri) {
  ITag* tag = protocol.CreateTag(uri);
  EXPECT_NE(tag, nullptr) << uri << ": " << protocol.GetLastErrorString();
  return tag;
}

void Put(MemoryProtocol& protocol, int offset, const Bytes& bytes) {
  std::memcpy(protocol.memory.data() + offset, bytes.data(), bytes.size());
}

Bytes Get(const MemoryProtocol& protocol, int offset, int length) {
  return {protocol.memory.begin() + offset, protocol.memory.begin() + offset + length};
}

// A protocol whose tags count their destruction in a counter of the test
// (which outlives the protocol); the address "bad" gives no tag.
class CountingProtocol final : public MemoryProtocol {
 public:
  explicit CountingProtocol(int& counter) : deletions(counter) {}
  TagBase* CreateTagBase(const char* uri) override {
    if (std::strcmp(uri, "bad") == 0) {
      SetError(-1, "no such tag");
      return nullptr;
    }
    auto* tag = new TestTagBase(ICU_INT, 4);
    tag->setVarName(uri);
    tag->countDeletionsIn(&deletions);
    return tag;
  }

 private:
  int& deletions;
};

class OnlyCoexist final : public MemoryProtocol {
 public:
  bool CanCoexistInDatagram(const ITag* tag1, const ITag* tag2) override {
    ++calls;
    first = tag1;
    added = tag2;
    return true;
  }
  int calls = 0;
  const ITag* first = nullptr;
  const ITag* added = nullptr;
};

class CoexistAndItems final : public MemoryProtocol {
 public:
  bool CanCoexistInDatagram(const ITag* /*tag1*/, const ITag* /*tag2*/) override { return true; }
  int MaxDatagramItems(const ITag* /*tag*/) override { return 8; }
};

class OnlyCanReadBitBlock final : public MemoryProtocol {
 public:
  bool CanReadBitBlock(const ITag* /*tag*/) override { return true; }
};

class WithStatusOverride final : public MemoryProtocolWithOverrides {
 public:
  bool ReadDatagramWithStatus(const ITag* const* /*tags*/, int count, unsigned char* buffer,
                              idal_error_t* status) override {
    ++statusReads;
    buffer[0] = 0x5A;
    for (int i = 0; i < count; ++i) {
      status[i] = 7;
    }
    return true;
  }
  int statusReads = 0;
};

// A driver with its own Read, which answers the bytes 0xA0, 0xA1, ... .
class OwnRead final : public MemoryProtocol {
 public:
  bool Read(const ITag* tag, unsigned char* dst) override {
    ++reads;
    for (int i = 0; i < tag->GetVarLength(); ++i) {
      dst[i] = static_cast<unsigned char>(0xA0 + i);
    }
    return true;
  }
  int reads = 0;
};

// A device that takes a few milliseconds per read and notes when each read
// ended.
class SlowDevice final : public MemoryProtocolWithOverrides {
 public:
  bool ReadBlock(const ITag* tag, unsigned char* buffer, int length) override {
    std::this_thread::sleep_for(std::chrono::milliseconds(3));
    readEnded = ProtUtilsN::currentTimeStamp();
    return MemoryProtocol::ReadBlock(tag, buffer, length);
  }
  bool ReadDatagram(const ITag* const* tags, int count, unsigned char* buffer) override {
    std::this_thread::sleep_for(std::chrono::milliseconds(3));
    readEnded = ProtUtilsN::currentTimeStamp();
    return MemoryProtocolWithOverrides::ReadDatagram(tags, count, buffer);
  }
  unsigned long long readEnded = 0;
};

class NamedFields final : public MemoryProtocol {
 public:
  const char* const* tagUriNames() const override {
    static const char* const kNames[] = {"node", "memorytype", "datatype", nullptr};
    return kNames;
  }
};

}  // namespace

// --- identity and interface names ---

TEST(ProtocolBase, StartsWithErrorCodeOneAndEmptyText) {
  const MemoryProtocol protocol;
  EXPECT_EQ(protocol.GetLastError(), 1);
  EXPECT_STREQ(protocol.GetLastErrorString(), "");
}

TEST(ProtocolBase, IdentBeforeSetIdentIsTheProtocolName) {
  MemoryProtocol protocol;
  EXPECT_STREQ(protocol.GetIdent(), "MEM");
  protocol.SetIdent("line 2");
  EXPECT_STREQ(protocol.GetIdent(), "line 2");
  protocol.SetIdent("");
  EXPECT_STREQ(protocol.GetIdent(), "MEM");
  protocol.SetIdent(nullptr);
  EXPECT_STREQ(protocol.GetIdent(), "MEM");
}

TEST(ProtocolBase, ConvertToAnswersTheProtocolNames) {
  MemoryProtocol protocol;
  IInterface* const self = static_cast<IProtocol7*>(&protocol);
  for (const char* name : {"ProtocolBase", "IProtocol7", "IProtocol6", "IProtocol5", "IProtocol4",
                           "IProtocol3", "IProtocol2", "IProtocol"}) {
    EXPECT_EQ(protocol.ConvertTo(name), self) << name;
  }
  for (const char* name : {"IProtocol8", "iprotocol", "ProtocolBase ", "IProtocolFactory", "ITag",
                           "MemoryProtocol", ""}) {
    EXPECT_EQ(protocol.ConvertTo(name), nullptr) << name;
  }
  EXPECT_EQ(protocol.ConvertTo(nullptr), nullptr);
}

TEST(ProtocolBase, BaseDefaultsOfIdentityAndLifecycle) {
  MemoryProtocol protocol;
  EXPECT_TRUE(protocol.Start());
  EXPECT_TRUE(protocol.Stop());
  EXPECT_STREQ(protocol.GetNextInstanceName(), "MEM");
  EXPECT_EQ(protocol.GetXml(), nullptr);
  EXPECT_FALSE(protocol.IsConverted());
  int data = 0;
  EXPECT_EQ(protocol.Extend(0, &data), 0);
  EXPECT_EQ(protocol.Extend(3, &data), 0);
  EXPECT_EQ(protocol.GetLastError(), 1);
}

// --- errors ---

TEST(ProtocolBaseErrors, SetErrorSetsCodeAndText) {
  MemoryProtocol protocol;
  protocol.SetError(-6, "Can't open connection socket");
  EXPECT_EQ(protocol.GetLastError(), -6);
  EXPECT_STREQ(protocol.GetLastErrorString(), "Can't open connection socket");
  protocol.SetError(-2, nullptr);
  EXPECT_EQ(protocol.GetLastError(), -2);
  EXPECT_STREQ(protocol.GetLastErrorString(), "");
}

TEST(ProtocolBaseErrors, LastErrorStringStaysUntilTheNextCall) {
  MemoryProtocol protocol;
  protocol.SetError(-1, "first");
  const char* first = protocol.GetLastErrorString();
  protocol.SetError(-1, "second, a longer text than the first one was");
  EXPECT_STREQ(first, "first");
  EXPECT_STREQ(protocol.GetLastErrorString(), "second, a longer text than the first one was");
}

TEST(ProtocolBaseErrors, SuccessDoesNotClearTheLastError) {
  MemoryProtocol protocol;
  protocol.SetError(-5, "earlier");
  ITag* tag = MustCreate(protocol, "0?int");
  unsigned char value[4];
  EXPECT_TRUE(protocol.Read(tag, value));
  EXPECT_EQ(protocol.GetLastError(), -5);
  EXPECT_STREQ(protocol.GetLastErrorString(), "earlier");
}

TEST(ProtocolBaseErrors, SetTagErrorNamesAddressAndTagText) {
  MemoryProtocol protocol;
  TestTagBase tag(ICU_INT, 4);
  tag.setVarName("1?rx_token?int");
  tag.SetError("not allowed tavu type");
  protocol.SetTagError(&tag);
  EXPECT_EQ(protocol.GetLastError(), -1);
  EXPECT_STREQ(protocol.GetLastErrorString(),
               "Tag URI error: 1?rx_token?int - not allowed tavu type");
}

TEST(ProtocolBaseErrors, FailedCreateTagReportsTheTagError) {
  MemoryProtocol protocol;
  EXPECT_EQ(protocol.CreateTag("0?integer"), nullptr);
  EXPECT_EQ(protocol.GetLastError(), -1);
  EXPECT_STREQ(protocol.GetLastErrorString(),
               "Tag URI error: 0?integer - integer: data type unknown");
}

TEST(ProtocolBaseErrors, WriteBlockIsNotSupported) {
  MemoryProtocol protocol;
  ITag* tag = MustCreate(protocol, "0?int");
  const unsigned char data[4] = {1, 2, 3, 4};
  EXPECT_FALSE(protocol.WriteBlock(tag, data, 4));
  EXPECT_EQ(protocol.GetLastError(), -3);
  EXPECT_STREQ(protocol.GetLastErrorString(), "Optimized writing not supported");
  EXPECT_EQ(Get(protocol, 0, 4), (Bytes{0, 0, 0, 0}));
}

TEST(ProtocolBaseErrors, UnsupportedOperationsReportTheirTexts) {
  MemoryProtocol protocol;
  ITag* tag = MustCreate(protocol, "0?int");
  const auto expectError = [&](const char* text) {
    EXPECT_EQ(protocol.GetLastError(), -1) << text;
    EXPECT_STREQ(protocol.GetLastErrorString(), text);
    protocol.SetError(1, "");
  };
  EXPECT_FALSE(protocol.readObject(tag, nullptr));
  expectError("read object not supported");
  EXPECT_FALSE(protocol.writeObject(tag, nullptr));
  expectError("write object not supported");
  EXPECT_EQ(protocol.createEventChannel(16), nullptr);
  expectError("protocol does not support event channel");
  EXPECT_EQ(protocol.createEventChannel(static_cast<IEventProcessor*>(nullptr)), nullptr);
  expectError("protocol does not support event channel");
  EXPECT_FALSE(protocol.addEventSource(nullptr, tag));
  expectError("protocol does not support event channel");
  EXPECT_FALSE(protocol.addAlarmEvents(nullptr, nullptr));
  expectError("protocol does not support event channel");
  EXPECT_EQ(protocol.createAlarm("alarm"), nullptr);
  expectError("protocol does not support alarms");
  EXPECT_EQ(protocol.createTrend("trend"), nullptr);
  expectError("protocol does not support trends");
}

TEST(ProtocolBaseErrors, NeutralDefaultsSetNoError) {
  MemoryProtocol protocol;
  ITag* tag = MustCreate(protocol, "0?int");
  const ITag* tags[] = {tag};
  unsigned char buffer[8] = {};
  const unsigned char* constBuffers[] = {buffer};
  unsigned char* buffers[] = {buffer};
  idal_error_t status[1] = {0};
  char text[8] = {'x', 'x', 'x', 'x', 'x', 'x', 'x', 'x'};
  EXPECT_FALSE(protocol.MultipleReadSupported(tag));
  EXPECT_EQ(protocol.MultipleRead(tags, 1, buffers, status), 0);
  EXPECT_FALSE(protocol.MultipleWriteSupported(tag));
  EXPECT_EQ(protocol.MultipleWrite(tags, 1, constBuffers, status), 0);
  EXPECT_FALSE(protocol.CanReadBitBlock(tag));
  EXPECT_FALSE(protocol.ReadBitBlock(tag, buffer, 8));
  EXPECT_EQ(protocol.GetInterface("IProtocol"), nullptr);
  EXPECT_EQ(protocol.MaxUnusedGap(tag), 0xFFFFFF);
  EXPECT_FALSE(protocol.NeedsReadBeforeWrite(tag));
  EXPECT_FALSE(protocol.CanWriteDatagrams(tag));
  EXPECT_FALSE(protocol.CanAddToWriteDatagram(tags, 1, tag));
  EXPECT_FALSE(protocol.WriteDatagramWithStatus(tags, 1, buffer, status));
  EXPECT_FALSE(protocol.CanWriteBitBlock(tag));
  EXPECT_FALSE(protocol.WriteBitBlock(tag, buffer, 8));
  EXPECT_EQ(protocol.vcsGetCapability(1), 0);
  EXPECT_EQ(protocol.vcsGetComParams(text, 8), 0);
  EXPECT_EQ(protocol.vcsActivateInterleaved(1), 0);
  protocol.deleteEventChannel(nullptr);
  EXPECT_EQ(protocol.frontEvent(nullptr), nullptr);
  protocol.popEvent(nullptr);
  protocol.deleteAlarm(nullptr);
  EXPECT_EQ(protocol.listAlarms(nullptr, text, 8), 0);
  EXPECT_EQ(protocol.quitAlarm(nullptr, 1), 0);
  protocol.deleteTrend(nullptr);
  EXPECT_EQ(protocol.readTrend(nullptr, 0, 1, buffer, 8), 0);
  EXPECT_FALSE(protocol.hasPlcTimestamp(tag));
  EXPECT_EQ(protocol.MaxDatagramItems(tag), 0);
  EXPECT_EQ(protocol.MaxDatagramLength(tag), 0);
  EXPECT_FALSE(protocol.CanCoexistInDatagram(tag, tag));
  EXPECT_FALSE(protocol.ReadDatagram(tags, 1, buffer));
  EXPECT_EQ(std::string(text, 8), "xxxxxxxx");
  EXPECT_EQ(status[0], 0);
  EXPECT_EQ(protocol.GetLastError(), 1);
  EXPECT_STREQ(protocol.GetLastErrorString(), "");
}

// --- the tag list ---

TEST(ProtocolBaseTags, CreateTagReturnsTheDriversTag) {
  int deletions = 0;
  CountingProtocol protocol(deletions);
  ITag* tag = protocol.CreateTag("a?b");
  ASSERT_NE(tag, nullptr);
  EXPECT_STREQ(tag->GetVarName(), "a?b");
  EXPECT_EQ(protocol.CreateTag("bad"), nullptr);
  EXPECT_STREQ(protocol.GetLastErrorString(), "no such tag");
  protocol.FreeTag(tag);
  EXPECT_EQ(deletions, 1);
}

TEST(ProtocolBaseTags, FreeTagOfATagAddedTwiceRemovesBothAndDeletesOnce) {
  int deletions = 0;
  auto* tag = new TestTagBase(ICU_INT, 4);
  tag->countDeletionsIn(&deletions);
  // A driver that hands out the same tag twice.
  class Twice final : public MemoryProtocol {
   public:
    TagBase* CreateTagBase(const char* /*uri*/) override { return same; }
    TagBase* same = nullptr;
  } twice;
  twice.same = tag;
  EXPECT_EQ(twice.CreateTag("x"), tag);
  EXPECT_EQ(twice.CreateTag("x"), tag);
  twice.FreeTag(tag);
  EXPECT_EQ(deletions, 1);
  // Both entries are gone: emptying the list deletes nothing more.
  twice.DeleteTags();
  EXPECT_EQ(deletions, 1);
}

TEST(ProtocolBaseTags, FreeTagDeletesATagThatIsNotListed) {
  int deletions = 0;
  CountingProtocol protocol(deletions);
  auto* stray = new TestTagBase(ICU_INT, 4);
  stray->countDeletionsIn(&deletions);
  ITag* listed = protocol.CreateTag("kept");
  protocol.FreeTag(stray);
  EXPECT_EQ(deletions, 1);
  protocol.FreeTag(nullptr);
  EXPECT_EQ(deletions, 1);
  EXPECT_STREQ(listed->GetVarName(), "kept");
}

TEST(ProtocolBaseTags, DeleteTagsDeletesEveryListedTagOnce) {
  int deletions = 0;
  CountingProtocol protocol(deletions);
  protocol.CreateTag("1");
  protocol.CreateTag("2");
  protocol.CreateTag("3");
  protocol.DeleteTags();
  EXPECT_EQ(deletions, 3);
  protocol.DeleteTags();
  EXPECT_EQ(deletions, 3);
}

TEST(ProtocolBaseTags, DestructorDeletesTheTagsTheHostDidNotFree) {
  int deletions = 0;
  {
    CountingProtocol protocol(deletions);
    ITag* freed = protocol.CreateTag("1");
    protocol.CreateTag("2");
    protocol.CreateTag("3");
    protocol.FreeTag(freed);
    EXPECT_EQ(deletions, 1);
  }
  EXPECT_EQ(deletions, 3);
}

// --- Read ---

TEST(ProtocolBaseRead, ReadsPackedLengthBytesAndConverts) {
  MemoryProtocol protocol;
  Put(protocol, 10, {0x34, 0x12});
  ITag* tag = MustCreate(protocol, "10?unsignedShort(bcd)");
  unsigned char value[2] = {};
  ASSERT_TRUE(protocol.Read(tag, value));
  EXPECT_EQ(value[0] | (value[1] << 8), 1234);
  EXPECT_EQ(protocol.blockReads(), 1);
  EXPECT_EQ(protocol.lastBlockReadLength(), 2);
}

TEST(ProtocolBaseRead, BitTagReadsTheBytesItsBitsTouch) {
  MemoryProtocol protocol;
  Put(protocol, 0, {0x80, 0x01});
  ITag* tag = MustCreate(protocol, "0?boolean-3?6");
  unsigned char value[3] = {9, 9, 9};
  ASSERT_TRUE(protocol.Read(tag, value));
  EXPECT_EQ(Bytes(value, value + 3), (Bytes{0, 1, 1}));
  EXPECT_EQ(protocol.lastBlockReadLength(), 2);
}

TEST(ProtocolBaseRead, ConversionFailureIsReadConversionErrorAndTheTagNamesIt) {
  MemoryProtocol protocol;
  Put(protocol, 0, {0x1A});
  ITag* tag = MustCreate(protocol, "0?unsignedByte(swap2,bcd)");
  unsigned char value[1] = {0x77};
  // bcd is undone first and fails on the nibble A.
  EXPECT_FALSE(protocol.Read(tag, value));
  EXPECT_EQ(protocol.GetLastError(), -9);
  EXPECT_STREQ(protocol.GetLastErrorString(), "read conversion error");
  EXPECT_EQ(dynamic_cast<TagBase*>(tag)->GetError(), "Conversion error at: bcd");
  EXPECT_EQ(value[0], 0x77);
}

TEST(ProtocolBaseRead, DriverFailureKeepsTheDriversError) {
  MemoryProtocol protocol;
  ITag* tag = MustCreate(protocol, "0?int");
  protocol.failReads = true;
  unsigned char value[4] = {7, 7, 7, 7};
  EXPECT_FALSE(protocol.Read(tag, value));
  EXPECT_EQ(protocol.GetLastError(), -1);
  EXPECT_STREQ(protocol.GetLastErrorString(), "device read failed");
  EXPECT_EQ(Bytes(value, value + 4), (Bytes{7, 7, 7, 7}));
}

TEST(ProtocolBaseRead, SixtyFourAndMoreDeviceBytes) {
  MemoryProtocol protocol;
  for (int length : {64, 65, 1000}) {
    Bytes stored(static_cast<std::size_t>(length));
    for (int i = 0; i < length; ++i) {
      stored[static_cast<std::size_t>(i)] = static_cast<unsigned char>(i * 3 + 1);
    }
    Put(protocol, 100, stored);
    const std::string uri = "100?binary-" + std::to_string(length) + "(inv)";
    ITag* tag = MustCreate(protocol, uri.c_str());
    Bytes value(static_cast<std::size_t>(length), 0);
    ASSERT_TRUE(protocol.Read(tag, value.data())) << length;
    EXPECT_EQ(protocol.lastBlockReadLength(), length);
    for (std::size_t i = 0; i < stored.size(); ++i) {
      ASSERT_EQ(value[i], static_cast<unsigned char>(~stored[i])) << length << " byte " << i;
    }
    protocol.FreeTag(tag);
  }
}

TEST(ProtocolBaseRead, NullArgumentsFailWithAClearError) {
  MemoryProtocol protocol;
  ITag* tag = MustCreate(protocol, "0?int");
  unsigned char value[4];
  EXPECT_FALSE(protocol.Read(nullptr, value));
  EXPECT_EQ(protocol.GetLastError(), -1);
  EXPECT_STREQ(protocol.GetLastErrorString(), "no tag given");
  EXPECT_FALSE(protocol.Read(tag, nullptr));
  EXPECT_STREQ(protocol.GetLastErrorString(), "no buffer given");
  EXPECT_EQ(protocol.blockReads(), 0);
}

TEST(ProtocolBaseRead, NegativePackedLengthFails) {
  MemoryProtocol protocol;
  TestTagBase tag(ICU_STRING, -1, ICU_BYTE);
  unsigned char value[4];
  EXPECT_FALSE(protocol.Read(&tag, value));
  EXPECT_STREQ(protocol.GetLastErrorString(), "invalid tag length");
  EXPECT_EQ(protocol.blockReads(), 0);
}

// --- time stamps ---

TEST(ProtocolBaseTimestamps, ReadWithTimestampStampsAfterTheRead) {
  MemoryProtocol protocol;
  Put(protocol, 0, {1, 0, 0, 0});
  ITag* tag = MustCreate(protocol, "0?int");
  unsigned char value[4] = {};
  unsigned long long ts = 0;
  const unsigned long long before = ProtUtilsN::currentTimeStamp();
  ASSERT_TRUE(protocol.readWithTimestamp(tag, value, &ts));
  const unsigned long long after = ProtUtilsN::currentTimeStamp();
  EXPECT_EQ(value[0], 1);
  EXPECT_GE(ts, before);
  EXPECT_LE(ts, after);
  EXPECT_TRUE(protocol.readWithTimestamp(tag, value, nullptr));
}

TEST(ProtocolBaseTimestamps, StampsAreTakenAfterTheDeviceRead) {
  SlowDevice protocol;
  protocol.bitBlocks = false;
  TestTagBase tag(ICU_INT, 4);
  const ITag* tags[] = {&tag};
  unsigned char value[4] = {};
  idal_error_t status[1] = {};
  unsigned long long ts = 0;
  ASSERT_TRUE(protocol.readWithTimestamp(&tag, value, &ts));
  EXPECT_GE(ts, protocol.readEnded);
  ASSERT_TRUE(protocol.readBlockWithTimestamp(&tag, value, 4, &ts));
  EXPECT_GE(ts, protocol.readEnded);
  ASSERT_TRUE(protocol.readDatagramWithTimestamp(tags, 1, value, status, &ts));
  EXPECT_GE(ts, protocol.readEnded);
}

TEST(ProtocolBaseTimestamps, FailedReadsLeaveTheTimeStamp) {
  MemoryProtocol protocol;
  ITag* tag = MustCreate(protocol, "0?int");
  protocol.failReads = true;
  unsigned char value[4] = {};
  unsigned long long ts = 42;
  EXPECT_FALSE(protocol.readWithTimestamp(tag, value, &ts));
  EXPECT_FALSE(protocol.readBlockWithTimestamp(tag, value, 4, &ts));
  EXPECT_EQ(ts, 42U);
}

TEST(ProtocolBaseTimestamps, ReadBlockWithTimestampIsTheDriversBlockRead) {
  MemoryProtocol protocol;
  Put(protocol, 0, {9, 8, 7});
  ITag* tag = MustCreate(protocol, "0?binary-3");
  unsigned char value[3] = {};
  unsigned long long ts = 0;
  const unsigned long long before = ProtUtilsN::currentTimeStamp();
  ASSERT_TRUE(protocol.readBlockWithTimestamp(tag, value, 3, &ts));
  EXPECT_EQ(Bytes(value, value + 3), (Bytes{9, 8, 7}));
  EXPECT_GE(ts, before);
  EXPECT_LE(ts, ProtUtilsN::currentTimeStamp());
}

// --- datagrams ---

TEST(ProtocolBaseDatagrams, CountZeroIsFalseWithoutReadingTheArray) {
  OnlyCoexist protocol;
  TestTagBase tag(ICU_INT, 4);
  EXPECT_FALSE(protocol.CanAddToDatagram(nullptr, 0, &tag));
  MemoryProtocolWithOverrides grouping;
  EXPECT_FALSE(grouping.CanAddToDatagram(nullptr, 0, &tag));
  // With an array present the answer stays false and the first entry is not
  // asked about, although every other condition would hold.
  const ITag* tags[] = {&tag};
  EXPECT_FALSE(protocol.CanAddToDatagram(tags, 0, &tag));
  EXPECT_FALSE(grouping.CanAddToDatagram(tags, 0, &tag));
  EXPECT_TRUE(grouping.CanAddToDatagram(tags, 1, &tag));
  EXPECT_EQ(protocol.calls, 0);
}

TEST(ProtocolBaseDatagrams, OverridingOnlyCoexistIsAlwaysFalse) {
  OnlyCoexist protocol;
  TestTagBase zero(ICU_STRING, 0, ICU_BYTE);
  TestTagBase four(ICU_INT, 4);
  const ITag* tags[] = {&four, &zero};
  EXPECT_FALSE(protocol.CanAddToDatagram(tags, 1, &zero));
  EXPECT_FALSE(protocol.CanAddToDatagram(tags, 2, &four));
  // The coexistence question was asked of the first tag and the new one.
  EXPECT_EQ(protocol.calls, 2);
  EXPECT_EQ(protocol.first, &four);
  EXPECT_EQ(protocol.added, &four);
}

TEST(ProtocolBaseDatagrams, WithoutLengthOverrideTheSumMustBeBelowOne) {
  CoexistAndItems protocol;
  TestTagBase empty(ICU_STRING, 0, ICU_BYTE);
  TestTagBase one(ICU_BYTE, 1);
  const ITag* empties[] = {&empty, &empty};
  EXPECT_TRUE(protocol.CanAddToDatagram(empties, 2, &empty));
  EXPECT_FALSE(protocol.CanAddToDatagram(empties, 2, &one));
}

TEST(ProtocolBaseDatagrams, WithoutCoexistOverrideAlwaysFalse) {
  MemoryProtocol protocol;
  TestTagBase empty(ICU_STRING, 0, ICU_BYTE);
  const ITag* tags[] = {&empty};
  EXPECT_FALSE(protocol.CanAddToDatagram(tags, 1, &empty));
}

TEST(ProtocolBaseDatagrams, ItemLimitMustExceedTheCount) {
  MemoryProtocolWithOverrides protocol;
  protocol.maxItems = 3;
  protocol.maxLength = 1000;
  TestTagBase tag(ICU_INT, 4);
  const ITag* tags[] = {&tag, &tag, &tag};
  EXPECT_TRUE(protocol.CanAddToDatagram(tags, 2, &tag));
  EXPECT_FALSE(protocol.CanAddToDatagram(tags, 3, &tag));
}

TEST(ProtocolBaseDatagrams, SumOfPackedLengthsMayReachTheMaximumLength) {
  MemoryProtocolWithOverrides protocol;
  protocol.maxItems = 10;
  protocol.maxLength = 12;
  TestTagBase four(ICU_INT, 4);
  TestTagBase five(ICU_BINARY, 5, ICU_UNSIGNED_BYTE);
  const ITag* tags[] = {&four, &four};
  EXPECT_TRUE(protocol.CanAddToDatagram(tags, 2, &four));   // 12
  EXPECT_FALSE(protocol.CanAddToDatagram(tags, 2, &five));  // 13
  protocol.coexist = false;
  EXPECT_FALSE(protocol.CanAddToDatagram(tags, 2, &four));
}

TEST(ProtocolBaseDatagrams, NullTagsAreRefused) {
  MemoryProtocolWithOverrides protocol;
  TestTagBase tag(ICU_INT, 4);
  const ITag* tags[] = {&tag, nullptr};
  EXPECT_FALSE(protocol.CanAddToDatagram(tags, 2, &tag));
  EXPECT_FALSE(protocol.CanAddToDatagram(tags, 1, nullptr));
  EXPECT_FALSE(protocol.CanAddToDatagram(tags, -1, &tag));
}

TEST(ProtocolBaseDatagrams, ReadDatagramWithStatusNeedsTheDriversDatagramRead) {
  MemoryProtocol plain;
  TestTagBase tag(ICU_INT, 4);
  const ITag* tags[] = {&tag, &tag};
  unsigned char buffer[8] = {};
  idal_error_t status[2] = {-4, -4};
  EXPECT_FALSE(plain.ReadDatagramWithStatus(tags, 2, buffer, status));
  EXPECT_EQ(status[0], -4);
  EXPECT_EQ(status[1], -4);

  MemoryProtocolWithOverrides grouping;
  Put(grouping, 0, {1, 2, 3, 4});
  ASSERT_TRUE(grouping.ReadDatagramWithStatus(tags, 2, buffer, status));
  EXPECT_EQ(Bytes(buffer, buffer + 8), (Bytes{1, 2, 3, 4, 1, 2, 3, 4}));
  EXPECT_EQ(status[0], 1);
  EXPECT_EQ(status[1], 1);
  EXPECT_EQ(grouping.datagramReads, 1);
}

TEST(ProtocolBaseDatagrams, FailedDatagramReadWritesNoStatus) {
  MemoryProtocolWithOverrides protocol;
  protocol.failGroupReads = true;
  TestTagBase tag(ICU_INT, 4);
  const ITag* tags[] = {&tag};
  unsigned char buffer[4] = {};
  idal_error_t status[1] = {-4};
  unsigned long long ts[1] = {42};
  EXPECT_FALSE(protocol.ReadDatagramWithStatus(tags, 1, buffer, status));
  EXPECT_FALSE(protocol.readDatagramWithTimestamp(tags, 1, buffer, status, ts));
  EXPECT_EQ(status[0], -4);
  EXPECT_EQ(ts[0], 42U);
  EXPECT_STREQ(protocol.GetLastErrorString(), "device read failed");
}

TEST(ProtocolBaseDatagrams, TimestampedDatagramWritesOneStampPerTag) {
  MemoryProtocolWithOverrides protocol;
  TestTagBase tag(ICU_INT, 4);
  const ITag* tags[] = {&tag, &tag, &tag};
  unsigned char buffer[12] = {};
  idal_error_t status[3] = {};
  unsigned long long ts[4] = {0, 0, 0, 42};
  const unsigned long long before = ProtUtilsN::currentTimeStamp();
  ASSERT_TRUE(protocol.readDatagramWithTimestamp(tags, 3, buffer, status, ts));
  EXPECT_GE(ts[0], before);
  EXPECT_LE(ts[0], ProtUtilsN::currentTimeStamp());
  EXPECT_EQ(ts[1], ts[0]);
  EXPECT_EQ(ts[2], ts[0]);
  EXPECT_EQ(ts[3], 42U);
  EXPECT_EQ(status[0], 1);
  EXPECT_EQ(status[1], 1);
  EXPECT_EQ(status[2], 1);
}

// --- array items ---

TEST(ProtocolBaseArrays, ItemOfAScalarTagIsRefused) {
  MemoryProtocol protocol;
  ITag* tag = MustCreate(protocol, "0?int");
  unsigned char item[4] = {};
  EXPECT_FALSE(protocol.readArrayItem(tag, 0, item));
  EXPECT_EQ(protocol.GetLastError(), -1);
  EXPECT_STREQ(protocol.GetLastErrorString(), "accessing an array item where the tag is not array");
  EXPECT_FALSE(protocol.writeArrayItem(tag, 0, item));
  EXPECT_STREQ(protocol.GetLastErrorString(), "accessing an array item where the tag is not array");
  EXPECT_EQ(protocol.blockReads(), 0);
}

TEST(ProtocolBaseArrays, IndexMinusOneOrTheCountIsOutOfRange) {
  MemoryProtocol protocol;
  ITag* tag = MustCreate(protocol, "0?short-3");
  unsigned char item[2] = {};
  for (int index : {-1, 3}) {
    protocol.SetError(1, "");
    EXPECT_FALSE(protocol.readArrayItem(tag, index, item)) << index;
    EXPECT_EQ(protocol.GetLastError(), -1);
    EXPECT_STREQ(protocol.GetLastErrorString(), "accessing array item out of range");
    protocol.SetError(1, "");
    EXPECT_FALSE(protocol.writeArrayItem(tag, index, item)) << index;
    EXPECT_STREQ(protocol.GetLastErrorString(), "accessing array item out of range");
  }
  EXPECT_EQ(protocol.blockReads(), 0);
  EXPECT_EQ(protocol.writes(), 0);
}

TEST(ProtocolBaseArrays, ReadsOneConvertedItem) {
  MemoryProtocol protocol;
  Put(protocol, 0, {0x00, 0x01, 0x00, 0x02, 0x00, 0x03});
  ITag* tag = MustCreate(protocol, "0?short-3(swap2)");
  unsigned char item[2] = {};
  ASSERT_TRUE(protocol.readArrayItem(tag, 2, item));
  EXPECT_EQ(Bytes(item, item + 2), (Bytes{0x03, 0x00}));
  EXPECT_EQ(protocol.lastBlockReadLength(), 6);
}

TEST(ProtocolBaseArrays, WriteReplacesOneItemAndWritesTheWholeArray) {
  MemoryProtocol protocol;
  Put(protocol, 4, {0x00, 0x01, 0x00, 0x02, 0x00, 0x03});
  ITag* tag = MustCreate(protocol, "4?short-3(swap2)");
  const unsigned char item[2] = {0x34, 0x12};
  ASSERT_TRUE(protocol.writeArrayItem(tag, 1, item));
  EXPECT_EQ(Get(protocol, 4, 6), (Bytes{0x00, 0x01, 0x12, 0x34, 0x00, 0x03}));
  EXPECT_EQ(protocol.writes(), 1);
}

TEST(ProtocolBaseArrays, FailedReadWritesNothing) {
  MemoryProtocol protocol;
  ITag* tag = MustCreate(protocol, "0?int-2");
  protocol.failReads = true;
  const unsigned char item[4] = {1, 2, 3, 4};
  EXPECT_FALSE(protocol.writeArrayItem(tag, 0, item));
  EXPECT_EQ(protocol.writes(), 0);
  EXPECT_STREQ(protocol.GetLastErrorString(), "device read failed");
}

TEST(ProtocolBaseArrays, WriteResultIsTheDriversWriteResult) {
  MemoryProtocol protocol;
  ITag* tag = MustCreate(protocol, "0?int-2");
  protocol.failWrites = true;
  const unsigned char item[4] = {1, 2, 3, 4};
  EXPECT_FALSE(protocol.writeArrayItem(tag, 0, item));
  EXPECT_EQ(protocol.writes(), 1);
  EXPECT_STREQ(protocol.GetLastErrorString(), "device write failed");
}

TEST(ProtocolBaseArrays, ArraysBeyondTheFixedBuffer) {
  MemoryProtocol protocol;
  // 100 ints, 400 bytes, each stored as its index.
  for (int i = 0; i < 100; ++i) {
    protocol.memory[static_cast<std::size_t>(i) * 4] = static_cast<unsigned char>(i);
  }
  ITag* tag = MustCreate(protocol, "0?int-100");
  unsigned char item[4] = {};
  ASSERT_TRUE(protocol.readArrayItem(tag, 99, item));
  EXPECT_EQ(Bytes(item, item + 4), (Bytes{99, 0, 0, 0}));
  const unsigned char value[4] = {0xAA, 0xBB, 0xCC, 0xDD};
  ASSERT_TRUE(protocol.writeArrayItem(tag, 64, value));
  EXPECT_EQ(Get(protocol, 256, 4), (Bytes{0xAA, 0xBB, 0xCC, 0xDD}));
  EXPECT_EQ(Get(protocol, 252, 4), (Bytes{63, 0, 0, 0}));
  EXPECT_EQ(Get(protocol, 396, 4), (Bytes{99, 0, 0, 0}));
  EXPECT_EQ(protocol.lastBlockReadLength(), 400);
}

TEST(ProtocolBaseArrays, NullArgumentsFail) {
  MemoryProtocol protocol;
  ITag* tag = MustCreate(protocol, "0?int-2");
  unsigned char item[4] = {};
  EXPECT_FALSE(protocol.readArrayItem(nullptr, 0, item));
  EXPECT_STREQ(protocol.GetLastErrorString(), "no tag given");
  EXPECT_FALSE(protocol.readArrayItem(tag, 0, nullptr));
  EXPECT_STREQ(protocol.GetLastErrorString(), "no buffer given");
  protocol.SetError(1, "");
  EXPECT_FALSE(protocol.writeArrayItem(tag, 0, nullptr));
  EXPECT_EQ(protocol.GetLastError(), -1);
  EXPECT_STREQ(protocol.GetLastErrorString(), "no buffer given");
  EXPECT_EQ(protocol.blockReads(), 0);
  EXPECT_EQ(protocol.writes(), 0);
}

// --- tag address fields ---

TEST(ProtocolBaseUriFields, FieldOneOfABCIsB) {
  MemoryProtocol protocol;
  TestTagBase tag(ICU_INT, 4);
  tag.setVarName("a?b?c");
  int length = -1;
  const char* field = protocol.getTagUriField(&tag, 1, &length);
  EXPECT_EQ(field, tag.GetVarName() + 2);
  EXPECT_EQ(length, 1);
  length = -1;
  EXPECT_EQ(protocol.getTagUriField(&tag, 3, &length), nullptr);
  EXPECT_EQ(length, -1);
}

TEST(ProtocolBaseUriFields, FirstLastAndEmptyFields) {
  MemoryProtocol protocol;
  TestTagBase tag(ICU_INT, 4);
  tag.setVarName("12?rx_token??binary-4");
  int length = -1;
  EXPECT_EQ(protocol.getTagUriField(&tag, 0, &length), tag.GetVarName());
  EXPECT_EQ(length, 2);
  EXPECT_EQ(protocol.getTagUriField(&tag, 2, &length), tag.GetVarName() + 12);
  EXPECT_EQ(length, 0);
  EXPECT_EQ(protocol.getTagUriField(&tag, 3, &length), tag.GetVarName() + 13);
  EXPECT_EQ(length, 8);
  EXPECT_EQ(protocol.getTagUriField(&tag, 4, &length), nullptr);
  EXPECT_EQ(protocol.getTagUriField(&tag, -1, &length), nullptr);
  EXPECT_NE(protocol.getTagUriField(&tag, 1, nullptr), nullptr);
}

TEST(ProtocolBaseUriFields, TagWithoutAddressTextHasNoFields) {
  MemoryProtocol protocol;
  TestTagBase tag(ICU_INT, 4);
  int length = -1;
  EXPECT_EQ(protocol.getTagUriField(&tag, 0, &length), nullptr);
  EXPECT_EQ(protocol.getTagUriField(nullptr, 0, &length), nullptr);
  EXPECT_EQ(length, -1);
}

TEST(ProtocolBaseUriFields, BaseHasNoFieldNames) {
  MemoryProtocol protocol;
  const char* const* names = protocol.tagUriNames();
  ASSERT_NE(names, nullptr);
  EXPECT_EQ(names[0], nullptr);
  EXPECT_EQ(protocol.getTagUriFieldCount(), 0);
  EXPECT_EQ(protocol.getTagUriFieldName(0), nullptr);
  EXPECT_EQ(protocol.getTagUriFieldPosition("node"), -1);
}

TEST(ProtocolBaseUriFields, DriverFieldNames) {
  NamedFields protocol;
  EXPECT_EQ(protocol.getTagUriFieldCount(), 3);
  EXPECT_STREQ(protocol.getTagUriFieldName(0), "node");
  EXPECT_STREQ(protocol.getTagUriFieldName(2), "datatype");
  EXPECT_EQ(protocol.getTagUriFieldName(3), nullptr);
  EXPECT_EQ(protocol.getTagUriFieldName(-1), nullptr);
  EXPECT_EQ(protocol.getTagUriFieldPosition("memorytype"), 1);
  EXPECT_EQ(protocol.getTagUriFieldPosition("datatype"), 2);
  EXPECT_EQ(protocol.getTagUriFieldPosition("Node"), -1);
  EXPECT_EQ(protocol.getTagUriFieldPosition(""), -1);
  EXPECT_EQ(protocol.getTagUriFieldPosition(nullptr), -1);
}

// --- tag order ---

TEST(ProtocolBaseOrder, IsBeforeComparesByteOffsetsUnsigned) {
  MemoryProtocol protocol;
  TestTagBase low(ICU_INT, 4);
  TestTagBase high(ICU_INT, 4);
  high.setByteOffset(8);
  EXPECT_TRUE(protocol.IsBefore(&low, &high));
  EXPECT_FALSE(protocol.IsBefore(&high, &low));
  EXPECT_FALSE(protocol.IsBefore(&low, &low));
  TestTagBase negative(ICU_INT, 4);
  negative.setByteOffset(-1);
  EXPECT_FALSE(protocol.IsBefore(&negative, &low));
  EXPECT_TRUE(protocol.IsBefore(&low, &negative));
  EXPECT_FALSE(protocol.IsBefore(nullptr, &low));
}

TEST(ProtocolBaseOrder, IsAdjacentWhenTheFirstBeginsWhereTheSecondEnds) {
  MemoryProtocol protocol;
  TestTagBase first(ICU_INT, 4);
  TestTagBase next(ICU_INT, 4);
  next.setByteOffset(4);
  EXPECT_TRUE(protocol.IsAdjacent(&next, &first));
  EXPECT_FALSE(protocol.IsAdjacent(&first, &next));
  TestTagBase bits(ICU_BOOLEAN_ARRAY, 3, ICU_BOOLEAN);
  bits.setBitIndex(6);  // bits 6 to 8
  TestTagBase bit(ICU_BOOLEAN, 1);
  bit.setByteOffset(1);
  bit.setBitIndex(1);  // bit 9
  EXPECT_TRUE(protocol.IsAdjacent(&bit, &bits));
  EXPECT_FALSE(protocol.IsAdjacent(&bits, &bit));
  EXPECT_FALSE(protocol.IsAdjacent(nullptr, &bits));
}

// --- paths that depend on the driver's optional operations ---

TEST(OverrideDetection, ReadWithoutBitBlockOperationsUsesTheBlockRead) {
  MemoryProtocol protocol;
  Put(protocol, 0, {0x40});
  ITag* tag = MustCreate(protocol, "0?boolean?6");
  unsigned char value[1] = {9};
  ASSERT_TRUE(protocol.Read(tag, value));
  EXPECT_EQ(value[0], 1);
  EXPECT_EQ(protocol.blockReads(), 1);
}

TEST(OverrideDetection, ReadWithBitBlockOperationsUsesTheBitBlockRead) {
  MemoryProtocolWithOverrides protocol;
  Put(protocol, 0, {0x80, 0x01});
  ITag* bits = MustCreate(protocol, "0?boolean-3?6");
  unsigned char value[3] = {9, 9, 9};
  ASSERT_TRUE(protocol.Read(bits, value));
  EXPECT_EQ(Bytes(value, value + 3), (Bytes{0, 1, 1}));
  EXPECT_EQ(protocol.lastBits, 3);  // one host byte per bit
  Put(protocol, 8, {0x11, 0x22});
  ITag* word = MustCreate(protocol, "8?unsignedShort(swap2)");
  ASSERT_TRUE(protocol.Read(word, value));
  EXPECT_EQ(Bytes(value, value + 2), (Bytes{0x22, 0x11}));
  EXPECT_EQ(protocol.lastBits, 16);  // packed length times 8
  EXPECT_EQ(protocol.bitBlockReads, 2);
  EXPECT_EQ(protocol.blockReads(), 0);
}

TEST(OverrideDetection, ReadWhereBitBlocksAreDeclinedUsesTheBlockRead) {
  MemoryProtocolWithOverrides protocol;
  protocol.bitBlocks = false;
  Put(protocol, 0, {1, 2, 3, 4});
  ITag* tag = MustCreate(protocol, "0?int");
  unsigned char value[4] = {};
  ASSERT_TRUE(protocol.Read(tag, value));
  EXPECT_EQ(Bytes(value, value + 4), (Bytes{1, 2, 3, 4}));
  EXPECT_EQ(protocol.lastBlockReadLength(), 4);
  EXPECT_EQ(protocol.bitBlockReads, 0);
  EXPECT_EQ(protocol.blockReads(), 1);
}

TEST(OverrideDetection, ReadWithBitBlockQuestionButNoBitBlockReadFailsAtOnce) {
  OnlyCanReadBitBlock protocol;
  Put(protocol, 0, {5, 0, 0, 0});
  ITag* tag = MustCreate(protocol, "0?int");
  unsigned char value[4] = {7, 7, 7, 7};
  EXPECT_FALSE(protocol.Read(tag, value));
  EXPECT_EQ(Bytes(value, value + 4), (Bytes{7, 7, 7, 7}));
  EXPECT_EQ(protocol.blockReads(), 0);
  EXPECT_EQ(protocol.GetLastError(), 1);
}

TEST(OverrideDetection, ReadBitBlockWithTimestamp) {
  MemoryProtocol plain;
  TestTagBase tag(ICU_BOOLEAN_ARRAY, 4, ICU_BOOLEAN);
  unsigned char buffer[1] = {0x33};
  unsigned long long ts = 42;
  EXPECT_FALSE(plain.readBitBlockWithTimestamp(&tag, buffer, 4, &ts));
  EXPECT_EQ(ts, 42U);
  EXPECT_EQ(buffer[0], 0x33);

  MemoryProtocolWithOverrides bits;
  Put(bits, 0, {0x0A});
  const unsigned long long before = ProtUtilsN::currentTimeStamp();
  ASSERT_TRUE(bits.readBitBlockWithTimestamp(&tag, buffer, 4, &ts));
  EXPECT_EQ(buffer[0], 0x3A);  // the four bits copied, the others kept
  EXPECT_GE(ts, before);
  EXPECT_LE(ts, ProtUtilsN::currentTimeStamp());
}

TEST(OverrideDetection, ReadWithTimestampUsesTheDriversRead) {
  OwnRead protocol;
  TestTagBase tag(ICU_BINARY, 3, ICU_UNSIGNED_BYTE);
  unsigned char value[3] = {};
  unsigned long long ts = 0;
  const unsigned long long before = ProtUtilsN::currentTimeStamp();
  ASSERT_TRUE(protocol.readWithTimestamp(&tag, value, &ts));
  EXPECT_EQ(Bytes(value, value + 3), (Bytes{0xA0, 0xA1, 0xA2}));
  EXPECT_EQ(protocol.reads, 1);
  EXPECT_EQ(protocol.blockReads(), 0);
  EXPECT_GE(ts, before);
  EXPECT_LE(ts, ProtUtilsN::currentTimeStamp());
}

TEST(OverrideDetection, ArrayItemsUseTheDriversRead) {
  OwnRead protocol;
  TestTagBase tag(ICU_UNSIGNED_SHORT_ARRAY, 6, ICU_UNSIGNED_SHORT);
  unsigned char item[2] = {};
  ASSERT_TRUE(protocol.readArrayItem(&tag, 1, item));
  EXPECT_EQ(Bytes(item, item + 2), (Bytes{0xA2, 0xA3}));
  EXPECT_EQ(protocol.reads, 1);
}

TEST(OverrideDetection, CanAddToDatagramForEachOverride) {
  TestTagBase tag(ICU_INT, 4);
  const ITag* tags[] = {&tag};
  MemoryProtocol none;
  EXPECT_FALSE(none.CanAddToDatagram(tags, 1, &tag));
  OnlyCoexist coexist;
  EXPECT_FALSE(coexist.CanAddToDatagram(tags, 1, &tag));
  CoexistAndItems items;
  EXPECT_FALSE(items.CanAddToDatagram(tags, 1, &tag));  // 8 bytes is not below 1
  MemoryProtocolWithOverrides all;
  EXPECT_TRUE(all.CanAddToDatagram(tags, 1, &tag));
}

TEST(OverrideDetection, TimestampedDatagramWithoutAnyDatagramReadFails) {
  MemoryProtocol protocol;
  TestTagBase tag(ICU_INT, 4);
  const ITag* tags[] = {&tag};
  unsigned char buffer[4] = {};
  idal_error_t status[1] = {-4};
  unsigned long long ts[1] = {42};
  EXPECT_FALSE(protocol.readDatagramWithTimestamp(tags, 1, buffer, status, ts));
  EXPECT_EQ(status[0], -4);
  EXPECT_EQ(ts[0], 42U);
}

TEST(OverrideDetection, TimestampedDatagramWithOnlyDatagramReadWritesStatusOne) {
  MemoryProtocolWithOverrides protocol;
  Put(protocol, 0, {4, 3, 2, 1});
  TestTagBase tag(ICU_INT, 4);
  const ITag* tags[] = {&tag};
  unsigned char buffer[4] = {};
  idal_error_t status[1] = {-4};
  unsigned long long ts[1] = {0};
  const unsigned long long before = ProtUtilsN::currentTimeStamp();
  ASSERT_TRUE(protocol.readDatagramWithTimestamp(tags, 1, buffer, status, ts));
  EXPECT_EQ(Bytes(buffer, buffer + 4), (Bytes{4, 3, 2, 1}));
  EXPECT_EQ(status[0], 1);
  EXPECT_GE(ts[0], before);
  EXPECT_LE(ts[0], ProtUtilsN::currentTimeStamp());
  EXPECT_EQ(protocol.datagramReads, 1);
}

TEST(OverrideDetection, TimestampedDatagramUsesTheDriversStatusRead) {
  WithStatusOverride protocol;
  TestTagBase tag(ICU_INT, 4);
  const ITag* tags[] = {&tag, &tag};
  unsigned char buffer[8] = {};
  idal_error_t status[2] = {};
  unsigned long long ts[2] = {0, 0};
  const unsigned long long before = ProtUtilsN::currentTimeStamp();
  ASSERT_TRUE(protocol.readDatagramWithTimestamp(tags, 2, buffer, status, ts));
  EXPECT_EQ(buffer[0], 0x5A);
  EXPECT_EQ(status[0], 7);
  EXPECT_EQ(status[1], 7);
  EXPECT_EQ(protocol.statusReads, 1);
  EXPECT_EQ(protocol.datagramReads, 0);
  EXPECT_GE(ts[0], before);
  EXPECT_LE(ts[0], ProtUtilsN::currentTimeStamp());
  EXPECT_EQ(ts[1], ts[0]);
}
