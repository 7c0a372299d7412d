// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "config/GroupParameterReplacer.h"

#include <gtest/gtest.h>

#include <atomic>
#include <map>
#include <string>
#include <thread>
#include <vector>

#include "MemoryStorage.h"
#include "StorageCall.h"
#include "binding/HostServices.h"
#include "config/ParameterReplacer.h"

namespace {

using Calls = std::vector<StorageCall>;
using Staged = GroupParameterReplacer::Variant;
using Live = ParameterReplacer::Variant;

const char* const kSection = "P1";

// Binds a storage double as the module's permanent storage, names the live
// set's section, and clears the module-wide pointer again afterwards.
class GroupParameterReplacerTest : public ::testing::Test {
 protected:
  void SetUp() override {
    piPermanentStorage = &storage;
    live.setSection(kSection);
  }
  void TearDown() override { piPermanentStorage = nullptr; }

  MemoryStorage storage;
  ParameterReplacer live;
  GroupParameterReplacer staging;
};

class GroupParameterReplacerWithoutStorageTest : public ::testing::Test {
 protected:
  void SetUp() override {
    piPermanentStorage = nullptr;
    live.setSection(kSection);
  }
  void TearDown() override { piPermanentStorage = nullptr; }

  ParameterReplacer live;
  GroupParameterReplacer staging;
};

// The full names of a set's entries, in map order.
template <typename Value>
std::vector<std::string> Keys(const std::map<std::string, Value>& entries) {
  std::vector<std::string> keys;
  for (const auto& entry : entries) {
    keys.push_back(entry.first);
  }
  return keys;
}

}  // namespace

TEST(GroupParameterReplacerName, FollowsTheLiveRule) {
  EXPECT_EQ(GroupParameterReplacer::makeFullName("gap", -1), "gap");
  EXPECT_EQ(GroupParameterReplacer::makeFullName("gap", 0), "gap0");
  EXPECT_EQ(GroupParameterReplacer::makeFullName("gap", 2), "gap2");
  EXPECT_EQ(GroupParameterReplacer::makeFullName("local_port", 15), "local_port15");
}

TEST_F(GroupParameterReplacerTest, EachSetterStagesItsType) {
  staging.set("socket_type", -1, "TCP");
  staging.set("hex_tokens", -1, true);
  staging.set("gap", -1, 100);

  const auto entries = staging.entries();
  ASSERT_EQ(Keys(entries), (std::vector<std::string>{"gap", "hex_tokens", "socket_type"}));
  const Staged& text = entries.at("socket_type");
  EXPECT_EQ(text.type, 2);
  EXPECT_EQ(text.name, "socket_type");
  EXPECT_EQ(text.stringValue, "TCP");
  EXPECT_EQ(text.node, -1);
  const Staged& flag = entries.at("hex_tokens");
  EXPECT_EQ(flag.type, 0);
  EXPECT_EQ(flag.name, "hex_tokens");
  EXPECT_TRUE(flag.boolValue);
  EXPECT_EQ(flag.node, -1);
  const Staged& number = entries.at("gap");
  EXPECT_EQ(number.type, 1);
  EXPECT_EQ(number.name, "gap");
  EXPECT_EQ(number.intValue, 100);
  EXPECT_EQ(number.node, -1);
  // Staging alone touches neither storage nor the live set.
  EXPECT_EQ(storage.calls(), Calls{});
  EXPECT_TRUE(live.entries().empty());
}

TEST_F(GroupParameterReplacerTest, LiteralsPickTheirOverload) {
  staging.set("a", -1, "1");
  staging.set("b", -1, false);
  staging.set("c", -1, 0);
  const auto entries = staging.entries();
  EXPECT_EQ(entries.at("a").type, ParameterReplacer::kString);
  EXPECT_EQ(entries.at("a").stringValue, "1");
  EXPECT_EQ(entries.at("b").type, ParameterReplacer::kBoolean);
  EXPECT_EQ(entries.at("c").type, ParameterReplacer::kInteger);
  EXPECT_EQ(entries.at("c").intValue, 0);
}

TEST_F(GroupParameterReplacerTest, ANullTextStagesTheEmptyText) {
  const char* const none = nullptr;
  staging.set("tx_prefix", -1, none);
  std::string out = "untouched";
  ASSERT_TRUE(staging.get("tx_prefix", -1, out));
  EXPECT_EQ(out, "");
}

