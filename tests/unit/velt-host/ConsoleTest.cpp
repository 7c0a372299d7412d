// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/Console.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <memory>
#include <string>
#include <vector>

#include "velt-host/ConsoleOutput.h"
#include "velt-host/PluginSession.h"
#include "velt-host/TempFolder.h"

using velthost::Console;
using velthost::ConsoleOutput;
using velthost::LineInput;
using velthost::PluginSession;
using velthost::TempFolder;
using velthost::WatchEnd;

namespace {

// A channel aimed at a closed loopback port: it configures and starts, and
// stays disconnected.
const std::string kConfig =
    "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=9 rx_prefix=02 "
    "rx_suffix=03";

// Lines from a list; a watch ends as at the end of scripted input.
class ScriptInput final : public LineInput {
 public:
  explicit ScriptInput(std::vector<std::string> lines) : lines_(std::move(lines)) {}
  Read Next(std::string& line) override {
    if (next_ == lines_.size()) {
      return Read::kEnded;
    }
    if (lines_[next_].size() > kLongestLine) {
      ++next_;
      return Read::kTooLong;
    }
    line = lines_[next_++];
    return Read::kLine;
  }
  std::unique_ptr<WatchEnd> BeginWatch() override { return std::make_unique<EndedInput>(); }
  bool KeyEndsWatch() const override { return false; }
  std::size_t Taken() const { return next_; }

 private:
  class EndedInput final : public WatchEnd {
   public:
    Event Wait(std::chrono::milliseconds /*timeout*/) override { return Event::kInputEnded; }
  };
  std::vector<std::string> lines_;
  std::size_t next_ = 0;
};

// Standard output and error of a console, kept in temporary files.
class Captured {
 public:
  Captured() : out_(std::tmpfile()), err_(std::tmpfile()) {}
  Captured(const Captured&) = delete;
  Captured& operator=(const Captured&) = delete;
  Captured(Captured&&) = delete;
  Captured& operator=(Captured&&) = delete;
  ~Captured() {
    std::fclose(out_);
    std::fclose(err_);
  }
  std::FILE* Out() const { return out_; }
  std::FILE* Err() const { return err_; }
  std::string OutText() const { return Text(out_); }
  std::string ErrText() const { return Text(err_); }

 private:
  static std::string Text(std::FILE* file) {
    std::fflush(file);
    std::rewind(file);
    std::string text;
    char buffer[4096];
    std::size_t count = 0;
    while ((count = std::fread(buffer, 1, sizeof buffer, file)) > 0) {
      text.append(buffer, count);
    }
    return text;
  }
  std::FILE* out_;
  std::FILE* err_;
};

class ConsoleTest : public ::testing::Test {
 protected:
  ConsoleTest() : session_(VELT_PLUGIN_PATH, storage_.File("storage.ini")) {}

  void AddInstance(const std::string& name) { session_.AddInstance(name, kConfig); }

  // Runs lines through a fresh console; false when any failed.
  bool RunLines(const std::vector<std::string>& lines, bool quiet = false) {
    ScriptInput input(lines);
    ConsoleOutput output(captured_.Out(), captured_.Err(), quiet);
    Console console(session_.Instances(), output, input);
    console.RunAll();
    taken_ = input.Taken();
    return !console.Failed();
  }

  TempFolder storage_{"velt-console"};
  PluginSession session_;
  Captured captured_;
  std::size_t taken_ = 0;
};

}  // namespace

TEST_F(ConsoleTest, DriverCommandReplyGetsALineFeed) {
  AddInstance("VELT");
  EXPECT_TRUE(RunLines({"get_stat", "tokens_available", "get"}));
  EXPECT_EQ(captured_.OutText(), "Disconnected\n0\n\n");
  EXPECT_EQ(captured_.ErrText(), "");
}

TEST_F(ConsoleTest, ReplyEndingInALineFeedIsPrintedAsItStands) {
  AddInstance("VELT");
  EXPECT_TRUE(RunLines({"read ?SP_Gap?unsignedInt", "getmaxtm"}));
  EXPECT_EQ(captured_.OutText(), "00000000\nmaxtm = 0 ms\n");
}

TEST_F(ConsoleTest, FailedDriverCommandPrintsItsReplyAndFailsTheRun) {
  AddInstance("VELT");
  EXPECT_FALSE(RunLines({"connect on", "get_stat"}));
  EXPECT_EQ(captured_.OutText(), "ERROR: wrong value\nDisconnected\n");
  EXPECT_EQ(captured_.ErrText(), "");
}

TEST_F(ConsoleTest, CommandWithoutReplyThatFailsIsReported) {
  AddInstance("VELT");
  EXPECT_FALSE(RunLines({"bogus word"}));
  EXPECT_EQ(captured_.OutText(), "");
  EXPECT_EQ(captured_.ErrText(),
            "velt-host: unknown command 'bogus word' (help lists the instance's commands, .help "
            "the host's)\n");
}

