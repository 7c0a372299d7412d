// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <string>

#include "driver/ChannelRequests.h"
#include "driver/RuntimeParameters.h"
#include "driver/SettingsTable.h"
#include "driver/TokenChannel.h"
#include "driver/TokenQueue.h"

class ProtocolBase;
class Tag_VELT;

// What each memory type of the channel means to a read and a write: the
// value that the token queue, the connection or a runtime setting gives a
// tag, and the effect of a written value. Each operation dispatches on the
// role the tag resolved when it was made; room is the number of bytes of the
// work buffer from data on. Failures are recorded as the protocol's last
// error.
//
// Runtime parameters take no lock of the channel's (their sets guard
// themselves) except for an apply; every other memory type is answered, or
// takes effect, under queueLock.
class MemoryAccess {
 public:
  MemoryAccess(ProtocolBase& protocol, TokenQueue& tokenQueue, ChannelRequests& requests,
               TokenChannel& channel, RuntimeParameters& parameters)
      : protocol_(protocol),
        tokenQueue_(tokenQueue),
        requests_(requests),
        channel_(channel),
        parameters_(parameters) {}

  // Writes the memory type's value at data.
  bool Read(const Tag_VELT& tag, unsigned char* data, int room);
  // Gives the memory type the value at data.
  bool Write(const Tag_VELT& tag, const unsigned char* data, int room);
  // Whether a send is made under queueLock: a tx_token write sends under it,
  // as every write to the channel is made; the console's put sends after it
  // is released, since the console takes the lock for the queue alone.
  enum class SendLock : std::uint8_t { Held, Released };
  // Frames text with the transmit markers (and decodes it first when hex
  // tokens are on) and sends it in one send on the current socket; false,
  // with nothing sent, when hex tokens are on and the text is not hex. The
  // frame is always made under queueLock.
  bool SendToken(const std::string& text, SendLock lock);
  // A copy of the working settings.
  ChannelSettings Working();

 private:
  bool FrameToken(const TokenQueue::Guard& held, const std::string& text, std::string& frame) const;
  bool ReadChannel(const Tag_VELT& tag, unsigned char* data, int room);
  bool ReadSetting(const Tag_VELT& tag, const SettingRow& row, unsigned char* data, int room);
  bool WriteChannel(const Tag_VELT& tag, const unsigned char* data, int room);
  bool StageSetting(const Tag_VELT& tag, const SettingRow& row, const unsigned char* data,
                    int room);

  ProtocolBase& protocol_;
  TokenQueue& tokenQueue_;
  ChannelRequests& requests_;
  TokenChannel& channel_;
  RuntimeParameters& parameters_;
};
