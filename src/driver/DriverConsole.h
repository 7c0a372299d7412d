// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

class Protocol_VELT;

// The channel's own console commands, which let a technician drive the token
// channel by hand (connect, send, fetch, acknowledge); every other command
// goes to the framework's console. Replies are copied into the caller's
// buffer bounded by its size: a reply as long as the buffer or longer is left
// unterminated.
class DriverConsole {
 public:
  explicit DriverConsole(Protocol_VELT& protocol) : protocol_(protocol) {}

  // True when the command succeeded.
  bool Run(const std::string& command, char* output, int outputSize);

 private:
  bool Help(const std::string& command, char* output, int outputSize);
  bool Connect(const std::vector<std::string>& words, char* output, int outputSize);
  bool SetIpPort(const std::vector<std::string>& words, char* output, int outputSize);
  bool Put(const std::string& command, char* output, int outputSize);
  bool Get(char* output, int outputSize);
  bool TokensAvailable(char* output, int outputSize);
  bool GetTokenLength(char* output, int outputSize);
  bool TokenAck(char* output, int outputSize);
  bool GetStat(char* output, int outputSize);

  Protocol_VELT& protocol_;
};
