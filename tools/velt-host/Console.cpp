// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/Console.h"

#include <algorithm>
#include <chrono>

#include "velt-host/PrintableText.h"
#include "velt-host/TokenWatcher.h"

namespace velthost {

namespace {

// How long a .watch waits for its end between looks at the queue.
constexpr std::chrono::milliseconds kWatchPoll{10};
// The largest count a .watch takes.
constexpr unsigned long kMaxWatchCount = 1000000000UL;
constexpr const char* kBlanks = " \t";

// The runtime parameters and flag that .list shows.
constexpr const char* kSocketType = "?SP_SocketType?string-256";
constexpr const char* kRemoteIp = "?SP_RemoteIP?string-256";
constexpr const char* kRemotePort = "?SP_RemotePort?unsignedShort";
constexpr const char* kConnected = "?conn_stat?boolean";

std::string Trim(const std::string& text) {
  const std::size_t begin = text.find_first_not_of(kBlanks);
  if (begin == std::string::npos) {
    return {};
  }
  return text.substr(begin, text.find_last_not_of(kBlanks) - begin + 1);
}

bool ParseCount(const std::string& text, unsigned long& count) {
  if (text.empty() || text.size() > 10 ||
      text.find_first_not_of("0123456789") != std::string::npos) {
    return false;
  }
  count = std::stoul(text);
  return count >= 1 && count <= kMaxWatchCount;
}

}  // namespace

const char* Console::HelpText() {
  return ".help                 list these commands\n"
         ".list                 the instances: name, socket type, remote address:port, "
         "connection state; the current one marked with *\n"
         ".use NAME             make NAME the current instance\n"
         ".read URI             read a tag by address and print its value typed as the tag's "
         "data type\n"
         ".write URI VALUE      write a tag: VALUE typed as the tag's data type\n"
         ".watch [N]            print each received token as it arrives, until a key is pressed "
         "(terminal), N tokens were printed, or the input ends\n"
         ".quit                 stop everything and exit\n"
         "Other lines go to the current instance's console; its help command lists them.\n";
}

Console::Console(const std::vector<std::unique_ptr<Instance>>& instances, ConsoleOutput& output,
                 LineInput& input)
    : instances_(instances),
      output_(output),
      input_(input),
      current_(instances.empty() ? nullptr : instances.front().get()) {}

void Console::RunAll() {
  std::string line;
  while (!quit_) {
    switch (input_.Next(line)) {
      case LineInput::Read::kEnded:
        return;
      case LineInput::Read::kTooLong:
        Fail("a line longer than " + std::to_string(LineInput::kLongestLine) +
             " bytes was refused");
        break;
      case LineInput::Read::kLine:
        Run(line);
        break;
    }
  }
}

bool Console::Run(const std::string& line) {
  if (line.find_first_not_of(kBlanks) == std::string::npos) {
    return true;
  }
  return line[0] == '.' ? RunDotCommand(line) : RunDriverCommand(line);
}

std::string Console::Prompt() const {
  return (current_ == nullptr ? std::string("velt-host") : current_->Name()) + "> ";
}

bool Console::Fail(const std::string& text) {
  output_.Error(text);
  failed_ = true;
  return false;
}

bool Console::NeedInstance() { return current_ != nullptr || Fail("no instance"); }

bool Console::RunDriverCommand(const std::string& line) {
  if (!NeedInstance()) {
    return false;
  }
  std::string error;
  if (!current_->CommandFits(line, error)) {
    return Fail(error);
  }
  std::string reply;
  const bool ok = current_->Command(line, reply);
  if (!ok && reply.empty()) {
    return Fail("unknown command '" + line +
                "' (help lists the instance's commands, .help the host's)");
  }
  output_.Reply(reply);
  if (!ok) {
    failed_ = true;
  }
  return ok;
}

bool Console::RunDotCommand(const std::string& line) {
  const std::size_t end = line.find_first_of(kBlanks);
  const std::string command = line.substr(0, end);
  const std::string argument = end == std::string::npos ? std::string() : line.substr(end + 1);
  if (command == ".help") {
    return Help(argument);
  }
  if (command == ".list") {
    return List(argument);
  }
  if (command == ".use") {
    return Use(argument);
  }
  if (command == ".read") {
    return Read(argument);
  }
  if (command == ".write") {
    return Write(argument);
  }
  if (command == ".watch") {
    return Watch(argument);
  }
  if (command == ".quit") {
    return Quit(argument);
  }
  return Fail("unknown command '" + command + "' (.help lists the host's commands)");
}

bool Console::Help(const std::string& argument) {
  if (!Trim(argument).empty()) {
    return Fail("usage: .help");
  }
  output_.Reply(HelpText());
  return true;
}

bool Console::List(const std::string& argument) {
  if (!Trim(argument).empty()) {
    return Fail("usage: .list");
  }
  if (instances_.empty()) {
    output_.Message("no instance (--config creates one)");
    return true;
  }
  std::size_t width = 0;
  for (const std::unique_ptr<Instance>& instance : instances_) {
    width = std::max(width, instance->Name().size());
  }
  for (const std::unique_ptr<Instance>& instance : instances_) {
    output_.Line(ListLine(*instance, width));
  }
  return true;
}

// "* NAME TYPE ADDRESS:PORT STATE", the name padded to the longest one; a
// value that cannot be read shows as "?".
std::string Console::ListLine(Instance& instance, std::size_t nameWidth) {
  const auto value = [&instance](const char* uri) {
    std::string text;
    std::string error;
    return instance.ReadText(uri, text, error) ? text : std::string("?");
  };
  std::string name = instance.Name();
  name.resize(std::max(nameWidth, name.size()), ' ');
  const std::string connected = value(kConnected);
  const std::string state =
      connected == "1" ? "connected" : (connected == "0" ? "disconnected" : "?");
  return std::string(&instance == current_ ? "* " : "  ") + name + " " + value(kSocketType) + " " +
         value(kRemoteIp) + ":" + value(kRemotePort) + " " + state;
}

bool Console::Use(const std::string& argument) {
  const std::string name = Trim(argument);
  if (name.empty()) {
    return Fail("usage: .use NAME");
  }
  for (const std::unique_ptr<Instance>& instance : instances_) {
    if (instance->Name() == name) {
      current_ = instance.get();
      return true;
    }
  }
  return Fail("no instance named '" + name + "'");
}

bool Console::Read(const std::string& argument) {
  const std::string uri = Trim(argument);
  if (uri.empty() || uri.find_first_of(kBlanks) != std::string::npos) {
    return Fail("usage: .read URI");
  }
  if (!NeedInstance()) {
    return false;
  }
  std::string text;
  std::string error;
  if (!current_->ReadText(uri, text, error)) {
    return Fail(error);
  }
  output_.Line(text);
  return true;
}

// The address is the first word; the value is everything after the one
// blank that follows it, blanks included.
bool Console::Write(const std::string& argument) {
  const std::size_t begin = argument.find_first_not_of(kBlanks);
  const std::size_t end =
      begin == std::string::npos ? std::string::npos : argument.find_first_of(kBlanks, begin);
  if (end == std::string::npos) {
    return Fail("usage: .write URI VALUE");
  }
  if (!NeedInstance()) {
    return false;
  }
  std::string error;
  if (!current_->Write(argument.substr(begin, end - begin), argument.substr(end + 1), error)) {
    return Fail(error);
  }
  return true;
}

bool Console::Watch(const std::string& argument) {
  const std::string countText = Trim(argument);
  unsigned long limit = 0;
  if (!countText.empty() && !ParseCount(countText, limit)) {
    return Fail("usage: .watch [N] (N: how many tokens, from 1)");
  }
  if (!NeedInstance()) {
    return false;
  }
  TokenWatcher watcher(*current_);
  const std::unique_ptr<WatchEnd> end = input_.BeginWatch();
  if (input_.KeyEndsWatch()) {
    output_.Message("watching " + current_->Name() + ": press a key to stop");
  }
  unsigned long printed = 0;
  while (limit == 0 || printed < limit) {
    std::string token;
    std::string error;
    const TokenWatcher::Result result = watcher.Take(token, error);
    if (result == TokenWatcher::Result::kError) {
      return Fail(error);
    }
    if (result == TokenWatcher::Result::kToken) {
      output_.Line(PrintableText::Escape(token));
      ++printed;
      continue;
    }
    const WatchEnd::Event event = end->Wait(kWatchPoll);
    if (event == WatchEnd::Event::kKey || event == WatchEnd::Event::kSignal ||
        (event == WatchEnd::Event::kInputEnded && limit == 0)) {
      break;
    }
  }
  return true;
}

bool Console::Quit(const std::string& argument) {
  if (!Trim(argument).empty()) {
    return Fail("usage: .quit");
  }
  quit_ = true;
  return true;
}

}  // namespace velthost
