// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-peer's command line (PeerCommandLine::Parse).
//
// Input: the arguments after the program's name, separated by zero bytes
// (at most 32 of them). A --to value whose host is not a numeric address is
// given the host "localhost" instead, so that no name goes to DNS.
//
// Accepted options keep the documented ranges and combinations; a refusal
// says why.

#include <netdb.h>
#include <sys/socket.h>

#include <cstdint>
#include <string>
#include <vector>

#include "FuzzInput.h"
#include "Require.h"
#include "velt-peer/PeerCommandLine.h"

namespace {

constexpr std::size_t kMostArguments = 32;

bool IsNumericHost(const std::string& host) {
  addrinfo hints{};
  hints.ai_flags = AI_NUMERICHOST;
  addrinfo* found = nullptr;
  const int rc = ::getaddrinfo(host.c_str(), nullptr, &hints, &found);
  if (found != nullptr) {
    ::freeaddrinfo(found);
  }
  return rc == 0;
}

// "--to=HOST:PORT" or the argument after "--to", with a host that is not a
// numeric address (brackets and all) turned into localhost.
std::string WithoutNames(const std::string& value) {
  const std::size_t colon = value.rfind(':');
  if (colon == std::string::npos) {
    return value;
  }
  std::string host = value.substr(0, colon);
  if (host.size() >= 2 && host.front() == '[' && host.back() == ']') {
    host = host.substr(1, host.size() - 2);
  }
  return host.empty() || IsNumericHost(host) ? value : "localhost" + value.substr(colon);
}

void KeepNamesLocal(std::vector<std::string>& arguments) {
  for (std::size_t i = 0; i < arguments.size(); ++i) {
    if (arguments[i].rfind("--to=", 0) == 0) {
      arguments[i] = "--to=" + WithoutNames(arguments[i].substr(5));
    } else if (arguments[i] == "--to" && i + 1 < arguments.size()) {
      arguments[i + 1] = WithoutNames(arguments[i + 1]);
    }
  }
}

void CheckAccepted(const veltpeer::PeerCommandLine& commandLine) {
  const veltpeer::PeerOptions& o = commandLine.Options();
  Require(!o.bindAddress.empty(), "a bind address is set");
  Require(o.gapMs >= 1 && o.gapMs <= 3600000 && o.delayMs >= 0 && o.delayMs <= 3600000 &&
              o.chunkDelayMs >= 0 && o.chunkDelayMs <= 3600000 && o.closeAfterMs >= 0 &&
              o.closeAfterMs <= 3600000,
          "times are within 0..3600000 ms (the gap from 1)");
  Require(o.chunkBytes <= 1000000000, "a chunk is at most 1000000000 bytes");
  Require(o.rate == 0 || (o.rate >= 0.001 && o.rate <= 1000000), "a rate is 0 or 0.001..1000000");
  Require(o.maxSeconds >= 0 && o.maxSeconds <= 31536000, "a run lasts at most a year");
  Require(o.to.empty() || o.transport == veltpeer::Transport::kUdp, "--to is for udp");
  Require(
      o.transport == veltpeer::Transport::kTcp || (o.closeAfterFrames == 0 && o.closeAfterMs == 0),
      "closing after frames or time is for tcp");
  Require(o.chunkDelayMs == 0 || o.chunkBytes != 0, "a chunk delay comes with chunks");
  Require(!(commandLine.Text() && commandLine.CountOnly()),
          "--text and --count exclude each other");
  Require(o.transport == veltpeer::Transport::kUdp || o.emitCount == 0 ||
              !(o.txPrefix + o.payload + o.txSuffix).empty(),
          "a token emitted over tcp is not empty");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzInput input(data, size);
  std::vector<std::string> arguments =
      size == 0 ? std::vector<std::string>() : FuzzInput::Split(input.Rest(), '\0', kMostArguments);
  KeepNamesLocal(arguments);
  veltpeer::PeerCommandLine commandLine;
  if (commandLine.Parse(arguments)) {
    Require(commandLine.Error().empty(), "an accepted command line has no error");
    if (commandLine.GetAction() == veltpeer::PeerCommandLine::Action::kRun) {
      CheckAccepted(commandLine);
    }
  } else {
    // The reason quotes the argument as given, which may hold any byte.
    Require(!commandLine.Error().empty(), "a refusal says why");
  }
  return 0;
}
