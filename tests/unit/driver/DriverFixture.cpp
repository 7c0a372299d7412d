// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "DriverFixture.h"

#include <cstring>

#include "protlib/HexText.h"

const char* const DriverFixture::kUdpConfig =
    "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=5000 localPort=6000";
const char* const DriverFixture::kTcpConfig =
    "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=5000";

DriverFixture::DriverFixture() {
  host.Offer("IMultiTask2", &tasks);
  host.Offer("ISocketFactory", &sockets);
  host.Offer("IPermanentStorage", &storage);
  EXPECT_EQ(module.Init(&host), 1) << module.GetLastError();
}

DriverFixture::~DriverFixture() {
  Destroy();
  module.Close();
}

Protocol_VELT& DriverFixture::Create(const std::string& text) {
  protocol = std::make_unique<Protocol_VELT>();
  EXPECT_TRUE(protocol->Config(text.c_str())) << protocol->GetLastErrorString();
  return *protocol;
}

Protocol_VELT& DriverFixture::Started(const std::string& text) {
  Create(text);
  EXPECT_TRUE(protocol->Start());
  return *protocol;
}

Protocol_VELT& DriverFixture::Connected(const std::string& text) {
  Started(text);
  Pass();
  ITag* const connect = Tag("?connect?boolean");
  EXPECT_TRUE(WriteBool(connect, true));
  Pass();
  EXPECT_TRUE(protocol->isConnected());
  protocol->FreeTag(connect);
  return *protocol;
}

void DriverFixture::Destroy() {
  if (protocol) {
    protocol->Stop();
    protocol.reset();
  }
}

ITag* DriverFixture::Tag(const std::string& uri) {
  ITag* const tag = protocol->CreateTag(uri.c_str());
  EXPECT_NE(tag, nullptr) << uri << ": " << protocol->GetLastErrorString();
  return tag;
}

bool DriverFixture::WriteText(ITag* tag, const std::string& text) {
  std::vector<unsigned char> value(static_cast<std::size_t>(tag->GetVarLength()) + 1, 0);
  std::memcpy(value.data(), text.data(), std::min(text.size(), value.size() - 1));
  return protocol->Write(tag, value.data());
}

bool DriverFixture::WriteInt(ITag* tag, int value) {
  unsigned char bytes[4];
  std::memcpy(bytes, &value, sizeof bytes);
  return protocol->Write(tag, bytes);
}

bool DriverFixture::WriteShort(ITag* tag, int value) {
  const auto half = static_cast<std::uint16_t>(value);
  unsigned char bytes[2];
  std::memcpy(bytes, &half, sizeof bytes);
  return protocol->Write(tag, bytes);
}

bool DriverFixture::WriteBool(ITag* tag, bool value) {
  const unsigned char byte = value ? 1 : 0;
  return protocol->Write(tag, &byte);
}

std::vector<unsigned char> DriverFixture::ReadBytes(ITag* tag, bool* ok) {
  std::vector<unsigned char> value(static_cast<std::size_t>(tag->GetVarLength()) + 8, 0xEE);
  const bool result = protocol->Read(tag, value.data());
  if (ok != nullptr) {
    *ok = result;
  }
  // Nothing past the tag's length may be written.
  for (std::size_t i = static_cast<std::size_t>(tag->GetVarLength()); i < value.size(); ++i) {
    EXPECT_EQ(value[i], 0xEE) << "byte " << i << " past the tag was written";
  }
  value.resize(static_cast<std::size_t>(tag->GetVarLength()));
  return value;
}

std::string DriverFixture::ReadText(ITag* tag, bool* ok) {
  const std::vector<unsigned char> value = ReadBytes(tag, ok);
  const auto* const text = reinterpret_cast<const char*>(value.data());
  return std::string(text, strnlen(text, value.size()));
}

int DriverFixture::ReadInt(ITag* tag, bool* ok) {
  const std::vector<unsigned char> value = ReadBytes(tag, ok);
  int result = 0;
  std::memcpy(&result, value.data(), std::min(value.size(), sizeof result));
  return result;
}

int DriverFixture::ReadShort(ITag* tag, bool* ok) {
  const std::vector<unsigned char> value = ReadBytes(tag, ok);
  std::uint16_t result = 0;
  std::memcpy(&result, value.data(), std::min(value.size(), sizeof result));
  return result;
}

bool DriverFixture::ReadBool(ITag* tag, bool* ok) { return ReadBytes(tag, ok).at(0) != 0; }

void DriverFixture::Pass(int count) {
  for (int i = 0; i < count; ++i) {
    protocol->Task();
  }
}

ScriptedSocket& DriverFixture::Sock() {
  ScriptedSocket* const last = sockets.Last();
  EXPECT_NE(last, nullptr);
  return *last;
}

std::string DriverFixture::Bytes(const std::string& hex) { return fromHex(hex); }

std::string DriverFixture::Command(const std::string& command, bool* ok, int outputSize) {
  std::vector<char> output(static_cast<std::size_t>(outputSize) + 1, '\0');
  const bool result = protocol->DoCommand(command.c_str(), output.data(), outputSize);
  if (ok != nullptr) {
    *ok = result;
  }
  return std::string(output.data(), strnlen(output.data(), static_cast<std::size_t>(outputSize)));
}
