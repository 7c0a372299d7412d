// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <iterator>
#include <memory>
#include <thread>
#include <vector>

#include "HostSocket.h"
#include "HostSocketFactory.h"
#include "LoopbackIo.h"

namespace {

using Clock = std::chrono::steady_clock;
using LoopbackIo::Bytes;
using std::chrono::milliseconds;

// A TCP HostSocket connected to a listener of the test, with the accepted
// end at hand.
class ConnectedTcp : public ::testing::Test {
 protected:
  void SetUp() override {
    listener_ = LoopbackIo::Listen(8, port_);
    socket_ = static_cast<HostSocket*>(factory_.CreateSocket(0, 1, 0));
    ASSERT_NE(socket_, nullptr) << factory_.LastError();
    ASSERT_EQ(socket_->Connect("127.0.0.1", port_), 0);
    peer_ = LoopbackIo::Accept(listener_.Get(), milliseconds(2000));
    ASSERT_TRUE(peer_.Valid());
  }

  // Receives count bytes one at a time, as the driver's stream framing does.
  Bytes ReceiveByteWise(std::size_t count) {
    Bytes received;
    unsigned char byte = 0;
    while (received.size() < count && socket_->Receive(&byte, 1, 2000) == 1) {
      received.push_back(byte);
    }
    return received;
  }

  bool BecomesBroken() {
    const auto deadline = Clock::now() + milliseconds(3000);
    while (Clock::now() < deadline) {
      if (socket_->IsBroken() != 0) {
        return true;
      }
      std::this_thread::sleep_for(milliseconds(2));
    }
    return false;
  }

  HostSocketFactory factory_;
  FileDescriptor listener_;
  std::uint16_t port_ = 0;
  HostSocket* socket_ = nullptr;
  FileDescriptor peer_;
};

}  // namespace

TEST(HostSocketTcp, CreateBindsAPortTheSystemPicks) {
  HostSocketFactory factory;
  auto* const socket = static_cast<HostSocket*>(factory.CreateSocket(0, 1, 0));
  ASSERT_NE(socket, nullptr);
  EXPECT_TRUE(socket->IsTcp());
  EXPECT_NE(socket->LocalPort(), 0);
  EXPECT_EQ(socket->IsBroken(), 0);
  factory.DeleteSocket(socket, 0);
}

TEST(HostSocketTcp, CreateOnAPortInUseByAListenerFails) {
  std::uint16_t port = 0;
  const FileDescriptor listener = LoopbackIo::Listen(1, port);
  HostSocketFactory factory;
  EXPECT_EQ(factory.CreateSocket(port, 1, 0), nullptr);
  EXPECT_EQ(factory.LastError(),
            "bind to port " + std::to_string(port) + ": Address already in use");
  EXPECT_EQ(factory.LiveSockets(), 0U);
}

TEST(HostSocketTcp, DefaultConnectTimeoutIsThreeSeconds) {
  EXPECT_EQ(HostSocket::Timeouts().connect, milliseconds(3000));
  EXPECT_EQ(HostSocket::Timeouts().send, milliseconds(3000));
  HostSocketFactory factory;
  EXPECT_EQ(factory.Timeouts().connect, milliseconds(3000));
}

TEST_F(ConnectedTcp, SendDeliversTheWholeFrame) {
  const Bytes frame = LoopbackIo::FromText("\x02hello\x03");
  EXPECT_EQ(socket_->Send(frame.data(), static_cast<int>(frame.size())), 7);
  EXPECT_EQ(LoopbackIo::ReceiveUpTo(peer_.Get(), 7, milliseconds(2000)), frame);
  EXPECT_EQ(socket_->IsBroken(), 0);
}

TEST_F(ConnectedTcp, SendOfNothingSucceedsAndBadArgumentsFail) {
  const unsigned char byte = 0x41;
  EXPECT_EQ(socket_->Send(&byte, 0), 0);
  EXPECT_EQ(socket_->Send(nullptr, 0), 0);
  EXPECT_EQ(socket_->Send(nullptr, 3), -1);
  EXPECT_EQ(socket_->Send(&byte, -1), -1);
}

TEST_F(ConnectedTcp, ReceiveReturnsWhatThePeerSent) {
  LoopbackIo::SendAll(peer_.Get(), LoopbackIo::FromText("abc"));
  unsigned char buffer[16] = {};
  EXPECT_EQ(socket_->Receive(buffer, sizeof buffer, 2000), 3);
  EXPECT_EQ(Bytes(buffer, buffer + 3), LoopbackIo::FromText("abc"));
}

