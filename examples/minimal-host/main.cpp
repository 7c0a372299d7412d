// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// minimal-host: the smallest complete host of the Velt Conduit plug-in.
//
// It does by hand, one step at a time, what a panel runtime does: load the
// plug-in, bind the host's services, create one channel from a configuration
// string, start it, connect, print every token that arrives for a few
// seconds, then stop and unload. The services themselves (tasks, mutexes,
// sockets, permanent storage) come from the reference host, velt_host.

#include <dlfcn.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "HostInterfaceFactory.h"
#include "IInterfaceFactory.h"
#include "IProtModule.h"
#include "IProtocol.h"
#include "IProtocolFactory.h"

namespace {

constexpr int kFailed = 1;
constexpr int kUsage = 2;
// How often the channel is polled for new tokens.
constexpr std::chrono::milliseconds kPollInterval{20};
// Room for the longest token: a UDP datagram of 1536 bytes read as hex text
// is 3072 characters, plus the terminating zero.
constexpr int kTokenRoom = 4096;

const char* const kUsageText =
    "usage: minimal-host [--plugin PATH] [--storage FILE] [--ident NAME] [--seconds N] CONFIG\n"
    "  Loads the plug-in, creates one channel from the configuration string CONFIG,\n"
    "  connects it and prints the tokens it receives for N seconds (default 5).\n"
    "  --plugin PATH   the plug-in (default: the libvelt.so of this build)\n"
    "  --storage FILE  the permanent-storage file (default: none)\n"
    "  --ident NAME    the channel's identity (default: VELT)\n";

struct Options {
  std::string plugin = VELT_DEFAULT_PLUGIN;
  std::string storage;
  std::string ident = "VELT";
  double seconds = 5;
  std::string config;
};

int Fail(const std::string& what) {
  // A failed write to standard error has nowhere left to be reported.
  (void)std::fprintf(stderr, "minimal-host: %s\n", what.c_str());
  return kFailed;
}

// A progress line; if standard output is gone, the run goes on regardless.
void Say(const std::string& line) {
  (void)std::printf("%s\n", line.c_str());
  (void)std::fflush(stdout);
}

bool ParseArguments(const std::vector<std::string>& arguments, Options& options) {
  for (std::size_t i = 0; i < arguments.size(); ++i) {
    const std::string& word = arguments[i];
    const bool hasValue = i + 1 < arguments.size();
    if (word == "--plugin" && hasValue) {
      options.plugin = arguments[++i];
    } else if (word == "--storage" && hasValue) {
      options.storage = arguments[++i];
    } else if (word == "--ident" && hasValue) {
      options.ident = arguments[++i];
    } else if (word == "--seconds" && hasValue) {
      char* end = nullptr;
      options.seconds = std::strtod(arguments[++i].c_str(), &end);
      if (end == nullptr || *end != '\0' || !(options.seconds > 0 && options.seconds <= 3600)) {
        return false;
      }
    } else if (word.rfind("--", 0) == 0 || !options.config.empty()) {
      return false;
    } else {
      options.config = word;
    }
  }
  return !options.config.empty();
}

// Token bytes as one printable line: printable ASCII as it is, a backslash
// doubled, any other byte as \xHH.
std::string Printable(const std::string& bytes) {
  std::string text;
  for (const char c : bytes) {
    const auto byte = static_cast<unsigned char>(c);
    if (byte == '\\') {
      text += "\\\\";
    } else if (byte >= 0x20 && byte < 0x7F) {
      text += c;
    } else {
      std::array<char, 8> escaped{};
      // "\xHH" of one byte always fits, so the length is not needed.
      (void)std::snprintf(escaped.data(), escaped.size(), "\\x%02X", byte);
      text += escaped.data();
    }
  }
  return text;
}

// Reads an unsignedInt tag (4 bytes in the host's byte order).
bool ReadNumber(IProtocol& channel, const ITag& tag, std::uint32_t& value) {
  std::array<unsigned char, 4> bytes{};
  if (!channel.Read(&tag, bytes.data())) {
    return false;
  }
  std::memcpy(&value, bytes.data(), sizeof value);
  return true;
}

bool ReadFlag(IProtocol& channel, const ITag& tag, bool& value) {
  unsigned char byte = 0;
  if (!channel.Read(&tag, &byte)) {
    return false;
  }
  value = byte != 0;
  return true;
}

bool WriteFlag(IProtocol& channel, const ITag& tag, bool value) {
  const unsigned char byte = value ? 1 : 0;
  return channel.Write(&tag, &byte);
}

// The interface the plug-in hands out under name, or null. The name fixes
// the type: host interfaces are found by name and converted with static_cast,
// as IInterface declares no virtual function for a checked cast to use.
template <typename Interface>
Interface* CreateByName(IInterfaceFactory& plugin, const char* name) {
  return static_cast<Interface*>(plugin.CreateInterface(name));
}

std::string LastError(const IProtocol& channel) {
  return std::string(channel.GetLastErrorString()) + " (error " +
         std::to_string(channel.GetLastError()) + ")";
}

// Steps 5 to 8: the channel's tags, the connect request and the token loop.
// Returns the process's exit status.
int RunChannel(IProtocol& channel, const Options& options) {
  // A tag is created from its address, "node?memorytype?datatype", and is
  // owned by the channel; FreeTag gives it back.
  const auto freeTag = [&channel](ITag* tag) { channel.FreeTag(tag); };
  using Tag = std::unique_ptr<ITag, decltype(freeTag)>;
  const Tag available(channel.CreateTag("?tokens_available?unsignedInt"), freeTag);
  const Tag length(channel.CreateTag("?rx_token_len?unsignedInt"), freeTag);
  const std::string tokenAddress = "?rx_token?string-" + std::to_string(kTokenRoom);
  const Tag token(channel.CreateTag(tokenAddress.c_str()), freeTag);
  const Tag ack(channel.CreateTag("?token_ack?boolean"), freeTag);
  const Tag connect(channel.CreateTag("?connect?boolean"), freeTag);
  const Tag connected(channel.CreateTag("?conn_stat?boolean"), freeTag);
  if (!available || !length || !token || !ack || !connect || !connected) {
    return Fail("CreateTag failed: " + LastError(channel));
  }

  // 6. Nothing is connected (and, on UDP, nothing received) until connect
  //    is written 1.
  if (!WriteFlag(channel, *connect, true)) {
    return Fail("writing connect failed: " + LastError(channel));
  }
  Say("connect requested");

  // 7. Print every token as it arrives: read the oldest, then acknowledge it
  //    so that the next one moves up.
  const auto deadline = std::chrono::steady_clock::now() +
                        std::chrono::duration_cast<std::chrono::steady_clock::duration>(
                            std::chrono::duration<double>(options.seconds));
  std::vector<unsigned char> text(kTokenRoom);
  bool wasConnected = false;
  unsigned long received = 0;
  while (std::chrono::steady_clock::now() < deadline) {
    bool isConnected = false;
    if (!ReadFlag(channel, *connected, isConnected)) {
      return Fail("reading conn_stat failed: " + LastError(channel));
    }
    if (isConnected != wasConnected) {
      Say(isConnected ? "connected" : "disconnected");
      wasConnected = isConnected;
    }
    std::uint32_t waiting = 0;
    if (!ReadNumber(channel, *available, waiting)) {
      return Fail("reading tokens_available failed: " + LastError(channel));
    }
    for (; waiting > 0; --waiting) {
      std::uint32_t bytes = 0;
      std::fill(text.begin(), text.end(), 0);
      if (!ReadNumber(channel, *length, bytes) || !channel.Read(token.get(), text.data())) {
        return Fail("reading rx_token failed: " + LastError(channel));
      }
      // rx_token stops at a zero byte inside the token; rx_token_len does not.
      const std::string value(reinterpret_cast<const char*>(text.data()));
      Say("token " + std::to_string(++received) + " (" + std::to_string(bytes) +
          " bytes): " + Printable(value));
      if (!WriteFlag(channel, *ack, true)) {
        return Fail("writing token_ack failed: " + LastError(channel));
      }
    }
    std::this_thread::sleep_for(kPollInterval);
  }
  Say("received " + std::to_string(received) + " tokens");
  return 0;
}

int Run(const Options& options) {
  // 1. The host's services. The permanent storage keeps runtime parameters
  //    applied with SP_Done; without a file there is none, which the plug-in
  //    accepts.
  HostInterfaceFactory host(options.storage);

  // 2. Load the library and enter it through its one exported function.
  std::unique_ptr<void, int (*)(void*)> library(
      dlopen(options.plugin.c_str(), RTLD_NOW | RTLD_LOCAL), &dlclose);
  if (!library) {
    const char* const reason = dlerror();
    return Fail("cannot load the plug-in: " + std::string(reason == nullptr ? "" : reason));
  }
  using EntryPoint = IInterfaceFactory* (*)();
  const auto entry = reinterpret_cast<EntryPoint>(dlsym(library.get(), "GetInterfaceFactory"));
  if (entry == nullptr) {
    return Fail("the plug-in has no GetInterfaceFactory");
  }
  IInterfaceFactory* const plugin = entry();
  Say("loaded " + options.plugin);

  // 3. Bind: the module asks the host's factory for its services by name.
  //    Close gives them back; it must come after the last channel is deleted.
  auto* const module = CreateByName<IProtModule>(*plugin, "IProtModule");
  auto* const factory = CreateByName<IProtocolFactory>(*plugin, "IProtocolFactory");
  if (module == nullptr || factory == nullptr) {
    return Fail("the plug-in offers no IProtModule or IProtocolFactory");
  }
  if (module->Init(&host) == 0) {
    return Fail(std::string("module Init failed: ") + module->GetLastError());
  }
  const auto close = [plugin](IProtModule* bound) {
    bound->Close();
    plugin->ReleaseInterface(bound);
  };
  std::unique_ptr<IProtModule, decltype(close)> binding(module, close);
  Say("module bound");

  // 4. One channel: create, name, configure, start. The identity names the
  //    channel's section in the permanent storage.
  const auto remove = [factory](IProtocol* created) {
    created->Stop();
    factory->DeleteProtocol(created);
  };
  std::unique_ptr<IProtocol, decltype(remove)> channel(factory->CreateProtocol("VELT"), remove);
  if (!channel) {
    return Fail("CreateProtocol(\"VELT\") failed");
  }
  channel->SetIdent(options.ident.c_str());
  if (!channel->Config(options.config.c_str())) {
    return Fail("Config failed: " + LastError(*channel));
  }
  channel->Start();
  Say("channel " + std::string(channel->GetIdent()) + " started");

  const int status = RunChannel(*channel, options);

  // 8. Tear down in this order. Stop ends the channel's worker task and
  //    closes its socket; only then may the channel be deleted. The module is
  //    closed after the last channel is gone, and the library unloaded last.
  //    (On an early return above, the guards do the same in the same order.)
  channel->Stop();
  Say("stopped");
  channel.reset();
  binding.reset();
  Say("module closed");
  library.reset();
  Say("unloaded");
  return status;
}

}  // namespace

int main(int argc, char** argv) {
  Options options;
  if (!ParseArguments(std::vector<std::string>(argv + 1, argv + argc), options)) {
    // A failed write to standard error has nowhere left to be reported.
    (void)std::fputs(kUsageText, stderr);
    return kUsage;
  }
  try {
    return Run(options);
  } catch (const std::exception& error) {
    // A corrupt storage file (StorageError) or a host service that cannot be
    // made.
    return Fail(error.what());
  }
}
