// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The driver console (Protocol_VELT::DoCommand, falling back to the base
// console) with fuzzed command lines and output sizes. Bytes after the
// output buffer's size must never be written.
//
// Input: a flag byte (bit 0: hex tokens; bit 1: TCP; bit 2: start the
// channel; bits 3-4: how many tokens wait in the queue), two bytes that give
// the output size, then up to eight command lines separated by line feeds.

#include <algorithm>
#include <cctype>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

#include "FuzzInput.h"
#include "Require.h"
#include "ScriptedChannel.h"
#include "protlib/TextUtils.h"

namespace {

const char kConfig[] =
    "CfgVer=1 model=1 remoteIpAddress=127.0.0.1 remotePort=5000 localPort=6000 "
    "tx_prefix=02 tx_suffix=0D0A token_queue_size=5";

constexpr std::size_t kMostCommands = 8;
constexpr std::size_t kCanary = 32;
constexpr char kCanaryByte = '\x5A';
// A console "read" or "write" allocates a buffer as long as the tag it names;
// commands naming longer values are skipped, the allocation being the host's
// to allow.
constexpr long kLongestCount = 4096;

const char* const kKnownWords[] = {"help",
                                   "connect",
                                   "set_ip_port",
                                   "put",
                                   "get",
                                   "tokens_available",
                                   "get_token_length",
                                   "token_ack",
                                   "get_stat",
                                   "info",
                                   "xml",
                                   "lasterror",
                                   "read",
                                   "write",
                                   "getmaxtm",
                                   "deletetags"};

std::string QueuedToken(int which) {
  switch (which) {
    case 0:
      return "A";
    case 1:
      return std::string("with\0zero", 9);
    default:
      return std::string(1000, 'x');
  }
}

bool NamesLongValue(const std::string& command) {
  for (std::size_t dash = command.find('-'); dash != std::string::npos;
       dash = command.find('-', dash + 1)) {
    std::size_t digit = dash + 1;
    while (digit < command.size() && std::isspace(static_cast<unsigned char>(command[digit]))) {
      ++digit;
    }
    if (digit < command.size() && (command[digit] == '+' || command[digit] == '-')) {
      ++digit;
    }
    std::size_t end = digit;
    while (end < command.size() && std::isdigit(static_cast<unsigned char>(command[end])) &&
           end - digit < 12) {
      ++end;
    }
    if (end > digit &&
        (end - digit >= 12 || std::stol(command.substr(digit, end - digit)) > kLongestCount)) {
      return true;
    }
  }
  return false;
}

bool IsKnownWord(const std::string& command) {
  std::vector<std::string> words;
  ProtUtilsN::ParseSubstrings(command, words, ' ');
  return std::find(std::begin(kKnownWords), std::end(kKnownWords), words.front()) !=
         std::end(kKnownWords);
}

void Run(Protocol_VELT& protocol, const std::string& command, int outputSize) {
  const std::size_t room = outputSize < 0 ? 0 : static_cast<std::size_t>(outputSize);
  std::vector<char> output(room + kCanary, kCanaryByte);
  const bool succeeded = protocol.DoCommand(command.c_str(), output.data(), outputSize);
  Require(std::all_of(output.begin() + static_cast<std::ptrdiff_t>(room), output.end(),
                      [](char c) { return c == kCanaryByte; }),
          "a reply stays within the output size");
  if (!IsKnownWord(command)) {
    Require(!succeeded, "an unknown command fails");
    Require(std::all_of(output.begin(), output.end(), [](char c) { return c == kCanaryByte; }),
            "an unknown command leaves the output alone");
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzInput input(data, size);
  const std::uint8_t flags = input.Byte();
  const int outputSize = input.IntInRange(-2, 700);
  std::string config = kConfig;
  config += (flags & 1) != 0 ? " hex_tokens=true" : "";
  config += (flags & 2) != 0 ? " socketType=TCP" : " socketType=UDP";
  ScriptedChannel channel(config, (flags & 4) != 0);
  Require(channel.Bound() && channel.Configured(), "the console's channel is configured");
  for (int i = 0; i < (flags >> 3 & 3); ++i) {
    channel.Receive(QueuedToken(i));
  }
  for (const std::string& line : FuzzInput::Split(input.Rest(), '\n', kMostCommands)) {
    const std::string command = line.c_str();
    if (!NamesLongValue(command)) {
      Run(channel.Protocol(), command, outputSize);
    }
  }
  return 0;
}