TEST_F(ConnectedTcp, OneByteReceivesReturnExactlyTheBytesSentAcrossSizes) {
  const std::size_t sizes[] = {1, 2, 7, 100, 1000, 1001, 4095, 4096, 4097, 10000, 65536, 200000};
  unsigned seed = 0;
  for (const std::size_t size : sizes) {
    const Bytes sent = LoopbackIo::Pattern(size, ++seed);
    std::thread writer([&] { LoopbackIo::SendAll(peer_.Get(), sent); });
    const Bytes received = ReceiveByteWise(size);
    writer.join();
    ASSERT_EQ(received.size(), size);
    EXPECT_EQ(received, sent) << "size " << size;
  }
  unsigned char byte = 0;
  EXPECT_EQ(socket_->Receive(&byte, 1, 0), 0);
}

TEST_F(ConnectedTcp, AReceiveTakesNoMoreThanAskedAndKeepsTheRest) {
  LoopbackIo::SendAll(peer_.Get(), LoopbackIo::FromText("0123456789"));
  std::this_thread::sleep_for(milliseconds(20));
  unsigned char buffer[4] = {};
  EXPECT_EQ(socket_->Receive(buffer, 4, 2000), 4);
  EXPECT_EQ(Bytes(buffer, buffer + 4), LoopbackIo::FromText("0123"));
  unsigned char rest[16] = {};
  EXPECT_EQ(socket_->Receive(rest, sizeof rest, 2000), 6);
  EXPECT_EQ(Bytes(rest, rest + 6), LoopbackIo::FromText("456789"));
}

TEST_F(ConnectedTcp, ReceiveHonoursItsTimeout) {
  unsigned char byte = 0;
  const auto start = Clock::now();
  EXPECT_EQ(socket_->Receive(&byte, 1, 200), 0);
  EXPECT_GE(Clock::now() - start, milliseconds(200));
  EXPECT_EQ(socket_->IsBroken(), 0);
}

TEST_F(ConnectedTcp, ReceiveWithZeroTimeoutOnlyTakesWhatIsThere) {
  unsigned char byte = 0;
  EXPECT_EQ(socket_->Receive(&byte, 1, 0), 0);
}

TEST_F(ConnectedTcp, ReceiveWithANegativeTimeoutWaitsForData) {
  const auto start = Clock::now();
  std::thread late([this] {
    std::this_thread::sleep_for(milliseconds(150));
    LoopbackIo::SendAll(peer_.Get(), LoopbackIo::FromText("z"));
  });
  unsigned char byte = 0;
  EXPECT_EQ(socket_->Receive(&byte, 1, -1), 1);
  EXPECT_GE(Clock::now() - start, milliseconds(150));
  EXPECT_EQ(byte, 'z');
  late.join();
}

TEST_F(ConnectedTcp, ReceiveRefusesBadArguments) {
  unsigned char byte = 0;
  EXPECT_EQ(socket_->Receive(nullptr, 1, 0), -1);
  EXPECT_EQ(socket_->Receive(&byte, 0, 0), -1);
}

TEST_F(ConnectedTcp, PeerCloseIsNoticedWithoutAReceive) {
  peer_.Close();
  EXPECT_TRUE(BecomesBroken());
  unsigned char byte = 0;
  EXPECT_EQ(socket_->Receive(&byte, 1, 100), -1);
}

TEST_F(ConnectedTcp, PeerResetIsNoticedWithoutAReceive) {
  LoopbackIo::Reset(peer_);
  EXPECT_TRUE(BecomesBroken());
}

TEST_F(ConnectedTcp, BytesSentBeforeACloseAreReceivedBeforeTheBreakShows) {
  LoopbackIo::SendAll(peer_.Get(), LoopbackIo::FromText("abc"));
  peer_.Close();
  std::this_thread::sleep_for(milliseconds(50));
  EXPECT_EQ(socket_->IsBroken(), 0);
  EXPECT_EQ(ReceiveByteWise(1), LoopbackIo::FromText("a"));
  EXPECT_EQ(socket_->IsBroken(), 0);
  EXPECT_EQ(ReceiveByteWise(2), LoopbackIo::FromText("bc"));
  EXPECT_EQ(socket_->IsBroken(), 1);
}

