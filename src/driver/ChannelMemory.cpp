// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/ChannelMemory.h"

#include <algorithm>
#include <array>

#include "driver/SettingsTable.h"
#include "memory/MemoryType.h"

namespace {

// A memory type of the channel that is not a runtime setting.
struct FixedMemory {
  const char* name;
  ChannelMemory memory;
  ICU_Type naturalType;
  int tavuTypes;
  bool readOnly;
  bool writeOnly;
  int maxIndex;
  int blockRead;
  int blockWrite;
};

// clang-format off
constexpr std::array<FixedMemory, 5> kTokenMemory = {{
    {"tx_token",         ChannelMemory::TxToken,         ICU_BYTE,         0x200, false, true,
     999999999, 999999999, 999999999},
    {"rx_token",         ChannelMemory::RxToken,         ICU_BYTE,         0x200, true,  false,
     999999999, 999999999, 0},
    {"rx_token_len",     ChannelMemory::RxTokenLen,      ICU_UNSIGNED_INT, 0x40,  true,  false,
     1, 1, 0},
    {"tokens_available", ChannelMemory::TokensAvailable, ICU_UNSIGNED_INT, 0x40,  true,  false,
     1, 0, 0},
    {"token_ack",        ChannelMemory::TokenAck,        ICU_BOOLEAN,      0x1,   false, true,
     1, 0, 0},
}};
// Registered after the runtime settings.
constexpr std::array<FixedMemory, 3> kControlMemory = {{
    {"SP_Done",   ChannelMemory::Apply,    ICU_BOOLEAN, 0x1, false, false, 1, 0, 0},
    {"conn_stat", ChannelMemory::ConnStat, ICU_BOOLEAN, 0x1, true,  false, 1, 0, 0},
    {"connect",   ChannelMemory::Connect,  ICU_BOOLEAN, 0x1, false, false, 1, 0, 0},
}};
// clang-format on

// The memory type of a runtime setting, typed after the setting's kind.
FixedMemory SettingMemory(const SettingRow& row) {
  switch (row.kind) {
    case SettingKind::Text:
      return {
          row.memoryType, ChannelMemory::Setting, ICU_BYTE, 0x200, false, false, 9999, 9999, 9999};
    case SettingKind::Port:
      return {
          row.memoryType, ChannelMemory::Setting, ICU_UNSIGNED_SHORT, 0x20, false, false, 1, 0, 0};
    case SettingKind::Number:
      return {
          row.memoryType, ChannelMemory::Setting, ICU_UNSIGNED_INT, 0x40, false, false, 1, 0, 0};
    case SettingKind::Flag:
      break;
  }
  return {row.memoryType, ChannelMemory::Setting, ICU_BOOLEAN, 0x1, false, false, 1, 0, 0};
}

void Register(Model& model, const FixedMemory& entry) {
  // Every type starts from one template and changes only what its entry
  // says.
  MemoryType type;
  type.setName(entry.name);
  type.setNaturalType(entry.naturalType);
  type.setTavuTypes(entry.tavuTypes);
  type.setReadOnly(entry.readOnly);
  type.setWriteOnly(entry.writeOnly);
  type.setMinIndex(0);
  type.setMaxIndex(entry.maxIndex);
  type.setBlockReadCount(entry.blockRead);
  type.setBlockWriteCount(entry.blockWrite);
  model.addMemoryType(type);
}

template <std::size_t Count>
const FixedMemory* FindFixed(const std::array<FixedMemory, Count>& table, std::string_view name) {
  const auto* const found = std::find_if(
      table.begin(), table.end(), [name](const FixedMemory& entry) { return name == entry.name; });
  return found == table.end() ? nullptr : found;
}

}  // namespace

Model BuildChannelModel() {
  Model model("1");
  for (const FixedMemory& entry : kTokenMemory) {
    Register(model, entry);
  }
  for (const SettingRow& row : SettingRows()) {
    Register(model, SettingMemory(row));
  }
  for (const FixedMemory& entry : kControlMemory) {
    Register(model, entry);
  }
  model.setMaxDatagramItems(0);
  model.setMaxDatagramLength(0);
  return model;
}

MemoryRole ResolveMemory(std::string_view name) {
  if (const SettingRow* const row = RowForMemoryType(name); row != nullptr) {
    return {ChannelMemory::Setting, row->setting};
  }
  const FixedMemory* entry = FindFixed(kTokenMemory, name);
  if (entry == nullptr) {
    entry = FindFixed(kControlMemory, name);
  }
  return entry == nullptr ? MemoryRole{} : MemoryRole{entry->memory, Setting::SocketType};
}

bool IsRuntimeParameter(std::string_view name) {
  return RowForMemoryType(name) != nullptr || name == "SP_Done" || name == "SP_ConnectTimeout";
}
