// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <string_view>

#include "driver/ChannelSettings.h"
#include "memory/Model.h"

// What a tag's memory type does on the channel. A tag resolves it once, when
// it is made, so the read and write paths dispatch on it without comparing
// names.
enum class ChannelMemory : std::uint8_t {
  // No memory type of this channel.
  None,
  TxToken,
  RxToken,
  RxTokenLen,
  TokensAvailable,
  TokenAck,
  // One of the runtime settings (MemoryRole::setting says which).
  Setting,
  // SP_Done: applies the staged runtime settings.
  Apply,
  ConnStat,
  Connect,
};

struct MemoryRole {
  ChannelMemory memory = ChannelMemory::None;
  // Meaningful for ChannelMemory::Setting only.
  Setting setting = Setting::SocketType;
};

// The channel's one model, named "1", with its 21 memory types in their
// registration order: the five token types, the runtime settings in the
// settings table's order (each typed after its kind), SP_Done, conn_stat and
// connect.
Model BuildChannelModel();

// The role of the memory type of that name.
MemoryRole ResolveMemory(std::string_view name);

// Whether the memory type of that name is a runtime parameter: a setting's
// memory type, SP_Done, or SP_ConnectTimeout, which no model of this driver
// offers but which stays one, so a model that offered it would make it a
// runtime parameter at once.
bool IsRuntimeParameter(std::string_view name);