TEST_F(ConnectedTcp, BytesSentBeforeAResetAreReceivedBeforeTheBreakShows) {
  LoopbackIo::SendAll(peer_.Get(), LoopbackIo::FromText("abc"));
  LoopbackIo::Reset(peer_);
  std::this_thread::sleep_for(milliseconds(50));
  EXPECT_EQ(socket_->IsBroken(), 0);
  EXPECT_EQ(ReceiveByteWise(3), LoopbackIo::FromText("abc"));
  EXPECT_EQ(socket_->IsBroken(), 1);
  unsigned char byte = 0;
  EXPECT_EQ(socket_->Receive(&byte, 1, 100), -1);
}

TEST_F(ConnectedTcp, AFailedSendDoesNotHideBytesThatArrived) {
  LoopbackIo::SendAll(peer_.Get(), LoopbackIo::FromText("xyz"));
  LoopbackIo::Reset(peer_);
  std::this_thread::sleep_for(milliseconds(50));
  const Bytes frame = LoopbackIo::FromText("late");
  EXPECT_EQ(socket_->Send(frame.data(), static_cast<int>(frame.size())), -1);
  // The send found the connection reset, but what the peer sent first is
  // still to be received.
  EXPECT_EQ(socket_->IsBroken(), 0);
  EXPECT_EQ(ReceiveByteWise(3), LoopbackIo::FromText("xyz"));
  EXPECT_EQ(socket_->IsBroken(), 1);
  EXPECT_EQ(socket_->Send(frame.data(), static_cast<int>(frame.size())), -1);
}

TEST_F(ConnectedTcp, ReceivesOfAnySizeReturnTheStreamInOrder) {
  const Bytes sent = LoopbackIo::Pattern(40000, 5);
  std::thread writer([&] { LoopbackIo::SendAll(peer_.Get(), sent); });
  // Small receives are served from the internal buffer, large ones take the
  // stream straight into the caller's buffer.
  const int sizes[] = {1, 3, 4096, 7, 8192, 1, 4095, 65536, 2};
  Bytes received;
  Bytes buffer(65536);
  for (std::size_t i = 0; received.size() < sent.size(); ++i) {
    const int n = socket_->Receive(buffer.data(), sizes[i % std::size(sizes)], 2000);
    ASSERT_GT(n, 0);
    ASSERT_LE(n, sizes[i % std::size(sizes)]);
    received.insert(received.end(), buffer.begin(), buffer.begin() + n);
  }
  writer.join();
  EXPECT_EQ(received, sent);
}

TEST_F(ConnectedTcp, ClosedPeerMakesReceiveFailAndBreaks) {
  peer_.Close();
  unsigned char byte = 0;
  EXPECT_EQ(socket_->Receive(&byte, 1, 2000), -1);
  EXPECT_EQ(socket_->IsBroken(), 1);
}

TEST_F(ConnectedTcp, SendToAClosedPeerFailsWithoutSigpipe) {
  peer_.Close();
  const Bytes frame = LoopbackIo::Pattern(100);
  int result = 0;
  for (int attempt = 0; attempt < 200 && result >= 0; ++attempt) {
    result = socket_->Send(frame.data(), static_cast<int>(frame.size()));
    std::this_thread::sleep_for(milliseconds(2));
  }
  EXPECT_EQ(result, -1);
  EXPECT_EQ(socket_->IsBroken(), 1);
}

TEST_F(ConnectedTcp, ALargeFrameArrivesWhole) {
  const Bytes frame = LoopbackIo::Pattern(4 * 1024 * 1024, 7);
  Bytes received;
  std::thread reader(
      [&] { received = LoopbackIo::ReceiveUpTo(peer_.Get(), frame.size(), milliseconds(10000)); });
  EXPECT_EQ(socket_->Send(frame.data(), static_cast<int>(frame.size())),
            static_cast<int>(frame.size()));
  reader.join();
  EXPECT_EQ(received, frame);
}

