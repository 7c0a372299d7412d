// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-host's command line (HostCommandLine::Parse).
//
// Input: the arguments after the program's name, separated by zero bytes
// (at most 32 of them).
//
// An accepted command line names every instance once, with a name for each
// configuration; xml, info and demo come without instances, commands or a
// storage path; a path given is never empty. A refused one says why on one
// line, in one of the documented forms, and parsing the same arguments again
// gives the same answer.

#include <algorithm>
#include <cstdint>
#include <set>
#include <string>
#include <vector>

#include "FuzzInput.h"
#include "Require.h"
#include "velt-host/HostCommandLine.h"

namespace {

constexpr std::size_t kMostArguments = 32;

// The beginnings of the texts a refusal may have.
const char* const kRefusals[] = {
    "unknown option '", "unknown command '",      "unexpected argument '",
    "option '",         "more --ident options (", "two instances are named '",
    "xml takes no ",    "info takes no ",         "demo takes no "};

bool Documented(const std::string& error) {
  return std::any_of(std::begin(kRefusals), std::end(kRefusals),
                     [&error](const char* start) { return error.rfind(start, 0) == 0; });
}

void CheckAccepted(const velthost::HostOptions& options) {
  using velthost::Action;
  Require(options.names.size() == options.channels.size(), "every instance has a name");
  Require(std::set<std::string>(options.names.begin(), options.names.end()).size() ==
              options.names.size(),
          "no two instances share a name");
  Require(std::none_of(options.names.begin(), options.names.end(),
                       [](const std::string& name) { return name.empty(); }),
          "no name is empty");
  for (const velthost::ChannelSource& source : options.channels) {
    Require(!source.fromFile || !source.text.empty(), "a configuration file has a path");
  }
  if (options.action == Action::kXml || options.action == Action::kInfo ||
      options.action == Action::kDemo) {
    Require(options.channels.empty() && options.commands.empty() && options.storagePath.empty(),
            "xml, info and demo come without instances, commands or storage");
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzInput input(data, size);
  const std::vector<std::string> arguments =
      size == 0 ? std::vector<std::string>() : FuzzInput::Split(input.Rest(), '\0', kMostArguments);
  velthost::HostCommandLine commandLine;
  const bool accepted = commandLine.Parse(arguments);
  const velthost::Action action = commandLine.Options().action;
  if (accepted) {
    Require(commandLine.Error().empty(), "an accepted command line has no error");
    // --help and --version end the scan where they stand.
    if (action != velthost::Action::kHelp && action != velthost::Action::kVersion) {
      CheckAccepted(commandLine.Options());
    }
  } else {
    const std::string& error = commandLine.Error();
    Require(Documented(error), "a refusal is one of the documented reasons");
  }
  velthost::HostCommandLine again;
  Require(again.Parse(arguments) == accepted && again.Error() == commandLine.Error(),
          "the same arguments get the same answer");
  return 0;
}
