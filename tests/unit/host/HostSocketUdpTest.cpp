// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <arpa/inet.h>
#include <gtest/gtest.h>
#include <netinet/in.h>

#include <chrono>
#include <thread>

#include "HostSocket.h"
#include "HostSocketFactory.h"
#include "LoopbackIo.h"

namespace {

using Clock = std::chrono::steady_clock;
using LoopbackIo::Bytes;
using std::chrono::milliseconds;

class UdpSocket : public ::testing::Test {
 protected:
  void SetUp() override {
    socket_ = static_cast<HostSocket*>(factory_.CreateSocket(0, 0, 0));
    ASSERT_NE(socket_, nullptr) << factory_.LastError();
    peer_ = LoopbackIo::BindUdp(INADDR_LOOPBACK, peerPort_);
  }

  Bytes Receive(int maxLength, int timeout = 2000) {
    Bytes buffer(static_cast<std::size_t>(maxLength));
    const int n = socket_->Receive(buffer.data(), maxLength, timeout);
    buffer.resize(n < 0 ? 0 : static_cast<std::size_t>(n));
    return buffer;
  }

  HostSocketFactory factory_;
  HostSocket* socket_ = nullptr;
  FileDescriptor peer_;
  std::uint16_t peerPort_ = 0;
};

}  // namespace

TEST_F(UdpSocket, CreateBindsAPortTheSystemPicks) {
  EXPECT_FALSE(socket_->IsTcp());
  EXPECT_NE(socket_->LocalPort(), 0);
  EXPECT_EQ(socket_->IsBroken(), 0);
}

TEST_F(UdpSocket, EachReceiveReturnsOneDatagramNeverMergingTwo) {
  ASSERT_EQ(socket_->Connect("127.0.0.1", peerPort_), 0);
  const Bytes first = LoopbackIo::Pattern(5, 1);
  const Bytes second = LoopbackIo::Pattern(1, 2);
  const Bytes third = LoopbackIo::Pattern(1536, 3);
  LoopbackIo::SendTo(peer_.Get(), socket_->LocalPort(), first);
  LoopbackIo::SendTo(peer_.Get(), socket_->LocalPort(), second);
  LoopbackIo::SendTo(peer_.Get(), socket_->LocalPort(), third);
  std::this_thread::sleep_for(milliseconds(20));
  EXPECT_EQ(Receive(2000), first);
  EXPECT_EQ(Receive(2000), second);
  EXPECT_EQ(Receive(1536), third);
  EXPECT_EQ(socket_->Receive(Bytes(10).data(), 10, 0), 0);
}

TEST_F(UdpSocket, ALongerDatagramIsTruncatedAndItsRestDiscarded) {
  ASSERT_EQ(socket_->Connect("127.0.0.1", peerPort_), 0);
  const Bytes longer = LoopbackIo::Pattern(3000, 4);
  const Bytes next = LoopbackIo::Pattern(10, 5);
  LoopbackIo::SendTo(peer_.Get(), socket_->LocalPort(), longer);
  LoopbackIo::SendTo(peer_.Get(), socket_->LocalPort(), next);
  EXPECT_EQ(Receive(1536), Bytes(longer.begin(), longer.begin() + 1536));
  EXPECT_EQ(Receive(1536), next);
}

TEST_F(UdpSocket, DatagramsFromAnySenderAreReceivedAfterConnect) {
  ASSERT_EQ(socket_->Connect("127.0.0.1", peerPort_), 0);
  std::uint16_t otherPort = 0;
  const FileDescriptor other = LoopbackIo::BindUdp(INADDR_LOOPBACK, otherPort);
  LoopbackIo::SendTo(other.Get(), socket_->LocalPort(), LoopbackIo::FromText("reply"));
  EXPECT_EQ(Receive(100), LoopbackIo::FromText("reply"));
}

TEST_F(UdpSocket, DatagramsArrivingBeforeConnectAreDelivered) {
  LoopbackIo::SendTo(peer_.Get(), socket_->LocalPort(), LoopbackIo::FromText("early"));
  EXPECT_EQ(Receive(100), LoopbackIo::FromText("early"));
}