TEST_F(GroupParameterReplacerTest, ANameStagedTwiceKeepsOnlyTheLastValueAndType) {
  staging.set("gap", -1, 100);
  staging.set("gap", -1, "fast");

  const auto entries = staging.entries();
  ASSERT_EQ(entries.size(), 1U);
  EXPECT_EQ(entries.at("gap").type, ParameterReplacer::kString);
  EXPECT_EQ(entries.at("gap").stringValue, "fast");
  int number = -1;
  EXPECT_FALSE(staging.get("gap", -1, number));
  EXPECT_EQ(number, -1);
  std::string text;
  ASSERT_TRUE(staging.get("gap", -1, text));
  EXPECT_EQ(text, "fast");

  staging.set("gap", -1, 250);
  EXPECT_EQ(staging.entries().size(), 1U);
  ASSERT_TRUE(staging.get("gap", -1, number));
  EXPECT_EQ(number, 250);
}

TEST_F(GroupParameterReplacerTest, TheLastOfTwoValuesOfOneTypeIsApplied) {
  staging.set("remote_port", -1, 5000);
  staging.set("remote_port", -1, 6000);
  staging.activate(live, -1, true);
  EXPECT_EQ(storage.writes(), (Calls{{"SetIntValue", "P1", "remote_port", "6000"}}));
}

TEST_F(GroupParameterReplacerTest, TypedGetAnswersTheStagedValueOfItsType) {
  staging.set("gap", -1, 100);
  staging.set("hex_tokens", -1, true);
  staging.set("remote_ip_address", -1, "10.1.2.3");

  int gap = 0;
  bool hex = false;
  std::string ip;
  EXPECT_TRUE(staging.get("gap", -1, gap));
  EXPECT_TRUE(staging.get("hex_tokens", -1, hex));
  EXPECT_TRUE(staging.get("remote_ip_address", -1, ip));
  EXPECT_EQ(gap, 100);
  EXPECT_TRUE(hex);
  EXPECT_EQ(ip, "10.1.2.3");
}

TEST_F(GroupParameterReplacerTest, TypedGetOfAnotherTypeAnswersFalseAndLeavesOut) {
  staging.set("gap", -1, 100);
  std::string text = "keep";
  bool flag = true;
  EXPECT_FALSE(staging.get("gap", -1, text));
  EXPECT_FALSE(staging.get("gap", -1, flag));
  EXPECT_EQ(text, "keep");
  EXPECT_TRUE(flag);

  staging.set("hex_tokens", -1, false);
  int number = 7;
  EXPECT_FALSE(staging.get("hex_tokens", -1, number));
  EXPECT_EQ(number, 7);
}

TEST_F(GroupParameterReplacerTest, GetOfNothingStagedAnswersFalseAndLeavesOut) {
  std::string text = "keep";
  int number = 7;
  bool flag = true;
  EXPECT_FALSE(staging.get("socket_type", -1, text));
  EXPECT_FALSE(staging.get("gap", -1, number));
  EXPECT_FALSE(staging.get("hex_tokens", -1, flag));
  EXPECT_EQ(text, "keep");
  EXPECT_EQ(number, 7);
  EXPECT_TRUE(flag);
}

TEST_F(GroupParameterReplacerTest, NodesAreStagedUnderTheirFullNames) {
  staging.set("gap", 2, 5);
  int number = 0;
  EXPECT_FALSE(staging.get("gap", -1, number));
  ASSERT_TRUE(staging.get("gap", 2, number));
  EXPECT_EQ(number, 5);
  const auto entries = staging.entries();
  ASSERT_EQ(Keys(entries), std::vector<std::string>{"gap2"});
  EXPECT_EQ(entries.at("gap2").name, "gap");
  EXPECT_EQ(entries.at("gap2").node, 2);
}

TEST_F(GroupParameterReplacerTest, ApplyingWithNothingStagedChangesNothing) {
  storage.presetInt(kSection, "gap", 250);
  int gap = 0;
  live.get("gap", -1, 100, gap);
  std::string socketType;
  live.get("socket_type", -1, "TCP", socketType);
  const auto before = live.entries();
  storage.clearCalls();

  staging.activate(live, -1, true);

  EXPECT_EQ(storage.calls(), Calls{});
  const auto after = live.entries();
  ASSERT_EQ(after.size(), before.size());
  EXPECT_EQ(after.at("gap").type, ParameterReplacer::kInteger);
  EXPECT_EQ(after.at("gap").intValue, 250);
  EXPECT_EQ(after.at("socket_type").type, ParameterReplacer::kString);
  EXPECT_EQ(after.at("socket_type").stringValue, "TCP");
  EXPECT_EQ(storage.size(), 1U);
}

