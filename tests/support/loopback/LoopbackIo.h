// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <cstdint>
#include <string>
#include <vector>

#include "FileDescriptor.h"

// Plain BSD-socket helpers for the tests' side of a loopback conversation.
namespace LoopbackIo {

using Bytes = std::vector<unsigned char>;

// A TCP socket listening on 127.0.0.1 at a port the system picks.
FileDescriptor Listen(int backlog, std::uint16_t& port);
// A listener on the given loopback port (address reuse on, so the port of a
// listener closed a moment ago can be taken again).
FileDescriptor ListenOn(int backlog, std::uint16_t port);
// A listener on a free port below the kernel's ephemeral range, returned in
// port: no socket bound to port 0 can take that port while the listener is
// closed.
FileDescriptor ListenBelowEphemeral(int backlog, std::uint16_t& port);
// The next connection on a listening socket; invalid after the time-out.
FileDescriptor Accept(int listener, std::chrono::milliseconds timeout);
// A blocking TCP connection to 127.0.0.1:port; invalid on failure.
FileDescriptor ConnectTo(std::uint16_t port);
// A UDP socket bound to address (host order) at a port the system picks.
FileDescriptor BindUdp(std::uint32_t address, std::uint16_t& port);
// A port on which nothing listens: it stays bound (so nobody else takes
// it) but never listens, so connects to it are refused.
FileDescriptor ClosedTcpPort(std::uint16_t& port);
// A loopback UDP port that was free a moment ago.
std::uint16_t FreeUdpPort();
// Sends one datagram to a loopback port from a socket of its own; true when
// the whole datagram went out.
bool SendDatagram(std::uint16_t port, const std::string& bytes);

// The local port of a socket.
std::uint16_t LocalPort(int fd);
// The peer's port of a connected socket.
std::uint16_t PeerPort(int fd);

void SendAll(int fd, const Bytes& data);
void SendTo(int fd, std::uint16_t port, const Bytes& data);
// Reads until count bytes arrived, the peer closed, or the time-out elapsed.
Bytes ReceiveUpTo(int fd, std::size_t count, std::chrono::milliseconds timeout);
// One datagram (and its sender's port); empty with port 0 on time-out.
Bytes ReceiveDatagram(int fd, std::chrono::milliseconds timeout, std::uint16_t* senderPort);
// Closes with an immediate reset instead of an orderly close.
void Reset(FileDescriptor& fd);

// count bytes of a recognisable pattern.
Bytes Pattern(std::size_t count, unsigned seed = 0);
Bytes FromText(const std::string& text);

}  // namespace LoopbackIo
