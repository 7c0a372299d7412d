// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/ParameterReplacer.h"

#include <gtest/gtest.h>

#include <string>
#include <thread>
#include <type_traits>
#include <utility>
#include <vector>

#include "MemoryStorage.h"
#include "StorageCall.h"
#include "binding/HostServices.h"

namespace {

using Calls = std::vector<StorageCall>;
using Variant = ParameterReplacer::Variant;

const char* const kSection = "P1";

// Whether get(name, node, Def, Out&) names a usable overload.
template <typename Def, typename Out, typename = void>
struct CanGet : std::false_type {};
template <typename Def, typename Out>
struct CanGet<
    Def, Out,
    std::void_t<decltype(std::declval<ParameterReplacer&>().get(
        std::declval<const std::string&>(), 0, std::declval<Def>(), std::declval<Out&>()))>>
    : std::true_type {};

using Literal = decltype("text");

static_assert(CanGet<Literal, std::string>::value, "a literal default reads a text");
static_assert(CanGet<const std::string&, std::string>::value, "a text default reads a text");
static_assert(CanGet<int, int>::value, "an integer default reads an integer");
static_assert(CanGet<bool, bool>::value, "a flag default reads a flag");
static_assert(!CanGet<Literal, bool>::value, "a literal default must not read a flag");
static_assert(!CanGet<const char*, bool>::value, "a text pointer default must not read a flag");
static_assert(!CanGet<int, bool>::value, "an integer default must not read a flag");
static_assert(!CanGet<bool, int>::value, "a flag default must not read an integer");
static_assert(!CanGet<Literal, int>::value, "a literal default must not read an integer");
static_assert(!CanGet<int, std::string>::value, "an integer default must not read a text");

// Binds a storage double of the given generation as the module's permanent
// storage and clears the module-wide pointer again afterwards.
template <MemoryStorage::Generation kGeneration>
class StorageBoundTest : public ::testing::Test {
 protected:
  void SetUp() override {
    piPermanentStorage = &storage;
    live.setSection(kSection);
  }
  void TearDown() override { piPermanentStorage = nullptr; }

  MemoryStorage storage{kGeneration};
  ParameterReplacer live;
};

using ParameterReplacerTest = StorageBoundTest<MemoryStorage::Generation::Second>;
// A storage that offers only the first interface.
using ParameterReplacerFirstGenerationTest = StorageBoundTest<MemoryStorage::Generation::First>;

// No storage service bound.
class ParameterReplacerWithoutStorageTest : public ::testing::Test {
 protected:
  void SetUp() override { piPermanentStorage = nullptr; }
  void TearDown() override { piPermanentStorage = nullptr; }

  ParameterReplacer live;
};

Variant Text(const std::string& value) {
  Variant v;
  v.type = ParameterReplacer::kString;
  v.stringValue = value;
  return v;
}

Variant Number(int value) {
  Variant v;
  v.type = ParameterReplacer::kInteger;
  v.intValue = value;
  return v;
}

Variant Flag(bool value) {
  Variant v;
  v.type = ParameterReplacer::kBoolean;
  v.boolValue = value;
  return v;
}

}  // namespace

TEST(ParameterReplacerName, NodeMinusOneLeavesTheNameUnchanged) {
  EXPECT_EQ(ParameterReplacer::makeFullName("gap", -1), "gap");
  EXPECT_EQ(ParameterReplacer::makeFullName("remote_ip_address", -1), "remote_ip_address");
  EXPECT_EQ(ParameterReplacer::makeFullName("", -1), "");
}

TEST(ParameterReplacerName, NodeNumberIsAppendedWithoutSeparator) {
  EXPECT_EQ(ParameterReplacer::makeFullName("gap", 0), "gap0");
  EXPECT_EQ(ParameterReplacer::makeFullName("gap", 2), "gap2");
  EXPECT_EQ(ParameterReplacer::makeFullName("rx_prefix", 17), "rx_prefix17");
}