TEST_F(ConsoleTest, BlankLinesAreIgnored) {
  AddInstance("VELT");
  EXPECT_TRUE(RunLines({"", "  \t ", "get_stat"}));
  EXPECT_EQ(captured_.OutText(), "Disconnected\n");
}

TEST_F(ConsoleTest, HelpListsTheDotCommands) {
  EXPECT_TRUE(RunLines({".help"}));
  EXPECT_EQ(captured_.OutText(), Console::HelpText());
  EXPECT_EQ(
      std::string(Console::HelpText()).rfind(".help                 list these commands\n", 0), 0U);
}

TEST_F(ConsoleTest, UnknownDotCommandFails) {
  AddInstance("VELT");
  EXPECT_FALSE(RunLines({".bogus x", ".help extra"}));
  EXPECT_EQ(captured_.ErrText(),
            "velt-host: unknown command '.bogus' (.help lists the host's commands)\n"
            "velt-host: usage: .help\n");
}

TEST_F(ConsoleTest, WithoutInstanceInstanceCommandsFail) {
  EXPECT_FALSE(RunLines(
      {"get_stat", ".read ?conn_stat?boolean", ".write ?connect?boolean 1", ".watch 1", ".list"}));
  EXPECT_EQ(captured_.ErrText(),
            "velt-host: no instance\nvelt-host: no instance\n"
            "velt-host: no instance\nvelt-host: no instance\n");
  EXPECT_EQ(captured_.OutText(), "no instance (--config creates one)\n");
}

TEST_F(ConsoleTest, QuietLeavesOutTheConsolesOwnMessages) {
  EXPECT_TRUE(RunLines({".list"}, true));
  EXPECT_EQ(captured_.OutText(), "");
}

TEST_F(ConsoleTest, ListShowsEveryInstanceAndMarksTheCurrentOne) {
  AddInstance("VELT");
  AddInstance("Conveyor");
  EXPECT_TRUE(RunLines({".list", ".use Conveyor", ".list"}));
  EXPECT_EQ(captured_.OutText(),
            "* VELT     TCP 127.0.0.1:9 disconnected\n"
            "  Conveyor TCP 127.0.0.1:9 disconnected\n"
            "  VELT     TCP 127.0.0.1:9 disconnected\n"
            "* Conveyor TCP 127.0.0.1:9 disconnected\n");
}

TEST_F(ConsoleTest, UseOfAnUnknownInstanceFailsAndKeepsTheCurrentOne) {
  AddInstance("VELT");
  ScriptInput input({".use Nothing", ".use", "get_stat"});
  ConsoleOutput output(captured_.Out(), captured_.Err(), false);
  Console console(session_.Instances(), output, input);
  EXPECT_EQ(console.Prompt(), "VELT> ");
  console.RunAll();
  EXPECT_TRUE(console.Failed());
  EXPECT_EQ(console.Prompt(), "VELT> ");
  EXPECT_EQ(captured_.ErrText(),
            "velt-host: no instance named 'Nothing'\nvelt-host: usage: .use NAME\n");
  EXPECT_EQ(captured_.OutText(), "Disconnected\n");
}

TEST_F(ConsoleTest, PromptNamesTheCurrentInstance) {
  ScriptInput input({});
  ConsoleOutput output(captured_.Out(), captured_.Err(), false);
  Console console(session_.Instances(), output, input);
  EXPECT_EQ(console.Prompt(), "velt-host> ");
  EXPECT_EQ(console.Current(), nullptr);
}

TEST_F(ConsoleTest, ReadAndWriteAreTypedAsTheTag) {
  AddInstance("VELT");
  EXPECT_TRUE(
      RunLines({".read ?SP_RemoteIP?string-32", ".write ?SP_RemoteIP?string-32 10.1.2.3",
                ".read  ?SP_RemoteIP?string-32 ", ".write ?SP_RemotePort?unsignedShort 0x1F",
                ".read ?SP_RemotePort?unsignedShort", ".read ?SP_HexTokens?boolean",
                ".write ?SP_HexTokens?boolean true", ".read ?SP_HexTokens?boolean"}));
  EXPECT_EQ(captured_.OutText(), "127.0.0.1\n10.1.2.3\n31\n0\n1\n");
  EXPECT_EQ(captured_.ErrText(), "");
}

TEST_F(ConsoleTest, WriteTakesTheRestOfTheLineBlanksIncluded) {
  AddInstance("VELT");
  EXPECT_TRUE(
      RunLines({".write ?SP_RemoteIP?string-32  two  blanks ", ".read ?SP_RemoteIP?string-32"}));
  EXPECT_EQ(captured_.OutText(), " two  blanks \n");
}

