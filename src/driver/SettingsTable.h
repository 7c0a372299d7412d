// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <array>
#include <cstdint>
#include <string>
#include <string_view>

#include "config/CommonParams.h"
#include "driver/ChannelSettings.h"

// How a setting's value is held, staged and exchanged with a tag. The
// natural type of its memory type follows from it.
enum class SettingKind : std::uint8_t {
  // A text; a tag reads it followed by a zero byte.
  Text,
  // A number that a tag sees as an unsigned 16-bit value.
  Port,
  // A number that a tag sees as a 32-bit value.
  Number,
  // A flag that a tag sees as one byte, 0 or 1.
  Flag,
};

// The check that a staged text must pass.
enum class SettingCheck : std::uint8_t { None, SocketType, BroadcastType, HexText };

// One runtime setting of the channel: the memory type that stages and reads
// it, the name it has in the live and staging sets and in permanent storage,
// the configuration key it defaults to, how its value is held and checked,
// the texts of its errors, whether a new value re-creates the socket, and its
// place in the order in which an apply reloads the settings (its place in
// the table is its place in Start's order).
struct SettingRow {
  Setting setting;
  const char* memoryType;
  const char* storageName;
  const char* configKey;
  SettingKind kind;
  SettingCheck check;
  // Error text of a staged text that fails the check.
  const char* illegalText;
  // Error text of a read whose text does not fit the tag (texts only).
  const char* tooLongText;
  bool renewsSocket;
  std::uint8_t applyPosition;
  // The configured value: the member of the configuration record that
  // matches the kind (texts, numbers and ports, flags); the others are null.
  std::string _VELT::CommonParams::*configuredText;
  std::int32_t _VELT::CommonParams::*configuredNumber;
  bool _VELT::CommonParams::*configuredFlag;
};

// Every setting, in Start's order, which is the order of Setting.
const std::array<SettingRow, kSettingCount>& SettingRows();
const SettingRow& RowOf(Setting setting);
// Every setting, in the order in which an apply reloads them.
const std::array<const SettingRow*, kSettingCount>& ApplyOrder();
// The setting staged by the memory type of that name; null for any other
// name.
const SettingRow* RowForMemoryType(std::string_view name);
// Whether a staged text passes the row's check.
bool PassesCheck(const SettingRow& row, const std::string& value);
