// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

#include "velt-host/HostOptions.h"

namespace velthost {

// velt-host's command line:
//   velt-host [OPTIONS] [xml | info | demo]
//   velt-host --help | --version
// Options: --plugin PATH, --storage PATH, --config STRING (repeatable),
// --config-file FILE (repeatable), --ident NAME (repeatable), -c COMMAND
// (repeatable), -q/--quiet, --connect-backoff MS. Long options take their
// value as the next argument or after "=". --help and --version end the
// scan where they stand.
class HostCommandLine {
 public:
  // False with Error() set for a bad command line.
  bool Parse(const std::vector<std::string>& arguments);
  const std::string& Error() const { return error_; }
  const HostOptions& Options() const { return options_; }

  static const char* Usage();
  static std::string Version();
  // The name of the instance at index (from 0) that no --ident names: VELT,
  // VELT2, VELT3, ...
  static std::string DefaultName(std::size_t index);
  // The largest --connect-backoff: an hour.
  static constexpr long kMaxConnectBackoff = 3600000;

 private:
  bool TakeValue(const std::vector<std::string>& arguments, std::size_t& index,
                 const std::string& name, std::string& value);
  bool TakeOption(const std::vector<std::string>& arguments, std::size_t& index, bool& known);
  bool TakeAction(const std::string& word, bool& actionGiven);
  bool TakeBackoff(const std::string& value);
  bool Check();
  bool NameInstances();
  bool Fail(const std::string& text);

  HostOptions options_;
  std::string error_;
  bool pluginGiven_ = false;
  bool storageGiven_ = false;
};

}  // namespace velthost
