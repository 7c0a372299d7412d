// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-host's console (Console::Run): dot commands, typed reads and writes,
// and the lines it passes to an instance's own console, on two instances of
// the driver over the test doubles of the host's services (no thread, no
// socket, storage in memory).
//
// Input: a flag byte (bits 0-1: how many tokens wait in the current
// instance's queue; bit 2: hex tokens; bit 3: TCP), then up to eight lines
// separated by line feeds.
//
// A line that fails says so on the console's output or error. Values longer
// than velt-host's limit are refused before they are allocated: the
// fuzzer's allocation limit is set to 64 MiB, well above the limit's 16 MiB
// buffers and far below what a refused tag would take.

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>
#include <vector>

#include "BoundModule.h"
#include "FuzzInput.h"
#include "MemoryStorage.h"
#include "Require.h"
#include "driver/Protocol_VELT.h"
#include "factory/ProtocolFactory.h"
#include "velt-host/Console.h"
#include "velt-host/ConsoleOutput.h"
#include "velt-host/Instance.h"
#include "velt-host/LineInput.h"

namespace {

constexpr std::size_t kMostLines = 8;

const char kConfig[] =
    "CfgVer=1 model=1 remoteIpAddress=127.0.0.1 remotePort=5000 localPort=6000 rx_prefix=02 "
    "rx_suffix=03 tx_prefix=02 tx_suffix=03 token_queue_size=4";

// Lines come from the fuzzer, not from here; a .watch ends at once, as on a
// stop signal (with a count it would otherwise wait for its tokens).
class NoInput final : public velthost::LineInput {
 public:
  Read Next(std::string& /*line*/) override { return Read::kEnded; }
  std::unique_ptr<velthost::WatchEnd> BeginWatch() override { return std::make_unique<Stopped>(); }
  bool KeyEndsWatch() const override { return false; }

 private:
  class Stopped final : public velthost::WatchEnd {
   public:
    Event Wait(std::chrono::milliseconds /*timeout*/) override { return Event::kSignal; }
  };
};

// A stream in memory for the console's output and errors.
class MemoryFile {
 public:
  MemoryFile() : file_(::open_memstream(&text_, &size_)) {}
  MemoryFile(const MemoryFile&) = delete;
  MemoryFile& operator=(const MemoryFile&) = delete;
  MemoryFile(MemoryFile&&) = delete;
  MemoryFile& operator=(MemoryFile&&) = delete;
  ~MemoryFile() {
    std::fclose(file_);
    std::free(text_);
  }
  std::FILE* Get() const { return file_; }
  std::size_t Size() {
    std::fflush(file_);
    return size_;
  }

 private:
  char* text_ = nullptr;
  std::size_t size_ = 0;
  std::FILE* file_;
};

std::string Token(int which) {
  return which == 0 ? std::string("tok\\en") : std::string(300, static_cast<char>(0xFF));
}

void RunLines(const std::vector<std::string>& lines, std::uint8_t flags) {
  std::string config = kConfig;
  config += (flags & 4U) != 0 ? " hex_tokens=true" : "";
  config += (flags & 8U) != 0 ? " socketType=TCP" : " socketType=UDP";
  ProtocolFactory factory;
  std::vector<std::unique_ptr<velthost::Instance>> instances;
  instances.push_back(std::make_unique<velthost::Instance>(factory, "VELT", config));
  instances.push_back(std::make_unique<velthost::Instance>(factory, "B", config));
  auto& protocol = dynamic_cast<Protocol_VELT&>(instances.front()->Protocol());
  for (unsigned i = 0; i < (flags & 3U); ++i) {
    TokenQueue::Guard held(protocol.getTokenQueue());
    held.addToken(Token(static_cast<int>(i % 2)));
  }
  MemoryFile out;
  MemoryFile err;
  velthost::ConsoleOutput output(out.Get(), err.Get(), false);
  NoInput input;
  velthost::Console console(instances, output, input);
  for (const std::string& line : lines) {
    const std::size_t before = out.Size() + err.Size();
    if (!console.Run(line)) {
      Require(out.Size() + err.Size() > before, "a line that fails says so");
    }
  }
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int* argc, char*** argv) {
  static std::vector<char*> arguments;
  static char limit[] = "-malloc_limit_mb=64";
  arguments.assign(*argv, *argv + *argc);
  arguments.push_back(limit);
  arguments.push_back(nullptr);
  *argc = static_cast<int>(arguments.size()) - 1;
  *argv = arguments.data();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzInput input(data, size);
  const std::uint8_t flags = input.Byte();
  const std::vector<std::string> lines = FuzzInput::Split(input.Rest(), '\n', kMostLines);
  MemoryStorage storage;
  const BoundModule module(storage);
  RunLines(lines, flags);
  return 0;
}