TEST(ParameterReplacerName, OtherNegativeNodesAreAppendedInDecimal) {
  EXPECT_EQ(ParameterReplacer::makeFullName("gap", -2), "gap-2");
}

TEST(ParameterReplacerSection, StartsEmptyAndKeepsWhatIsSet) {
  ParameterReplacer fresh;
  EXPECT_EQ(fresh.getSection(), "");
  fresh.setSection("VELT#3");
  EXPECT_EQ(fresh.getSection(), "VELT#3");
  fresh.setSection("other");
  EXPECT_EQ(fresh.getSection(), "other");
}

TEST_F(ParameterReplacerTest, ReadsAStoredIntegerUnderItsSection) {
  storage.presetInt(kSection, "gap", 250);
  int gap = 0;
  live.get("gap", -1, 100, gap);
  EXPECT_EQ(gap, 250);
  EXPECT_EQ(storage.calls(),
            (Calls{{"HasValue", "P1", "gap", "1"}, {"GetIntValue", "P1", "gap", "250"}}));
}

TEST_F(ParameterReplacerTest, ReadsAStoredFlag) {
  storage.presetBool(kSection, "hex_tokens", true);
  bool hex = false;
  live.get("hex_tokens", -1, false, hex);
  EXPECT_TRUE(hex);
  EXPECT_EQ(storage.calls(), (Calls{{"HasValue", "P1", "hex_tokens", "1"},
                                    {"GetBoolValue", "P1", "hex_tokens", "true"}}));
}

TEST_F(ParameterReplacerTest, ReadsAStoredTextIntoA256ByteBuffer) {
  storage.presetText(kSection, "rx_prefix", "0D0A");
  std::string prefix;
  live.get("rx_prefix", -1, "02", prefix);
  EXPECT_EQ(prefix, "0D0A");
  EXPECT_EQ(storage.calls(), (Calls{{"HasValue", "P1", "rx_prefix", "1"},
                                    {"ConvertTo", "", "IPermanentStorage2", ""},
                                    {"GetStringValueInto", "P1", "rx_prefix", "256"}}));
  EXPECT_EQ(storage.count("GetStringValue"), 0);
}

TEST_F(ParameterReplacerTest, A255CharacterTextReadsBack) {
  const std::string stored(255, 'A');
  storage.presetText(kSection, "remote_ip_address", stored);
  std::string out;
  live.get("remote_ip_address", -1, "10.0.0.1", out);
  EXPECT_EQ(out, stored);
}

TEST_F(ParameterReplacerTest, A256CharacterTextFailsAndGivesTheEmptyTextNotTheDefault) {
  storage.presetText(kSection, "remote_ip_address", std::string(256, 'A'));
  std::string out = "untouched";
  live.get("remote_ip_address", -1, "10.0.0.1", out);
  EXPECT_EQ(out, "");
  // The empty text is what the set now holds.
  std::string again;
  live.get("remote_ip_address", -1, "10.0.0.2", again);
  EXPECT_EQ(again, "");
  EXPECT_EQ(storage.count("GetStringValueInto"), 1);
  EXPECT_EQ(storage.count("GetStringValue"), 0);
}

TEST_F(ParameterReplacerTest, AFailedTextReadGivesTheEmptyText) {
  storage.presetText(kSection, "socket_type", "TCP");
  storage.failStringReads(true);
  std::string out = "untouched";
  live.get("socket_type", -1, "UDP", out);
  EXPECT_EQ(out, "");
  EXPECT_EQ(storage.calls(), (Calls{{"HasValue", "P1", "socket_type", "1"},
                                    {"ConvertTo", "", "IPermanentStorage2", ""},
                                    {"GetStringValueInto", "P1", "socket_type", "256"}}));
}