TEST_F(GroupParameterReplacerTest, ApplyWritesTheEntriesOfTheNodeInFullNameOrder) {
  staging.set("tx_suffix", -1, "0D0A");
  staging.set("gap", 2, 9);
  staging.set("local_port", -1, 6001);
  staging.set("rx_prefix", 0, "02");
  staging.set("hex_tokens", -1, true);
  staging.set("gap", -1, 40);
  staging.set("Zone", -1, "A");

  staging.activate(live, -1, true);

  EXPECT_EQ(storage.calls(), (Calls{{"SetStringValue", "P1", "Zone", "A"},
                                    {"SetIntValue", "P1", "gap", "40"},
                                    {"SetBoolValue", "P1", "hex_tokens", "true"},
                                    {"SetIntValue", "P1", "local_port", "6001"},
                                    {"SetStringValue", "P1", "tx_suffix", "0D0A"}}));
  const auto applied = live.entries();
  EXPECT_EQ(Keys(applied),
            (std::vector<std::string>{"Zone", "gap", "hex_tokens", "local_port", "tx_suffix"}));
  EXPECT_EQ(applied.at("gap").intValue, 40);
  EXPECT_TRUE(applied.at("hex_tokens").boolValue);
  EXPECT_EQ(applied.at("local_port").intValue, 6001);
  EXPECT_EQ(applied.at("tx_suffix").stringValue, "0D0A");
}

TEST_F(GroupParameterReplacerTest, ApplyOfANodeWritesOnlyThatNodeUnderItsFullName) {
  staging.set("gap", -1, 40);
  staging.set("gap", 2, 9);
  staging.set("rx_prefix", 0, "02");

  staging.activate(live, 2, true);

  EXPECT_EQ(storage.calls(), (Calls{{"SetIntValue", "P1", "gap2", "9"}}));
  const auto applied = live.entries();
  ASSERT_EQ(applied.size(), 1U);
  EXPECT_EQ(applied.at("gap2").type, ParameterReplacer::kInteger);
  EXPECT_EQ(applied.at("gap2").intValue, 9);

  storage.clearCalls();
  staging.activate(live, 0, true);
  EXPECT_EQ(storage.calls(), (Calls{{"SetStringValue", "P1", "rx_prefix0", "02"}}));
}

TEST_F(GroupParameterReplacerTest, ApplyWithoutPersistWritesNothingButUpdatesTheLiveSet) {
  staging.set("gap", -1, 40);
  staging.set("socket_type", -1, "TCP");

  staging.activate(live, -1, false);

  EXPECT_EQ(storage.calls(), Calls{});
  EXPECT_EQ(storage.size(), 0U);
  int gap = 0;
  std::string socketType;
  live.get("gap", -1, 100, gap);
  live.get("socket_type", -1, "UDP", socketType);
  EXPECT_EQ(gap, 40);
  EXPECT_EQ(socketType, "TCP");
  EXPECT_EQ(storage.calls(), Calls{});
}

TEST_F(GroupParameterReplacerTest, ApplyInTwoStepsWritesStorageOnlyWhenPersisted) {
  staging.set("tx_suffix", -1, "0D0A");
  staging.set("gap", 2, 9);
  staging.set("gap", -1, 40);

  const GroupParameterReplacer::Applied applied = staging.apply(live, -1);

  EXPECT_EQ(storage.calls(), Calls{});
  ASSERT_EQ(applied.size(), 2U);
  EXPECT_EQ(applied[0].first, "gap");
  EXPECT_EQ(applied[0].second.intValue, 40);
  EXPECT_EQ(applied[1].first, "tx_suffix");
  EXPECT_EQ(applied[1].second.stringValue, "0D0A");
  EXPECT_EQ(Keys(live.entries()), (std::vector<std::string>{"gap", "tx_suffix"}));

  GroupParameterReplacer::persist(live, applied);
  EXPECT_EQ(storage.calls(), (Calls{{"SetIntValue", "P1", "gap", "40"},
                                    {"SetStringValue", "P1", "tx_suffix", "0D0A"}}));
}

TEST_F(GroupParameterReplacerTest, LiveValuesCanBeReadWhileTheyAreWrittenToStorage) {
  staging.set("gap", -1, 40);
  int seen = 0;
  storage.onWrite([this, &seen](const std::string& /*name*/) {
    // Another thread reads the live set while its value is being stored.
    std::thread reader([this, &seen] { live.get("gap", -1, 0, seen); });
    reader.join();
  });
  staging.activate(live, -1, true);
  storage.onWrite(nullptr);
  EXPECT_EQ(seen, 40);
}

