// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/StreamInput.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <memory>
#include <string>
#include <thread>

#include "FileDescriptor.h"
#include "velt-host/StopSignals.h"

using std::chrono::milliseconds;
using velthost::LineInput;
using velthost::StopSignals;
using velthost::StreamInput;
using velthost::WatchEnd;

namespace {

// A pipe whose read end feeds a StreamInput.
class Pipe {
 public:
  Pipe() {
    int ends[2] = {-1, -1};
    EXPECT_EQ(::pipe(ends), 0);
    read_ = FileDescriptor(ends[0]);
    write_ = FileDescriptor(ends[1]);
  }
  int ReadEnd() const { return read_.Get(); }
  void Write(const std::string& text) {
    ASSERT_EQ(::write(write_.Get(), text.data(), text.size()), static_cast<ssize_t>(text.size()));
  }
  void Close() { write_.Close(); }

 private:
  FileDescriptor read_;
  FileDescriptor write_;
};

}  // namespace

TEST(StreamInput, SplitsLinesDropsCarriageReturnsAndKeepsALastLineWithoutLineFeed) {
  StopSignals signals;
  Pipe pipe;
  StreamInput input(pipe.ReadEnd(), signals);
  pipe.Write("get_stat\r\n\n  put a b\nlast");
  pipe.Close();
  std::string line;
  ASSERT_EQ(input.Next(line), LineInput::Read::kLine);
  EXPECT_EQ(line, "get_stat");
  ASSERT_EQ(input.Next(line), LineInput::Read::kLine);
  EXPECT_EQ(line, "");
  ASSERT_EQ(input.Next(line), LineInput::Read::kLine);
  EXPECT_EQ(line, "  put a b");
  ASSERT_EQ(input.Next(line), LineInput::Read::kLine);
  EXPECT_EQ(line, "last");
  EXPECT_EQ(input.Next(line), LineInput::Read::kEnded);
  EXPECT_FALSE(input.KeyEndsWatch());
}

TEST(StreamInput, WatchEndsAtTheEndOfInputAndKeepsLinesThatArriveMeanwhile) {
  StopSignals signals;
  Pipe pipe;
  StreamInput input(pipe.ReadEnd(), signals);
  {
    const std::unique_ptr<WatchEnd> end = input.BeginWatch();
    EXPECT_EQ(end->Wait(milliseconds(1)), WatchEnd::Event::kNone);
    pipe.Write(".list\n");
    EXPECT_EQ(end->Wait(milliseconds(1000)), WatchEnd::Event::kNone);
    pipe.Close();
    EXPECT_EQ(end->Wait(milliseconds(1000)), WatchEnd::Event::kInputEnded);
    EXPECT_EQ(end->Wait(milliseconds(1)), WatchEnd::Event::kInputEnded);
  }
  std::string line;
  ASSERT_EQ(input.Next(line), LineInput::Read::kLine);
  EXPECT_EQ(line, ".list");
  EXPECT_EQ(input.Next(line), LineInput::Read::kEnded);
}

TEST(StreamInput, StopSignalEndsTheInputAndTheWatch) {
  StopSignals signals;
  Pipe pipe;
  StreamInput input(pipe.ReadEnd(), signals);
  pipe.Write("first\nsecond\n");
  std::string line;
  ASSERT_EQ(input.Next(line), LineInput::Read::kLine);
  EXPECT_EQ(line, "first");
  ASSERT_EQ(::kill(::getpid(), SIGTERM), 0);
  EXPECT_EQ(input.BeginWatch()->Wait(milliseconds(1000)), WatchEnd::Event::kSignal);
  EXPECT_EQ(input.Next(line), LineInput::Read::kEnded);
  EXPECT_EQ(signals.Signal(), SIGTERM);
}

TEST(StreamInput, ALineLongerThanTheLimitIsDroppedWholeAndTheNextOneIsRead) {
  StopSignals signals;
  Pipe pipe;
  StreamInput input(pipe.ReadEnd(), signals);
  const std::string longest(LineInput::kLongestLine, 'a');
  std::thread writer([&pipe, &longest] {
    pipe.Write(longest + "\n");
    pipe.Write(longest + "\r\n");
    pipe.Write(longest + "b\n");
    pipe.Write(std::string(5 * LineInput::kLongestLine, 'c') + "\nnext\n");
    pipe.Write(longest + "d");
    pipe.Close();
  });
  std::string line;
  ASSERT_EQ(input.Next(line), LineInput::Read::kLine);
  EXPECT_EQ(line, longest);
  ASSERT_EQ(input.Next(line), LineInput::Read::kLine);
  EXPECT_EQ(line, longest);
  EXPECT_EQ(input.Next(line), LineInput::Read::kTooLong);
  EXPECT_EQ(input.Next(line), LineInput::Read::kTooLong);
  ASSERT_EQ(input.Next(line), LineInput::Read::kLine);
  EXPECT_EQ(line, "next");
  EXPECT_EQ(input.Next(line), LineInput::Read::kTooLong);
  EXPECT_EQ(input.Next(line), LineInput::Read::kEnded);
  writer.join();
}

TEST(StreamInput, AWatchStopsReadingWhenTheLinesWaitingFillTheInput) {
  StopSignals signals;
  Pipe pipe;
  StreamInput input(pipe.ReadEnd(), signals);
  std::thread writer([&pipe] {
    pipe.Write(std::string(LineInput::kLongestLine + 100000, 'x'));
    pipe.Close();
  });
  {
    const std::unique_ptr<WatchEnd> end = input.BeginWatch();
    while (!input.Full()) {
      ASSERT_EQ(end->Wait(milliseconds(1000)), WatchEnd::Event::kNone);
    }
    // The rest stays in the pipe: the watch no longer sees the input end.
    EXPECT_EQ(end->Wait(milliseconds(20)), WatchEnd::Event::kNone);
    EXPECT_FALSE(input.Ended());
  }
  std::string line;
  EXPECT_EQ(input.Next(line), LineInput::Read::kTooLong);
  EXPECT_EQ(input.Next(line), LineInput::Read::kEnded);
  writer.join();
}
