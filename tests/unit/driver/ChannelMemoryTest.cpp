// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include <set>
#include <string>

#include "driver/ChannelMemory.h"
#include "driver/SettingsTable.h"
#include "memory/MemoryType.h"

TEST(ChannelMemory, EveryRegisteredTypeResolvesToARoleOfItsOwn) {
  const Model model = BuildChannelModel();
  ASSERT_EQ(model.getMemoryTypes().size(), 21U);
  std::set<std::pair<int, int>> roles;
  for (const MemoryType& type : model.getMemoryTypes()) {
    const MemoryRole role = ResolveMemory(type.getName());
    EXPECT_NE(role.memory, ChannelMemory::None) << type.getName();
    const int setting = role.memory == ChannelMemory::Setting ? static_cast<int>(role.setting) : -1;
    EXPECT_TRUE(roles.insert({static_cast<int>(role.memory), setting}).second) << type.getName();
  }
}

TEST(ChannelMemory, SettingTypesResolveToTheirRow) {
  for (const SettingRow& row : SettingRows()) {
    const MemoryRole role = ResolveMemory(row.memoryType);
    EXPECT_EQ(role.memory, ChannelMemory::Setting) << row.memoryType;
    EXPECT_EQ(role.setting, row.setting) << row.memoryType;
  }
  EXPECT_EQ(ResolveMemory("SP_Done").memory, ChannelMemory::Apply);
  EXPECT_EQ(ResolveMemory("connect").memory, ChannelMemory::Connect);
}

TEST(ChannelMemory, NamesAreComparedExactly) {
  EXPECT_EQ(ResolveMemory("RX_TOKEN").memory, ChannelMemory::None);
  EXPECT_EQ(ResolveMemory("rx_token ").memory, ChannelMemory::None);
  EXPECT_EQ(ResolveMemory("").memory, ChannelMemory::None);
}

TEST(ChannelMemory, RuntimeParametersIncludeTheConnectTimeoutNoModelOffers) {
  EXPECT_TRUE(IsRuntimeParameter("SP_ConnectTimeout"));
  EXPECT_TRUE(IsRuntimeParameter("SP_Done"));
  EXPECT_TRUE(IsRuntimeParameter("SP_TokenQueueSize"));
  EXPECT_FALSE(IsRuntimeParameter("connect"));
  EXPECT_FALSE(IsRuntimeParameter("sp_done"));
  EXPECT_EQ(ResolveMemory("SP_ConnectTimeout").memory, ChannelMemory::None);
}

TEST(SettingsTable, ApplyOrderIsTheApplysOwn) {
  std::vector<std::string> order;
  for (const SettingRow* row : ApplyOrder()) {
    order.emplace_back(row->storageName);
  }
  EXPECT_EQ(order, (std::vector<std::string>{"socket_type", "local_ip_address", "local_port",
                                             "remote_ip_address", "remote_port", "broadcast_type",
                                             "rx_prefix", "rx_suffix", "tx_prefix", "tx_suffix",
                                             "gap", "hex_tokens", "token_queue_size"}));
}

TEST(SettingsTable, OnlyTheSocketSettingsRenewTheSocket) {
  std::vector<std::string> renewing;
  for (const SettingRow& row : SettingRows()) {
    if (row.renewsSocket) {
      renewing.emplace_back(row.storageName);
    }
  }
  EXPECT_EQ(renewing,
            (std::vector<std::string>{"socket_type", "remote_ip_address", "remote_port",
                                      "local_ip_address", "local_port", "broadcast_type"}));
}

TEST(SettingsTable, ChecksOfStagedTexts) {
  const SettingRow& socketType = RowOf(Setting::SocketType);
  EXPECT_TRUE(PassesCheck(socketType, "TCP"));
  EXPECT_FALSE(PassesCheck(socketType, "tcp"));
  const SettingRow& broadcast = RowOf(Setting::BroadcastType);
  EXPECT_TRUE(PassesCheck(broadcast, "Local"));
  EXPECT_FALSE(PassesCheck(broadcast, "local"));
  const SettingRow& prefix = RowOf(Setting::RxPrefix);
  EXPECT_TRUE(PassesCheck(prefix, "none"));
  EXPECT_TRUE(PassesCheck(prefix, "0d0A"));
  EXPECT_FALSE(PassesCheck(prefix, "ABC"));
  EXPECT_TRUE(PassesCheck(RowOf(Setting::RemoteIp), "anything at all"));
}
