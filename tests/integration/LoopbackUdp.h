#pragma once

#include <cstdint>
#include <string>

// A UDP port on 127.0.0.1 that was free a moment ago; 0 when none could be
// found.
std::uint16_t FreeUdpPort();

// Sends one datagram to 127.0.0.1:port from a socket of its own; true when it
// was sent whole.
bool SendUdpDatagram(std::uint16_t port, const std::string& bytes);
