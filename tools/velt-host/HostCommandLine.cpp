// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/HostCommandLine.h"

#include <string>
#include <unordered_set>

// The build gives the project's version.
#ifndef VELT_VERSION
#error "VELT_VERSION must be defined"
#endif

namespace velthost {

const char* HostCommandLine::Usage() {
  return "Usage: velt-host [OPTIONS]          the console (interactive, or scripted from "
         "standard input)\n"
         "       velt-host [OPTIONS] xml      print the plug-in's XML description\n"
         "       velt-host [OPTIONS] info     print the information text of a new instance\n"
         "       velt-host [OPTIONS] demo     run the self-contained demo\n"
         "       velt-host --help | --version\n"
         "\n"
         "Loads the Velt Conduit plug-in into the reference host and drives its instances.\n"
         "\n"
         "Options:\n"
         "  --plugin PATH        the plug-in to load (default: libvelt.so beside velt-host, "
         "or in\n"
         "                       " VELT_INSTALLED_PLUGIN_FOLDER
         " from velt-host's folder)\n"
         "  --storage PATH       the permanent-storage file (default: "
         "$XDG_STATE_HOME/velt/storage.ini,\n"
         "                       or ~/.local/state/velt/storage.ini)\n"
         "  --config STRING      a configuration string; one instance per --config "
         "(repeatable)\n"
         "  --config-file FILE   a file holding one configuration string; one instance per "
         "file\n"
         "                       (repeatable, in order with --config)\n"
         "  --ident NAME         the identity of the instances, in order (default VELT, VELT2, "
         "...)\n"
         "  -c COMMAND           run COMMAND (repeatable, in order) and exit; no console\n"
         "  -q, --quiet          no banner or console messages (replies are still printed)\n"
         "  --connect-backoff MS the longest wait between connect attempts to a TCP peer "
         "that\n"
         "                       refuses them (default 1000; 0: attempt whenever the driver "
         "asks)\n"
         "  --help               print this help and exit\n"
         "  --version            print the version and exit\n"
         "\n"
         "Console: lines starting with \".\" are host commands (.help lists them); every other\n"
         "line goes to the current instance's console (help lists its commands).\n"
         "Exit status: 0 when every command succeeded, 1 when one failed or start-up failed,\n"
         "2 for a bad command line.\n";
}

std::string HostCommandLine::Version() { return std::string("velt-host ") + VELT_VERSION; }

std::string HostCommandLine::DefaultName(std::size_t index) {
  return index == 0 ? std::string("VELT") : "VELT" + std::to_string(index + 1);
}

bool HostCommandLine::Fail(const std::string& text) {
  error_ = text;
  return false;
}

bool HostCommandLine::Parse(const std::vector<std::string>& arguments) {
  options_ = HostOptions();
  error_.clear();
  pluginGiven_ = false;
  storageGiven_ = false;
  bool actionGiven = false;
  for (std::size_t i = 0; i < arguments.size(); ++i) {
    const std::string& argument = arguments[i];
    if (argument == "--help" || argument == "--version") {
      options_.action = argument == "--help" ? Action::kHelp : Action::kVersion;
      return true;
    }
    bool known = false;
    if (!TakeOption(arguments, i, known)) {
      return false;
    }
    if (known) {
      continue;
    }
    if (argument.size() > 1 && argument[0] == '-') {
      return Fail("unknown option '" + argument + "'");
    }
    if (!TakeAction(argument, actionGiven)) {
      return false;
    }
  }
  return Check() && NameInstances();
}

// Takes the value of option name at arguments[index]: after "=" in the same
// argument, or the next argument.
bool HostCommandLine::TakeValue(const std::vector<std::string>& arguments, std::size_t& index,
                                const std::string& name, std::string& value) {
  const std::string& argument = arguments[index];
  if (argument.size() > name.size() && argument[name.size()] == '=') {
    value = argument.substr(name.size() + 1);
    return true;
  }
  if (index + 1 == arguments.size()) {
    return Fail("option '" + name + "' needs a value");
  }
  value = arguments[++index];
  return true;
}

bool HostCommandLine::TakeOption(const std::vector<std::string>& arguments, std::size_t& index,
                                 bool& known) {
  const std::string& argument = arguments[index];
  const std::string name = argument.substr(0, argument.find('='));
  known = true;
  std::string value;
  if (argument == "-q" || argument == "--quiet") {
    options_.quiet = true;
    return true;
  }
  if (argument == "-c") {
    if (index + 1 == arguments.size()) {
      return Fail("option '-c' needs a value");
    }
    options_.commands.push_back(arguments[++index]);
    return true;
  }
  if (name == "--plugin" || name == "--storage") {
    bool& given = name == "--plugin" ? pluginGiven_ : storageGiven_;
    if (given) {
      return Fail("option '" + name + "' given twice");
    }
    given = true;
    if (!TakeValue(arguments, index, name, value)) {
      return false;
    }
    if (value.empty()) {
      return Fail("option '" + name + "' needs a value");
    }
    (name == "--plugin" ? options_.pluginPath : options_.storagePath) = value;
    return true;
  }
  if (name == "--config" || name == "--config-file") {
    if (!TakeValue(arguments, index, name, value)) {
      return false;
    }
    if (name == "--config-file" && value.empty()) {
      return Fail("option '--config-file' needs a value");
    }
    options_.channels.push_back(ChannelSource{value, name == "--config-file"});
    return true;
  }
  if (name == "--connect-backoff") {
    if (options_.connectBackoff.has_value()) {
      return Fail("option '--connect-backoff' given twice");
    }
    return TakeValue(arguments, index, name, value) && TakeBackoff(value);
  }
  if (name == "--ident") {
    if (!TakeValue(arguments, index, name, value)) {
      return false;
    }
    if (value.empty()) {
      return Fail("option '--ident' needs a non-empty name");
    }
    options_.names.push_back(value);
    return true;
  }
  known = false;
  return true;
}

bool HostCommandLine::TakeBackoff(const std::string& value) {
  const bool digits = !value.empty() && value.size() <= 7 &&
                      value.find_first_not_of("0123456789") == std::string::npos;
  const long milliseconds = digits ? std::stol(value) : -1;
  if (milliseconds < 0 || milliseconds > kMaxConnectBackoff) {
    return Fail("option '--connect-backoff' needs milliseconds from 0 to " +
                std::to_string(kMaxConnectBackoff) + ", not '" + value + "'");
  }
  options_.connectBackoff = std::chrono::milliseconds(milliseconds);
  return true;
}

bool HostCommandLine::TakeAction(const std::string& word, bool& actionGiven) {
  if (actionGiven) {
    return Fail("unexpected argument '" + word + "'");
  }
  if (word == "xml") {
    options_.action = Action::kXml;
  } else if (word == "info") {
    options_.action = Action::kInfo;
  } else if (word == "demo") {
    options_.action = Action::kDemo;
  } else {
    return Fail("unknown command '" + word + "'");
  }
  actionGiven = true;
  return true;
}

// xml, info and demo make instances of their own: the options that shape the
// console's instances do not apply to them.
bool HostCommandLine::Check() {
  if (options_.action == Action::kConsole) {
    return true;
  }
  const char* const word = options_.action == Action::kXml    ? "xml"
                           : options_.action == Action::kInfo ? "info"
                                                              : "demo";
  if (!options_.channels.empty() || !options_.names.empty() || !options_.commands.empty() ||
      storageGiven_) {
    return Fail(std::string(word) + " takes no --config, --config-file, --ident, --storage or -c");
  }
  if (options_.connectBackoff.has_value()) {
    return Fail(std::string(word) + " takes no --connect-backoff");
  }
  return true;
}

bool HostCommandLine::NameInstances() {
  const std::size_t count = options_.channels.size();
  if (options_.names.size() > count) {
    return Fail("more --ident options (" + std::to_string(options_.names.size()) +
                ") than instances (" + std::to_string(count) + ")");
  }
  for (std::size_t i = options_.names.size(); i < count; ++i) {
    options_.names.push_back(DefaultName(i));
  }
  // One pass over a set: hundreds of instances are checked in linear time.
  std::unordered_set<std::string> seen;
  for (const std::string& name : options_.names) {
    if (!seen.insert(name).second) {
      return Fail("two instances are named '" + name + "'");
    }
  }
  return true;
}

}  // namespace velthost
