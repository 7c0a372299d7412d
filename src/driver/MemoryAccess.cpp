// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/MemoryAccess.h"

#include <cstdint>
#include <optional>

#include "driver/ChannelMemory.h"
#include "driver/DriverErrors.h"
#include "driver/TagValue.h"
#include "driver/Tag_VELT.h"
#include "protlib/HexText.h"
#include "protlib/ProtUtilsN.h"

namespace {

int NaturalLength(const Tag_VELT& tag) {
  return ProtUtilsN::GetDataLength(tag.getMemoryType()->getNaturalType());
}

}  // namespace

bool MemoryAccess::Read(const Tag_VELT& tag, unsigned char* data, int room) {
  const MemoryRole role = tag.getMemoryRole();
  if (tag.getIsRuntimeParameter()) {
    if (role.memory == ChannelMemory::Setting) {
      return ReadSetting(tag, RowOf(role.setting), data, room);
    }
    if (role.memory == ChannelMemory::Apply) {
      data[0] = 0;
      return true;
    }
  }
  return ReadChannel(tag, data, room);
}

bool MemoryAccess::ReadChannel(const Tag_VELT& tag, unsigned char* data, int room) {
  const TokenQueue::Guard held(tokenQueue_);
  switch (tag.getMemoryRole().memory) {
    case ChannelMemory::RxToken:
      if (held.Empty()) {
        data[0] = 0;
        return true;
      }
      // The token's whole length counts, even past a zero byte in it: the
      // tag must have room for the token and its terminator.
      return PutText(data, room, tag.GetVarLength(), held.Front()) ||
             Fail(protocol_, kTokenTooLong);
    case ChannelMemory::RxTokenLen:
      PutInteger(data, room, NaturalLength(tag),
                 held.Empty() ? 0 : static_cast<std::int64_t>(held.Front().size()));
      return true;
    case ChannelMemory::TokensAvailable:
      PutInteger(data, room, NaturalLength(tag), static_cast<std::int64_t>(held.Size()));
      return true;
    case ChannelMemory::TokenAck:
    case ChannelMemory::TxToken:
      data[0] = 0;
      return true;
    case ChannelMemory::ConnStat:
      data[0] = channel_.isConnected() ? 1 : 0;
      return true;
    case ChannelMemory::Connect:
      data[0] = requests_.ConnectRequested(held) ? 1 : 0;
      return true;
    default:
      return Fail(protocol_, kIllegalRead);
  }
}

bool MemoryAccess::ReadSetting(const Tag_VELT& tag, const SettingRow& row, unsigned char* data,
                               int room) {
  const ChannelSettings working = Working();
  switch (row.kind) {
    case SettingKind::Text:
      return PutText(data, room, tag.GetVarLength(),
                     parameters_.Text(row, working.text(row.setting))) ||
             Fail(protocol_, {kDriverError, row.tooLongText});
    case SettingKind::Port:
    case SettingKind::Number:
      PutInteger(data, room, NaturalLength(tag),
                 parameters_.Number(row, working.number(row.setting)));
      return true;
    case SettingKind::Flag:
      data[0] = parameters_.Flag(row, working.flag(row.setting)) ? 1 : 0;
      return true;
  }
  return Fail(protocol_, kIllegalRead);
}

bool MemoryAccess::Write(const Tag_VELT& tag, const unsigned char* data, int room) {
  const MemoryRole role = tag.getMemoryRole();
  if (tag.getIsRuntimeParameter()) {
    if (role.memory == ChannelMemory::Setting) {
      return StageSetting(tag, RowOf(role.setting), data, room);
    }
    if (role.memory == ChannelMemory::Apply) {
      // Whatever value is written.
      parameters_.Apply(tokenQueue_, requests_);
      return true;
    }
  }
  return WriteChannel(tag, data, room);
}

bool MemoryAccess::WriteChannel(const Tag_VELT& tag, const unsigned char* data, int room) {
  switch (tag.getMemoryRole().memory) {
    case ChannelMemory::TokenAck: {
      // The value written is not looked at: writing 0 acknowledges too.
      TokenQueue::Guard held(tokenQueue_);
      held.PopFront();
      return true;
    }
    case ChannelMemory::Connect: {
      TokenQueue::Guard held(tokenQueue_);
      requests_.Connect(held, data[0] != 0);
      return true;
    }
    case ChannelMemory::TxToken:
      return SendToken(GetText(data, room), SendLock::Held) || Fail(protocol_, kTokenNotHex);
    default:
      return Fail(protocol_, kIllegalWrite);
  }
}

bool MemoryAccess::StageSetting(const Tag_VELT& tag, const SettingRow& row,
                                const unsigned char* data, int room) {
  switch (row.kind) {
    case SettingKind::Text: {
      const std::string value = GetText(data, room);
      if (!PassesCheck(row, value)) {
        return Fail(protocol_, {kDriverError, row.illegalText});
      }
      parameters_.Stage(row, value);
      return true;
    }
    case SettingKind::Port:
    case SettingKind::Number:
      parameters_.Stage(row, GetInteger(data, room, NaturalLength(tag)));
      return true;
    case SettingKind::Flag:
      parameters_.Stage(row, data[0] != 0);
      return true;
  }
  return Fail(protocol_, kIllegalWrite);
}

bool MemoryAccess::FrameToken(const TokenQueue::Guard& held, const std::string& text,
                              std::string& frame) const {
  const ChannelSettings& working = requests_.Settings(held);
  const bool hex = working.flag(Setting::HexTokens);
  if (hex && !isHex(text.c_str())) {
    return false;
  }
  // Prefix and suffix are always held as hexadecimal text.
  frame = fromHex(working.text(Setting::TxPrefix));
  frame += hex ? fromHex(text) : text;
  frame += fromHex(working.text(Setting::TxSuffix));
  return true;
}

bool MemoryAccess::SendToken(const std::string& text, SendLock lock) {
  std::optional<TokenQueue::Guard> held;
  held.emplace(tokenQueue_);
  std::string frame;
  if (!FrameToken(*held, text, frame)) {
    return false;
  }
  if (lock == SendLock::Released) {
    held.reset();
  }
  channel_.Send(frame);
  return true;
}

ChannelSettings MemoryAccess::Working() {
  const TokenQueue::Guard held(tokenQueue_);
  return requests_.Settings(held);
}
