// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/HostProgram.h"

#include <unistd.h>

#include <atomic>
#include <clocale>
#include <csignal>
#include <cstdlib>
#include <exception>
#include <memory>
#include <stdexcept>

#include "DescriptionBlock.h"
#include "DescriptorLimit.h"
#include "velt-host/CommandListInput.h"
#include "velt-host/ConfigFile.h"
#include "velt-host/Console.h"
#include "velt-host/DefaultPaths.h"
#include "velt-host/Demo.h"
#include "velt-host/HostCommandLine.h"
#include "velt-host/PluginSession.h"
#include "velt-host/ProtocolHandle.h"
#include "velt-host/StoredSettings.h"
#include "velt-host/StreamInput.h"
#include "velt-host/TerminalInput.h"

namespace velthost {

namespace {

constexpr int kInfoBytes = 64 * 1024;

std::string Join(const std::vector<std::unique_ptr<Instance>>& instances) {
  std::string names;
  for (const std::unique_ptr<Instance>& instance : instances) {
    names += (names.empty() ? "" : ", ") + instance->Name();
  }
  return names;
}

}  // namespace

int HostProgram::Run(const std::vector<std::string>& arguments) {
  HostCommandLine commandLine;
  if (!commandLine.Parse(arguments)) {
    // A failed write to standard error has nowhere left to be reported.
    (void)std::fprintf(err_, "velt-host: %s\nTry 'velt-host --help'.\n",
                       commandLine.Error().c_str());
    return kBadCommandLine;
  }
  const HostOptions& options = commandLine.Options();
  if (options.action == Action::kHelp) {
    // Best effort, as for the version line below.
    (void)std::fputs(HostCommandLine::Usage(), out_);
    return kSucceeded;
  }
  if (options.action == Action::kVersion) {
    (void)std::fprintf(out_, "%s\n", HostCommandLine::Version().c_str());
    return kSucceeded;
  }
  // A reader that goes away must not kill velt-host before it has stopped
  // its instances; the failed write is enough. signal fails only for a
  // signal number that does not exist.
  (void)::signal(SIGPIPE, SIG_IGN);
  ConsoleOutput output(out_, err_, options.quiet);
  try {
    StopSignals signals;
    return RunAction(options, signals, output);
  } catch (const std::exception& e) {
    output.Error(e.what());
    return kFailed;
  }
}

int HostProgram::RunAction(const HostOptions& options, StopSignals& signals,
                           ConsoleOutput& output) {
  switch (options.action) {
    case Action::kXml:
      return PrintXml(PluginPath(options), output);
    case Action::kInfo:
      return PrintInfo(PluginPath(options), output);
    case Action::kDemo: {
      Demo demo(PluginPath(options), output, signals);
      if (!demo.Run()) {
        output.Error("demo failed: " + demo.Error());
        return kFailed;
      }
      return kSucceeded;
    }
    default:
      return RunConsole(options, signals, output);
  }
}

std::string HostProgram::PluginPath(const HostOptions& options) {
  if (!options.pluginPath.empty()) {
    return options.pluginPath;
  }
  return DefaultPaths::PluginPath(DefaultPaths::ExecutableFolder());
}

// The default file's folder is created; a given file's folder must exist.
std::string HostProgram::StoragePath(const HostOptions& options) {
  if (!options.storagePath.empty()) {
    const std::string folder = DefaultPaths::FolderOf(options.storagePath);
    if (!DefaultPaths::IsFolder(folder)) {
      throw std::runtime_error("the storage folder " + folder + " does not exist");
    }
    return options.storagePath;
  }
  std::string path = DefaultPaths::StoragePath(std::getenv("XDG_STATE_HOME"), DefaultPaths::Home());
  if (path.empty()) {
    throw std::runtime_error(
        "no place for the storage file: neither XDG_STATE_HOME nor a home folder is known "
        "(give --storage)");
  }
  std::string error;
  if (!DefaultPaths::MakeFolders(DefaultPaths::FolderOf(path), error)) {
    throw std::runtime_error(error);
  }
  return path;
}

std::vector<std::string> HostProgram::ConfigStrings(const HostOptions& options) {
  std::vector<std::string> configs;
  for (const ChannelSource& source : options.channels) {
    std::string text = source.text;
    std::string error;
    if (source.fromFile && !ConfigFile::Read(source.text, text, error)) {
      throw std::runtime_error(error);
    }
    configs.push_back(text);
  }
  return configs;
}

int HostProgram::PrintXml(const std::string& pluginPath, ConsoleOutput& output) {
  PluginSession session(pluginPath, std::string());
  const ProtocolHandle protocol(session.Plugin().Protocols());
  const DescriptionBlock description(protocol.Get().GetXml());
  if (!description.Ok()) {
    output.Error("cannot read the plug-in's description: " + description.Error());
    return kFailed;
  }
  output.Reply(description.Document());
  return kSucceeded;
}

int HostProgram::PrintInfo(const std::string& pluginPath, ConsoleOutput& output) {
  PluginSession session(pluginPath, std::string());
  const ProtocolHandle protocol(session.Plugin().Protocols());
  std::vector<char> text(kInfoBytes);
  const int written = protocol.Get().GetInfo(text.data(), kInfoBytes);
  const int length = written < 0 ? 0 : (written > kInfoBytes ? kInfoBytes : written);
  output.Reply(std::string(text.data(), static_cast<std::size_t>(length)));
  return kSucceeded;
}

HostSocket::Timeouts HostProgram::SocketTimeouts(const HostOptions& options) {
  HostSocket::Timeouts timeouts;
  if (options.connectBackoff.has_value()) {
    timeouts.connectBackoff = *options.connectBackoff;
  }
  return timeouts;
}

int HostProgram::RunConsole(const HostOptions& options, StopSignals& signals,
                            ConsoleOutput& output) {
  const bool terminal = ::isatty(STDIN_FILENO) == 1;
  if (terminal) {
    // The terminal's encoding, so that the line editor moves over whole
    // characters. A locale the system does not have leaves "C", where every
    // byte stands for itself, which the line editor handles as well.
    // A false positive: setlocale is not safe beside threads that use the
    // locale, and none exists yet (the plug-in is loaded below). uselocale
    // would set the encoding for this thread alone, so the plug-in's threads
    // would see another locale than the console's.
    // NOLINTNEXTLINE(concurrency-mt-unsafe)
    (void)std::setlocale(LC_CTYPE, "");
  }
  const std::string pluginPath = PluginPath(options);
  const std::string storagePath = StoragePath(options);
  const std::vector<std::string> configs = ConfigStrings(options);
  std::string limitError;
  if (!DescriptorLimit::Ensure(DescriptorLimit::ForChannels(configs.size()), limitError)) {
    throw std::runtime_error("cannot run " + std::to_string(configs.size()) +
                             " instances: " + limitError);
  }
  // Storage failures are reported on the thread that applied: the console's.
  std::atomic<bool> storageFailed{false};
  bool commandFailed = false;
  {
    PluginSession session(pluginPath, storagePath, SocketTimeouts(options),
                          [&output, &storageFailed](const StorageFailure& failure) {
                            output.Error(failure.Text());
                            storageFailed = true;
                          });
    WarnOfStoredSettings(session, options, configs.size(), output);
    for (std::size_t i = 0; i < configs.size(); ++i) {
      session.AddInstance(options.names[i], configs[i]);
    }
    commandFailed = RunCommands(options, signals, output, session, terminal);
  }
  return commandFailed || storageFailed ? kFailed : kSucceeded;
}

void HostProgram::WarnOfStoredSettings(PluginSession& session, const HostOptions& options,
                                       std::size_t instances, ConsoleOutput& output) {
  HostPermanentStorage* const storage = session.Host().Storage();
  for (std::size_t i = 0; storage != nullptr && i < instances; ++i) {
    for (const std::string& warning : StoredSettings::Warnings(*storage, options.names[i])) {
      output.Error("warning: " + warning);
    }
  }
}

// True when a command failed.
bool HostProgram::RunCommands(const HostOptions& options, StopSignals& signals,
                              ConsoleOutput& output, PluginSession& session, bool terminal) {
  const Console* console = nullptr;
  const auto prompt = [&console]() {
    return console == nullptr ? std::string() : console->Prompt();
  };
  std::unique_ptr<LineInput> standardInput;
  if (terminal) {
    standardInput = std::make_unique<TerminalInput>(signals, prompt);
  } else {
    standardInput = std::make_unique<StreamInput>(STDIN_FILENO, signals);
  }
  std::unique_ptr<LineInput> input;
  if (!options.commands.empty()) {
    input = std::make_unique<CommandListInput>(options.commands, signals, std::move(standardInput));
  } else {
    input = std::move(standardInput);
  }

  Console running(session.Instances(), output, *input);
  console = &running;
  if (terminal && options.commands.empty()) {
    const HostPermanentStorage* const storage = session.Host().Storage();
    output.Message(HostCommandLine::Version() + ": plug-in " + PluginPath(options) + ", storage " +
                   (storage == nullptr ? std::string("none") : storage->Path()));
    output.Message(session.Instances().empty() ? "no instance (--config creates one)"
                                               : "instances: " + Join(session.Instances()));
    output.Message(".help lists the host's commands, help the instance's; .quit or Ctrl-D leaves");
  }
  running.RunAll();
  return running.Failed();
}

}  // namespace velthost
