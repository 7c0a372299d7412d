// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/StreamInput.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <string>

#include "FileDescriptor.h"
#include "velt-host/StopSignals.h"

using std::chrono::milliseconds;
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
  ASSERT_TRUE(input.Next(line));
  EXPECT_EQ(line, "get_stat");
  ASSERT_TRUE(input.Next(line));
  EXPECT_EQ(line, "");
  ASSERT_TRUE(input.Next(line));
  EXPECT_EQ(line, "  put a b");
  ASSERT_TRUE(input.Next(line));
  EXPECT_EQ(line, "last");
  EXPECT_FALSE(input.Next(line));
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
  ASSERT_TRUE(input.Next(line));
  EXPECT_EQ(line, ".list");
  EXPECT_FALSE(input.Next(line));
}

TEST(StreamInput, StopSignalEndsTheInputAndTheWatch) {
  StopSignals signals;
  Pipe pipe;
  StreamInput input(pipe.ReadEnd(), signals);
  pipe.Write("first\nsecond\n");
  std::string line;
  ASSERT_TRUE(input.Next(line));
  EXPECT_EQ(line, "first");
  ASSERT_EQ(::kill(::getpid(), SIGTERM), 0);
  EXPECT_EQ(input.BeginWatch()->Wait(milliseconds(1000)), WatchEnd::Event::kSignal);
  EXPECT_FALSE(input.Next(line));
  EXPECT_EQ(signals.Signal(), SIGTERM);
}
