// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/DriverConsole.h"

#include <cstdlib>
#include <cstring>

#include "driver/DriverErrors.h"
#include "driver/Protocol_VELT.h"
#include "protlib/BaseConsole.h"
#include "protlib/ProtUtilsN.h"

namespace {

// The driver's help, appended after the framework's. The first line reads
// "connect cmd" although the command takes ON or OFF.
const char* const kHelp =
    "connect cmd - set connect ON or OFF\n"
    "get_stat - get status of connection\n"
    "set_ip_port ip port - set new ip/port values\n"
    "put str - put the token to send\n"
    "get - get the received token\n"
    "get_token_length - get the length of the received token\n"
    "tokens_available - get number of tokens received\n"
    "token_ack - acknowledge reading token\n";

void Reply(char* output, int outputSize, const std::string& reply) {
  BaseConsole::CopyReply(output, outputSize, reply.c_str());
}

bool Failure(char* output, int outputSize, const std::string& reply) {
  Reply(output, outputSize, reply);
  return false;
}

bool Success(char* output, int outputSize, const std::string& reply) {
  Reply(output, outputSize, reply);
  return true;
}

}  // namespace

bool DriverConsole::Run(const std::string& command, char* output, int outputSize) {
  std::vector<std::string> words;
  ProtUtilsN::ParseSubstrings(command, words, ' ');
  const std::string& verb = words.front();
  if (verb == "help") {
    return Help(command, output, outputSize);
  }
  if (verb == "connect") {
    return Connect(words, output, outputSize);
  }
  if (verb == "set_ip_port") {
    return SetIpPort(words, output, outputSize);
  }
  if (verb == "put") {
    return Put(command, output, outputSize);
  }
  if (verb == "get") {
    return Get(output, outputSize);
  }
  if (verb == "tokens_available") {
    return TokensAvailable(output, outputSize);
  }
  if (verb == "get_token_length") {
    return GetTokenLength(output, outputSize);
  }
  if (verb == "token_ack") {
    return TokenAck(output, outputSize);
  }
  if (verb == "get_stat") {
    return GetStat(output, outputSize);
  }
  return protocol_.ProtocolBase::DoCommand(command.c_str(), output, outputSize);
}

bool DriverConsole::Help(const std::string& command, char* output, int outputSize) {
  if (!protocol_.ProtocolBase::DoCommand(command.c_str(), output, outputSize)) {
    return false;
  }
  // The base reply may fill the buffer without a terminator.
  const int used =
      outputSize <= 0 ? 0 : static_cast<int>(strnlen(output, static_cast<std::size_t>(outputSize)));
  Reply(output + used, outputSize - used, kHelp);
  return true;
}

bool DriverConsole::Connect(const std::vector<std::string>& words, char* output, int outputSize) {
  if (words.size() < 2) {
    return Failure(output, outputSize, "ERROR: new connect state is missing");
  }
  if (words[1] == "ON" || words[1] == "OFF") {
    TokenQueue::Guard held(protocol_.getTokenQueue());
    protocol_.getRequests().Connect(held, words[1] == "ON");
    return Success(output, outputSize, "OK");
  }
  return Failure(output, outputSize, "ERROR: wrong value");
}

bool DriverConsole::SetIpPort(const std::vector<std::string>& words, char* output, int outputSize) {
  if (words.size() < 3) {
    return Failure(output, outputSize, "ERROR: IP and port are missing");
  }
  const auto port = static_cast<int>(std::strtol(words[2].c_str(), nullptr, 0));
  TokenQueue::Guard held(protocol_.getTokenQueue());
  protocol_.getRequests().SetRemote(held, words[1], port);
  return Success(output, outputSize, "OK");
}

bool DriverConsole::Put(const std::string& command, char* output, int outputSize) {
  // The token is the raw rest of the line, inner blanks included.
  std::size_t start = command.find("put") + 3;
  while (start < command.size() && command[start] == ' ') {
    ++start;
  }
  const std::string text = command.substr(start);
  if (text.empty()) {
    return Failure(output, outputSize, "ERROR: string to send is missing");
  }
  if (!protocol_.getAccess().SendToken(text, MemoryAccess::SendLock::Released)) {
    return Failure(output, outputSize, std::string("ERROR: ") + kTokenNotHex.text);
  }
  return Success(output, outputSize, "OK");
}

bool DriverConsole::Get(char* output, int outputSize) {
  TokenQueue::Guard held(protocol_.getTokenQueue());
  return Success(output, outputSize, held.Empty() ? std::string() : held.Front());
}

bool DriverConsole::TokensAvailable(char* output, int outputSize) {
  TokenQueue::Guard held(protocol_.getTokenQueue());
  return Success(output, outputSize, std::to_string(held.Size()));
}

bool DriverConsole::GetTokenLength(char* output, int outputSize) {
  TokenQueue::Guard held(protocol_.getTokenQueue());
  return Success(output, outputSize, std::to_string(held.Empty() ? 0 : held.Front().size()));
}

bool DriverConsole::TokenAck(char* output, int outputSize) {
  TokenQueue::Guard held(protocol_.getTokenQueue());
  held.PopFront();
  return Success(output, outputSize, "OK");
}

bool DriverConsole::GetStat(char* output, int outputSize) {
  return Success(output, outputSize, protocol_.isConnected() ? "Connected" : "Disconnected");
}