TEST_F(GroupParameterReplacerTest, ApplyReplacesAValueTheLiveSetAlreadyHeld) {
  int gap = 0;
  live.get("gap", -1, 100, gap);
  ASSERT_EQ(gap, 100);
  staging.set("gap", -1, 250);

  staging.activate(live, -1, true);

  storage.clearCalls();
  live.get("gap", -1, 100, gap);
  EXPECT_EQ(gap, 250);
  EXPECT_EQ(storage.calls(), Calls{});
}

TEST_F(GroupParameterReplacerTest, ApplyChangesTheTypeOfALiveEntryAndKeepsItsOtherMembers) {
  int gap = 0;
  live.get("gap", -1, 100, gap);
  staging.set("gap", -1, "fast");

  staging.activate(live, -1, false);

  Live held;
  ASSERT_TRUE(live.find("gap", held));
  EXPECT_EQ(held.type, ParameterReplacer::kString);
  EXPECT_EQ(held.stringValue, "fast");
  EXPECT_EQ(held.intValue, 100);
}

TEST_F(GroupParameterReplacerTest, StagedValuesStayStagedAndASecondApplyReappliesThem) {
  staging.set("remote_ip_address", -1, "10.0.0.9");
  staging.set("remote_port", -1, 7000);

  staging.activate(live, -1, true);
  const Calls firstApply = storage.calls();
  EXPECT_EQ(firstApply, (Calls{{"SetStringValue", "P1", "remote_ip_address", "10.0.0.9"},
                               {"SetIntValue", "P1", "remote_port", "7000"}}));

  std::string ip;
  int port = 0;
  ASSERT_TRUE(staging.get("remote_ip_address", -1, ip));
  ASSERT_TRUE(staging.get("remote_port", -1, port));
  EXPECT_EQ(ip, "10.0.0.9");
  EXPECT_EQ(port, 7000);
  EXPECT_EQ(staging.entries().size(), 2U);

  // A value set in the live set in between is overwritten again.
  ParameterReplacer::Variant other;
  other.type = ParameterReplacer::kInteger;
  other.intValue = 1;
  live.set("remote_port", other);
  storage.clearCalls();
  staging.activate(live, -1, true);
  EXPECT_EQ(storage.calls(), firstApply);
  live.get("remote_port", -1, 0, port);
  EXPECT_EQ(port, 7000);
}

TEST_F(GroupParameterReplacerTest, AFreshLiveSetReadsTheAppliedValueFromStorage) {
  staging.set("gap", -1, 250);
  staging.set("rx_prefix", -1, "0D0A");
  staging.set("hex_tokens", -1, true);
  staging.activate(live, -1, true);
  storage.clearCalls();

  ParameterReplacer restarted;
  restarted.setSection(kSection);
  int gap = 0;
  std::string prefix;
  bool hex = false;
  restarted.get("gap", -1, 100, gap);
  restarted.get("rx_prefix", -1, "02", prefix);
  restarted.get("hex_tokens", -1, false, hex);

  EXPECT_EQ(gap, 250);
  EXPECT_EQ(prefix, "0D0A");
  EXPECT_TRUE(hex);
  EXPECT_EQ(storage.calls(), (Calls{{"HasValue", "P1", "gap", "1"},
                                    {"GetIntValue", "P1", "gap", "250"},
                                    {"HasValue", "P1", "rx_prefix", "1"},
                                    {"ConvertTo", "", "IPermanentStorage2", ""},
                                    {"GetStringValueInto", "P1", "rx_prefix", "256"},
                                    {"HasValue", "P1", "hex_tokens", "1"},
                                    {"GetBoolValue", "P1", "hex_tokens", "true"}}));
}

TEST_F(GroupParameterReplacerTest, AFreshLiveSetOfAnotherInstanceKeepsItsDefault) {
  staging.set("gap", -1, 250);
  staging.activate(live, -1, true);

  ParameterReplacer otherInstance;
  otherInstance.setSection("P2");
  int gap = 0;
  otherInstance.get("gap", -1, 100, gap);
  EXPECT_EQ(gap, 100);
}

TEST_F(GroupParameterReplacerTest, AFreshLiveSetAfterApplyWithoutPersistKeepsItsDefault) {
  staging.set("gap", -1, 250);
  staging.activate(live, -1, false);

  ParameterReplacer restarted;
  restarted.setSection(kSection);
  int gap = 0;
  restarted.get("gap", -1, 100, gap);
  EXPECT_EQ(gap, 100);
}