TEST_F(ParameterReplacerTest, AnAbsentNameGivesTheDefaultWithoutAGetterCall) {
  std::string text;
  int number = 0;
  bool flag = false;
  live.get("socket_type", -1, "UDP", text);
  live.get("remote_port", -1, 5000, number);
  live.get("hex_tokens", -1, true, flag);
  EXPECT_EQ(text, "UDP");
  EXPECT_EQ(number, 5000);
  EXPECT_TRUE(flag);
  EXPECT_EQ(storage.calls(), (Calls{{"HasValue", "P1", "socket_type", "0"},
                                    {"HasValue", "P1", "remote_port", "0"},
                                    {"HasValue", "P1", "hex_tokens", "0"}}));
}

TEST_F(ParameterReplacerTest, AValueStoredUnderAnotherSectionIsNotSeen) {
  storage.presetInt("P2", "gap", 250);
  int gap = 0;
  live.get("gap", -1, 100, gap);
  EXPECT_EQ(gap, 100);
}

TEST_F(ParameterReplacerTest, ANodeReadsUnderItsFullName) {
  storage.presetInt(kSection, "gap3", 30);
  int gap = 0;
  live.get("gap", 3, 100, gap);
  EXPECT_EQ(gap, 30);
  EXPECT_EQ(storage.calls(),
            (Calls{{"HasValue", "P1", "gap3", "1"}, {"GetIntValue", "P1", "gap3", "30"}}));
  int protocolWide = 0;
  live.get("gap", -1, 100, protocolWide);
  EXPECT_EQ(protocolWide, 100);
}

TEST_F(ParameterReplacerTest, TheFirstValueReadStaysWhateverDefaultFollows) {
  int gap = 0;
  live.get("gap", -1, 100, gap);
  ASSERT_EQ(gap, 100);
  storage.presetInt(kSection, "gap", 250);
  storage.clearCalls();

  live.get("gap", -1, 200, gap);
  EXPECT_EQ(gap, 100);
  EXPECT_EQ(storage.calls(), Calls{});
}

TEST_F(ParameterReplacerTest, TheFirstStoredValueStaysAfterStorageChanges) {
  storage.presetText(kSection, "tx_suffix", "03");
  std::string suffix;
  live.get("tx_suffix", -1, "", suffix);
  ASSERT_EQ(suffix, "03");
  storage.presetText(kSection, "tx_suffix", "04");
  storage.clearCalls();

  live.get("tx_suffix", -1, "05", suffix);
  EXPECT_EQ(suffix, "03");
  EXPECT_EQ(storage.calls(), Calls{});
}

TEST_F(ParameterReplacerTest, ALiteralDefaultReadsAText) {
  std::string out;
  live.get("hex_tokens", -1, "true", out);
  EXPECT_EQ(out, "true");
  Variant held;
  ASSERT_TRUE(live.find("hex_tokens", held));
  EXPECT_EQ(held.type, ParameterReplacer::kString);
  EXPECT_EQ(held.stringValue, "true");
}

TEST_F(ParameterReplacerTest, EachFormInsertsAnEntryOfItsType) {
  std::string text;
  int number = 0;
  bool flag = false;
  live.get("broadcast_type", -1, std::string("Global"), text);
  live.get("token_queue_size", -1, 16, number);
  live.get("hex_tokens", -1, true, flag);

  Variant held;
  ASSERT_TRUE(live.find("broadcast_type", held));
  EXPECT_EQ(held.type, 2);
  EXPECT_EQ(held.stringValue, "Global");
  ASSERT_TRUE(live.find("token_queue_size", held));
  EXPECT_EQ(held.type, 1);
  EXPECT_EQ(held.intValue, 16);
  ASSERT_TRUE(live.find("hex_tokens", held));
  EXPECT_EQ(held.type, 0);
  EXPECT_TRUE(held.boolValue);
  EXPECT_EQ(live.entries().size(), 3U);
}

TEST_F(ParameterReplacerTest, AHeldNameReadWithAnotherTypeGivesThatUntouchedMember) {
  int gap = 0;
  live.get("gap", -1, 100, gap);
  storage.clearCalls();

  std::string asText = "before";
  live.get("gap", -1, "fast", asText);
  bool asFlag = true;
  live.get("gap", -1, true, asFlag);
  EXPECT_EQ(asText, "");
  EXPECT_FALSE(asFlag);
  EXPECT_EQ(storage.calls(), Calls{});
  Variant held;
  ASSERT_TRUE(live.find("gap", held));
  EXPECT_EQ(held.type, ParameterReplacer::kInteger);
  EXPECT_EQ(held.intValue, 100);
}

