// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The writer the storage kill test kills: the plug-in in the reference host
// with one channel named VELT, applying rounds of 3 or 13 runtime parameters
// (ApplyRound) with SP_Done as fast as it can, from round FIRST on, until it
// is killed or has applied a bounded number of rounds. It prints "ready"
// once the first round is applied.
//   apply_writer PLUGIN STORAGE COUNT FIRST

#include <array>
#include <cstdio>
#include <cstring>
#include <exception>
#include <string>
#include <vector>

#include "ApplyRound.h"
#include "HostInterfaceFactory.h"
#include "PluginLoader.h"

namespace {

constexpr int kMostRounds = 1000000;

bool Write(IProtocol& channel, ITag* tag, const StoredValue& value) {
  std::vector<unsigned char> data(static_cast<std::size_t>(tag->GetVarLength()) + 8, 0);
  switch (value.GetType()) {
    case StoredValue::Type::Text: {
      const std::string text = value.AsText();
      std::memcpy(data.data(), text.data(), text.size());
      break;
    }
    case StoredValue::Type::Boolean:
      data[0] = value.AsBoolean() ? 1 : 0;
      break;
    case StoredValue::Type::Integer: {
      // Unsigned tags of 2 and 4 bytes, in the host's byte order.
      const auto number = static_cast<unsigned>(value.AsInteger());
      if (tag->GetVarLength() == 2) {
        const auto port = static_cast<unsigned short>(number);
        std::memcpy(data.data(), &port, sizeof port);
      } else {
        std::memcpy(data.data(), &number, sizeof number);
      }
      break;
    }
  }
  return channel.Write(tag, data.data()) != 0;
}

int Run(const std::string& plugin, const std::string& storage, int count, int first) {
  HostInterfaceFactory host(storage);
  PluginLoader loader(plugin, host);
  IProtocol* const channel = loader.Protocols().CreateProtocol("VELT");
  channel->SetIdent("VELT");
  if (!channel->Config("CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9") ||
      !channel->Start()) {
    std::fprintf(stderr, "apply_writer: %s\n", channel->GetLastErrorString());
    return 1;
  }
  std::vector<ITag*> tags;
  for (const ApplyRound::Staged& value : ApplyRound::ValuesOf(first, count)) {
    tags.push_back(channel->CreateTag(value.uri.c_str()));
  }
  ITag* const done = channel->CreateTag("?SP_Done?boolean");
  const std::array<unsigned char, 8> one = {1};
  for (int round = first; round < first + kMostRounds; ++round) {
    const std::vector<ApplyRound::Staged> values = ApplyRound::ValuesOf(round, count);
    for (std::size_t i = 0; i < values.size(); ++i) {
      if (!Write(*channel, tags[i], values[i].stored)) {
        std::fprintf(stderr, "apply_writer: %s: %s\n", values[i].uri.c_str(),
                     channel->GetLastErrorString());
        return 1;
      }
    }
    channel->Write(done, one.data());
    if (round == first) {
      std::printf("ready\n");
      std::fflush(stdout);
    }
  }
  channel->Stop();
  loader.Protocols().DeleteProtocol(channel);
  return 0;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 5) {
    std::fprintf(stderr, "usage: apply_writer PLUGIN STORAGE COUNT FIRST\n");
    return 2;
  }
  try {
    return Run(argv[1], argv[2], std::stoi(argv[3]), std::stoi(argv[4]));
  } catch (const std::exception& e) {
    std::fprintf(stderr, "apply_writer: %s\n", e.what());
    return 1;
  }
}
