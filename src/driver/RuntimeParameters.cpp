// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/RuntimeParameters.h"

#include <utility>

namespace {

// Runtime parameters are protocol-wide.
constexpr int kProtocolWide = -1;

}  // namespace

ChannelSettings RuntimeParameters::Load(const std::string& section,
                                        const _VELT::CommonParams& configured) {
  live.setSection(section);
  ChannelSettings settings;
  for (const SettingRow& row : SettingRows()) {
    switch (row.kind) {
      case SettingKind::Text: {
        std::string value;
        live.get(row.storageName, kProtocolWide, configured.*row.configuredText, value);
        settings.setText(row.setting, std::move(value));
        break;
      }
      case SettingKind::Port:
      case SettingKind::Number: {
        int value = 0;
        live.get(row.storageName, kProtocolWide, configured.*row.configuredNumber, value);
        settings.setNumber(row.setting, value);
        break;
      }
      case SettingKind::Flag: {
        bool value = false;
        live.get(row.storageName, kProtocolWide, configured.*row.configuredFlag, value);
        settings.setFlag(row.setting, value);
        break;
      }
    }
  }
  return settings;
}

template <typename Value>
Value RuntimeParameters::InForce(const SettingRow& row, const Value& working) {
  Value value{};
  if (!staged.get(row.storageName, kProtocolWide, value)) {
    live.get(row.storageName, kProtocolWide, working, value);
  }
  return value;
}

std::string RuntimeParameters::Text(const SettingRow& row, const std::string& working) {
  return InForce(row, working);
}

std::int32_t RuntimeParameters::Number(const SettingRow& row, std::int32_t working) {
  return InForce(row, working);
}

bool RuntimeParameters::Flag(const SettingRow& row, bool working) { return InForce(row, working); }

void RuntimeParameters::Stage(const SettingRow& row, const std::string& value) {
  staged.set(row.storageName, kProtocolWide, value.c_str());
}

void RuntimeParameters::Stage(const SettingRow& row, std::int32_t value) {
  staged.set(row.storageName, kProtocolWide, value);
}

void RuntimeParameters::Stage(const SettingRow& row, bool value) {
  staged.set(row.storageName, kProtocolWide, value);
}

bool RuntimeParameters::Reload(const SettingRow& row, ChannelSettings& working) {
  const Setting setting = row.setting;
  switch (row.kind) {
    case SettingKind::Text: {
      std::string value = InForce(row, working.text(setting));
      const bool changed = value != working.text(setting);
      working.setText(setting, std::move(value));
      return changed;
    }
    case SettingKind::Port:
    case SettingKind::Number: {
      const std::int32_t value = InForce(row, working.number(setting));
      const bool changed = value != working.number(setting);
      working.setNumber(setting, value);
      return changed;
    }
    case SettingKind::Flag: {
      const bool value = InForce(row, working.flag(setting));
      const bool changed = value != working.flag(setting);
      working.setFlag(setting, value);
      return changed;
    }
  }
  return false;
}

void RuntimeParameters::Apply(TokenQueue& tokenQueue, ChannelRequests& requests) {
  TokenQueue::Guard held(tokenQueue);
  staged.activate(live, kProtocolWide, true);
  ChannelSettings working = requests.Settings(held);
  bool renew = false;
  for (const SettingRow* row : ApplyOrder()) {
    // Reloaded whether or not an earlier one changed.
    const bool changed = Reload(*row, working);
    renew = renew || (changed && row->renewsSocket);
  }
  requests.Apply(held, working, renew);
  // Tokens received under the old settings are discarded.
  held.Clear();
}