TEST_F(ParameterReplacerTest, SetCreatesAndReplacesTheTypedMember) {
  ASSERT_TRUE(live.set("local_ip_address", Text("192.168.1.10")));
  ASSERT_TRUE(live.set("local_ip_address", Number(5)));

  Variant held;
  ASSERT_TRUE(live.find("local_ip_address", held));
  EXPECT_EQ(held.type, ParameterReplacer::kInteger);
  EXPECT_EQ(held.intValue, 5);
  // The member of the earlier type is left as it was.
  EXPECT_EQ(held.stringValue, "192.168.1.10");
  EXPECT_EQ(storage.calls(), Calls{});
}

TEST_F(ParameterReplacerTest, SetValueIsWhatGetAnswersWithoutStorage) {
  ASSERT_TRUE(live.set("local_port", Number(6000)));
  int port = 0;
  live.get("local_port", -1, 5000, port);
  EXPECT_EQ(port, 6000);
  EXPECT_EQ(storage.calls(), Calls{});
}

TEST_F(ParameterReplacerTest, SetRefusesAnUnknownType) {
  Variant odd = Number(7);
  odd.type = 3;
  EXPECT_FALSE(live.set("gap", odd));
  Variant held;
  EXPECT_FALSE(live.find("gap", held));
  EXPECT_TRUE(live.entries().empty());
}

TEST_F(ParameterReplacerTest, PersistWritesWithTheSetterOfEachTypeUnderTheSection) {
  live.persist("hex_tokens", Flag(true));
  live.persist("gap", Number(-7));
  live.persist("rx_suffix", Text("0D"));
  EXPECT_EQ(storage.calls(), (Calls{{"SetBoolValue", "P1", "hex_tokens", "true"},
                                    {"SetIntValue", "P1", "gap", "-7"},
                                    {"SetStringValue", "P1", "rx_suffix", "0D"}}));
  EXPECT_EQ(storage.boolValue(kSection, "hex_tokens"), true);
  EXPECT_EQ(storage.intValue(kSection, "gap"), -7);
  EXPECT_EQ(storage.textValue(kSection, "rx_suffix"), "0D");
  // Persisting does not touch the live map.
  EXPECT_TRUE(live.entries().empty());
}

TEST_F(ParameterReplacerTest, PersistOfAnUnknownTypeWritesNothing) {
  Variant odd = Text("x");
  odd.type = -1;
  live.persist("gap", odd);
  EXPECT_EQ(storage.calls(), Calls{});
}

TEST_F(ParameterReplacerTest, FindLeavesOutUntouchedForAnAbsentName) {
  Variant out = Number(42);
  EXPECT_FALSE(live.find("gap", out));
  EXPECT_EQ(out.type, ParameterReplacer::kInteger);
  EXPECT_EQ(out.intValue, 42);
}

TEST_F(ParameterReplacerTest, EntriesAreOrderedBytewise) {
  live.set("zeta", Number(1));
  live.set("\xC3\xA9t\xC3\xA9", Number(2));
  live.set("Zeta", Number(3));
  live.set("alpha", Number(4));
  live.set("gap2", Number(5));
  live.set("gap", Number(6));

  std::vector<std::string> order;
  for (const auto& entry : live.entries()) {
    order.push_back(entry.first);
  }
  EXPECT_EQ(order, (std::vector<std::string>{"Zeta", "alpha", "gap", "gap2", "zeta",
                                             "\xC3\xA9t\xC3\xA9"}));
}

