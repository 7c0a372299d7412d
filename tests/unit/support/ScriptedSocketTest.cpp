// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ScriptedSocket.h"

#include <gtest/gtest.h>

#include <string>

namespace {

std::string Take(ScriptedSocket& socket, int most) {
  std::string buffer(static_cast<std::size_t>(most), '\0');
  const int received = socket.Receive(reinterpret_cast<unsigned char*>(buffer.data()), most, 20);
  return received < 1 ? "<" + std::to_string(received) + ">"
                      : buffer.substr(0, static_cast<std::size_t>(received));
}

}  // namespace

TEST(ScriptedSocket, StreamIsHandedOutUpToTheMaximumAndDatagramsWhole) {
  ScriptedSocket socket(1, 1);
  socket.AddStream("abcde");
  socket.AddDatagram("xyz");
  socket.AddTimeout();
  socket.AddError();
  EXPECT_EQ(Take(socket, 2), "ab");
  EXPECT_EQ(Take(socket, 8), "cde");
  EXPECT_EQ(Take(socket, 1), "x");
  EXPECT_EQ(Take(socket, 8), "<0>");
  EXPECT_EQ(Take(socket, 8), "<-1>");
  EXPECT_EQ(Take(socket, 8), "<0>");
}

TEST(ScriptedSocket, RepeatedStreamIsReceivedAsOftenAsAsked) {
  ScriptedSocket socket(1, 1);
  socket.AddRepeatedStream("abc", 3);
  socket.AddTimeout();
  EXPECT_EQ(Take(socket, 2), "ab");
  EXPECT_EQ(Take(socket, 8), "c");
  EXPECT_EQ(Take(socket, 8), "abc");
  EXPECT_EQ(Take(socket, 8), "abc");
  EXPECT_EQ(socket.Pending(), 1U);
  EXPECT_EQ(Take(socket, 8), "<0>");
}

TEST(ScriptedSocket, ActionRunsWhenAReceiveReachesItAndTheReceiveGoesOn) {
  ScriptedSocket socket(1, 0);
  int runs = 0;
  socket.AddDatagram("1");
  socket.AddAction([&runs] { ++runs; });
  socket.AddDatagram("2");
  EXPECT_EQ(Take(socket, 8), "1");
  EXPECT_EQ(runs, 0);
  EXPECT_EQ(Take(socket, 8), "2");
  EXPECT_EQ(runs, 1);
  EXPECT_EQ(socket.Pending(), 0U);
}

TEST(ScriptedSocket, RecordsCanBeTurnedOff) {
  ScriptedSocket socket(1, 0);
  socket.KeepRecords(false);
  socket.Connect("1.2.3.4", 5);
  Take(socket, 8);
  const unsigned char byte = 7;
  EXPECT_EQ(socket.Send(&byte, 1), 1);
  EXPECT_TRUE(socket.Connects().empty());
  EXPECT_TRUE(socket.Receives().empty());
  EXPECT_TRUE(socket.Sends().empty());
  socket.KeepRecords(true);
  Take(socket, 8);
  EXPECT_EQ(socket.Receives().size(), 1U);
}