TEST_F(UdpSocket, SendGoesToTheConnectedPeerFromTheBoundPort) {
  ASSERT_EQ(socket_->Connect("127.0.0.1", peerPort_), 0);
  const Bytes frame = LoopbackIo::Pattern(300, 9);
  EXPECT_EQ(socket_->Send(frame.data(), 300), 300);
  std::uint16_t sender = 0;
  EXPECT_EQ(LoopbackIo::ReceiveDatagram(peer_.Get(), milliseconds(2000), &sender), frame);
  EXPECT_EQ(sender, socket_->LocalPort());
}

TEST_F(UdpSocket, AnEmptySendIsAnEmptyDatagram) {
  ASSERT_EQ(socket_->Connect("127.0.0.1", peerPort_), 0);
  const unsigned char unused = 0;
  EXPECT_EQ(socket_->Send(&unused, 0), 0);
  std::uint16_t sender = 0;
  EXPECT_TRUE(LoopbackIo::ReceiveDatagram(peer_.Get(), milliseconds(2000), &sender).empty());
  EXPECT_EQ(sender, socket_->LocalPort());
}

TEST_F(UdpSocket, ConnectAgainChangesThePeer) {
  ASSERT_EQ(socket_->Connect("127.0.0.1", peerPort_), 0);
  std::uint16_t otherPort = 0;
  const FileDescriptor other = LoopbackIo::BindUdp(INADDR_LOOPBACK, otherPort);
  ASSERT_EQ(socket_->Connect("127.0.0.1", otherPort), 0);
  const Bytes frame = LoopbackIo::FromText("to the other");
  EXPECT_EQ(socket_->Send(frame.data(), static_cast<int>(frame.size())), 12);
  EXPECT_EQ(LoopbackIo::ReceiveDatagram(other.Get(), milliseconds(2000), nullptr), frame);
  EXPECT_TRUE(LoopbackIo::ReceiveDatagram(peer_.Get(), milliseconds(50), nullptr).empty());
}

TEST_F(UdpSocket, SendBeforeConnectFails) {
  const unsigned char byte = 1;
  EXPECT_EQ(socket_->Send(&byte, 1), -1);
}

TEST_F(UdpSocket, ConnectRejectsBadAddressTextButAcceptsPortZero) {
  EXPECT_EQ(socket_->Connect("not an address", peerPort_), -1);
  EXPECT_EQ(socket_->Connect(nullptr, peerPort_), -1);
  // Port 0 makes a receive-only channel: connecting succeeds, sending fails.
  EXPECT_EQ(socket_->Connect("127.0.0.1", 0), 0);
  const unsigned char byte = 1;
  EXPECT_EQ(socket_->Send(&byte, 1), -1);
}

TEST_F(UdpSocket, BroadcastIsAllowed) {
  // The loopback network's own broadcast address reaches a socket bound to
  // every address; without the broadcast option the kernel would refuse.
  std::uint16_t port = 0;
  const FileDescriptor any = LoopbackIo::BindUdp(INADDR_ANY, port);
  ASSERT_EQ(socket_->Connect("127.255.255.255", port), 0);
  const Bytes frame = LoopbackIo::FromText("everyone");
  EXPECT_EQ(socket_->Send(frame.data(), 8), 8);
  EXPECT_EQ(LoopbackIo::ReceiveDatagram(any.Get(), milliseconds(2000), nullptr), frame);
}

TEST_F(UdpSocket, ReceiveHonoursItsTimeout) {
  ASSERT_EQ(socket_->Connect("127.0.0.1", peerPort_), 0);
  unsigned char buffer[16] = {};
  const auto start = Clock::now();
  EXPECT_EQ(socket_->Receive(buffer, sizeof buffer, 120), 0);
  EXPECT_GE(Clock::now() - start, milliseconds(120));
}

TEST_F(UdpSocket, ReceiveRefusesBadArguments) {
  unsigned char byte = 0;
  EXPECT_EQ(socket_->Receive(nullptr, 1, 0), -1);
  EXPECT_EQ(socket_->Receive(&byte, -1, 0), -1);
}