TEST_F(ConnectedTcp, OneReceiverAndOneSenderAtOnce) {
  constexpr int kFrames = 300;
  const Bytes frame = LoopbackIo::Pattern(64, 3);
  // The peer echoes everything back.
  std::thread echo([&] {
    std::size_t total = 0;
    while (total < kFrames * frame.size()) {
      const Bytes chunk = LoopbackIo::ReceiveUpTo(peer_.Get(), 4096, milliseconds(100));
      if (chunk.empty()) {
        continue;
      }
      LoopbackIo::SendAll(peer_.Get(), chunk);
      total += chunk.size();
    }
  });
  std::atomic<int> sendFailures{0};
  std::thread sender([&] {
    for (int i = 0; i < kFrames; ++i) {
      if (socket_->Send(frame.data(), static_cast<int>(frame.size())) != 64) {
        ++sendFailures;
      }
    }
  });
  const Bytes received = ReceiveByteWise(kFrames * frame.size());
  sender.join();
  echo.join();
  EXPECT_EQ(sendFailures.load(), 0);
  ASSERT_EQ(received.size(), kFrames * frame.size());
  for (int i = 0; i < kFrames; ++i) {
    EXPECT_EQ(Bytes(received.begin() + i * 64, received.begin() + (i + 1) * 64), frame);
  }
}

TEST(HostSocketTcp, SendToAPeerThatNeverReadsGivesUpAfterTheSendTimeout) {
  std::uint16_t port = 0;
  const FileDescriptor listener = LoopbackIo::Listen(8, port);
  HostSocketFactory factory(HostSocket::Timeouts{milliseconds(1000), milliseconds(200)});
  ISocket* const socket = factory.CreateSocket(0, 1, 0);
  ASSERT_EQ(socket->Connect("127.0.0.1", port), 0);
  const FileDescriptor peer = LoopbackIo::Accept(listener.Get(), milliseconds(2000));
  const Bytes chunk = LoopbackIo::Pattern(256 * 1024);
  int result = 0;
  auto lastCall = Clock::duration::zero();
  // The kernel buffers fill after some megabytes; the attempts are bounded.
  for (int attempt = 0; attempt < 400 && result >= 0; ++attempt) {
    const auto start = Clock::now();
    result = socket->Send(chunk.data(), static_cast<int>(chunk.size()));
    lastCall = Clock::now() - start;
  }
  EXPECT_EQ(result, -1);
  EXPECT_GE(lastCall, milliseconds(200));
}

TEST(HostSocketTcp, SendWithoutAConnectionFails) {
  HostSocketFactory factory;
  ISocket* const socket = factory.CreateSocket(0, 1, 0);
  const unsigned char byte = 1;
  EXPECT_EQ(socket->Send(&byte, 1), -1);
  unsigned char in = 0;
  EXPECT_EQ(socket->Receive(&in, 1, 50), -1);
}

TEST(HostSocketTcp, ConnectToAClosedPortFailsFast) {
  std::uint16_t port = 0;
  const FileDescriptor closed = LoopbackIo::ClosedTcpPort(port);
  HostSocketFactory factory;
  ISocket* const socket = factory.CreateSocket(0, 1, 0);
  const auto start = Clock::now();
  EXPECT_NE(socket->Connect("127.0.0.1", port), 0);
  EXPECT_LT(Clock::now() - start, milliseconds(1000));
  EXPECT_EQ(socket->IsBroken(), 1);
}

TEST(HostSocketTcp, ConnectRejectsAddressesThatAreNoIpv4Text) {
  HostSocketFactory factory;
  ISocket* const socket = factory.CreateSocket(0, 1, 0);
  EXPECT_EQ(socket->Connect(nullptr, 80), -1);
  EXPECT_EQ(socket->Connect("", 80), -1);
  EXPECT_EQ(socket->Connect("localhost", 80), -1);
  EXPECT_EQ(socket->Connect("127.0.0", 80), -1);
  EXPECT_EQ(socket->Connect("127.0.0.256", 80), -1);
  EXPECT_EQ(socket->IsBroken(), 0);
}

