// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

// The thirteen working settings of one token channel, as Start computes them
// and the runtime parameters change them.
struct ChannelSettings {
  std::string socketType;
  std::string remoteIp;
  int remotePort = 0;
  std::string localIp;
  int localPort = 0;
  std::string broadcastType;
  std::string rxPrefix;
  std::string rxSuffix;
  std::string txPrefix;
  std::string txSuffix;
  int gap = 0;
  bool hexTokens = false;
  // Compared unsigned with the queue length: a negative value leaves the
  // queue unbounded.
  int tokenQueueSize = 100;
};