TEST_F(ParameterReplacerTest, ConcurrentFirstReadsAgreeAndReadStorageOnce) {
  constexpr int kThreads = 4;
  constexpr int kRounds = 200;
  std::vector<std::vector<int>> seen(kThreads);
  {
    std::vector<std::thread> threads;
    for (int t = 0; t < kThreads; ++t) {
      threads.emplace_back([this, t, &seen] {
        for (int round = 0; round < kRounds; ++round) {
          int value = 0;
          live.get("token_queue_size", -1, 1000 + t, value);
          seen[t].push_back(value);
        }
      });
    }
    for (auto& thread : threads) {
      thread.join();
    }
  }
  const int first = seen[0][0];
  EXPECT_GE(first, 1000);
  EXPECT_LT(first, 1000 + kThreads);
  for (const auto& values : seen) {
    ASSERT_EQ(values.size(), static_cast<std::size_t>(kRounds));
    for (const int value : values) {
      EXPECT_EQ(value, first);
    }
  }
  EXPECT_EQ(storage.calls(), (Calls{{"HasValue", "P1", "token_queue_size", "0"}}));
}

TEST_F(ParameterReplacerFirstGenerationTest, ReadsATextThroughGetStringValue) {
  storage.presetText(kSection, "local_ip_address", "192.168.1.10");
  std::string ip;
  live.get("local_ip_address", -1, "", ip);
  EXPECT_EQ(ip, "192.168.1.10");
  EXPECT_EQ(storage.calls(), (Calls{{"HasValue", "P1", "local_ip_address", "1"},
                                    {"ConvertTo", "", "IPermanentStorage2", ""},
                                    {"GetStringValue", "P1", "local_ip_address", "192.168.1.10"}}));
  EXPECT_EQ(storage.count("GetStringValueInto"), 0);
}

TEST_F(ParameterReplacerFirstGenerationTest, ATextLongerThanTheBufferStillReadsBack) {
  const std::string stored(300, 'B');
  storage.presetText(kSection, "rx_prefix", stored);
  std::string out;
  live.get("rx_prefix", -1, "", out);
  EXPECT_EQ(out, stored);
}

TEST_F(ParameterReplacerFirstGenerationTest, ANullTextGivesTheEmptyText) {
  storage.presetText(kSection, "socket_type", "TCP");
  storage.failStringReads(true);
  std::string out = "untouched";
  live.get("socket_type", -1, "UDP", out);
  EXPECT_EQ(out, "");
  EXPECT_EQ(storage.calls(), (Calls{{"HasValue", "P1", "socket_type", "1"},
                                    {"ConvertTo", "", "IPermanentStorage2", ""},
                                    {"GetStringValue", "P1", "socket_type", "(null)"}}));
}

TEST_F(ParameterReplacerFirstGenerationTest, IntegersAndFlagsUseTheirGetters) {
  storage.presetInt(kSection, "local_port", 7000);
  storage.presetBool(kSection, "hex_tokens", false);
  int port = 0;
  bool hex = true;
  live.get("local_port", -1, 5000, port);
  live.get("hex_tokens", -1, true, hex);
  EXPECT_EQ(port, 7000);
  EXPECT_FALSE(hex);
  EXPECT_EQ(storage.calls(), (Calls{{"HasValue", "P1", "local_port", "1"},
                                    {"GetIntValue", "P1", "local_port", "7000"},
                                    {"HasValue", "P1", "hex_tokens", "1"},
                                    {"GetBoolValue", "P1", "hex_tokens", "false"}}));
}

TEST_F(ParameterReplacerWithoutStorageTest, GetReturnsTheDefault) {
  std::string text;
  int number = 0;
  bool flag = true;
  live.get("socket_type", -1, "TCP", text);
  live.get("gap", -1, 20, number);
  live.get("hex_tokens", -1, false, flag);
  EXPECT_EQ(text, "TCP");
  EXPECT_EQ(number, 20);
  EXPECT_FALSE(flag);
  EXPECT_EQ(live.entries().size(), 3U);
}

TEST_F(ParameterReplacerWithoutStorageTest, PersistDoesNothing) {
  live.persist("gap", Number(5));
  EXPECT_TRUE(live.entries().empty());
}
