// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>

// The process's limit on open descriptors (RLIMIT_NOFILE), checked and
// raised before many channels start: a channel that cannot open its socket
// only retries silently, so a host that runs out must say so at start.
namespace DescriptorLimit {

// Descriptors one channel of the reference host may hold at once: its
// socket, its task's stop descriptor, a fresh socket while one is renewed,
// and the probe of a local-broadcast look-up.
constexpr std::size_t kPerChannel = 4;
// Everything else of a host program: standard streams, the plug-in, the
// storage file and its temporary, the console's terminal, a few spares.
constexpr std::size_t kReserve = 64;

constexpr std::size_t ForChannels(std::size_t channels) {
  return channels * kPerChannel + kReserve;
}

// Raises the soft limit to needed when it is lower and the hard limit allows
// it; the soft limit is never lowered. False, with error saying what is
// needed and what the limit allows, when needed is above the hard limit or
// the limit cannot be read or set.
bool Ensure(std::size_t needed, std::string& error);

// The soft limit now; 0 when it cannot be read.
std::size_t Current();

}  // namespace DescriptorLimit
