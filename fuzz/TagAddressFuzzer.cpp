// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Tag addresses of the token driver (Tag_VELT, made through
// Protocol_VELT::CreateTagBase), and the reads and writes of the tags they
// make.
//
// Input: a flag byte (bit 0: start the channel; bit 1: connect and run worker
// passes; bit 2: hex tokens; bit 3: free the tags instead of leaving them to
// the channel), then up to four lines, each a tag address optionally followed
// by byte 0x01 and a value to write.

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "FuzzInput.h"
#include "Require.h"
#include "ScriptedChannel.h"
#include "driver/Tag_VELT.h"
#include "protlib/ProtUtilsN.h"

namespace {

const char kConfig[] =
    "CfgVer=1 model=1 Node3::model=2 Node5::model=1 socketType=UDP "
    "remoteIpAddress=127.0.0.1 remotePort=5000 localPort=6000 rx_prefix=02 rx_suffix=03 "
    "tx_prefix=02 tx_suffix=03 token_queue_size=4";
const char kHexTokens[] = " hex_tokens=true";

constexpr std::size_t kMostLines = 4;
// Tags longer than this are created and checked but not read or written: a
// value's buffers are as long as the tag, which the host sizes, not the
// driver.
constexpr int kLongestValue = 4096;
constexpr std::size_t kCanary = 16;
constexpr unsigned char kCanaryByte = 0xA5;

bool CanaryIntact(const std::vector<unsigned char>& buffer, std::size_t from) {
  return std::all_of(buffer.begin() + static_cast<std::ptrdiff_t>(from), buffer.end(),
                     [](unsigned char b) { return b == kCanaryByte; });
}

void CheckCreated(Protocol_VELT& protocol, ITag* tag, const std::string& uri) {
  const auto* own = dynamic_cast<const Tag_VELT*>(tag);
  Require(own != nullptr && own->IsValid(), "a created tag is a valid driver tag");
  Require(tag->GetByteOffset() == 0 && tag->GetBitIndex() == 0,
          "every tag answers byte offset 0 and bit index 0");
  Require(uri == tag->GetVarName(), "a tag's name is its address");
  Require(protocol.GetNodeID(tag) == own->getNode(), "the node ID is the tag's node");
  std::vector<std::string> fields;
  ProtUtilsN::ParseSubstrings(uri, fields, '?');
  Require(fields.size() == 3, "a tag's address has three fields");
  ITag* clone = tag->Clone();
  const auto* copy = dynamic_cast<const Tag_VELT*>(clone);
  Require(copy != nullptr && copy->getMemoryType() == own->getMemoryType() &&
              copy->GetVarType() == own->GetVarType() &&
              copy->GetVarLength() == own->GetVarLength() && copy->getNode() == own->getNode() &&
              copy->getIsRuntimeParameter() == own->getIsRuntimeParameter(),
          "a clone copies every field");
  delete clone;
  for (int field = 0; field < 4; ++field) {
    int length = -1;
    const char* start = protocol.getTagUriField(tag, field, &length);
    if (start != nullptr) {
      const char* name = tag->GetVarName();
      Require(start >= name && length >= 0 && start + length <= name + std::strlen(name),
              "a URI field lies within the address");
    }
  }
}

void ReadAndWrite(Protocol_VELT& protocol, ITag* tag, const std::string& value) {
  const int length = tag->GetVarLength();
  if (length < 0 || length > kLongestValue) {
    return;
  }
  const auto bytes = static_cast<std::size_t>(length);
  std::vector<unsigned char> read(bytes + kCanary, kCanaryByte);
  protocol.Read(tag, read.data());
  Require(CanaryIntact(read, bytes), "a read writes no more than the tag's length");
  unsigned long long stamp = 0;
  protocol.readWithTimestamp(tag, read.data(), &stamp);
  Require(CanaryIntact(read, bytes), "a stamped read writes no more than the tag's length");

  // Exactly the tag's length, so that reading past it is caught.
  std::vector<unsigned char> written(std::max<std::size_t>(bytes, 1), 0);
  std::memcpy(written.data(), value.data(), std::min(value.size(), bytes));
  protocol.Write(tag, written.data());

  const int item = ProtUtilsN::GetBasicLength(tag);
  if (item > 0) {
    std::vector<unsigned char> one(static_cast<std::size_t>(item) + kCanary, kCanaryByte);
    const int index = value.empty() ? 0 : static_cast<unsigned char>(value[0]) % 4;
    protocol.readArrayItem(tag, index, one.data());
    Require(CanaryIntact(one, static_cast<std::size_t>(item)),
            "an array item read writes one item");
    std::vector<unsigned char> source(static_cast<std::size_t>(item), 0x31);
    protocol.writeArrayItem(tag, index, source.data());
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzInput input(data, size);
  const std::uint8_t flags = input.Byte();
  std::string config = kConfig;
  if ((flags & 4) != 0) {
    config += kHexTokens;
  }
  ScriptedChannel channel(config, (flags & 1) != 0);
  Require(channel.Bound() && channel.Configured(), "the tags' channel is configured");
  Protocol_VELT& protocol = channel.Protocol();
  if ((flags & 2) != 0) {
    const unsigned char on = 1;
    ITag* connect = protocol.CreateTag("?connect?boolean");
    Require(connect != nullptr, "the connect tag exists");
    protocol.Write(connect, &on);
    protocol.Task();
    channel.Receive("queued");
  }

  const std::vector<std::string> lines = FuzzInput::Split(input.Rest(), '\n', kMostLines);
  std::vector<ITag*> tags;
  for (const std::string& line : lines) {
    const std::size_t split = line.find('\x01');
    const std::string uri = line.substr(0, split).c_str();
    const std::string value = split == std::string::npos ? std::string() : line.substr(split + 1);
    ITag* tag = protocol.CreateTag(uri.c_str());
    if (tag == nullptr) {
      const std::string start = "Tag URI error: " + uri + " - ";
      Require(protocol.GetLastError() == -1, "a refused address is error -1");
      Require(std::string(protocol.GetLastErrorString()).compare(0, start.size(), start) == 0,
              "a refused address is reported with the address");
      continue;
    }
    CheckCreated(protocol, tag, uri);
    ReadAndWrite(protocol, tag, value);
    if ((flags & 2) != 0) {
      protocol.Task();
    }
    tags.push_back(tag);
  }
  for (ITag* first : tags) {
    for (ITag* second : tags) {
      protocol.CanBeOptimized(first, second, false);
    }
  }
  if ((flags & 8) != 0) {
    for (ITag* tag : tags) {
      protocol.FreeTag(tag);
    }
  }
  return 0;
}