TEST(HostSocketTcp, AFailedConnectLeavesTheSocketReadyForTheNextOnTheSameLocalPort) {
  // A free port for the socket's own end.
  std::uint16_t localPort = 0;
  { const FileDescriptor probe = LoopbackIo::ClosedTcpPort(localPort); }
  std::uint16_t closedPort = 0;
  const FileDescriptor closed = LoopbackIo::ClosedTcpPort(closedPort);
  std::uint16_t listenPort = 0;
  const FileDescriptor listener = LoopbackIo::Listen(8, listenPort);

  HostSocketFactory factory;
  auto* const socket = static_cast<HostSocket*>(factory.CreateSocket(localPort, 1, 0));
  ASSERT_NE(socket, nullptr) << factory.LastError();
  EXPECT_EQ(socket->LocalPort(), localPort);
  for (int attempt = 0; attempt < 3; ++attempt) {
    EXPECT_NE(socket->Connect("127.0.0.1", closedPort), 0);
    EXPECT_EQ(socket->IsBroken(), 1);
    EXPECT_EQ(socket->LocalPort(), localPort);
  }
  ASSERT_EQ(socket->Connect("127.0.0.1", listenPort), 0);
  EXPECT_EQ(socket->IsBroken(), 0);
  const FileDescriptor peer = LoopbackIo::Accept(listener.Get(), milliseconds(2000));
  ASSERT_TRUE(peer.Valid());
  EXPECT_EQ(LoopbackIo::PeerPort(peer.Get()), localPort);
  const Bytes frame = LoopbackIo::FromText("after retry");
  EXPECT_EQ(socket->Send(frame.data(), static_cast<int>(frame.size())), 11);
  EXPECT_EQ(LoopbackIo::ReceiveUpTo(peer.Get(), 11, milliseconds(2000)), frame);
}

TEST(HostSocketTcp, ConnectAgainOpensANewConnection) {
  std::uint16_t port = 0;
  const FileDescriptor listener = LoopbackIo::Listen(8, port);
  HostSocketFactory factory;
  ISocket* const socket = factory.CreateSocket(0, 1, 0);
  ASSERT_EQ(socket->Connect("127.0.0.1", port), 0);
  FileDescriptor first = LoopbackIo::Accept(listener.Get(), milliseconds(2000));
  ASSERT_EQ(socket->Connect("127.0.0.1", port), 0);
  const FileDescriptor second = LoopbackIo::Accept(listener.Get(), milliseconds(2000));
  ASSERT_TRUE(second.Valid());
  // The first connection was closed by the second Connect.
  EXPECT_TRUE(LoopbackIo::ReceiveUpTo(first.Get(), 1, milliseconds(2000)).empty());
  const Bytes frame = LoopbackIo::FromText("x");
  EXPECT_EQ(socket->Send(frame.data(), 1), 1);
  EXPECT_EQ(LoopbackIo::ReceiveUpTo(second.Get(), 1, milliseconds(2000)), frame);
}

TEST(HostSocketTcp, ConnectToASilentPeerGivesUpAfterTheConnectTimeout) {
  // A listener with a full accept queue drops further handshakes, which is
  // what an absent host on the network looks like.
  std::uint16_t port = 0;
  const FileDescriptor listener = LoopbackIo::Listen(0, port);
  const FileDescriptor filler = LoopbackIo::ConnectTo(port);
  ASSERT_TRUE(filler.Valid());
  std::this_thread::sleep_for(milliseconds(20));

  HostSocketFactory factory(HostSocket::Timeouts{milliseconds(300), milliseconds(300)});
  ISocket* const socket = factory.CreateSocket(0, 1, 0);
  const auto start = Clock::now();
  const int result = socket->Connect("127.0.0.1", port);
  const auto elapsed = Clock::now() - start;
  if (result == 0) {
    GTEST_SKIP() << "this kernel completed a handshake on a full accept queue";
  }
  EXPECT_EQ(result, -1);
  EXPECT_GE(elapsed, milliseconds(300));
  EXPECT_LT(elapsed, milliseconds(2000));
  EXPECT_EQ(socket->IsBroken(), 1);
}

TEST(HostSocketTcp, DeleteSocketFreesOnlyItsOwnSockets) {
  HostSocketFactory factory;
  HostSocketFactory other;
  ISocket* const socket = factory.CreateSocket(0, 1, 0);
  ISocket* const foreign = other.CreateSocket(0, 0, 0);
  EXPECT_EQ(factory.LiveSockets(), 1U);
  factory.DeleteSocket(nullptr, 0);
  factory.DeleteSocket(foreign, 0);
  EXPECT_EQ(factory.LiveSockets(), 1U);
  EXPECT_EQ(other.LiveSockets(), 1U);
  factory.DeleteSocket(socket, 0);
  EXPECT_EQ(factory.LiveSockets(), 0U);
}

TEST(HostSocketFactory, Identity) {
  HostSocketFactory factory;
  EXPECT_STREQ(factory.GetImpName(), "HostSocketFactory");
  EXPECT_EQ(factory.GetImpVersion(), 100);
}
