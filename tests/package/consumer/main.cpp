// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Loads the installed plug-in into the installed reference host, creates one
// channel and prints its protocol name and the first line of its information
// text; the host must have every service back at the end.
#include <cstdio>
#include <exception>
#include <string>
#include <vector>

#include "HostInterfaceFactory.h"
#include "IProtocol.h"
#include "PluginLoader.h"

namespace {

std::string FirstInfoLine(const IProtocol& channel) {
  std::vector<char> text(4096, '\0');
  if (!channel.GetInfo(text.data(), static_cast<int>(text.size()))) {
    return "(no information)";
  }
  const std::string info(text.data());
  return info.substr(0, info.find('\n'));
}

}  // namespace

int main() {
  try {
    HostInterfaceFactory host("");
    {
      PluginLoader plugin(VELT_PLUGIN, host);
      IProtocol* channel = plugin.Protocols().CreateProtocol("VELT");
      if (channel == nullptr) {
        std::fprintf(stderr, "consumer: no VELT protocol\n");
        return 1;
      }
      std::printf("%s\n%s\n", channel->GetProtocolName(), FirstInfoLine(*channel).c_str());
      plugin.Protocols().DeleteProtocol(channel);
    }
    std::printf("held after unload: %d\n", host.HeldTotal());
    return host.HeldTotal() == 0 ? 0 : 1;
  } catch (const std::exception& error) {
    std::fprintf(stderr, "consumer: %s\n", error.what());
    return 1;
  }
}
