// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <string>

#include "config/CommonParams.h"
#include "config/GroupParameterReplacer.h"
#include "config/ParameterReplacer.h"
#include "driver/ChannelRequests.h"
#include "driver/ChannelSettings.h"
#include "driver/SettingsTable.h"
#include "driver/TokenQueue.h"

// The channel's runtime parameters: the live set (the values in force,
// backed by the host's permanent storage under the channel's identity) and
// the staging set (the values written to the SP_ memory types, waiting for
// an apply), with what the driver does with them, row by row of the
// settings table: take the live values at Start, read a value in force,
// stage a value, apply the staged ones.
//
// Both sets guard themselves, so reads and staging take no lock of the
// driver's. An apply runs whole under queueLock, storage writes included, so
// two applies never interleave and storage ends with the values of the later
// one, as the live set does; a host that defers its file writes until the
// lock is released writes each apply in one piece.
class RuntimeParameters {
 public:
  // Start: names the live set after the channel and takes each setting's
  // live value in Start's order, the configured value being the default
  // (so the first value read while the protocol lives stays in force).
  ChannelSettings Load(const std::string& section, const _VELT::CommonParams& configured);

  // The value in force: the staged one when one is staged, else the live
  // one (with working as its default).
  std::string Text(const SettingRow& row, const std::string& working);
  std::int32_t Number(const SettingRow& row, std::int32_t working);
  bool Flag(const SettingRow& row, bool working);

  // Stages a value under the setting's name; nothing changes in the channel
  // until an apply.
  void Stage(const SettingRow& row, const std::string& value);
  void Stage(const SettingRow& row, std::int32_t value);
  void Stage(const SettingRow& row, bool value);

  // SP_Done: under queueLock, in this order, copies the staged values into
  // the live set and into permanent storage, reloads the working settings in
  // the apply order (asking for a new socket when a socket setting changed)
  // and empties the token queue. Staged values stay staged.
  void Apply(TokenQueue& tokenQueue, ChannelRequests& requests);

 private:
  template <typename Value>
  Value InForce(const SettingRow& row, const Value& working);
  // Sets one working setting to its value in force; true when it changed.
  bool Reload(const SettingRow& row, ChannelSettings& working);

  ParameterReplacer live;
  GroupParameterReplacer staged;
};