TEST_F(GroupParameterReplacerTest, TheDriverNamesAreStoredExactlyAsGiven) {
  staging.set("socket_type", -1, "TCP");
  staging.set("remote_ip_address", -1, "10.0.0.2");
  staging.set("remote_port", -1, 5001);
  staging.set("local_ip_address", -1, "10.0.0.1");
  staging.set("local_port", -1, 5002);
  staging.set("broadcast_type", -1, "Local");
  staging.set("rx_prefix", -1, "02");
  staging.set("rx_suffix", -1, "03");
  staging.set("tx_prefix", -1, "04");
  staging.set("tx_suffix", -1, "05");
  staging.set("gap", -1, 30);
  staging.set("hex_tokens", -1, true);
  staging.set("token_queue_size", -1, 64);

  staging.activate(live, -1, true);

  EXPECT_EQ(storage.calls(), (Calls{{"SetStringValue", "P1", "broadcast_type", "Local"},
                                    {"SetIntValue", "P1", "gap", "30"},
                                    {"SetBoolValue", "P1", "hex_tokens", "true"},
                                    {"SetStringValue", "P1", "local_ip_address", "10.0.0.1"},
                                    {"SetIntValue", "P1", "local_port", "5002"},
                                    {"SetStringValue", "P1", "remote_ip_address", "10.0.0.2"},
                                    {"SetIntValue", "P1", "remote_port", "5001"},
                                    {"SetStringValue", "P1", "rx_prefix", "02"},
                                    {"SetStringValue", "P1", "rx_suffix", "03"},
                                    {"SetStringValue", "P1", "socket_type", "TCP"},
                                    {"SetIntValue", "P1", "token_queue_size", "64"},
                                    {"SetStringValue", "P1", "tx_prefix", "04"},
                                    {"SetStringValue", "P1", "tx_suffix", "05"}}));
  EXPECT_EQ(storage.size(), 13U);
}

TEST_F(GroupParameterReplacerTest, ConcurrentStagingReadingAndApplyingStayConsistent) {
  constexpr int kRounds = 300;
  std::atomic<bool> failed{false};
  std::vector<std::thread> threads;
  threads.emplace_back([this] {
    for (int round = 0; round < kRounds; ++round) {
      staging.set("gap", -1, round);
    }
  });
  threads.emplace_back([this] {
    for (int round = 0; round < kRounds; ++round) {
      staging.set("socket_type", -1, round % 2 == 0 ? "TCP" : "UDP");
    }
  });
  threads.emplace_back([this, &failed] {
    for (int round = 0; round < kRounds; ++round) {
      int gap = -1;
      if (staging.get("gap", -1, gap) && (gap < 0 || gap >= kRounds)) {
        failed = true;
      }
      live.get("gap", -1, 0, gap);
      if (gap < 0 || gap >= kRounds) {
        failed = true;
      }
    }
  });
  threads.emplace_back([this] {
    for (int round = 0; round < kRounds; ++round) {
      staging.activate(live, -1, round % 3 == 0);
    }
  });
  for (auto& thread : threads) {
    thread.join();
  }
  EXPECT_FALSE(failed.load());

  staging.activate(live, -1, true);
  int gap = -1;
  std::string socketType;
  live.get("gap", -1, 0, gap);
  live.get("socket_type", -1, "", socketType);
  EXPECT_EQ(gap, kRounds - 1);
  EXPECT_EQ(socketType, "UDP");
  EXPECT_EQ(storage.intValue(kSection, "gap"), kRounds - 1);
  EXPECT_EQ(storage.textValue(kSection, "socket_type"), "UDP");
}

TEST_F(GroupParameterReplacerWithoutStorageTest, GetReturnsTheDefaultAndApplyUpdatesTheLiveSet) {
  int gap = 0;
  live.get("gap", -1, 100, gap);
  EXPECT_EQ(gap, 100);

  staging.set("gap", -1, 250);
  staging.set("broadcast_type", -1, "Local");
  staging.activate(live, -1, true);

  live.get("gap", -1, 100, gap);
  EXPECT_EQ(gap, 250);
  std::string broadcast;
  live.get("broadcast_type", -1, "Global", broadcast);
  EXPECT_EQ(broadcast, "Local");

  ParameterReplacer restarted;
  restarted.setSection(kSection);
  restarted.get("gap", -1, 100, gap);
  EXPECT_EQ(gap, 100);
}