TEST_F(ConsoleTest, ReadAndWriteErrorsAreReported) {
  AddInstance("VELT");
  EXPECT_FALSE(RunLines({".read", ".read a b", ".write ?connect?boolean", ".read ?nothing?boolean",
                         ".write ?SP_Gap?unsignedInt -1", ".write ?conn_stat?boolean 1",
                         ".read ?SP_RemoteIP?string-4"}));
  EXPECT_EQ(captured_.ErrText(),
            "velt-host: usage: .read URI\n"
            "velt-host: usage: .read URI\n"
            "velt-host: usage: .write URI VALUE\n"
            "velt-host: Tag URI error: ?nothing?boolean - Can't access memory type\n"
            "velt-host: bad unsignedInt value '-1' (a decimal or 0x hex number from 0 to "
            "4294967295 expected)\n"
            "velt-host: cannot write ?conn_stat?boolean: writing to read_only type\n"
            "velt-host: cannot read ?SP_RemoteIP?string-4: remote ip address too long to read\n");
  EXPECT_EQ(captured_.OutText(), "");
}

TEST_F(ConsoleTest, WatchWithoutTokensEndsWithTheInput) {
  AddInstance("VELT");
  EXPECT_TRUE(RunLines({".watch", "get_stat"}));
  EXPECT_EQ(captured_.OutText(), "Disconnected\n");
  EXPECT_FALSE(RunLines({".watch 0", ".watch x", ".watch 1 2"}));
  EXPECT_EQ(captured_.ErrText(),
            "velt-host: usage: .watch [N] (N: how many tokens, from 1)\n"
            "velt-host: usage: .watch [N] (N: how many tokens, from 1)\n"
            "velt-host: usage: .watch [N] (N: how many tokens, from 1)\n");
}

TEST_F(ConsoleTest, QuitStopsReadingLines) {
  AddInstance("VELT");
  EXPECT_TRUE(RunLines({"get_stat", ".quit", "get_stat"}));
  EXPECT_EQ(captured_.OutText(), "Disconnected\n");
  EXPECT_EQ(taken_, 2U);
}

TEST_F(ConsoleTest, TagsLongerThanSixteenMebibytesAreRefusedBeforeTheyAreRead) {
  AddInstance("VELT");
  EXPECT_FALSE(
      RunLines({".read ?rx_token?string-1000000000", ".write ?tx_token?string-16777217 x",
                "read ?rx_token?string-2147483647", "write ?tx_token?string-16777217 00",
                "read  ?rx_token?string-1000000000", ".read ?SP_RemoteIP?string-16777216"}));
  EXPECT_EQ(captured_.ErrText(),
            "velt-host: cannot read ?rx_token?string-1000000000: its value of 1000000000 bytes "
            "is longer than velt-host's limit of 16777216 bytes\n"
            "velt-host: cannot write ?tx_token?string-16777217: its value of 16777217 bytes is "
            "longer than velt-host's limit of 16777216 bytes\n"
            "velt-host: cannot read ?rx_token?string-2147483647: its value of 2147483647 bytes "
            "is longer than velt-host's limit of 16777216 bytes\n"
            "velt-host: cannot write ?tx_token?string-16777217: its value of 16777217 bytes is "
            "longer than velt-host's limit of 16777216 bytes\n");
  // Two blanks make three words, which the instance's console refuses
  // itself; a tag at the limit is read.
  EXPECT_EQ(captured_.OutText(), "error: missing parameter (URI string)\n127.0.0.1\n");
}

TEST_F(ConsoleTest, AConsoleCommandIsCheckedUpToItsFirstZeroByteAsTheInstanceTakesIt) {
  AddInstance("VELT");
  // The instance sees "read ?rx_token?string-1000000000" only.
  EXPECT_FALSE(RunLines({std::string("read ?rx_token?string-1000000000\0 more words", 44)}));
  EXPECT_EQ(captured_.ErrText(),
            "velt-host: cannot read ?rx_token?string-1000000000: its value of 1000000000 bytes "
            "is longer than velt-host's limit of 16777216 bytes\n");
  EXPECT_EQ(captured_.OutText(), "");
}

TEST_F(ConsoleTest, ALineLongerThanTheLimitIsRefusedAndTheNextOneRuns) {
  AddInstance("VELT");
  EXPECT_FALSE(RunLines({"get_stat", std::string(LineInput::kLongestLine + 1, 'x'), "get_stat"}));
  EXPECT_EQ(captured_.ErrText(), "velt-host: a line longer than 1048576 bytes was refused\n");
  EXPECT_EQ(captured_.OutText(), "Disconnected\nDisconnected\n");
}
