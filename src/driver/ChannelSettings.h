// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <utility>

// The thirteen working settings of a token channel, in the order in which
// Start takes them from the live runtime parameters.
enum class Setting : std::uint8_t {
  SocketType,
  RemoteIp,
  RemotePort,
  LocalIp,
  LocalPort,
  BroadcastType,
  RxPrefix,
  RxSuffix,
  Gap,
  TxPrefix,
  TxSuffix,
  HexTokens,
  TokenQueueSize,
};
inline constexpr std::size_t kSettingCount = 13;

// The working value of each setting. A text setting keeps its text, a number
// or flag setting its number (a flag as 0 or 1); which of the two a setting
// uses is its kind in the settings table (SettingsTable.h).
class ChannelSettings {
 public:
  const std::string& text(Setting setting) const { return texts_[At(setting)]; }
  std::int32_t number(Setting setting) const { return numbers_[At(setting)]; }
  bool flag(Setting setting) const { return numbers_[At(setting)] != 0; }

  void setText(Setting setting, std::string value) { texts_[At(setting)] = std::move(value); }
  void setNumber(Setting setting, std::int32_t value) { numbers_[At(setting)] = value; }
  void setFlag(Setting setting, bool value) { numbers_[At(setting)] = value ? 1 : 0; }

 private:
  static constexpr std::size_t At(Setting setting) { return static_cast<std::size_t>(setting); }

  std::array<std::string, kSettingCount> texts_;
  std::array<std::int32_t, kSettingCount> numbers_{};
};
