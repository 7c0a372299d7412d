// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <map>
#include <string>
#include <vector>

#include "velt-peer/PeerOptions.h"

namespace veltpeer {

// The velt-peer command line: "velt-peer tcp|udp [options]", --help and
// --version. Turns the arguments into PeerOptions plus the output settings,
// or into one clear error text.
class PeerCommandLine {
 public:
  enum class Action { kRun, kHelp, kVersion };

  // Parses the arguments that follow the program name; false with Error set
  // when they are not acceptable.
  bool Parse(const std::vector<std::string>& arguments);

  Action GetAction() const { return action_; }
  const PeerOptions& Options() const { return options_; }
  // Print frames as escaped text instead of hex.
  bool Text() const { return text_; }
  // Print no frame lines, only the totals at the end.
  bool CountOnly() const { return countOnly_; }
  const std::string& Error() const { return error_; }

  // The --help text, ending in a newline.
  static const char* Usage();
  // The --version line, without newline.
  static std::string Version();

 private:
  bool Collect(const std::vector<std::string>& arguments);
  bool Interpret();
  bool Combine();
  bool Has(const std::string& name) const { return values_.count(name) != 0; }
  bool Fail(const std::string& error);
  bool ReadHex(const std::string& name, std::string& bytes);
  bool ReadCount(const std::string& name, std::uint64_t min, std::uint64_t max,
                 std::uint64_t& value, const std::string& expected);
  bool ReadMilliseconds(const std::string& name, int min, int& value);

  Action action_ = Action::kRun;
  PeerOptions options_;
  bool text_ = false;
  bool countOnly_ = false;
  std::string error_;
  std::string transport_;
  std::map<std::string, std::string> values_;
};

}  // namespace veltpeer
