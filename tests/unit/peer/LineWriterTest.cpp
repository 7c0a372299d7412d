// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/LineWriter.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <pthread.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <string>
#include <thread>
#include <vector>

#include "velt-peer/FileDescriptor.h"
#include "velt-peer/StopSignal.h"

using std::chrono::milliseconds;
using veltpeer::FileDescriptor;
using veltpeer::LineWriter;
using veltpeer::StopSignal;

namespace {

struct Pipe {
  Pipe() {
    int ends[2] = {-1, -1};
    if (::pipe2(ends, O_CLOEXEC) == 0) {
      readEnd.Reset(ends[0]);
      writeEnd.Reset(ends[1]);
    }
  }
  // Fills the pipe to the brim (non-blocking writes until it refuses more).
  void Fill() const {
    const int flags = ::fcntl(writeEnd.Get(), F_GETFL);
    ::fcntl(writeEnd.Get(), F_SETFL, flags | O_NONBLOCK);
    const std::string block(4096, 'f');
    while (::write(writeEnd.Get(), block.data(), block.size()) > 0) {
    }
    ::fcntl(writeEnd.Get(), F_SETFL, flags);
  }
  // Reads everything until the write end is closed.
  std::string Drain() const {
    std::string data;
    char buffer[8192];
    ssize_t got = 0;
    while ((got = ::read(readEnd.Get(), buffer, sizeof buffer)) > 0) {
      data.append(buffer, static_cast<std::size_t>(got));
    }
    return data;
  }
  FileDescriptor readEnd;
  FileDescriptor writeEnd;
};

}  // namespace

TEST(LineWriter, WritesTheLineAndANewline) {
  Pipe pipe;
  StopSignal stop;
  std::string error;
  ASSERT_TRUE(stop.Open(error)) << error;
  {
    LineWriter writer(pipe.writeEnd.Get());
    EXPECT_TRUE(writer.Write("rx 414243", stop));
    EXPECT_TRUE(writer.Write("", stop));
  }
  pipe.writeEnd.Reset();
  EXPECT_EQ(pipe.Drain(), "rx 414243\n\n");
}

TEST(LineWriter, LongLinesFromTwoThreadsNeverInterleave) {
  Pipe pipe;
  StopSignal stop;
  std::string error;
  ASSERT_TRUE(stop.Open(error)) << error;
  LineWriter writer(pipe.writeEnd.Get());
  std::string drained;
  std::thread reader([&] { drained = pipe.Drain(); });
  const std::string a(10000, 'a');
  const std::string b(10000, 'b');
  std::thread first([&] {
    for (int i = 0; i < 50; ++i) {
      writer.Write(a, stop);
    }
  });
  std::thread second([&] {
    for (int i = 0; i < 50; ++i) {
      writer.Write(b, stop);
    }
  });
  first.join();
  second.join();
  pipe.writeEnd.Reset();
  reader.join();
  ASSERT_EQ(drained.size(), 100U * 10001U);
  for (std::size_t at = 0; at < drained.size(); at += 10001) {
    const std::string line = drained.substr(at, 10001);
    EXPECT_TRUE(line == a + "\n" || line == b + "\n") << "line at " << at << " is torn";
  }
}

TEST(LineWriter, GivesUpOnAFullPipeAtTheDeadline) {
  Pipe pipe;
  pipe.Fill();
  StopSignal stop;
  std::string error;
  ASSERT_TRUE(stop.Open(error)) << error;
  LineWriter writer(pipe.writeEnd.Get());
  const auto begin = StopSignal::Clock::now();
  EXPECT_FALSE(writer.Write("tx 00", stop, begin + milliseconds(50)));
  EXPECT_GE(StopSignal::Clock::now() - begin, milliseconds(50));
}

TEST(LineWriter, GivesUpOnAFullPipeWhenStopIsRaised) {
  Pipe pipe;
  pipe.Fill();
  StopSignal stop;
  std::string error;
  ASSERT_TRUE(stop.Open(error)) << error;
  LineWriter writer(pipe.writeEnd.Get());
  std::thread raiser([&] {
    std::this_thread::sleep_for(milliseconds(50));
    stop.Raise();
  });
  EXPECT_FALSE(writer.Write("tx 00", stop));
  raiser.join();
  EXPECT_FALSE(writer.Write("tx 00", stop));
}

TEST(LineWriter, AClosedReaderIsAWriteError) {
  Pipe pipe;
  pipe.readEnd.Reset();
  StopSignal stop;
  LineWriter writer(pipe.writeEnd.Get());
  // The write would raise SIGPIPE; block it for this thread so that the
  // test sees the error result instead.
  sigset_t pipeSignal;
  sigemptyset(&pipeSignal);
  sigaddset(&pipeSignal, SIGPIPE);
  sigset_t old;
  pthread_sigmask(SIG_BLOCK, &pipeSignal, &old);
  EXPECT_FALSE(writer.Write("x", stop));
  timespec none{0, 0};
  sigtimedwait(&pipeSignal, nullptr, &none);
  pthread_sigmask(SIG_SETMASK, &old, nullptr);
}
