// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <cstring>
#include <string>
#include <vector>

#include "DriverFixture.h"

namespace {

const char kBaseHelp[] =
    "help - displays this message\n"
    "info - displays information about the protocol version\n"
    "xml  - displays the protocol xml description\n"
    "read uri - reads data pointed by uri string\n"
    "write uri hexData - writes data pointed by uri string\n"
    "lasterror - displays the last protocol error\n"
    "getmaxtm - displays the max time for executing a single read/write access\n";

const char kDriverHelp[] =
    "connect cmd - set connect ON or OFF\n"
    "get_stat - get status of connection\n"
    "set_ip_port ip port - set new ip/port values\n"
    "put str - put the token to send\n"
    "get - get the received token\n"
    "get_token_length - get the length of the received token\n"
    "tokens_available - get number of tokens received\n"
    "token_ack - acknowledge reading token\n";

class ConsoleTest : public DriverFixture {
 protected:
  void Queue(const std::string& token) {
    TokenQueue::Guard held(protocol->getTokenQueue());
    held.addToken(token);
  }
};

}  // namespace

TEST_F(ConsoleTest, ConnectOnAndOff) {
  Started(kUdpConfig);
  bool ok = false;
  EXPECT_EQ(Command("connect ON", &ok), "OK");
  EXPECT_TRUE(ok);
  EXPECT_TRUE(protocol->isConnectRequested());
  EXPECT_EQ(Command("connect OFF", &ok), "OK");
  EXPECT_TRUE(ok);
  EXPECT_FALSE(protocol->isConnectRequested());
}

TEST_F(ConsoleTest, ConnectWithLowerCaseValueIsAWrongValue) {
  Started(kUdpConfig);
  bool ok = true;
  EXPECT_EQ(Command("connect on", &ok), "ERROR: wrong value");
  EXPECT_FALSE(ok);
  EXPECT_FALSE(protocol->isConnectRequested());
}

TEST_F(ConsoleTest, ConnectWithTwoBlanksSeesAnEmptyWord) {
  Started(kUdpConfig);
  bool ok = true;
  EXPECT_EQ(Command("connect  ON", &ok), "ERROR: wrong value");
  EXPECT_FALSE(ok);
}

TEST_F(ConsoleTest, ConnectWithoutValue) {
  Started(kUdpConfig);
  bool ok = true;
  EXPECT_EQ(Command("connect", &ok), "ERROR: new connect state is missing");
  EXPECT_FALSE(ok);
}

TEST_F(ConsoleTest, SetIpPortChangesTheWorkingRemote) {
  Started(kUdpConfig);
  bool ok = false;
  EXPECT_EQ(Command("set_ip_port 10.0.0.9 010", &ok), "OK");
  EXPECT_TRUE(ok);
  EXPECT_EQ(protocol->getSettings().text(Setting::RemoteIp), "10.0.0.9");
  EXPECT_EQ(protocol->getSettings().number(Setting::RemotePort), 8);
  EXPECT_EQ(storage.writes(), std::vector<StorageCall>{});
  EXPECT_EQ(Command("set_ip_port 10.0.0.9", &ok), "ERROR: IP and port are missing");
  EXPECT_FALSE(ok);
}

TEST_F(ConsoleTest, PutSendsTheRestOfTheLineWithItsBlanks) {
  Connected(std::string(kUdpConfig) + " tx_prefix=02 tx_suffix=03");
  bool ok = false;
  EXPECT_EQ(Command("put   hello  big world", &ok), "OK");
  EXPECT_TRUE(ok);
  EXPECT_EQ(Sock().Sends(),
            std::vector<std::string>{Bytes("02") + "hello  big world" + Bytes("03")});
}

TEST_F(ConsoleTest, PutWithNothingToSend) {
  Connected(kUdpConfig);
  bool ok = true;
  EXPECT_EQ(Command("put", &ok), "ERROR: string to send is missing");
  EXPECT_FALSE(ok);
  EXPECT_EQ(Command("put   ", &ok), "ERROR: string to send is missing");
  EXPECT_FALSE(ok);
  EXPECT_TRUE(Sock().Sends().empty());
}

TEST_F(ConsoleTest, PutInHexMode) {
  Connected(std::string(kUdpConfig) + " hex_tokens=true");
  bool ok = true;
  EXPECT_EQ(Command("put 0a0B", &ok), "OK");
  EXPECT_TRUE(ok);
  EXPECT_EQ(Command("put 0a0", &ok), "ERROR: token to send must be in hex format");
  EXPECT_FALSE(ok);
  EXPECT_EQ(Sock().Sends(), std::vector<std::string>{Bytes("0A0B")});
}

TEST_F(ConsoleTest, GetOnAnEmptyQueue) {
  Started(kUdpConfig);
  bool ok = false;
  EXPECT_EQ(Command("get", &ok), "");
  EXPECT_TRUE(ok);
  EXPECT_EQ(Command("get_token_length", &ok), "0");
  EXPECT_TRUE(ok);
  EXPECT_EQ(Command("tokens_available", &ok), "0");
}

TEST_F(ConsoleTest, GetTwiceThenAcknowledge) {
  Started(kUdpConfig);
  Queue("one");
  Queue("three");
  EXPECT_EQ(Command("get"), "one");
  EXPECT_EQ(Command("get"), "one");
  EXPECT_EQ(Command("tokens_available"), "2");
  EXPECT_EQ(Command("get_token_length"), "3");
  bool ok = false;
  EXPECT_EQ(Command("token_ack", &ok), "OK");
  EXPECT_TRUE(ok);
  EXPECT_EQ(Command("get"), "three");
  EXPECT_EQ(Command("get_token_length"), "5");
  EXPECT_EQ(Command("token_ack"), "OK");
  EXPECT_EQ(Command("token_ack"), "OK");
  EXPECT_EQ(Command("tokens_available"), "0");
}

TEST_F(ConsoleTest, GetStat) {
  Started(kUdpConfig);
  EXPECT_EQ(Command("get_stat"), "Disconnected");
  Command("connect ON");
  Pass(2);
  EXPECT_EQ(Command("get_stat"), "Connected");
}

TEST_F(ConsoleTest, UnknownWordReachesTheBaseConsoleUnchanged) {
  Started(kUdpConfig);
  std::vector<char> output(32, '#');
  EXPECT_FALSE(protocol->DoCommand("frobnicate now", output.data(), 32));
  EXPECT_EQ(std::string(output.begin(), output.end()), std::string(32, '#'));
  EXPECT_EQ(Command("lasterror"), "");
  EXPECT_EQ(Command("getmaxtm"), "maxtm = 0 ms\n");
}

TEST_F(ConsoleTest, HelpIsTheBaseHelpThenTheDriverLines) {
  Started(kUdpConfig);
  bool ok = false;
  EXPECT_EQ(Command("help", &ok), std::string(kBaseHelp) + kDriverHelp);
  EXPECT_TRUE(ok);
}

TEST_F(ConsoleTest, HelpIsCutAtTheBufferWithoutATerminator) {
  Started(kUdpConfig);
  const int size = static_cast<int>(std::strlen(kBaseHelp)) + 10;
  std::vector<char> output(static_cast<std::size_t>(size) + 4, '#');
  EXPECT_TRUE(protocol->DoCommand("help", output.data(), size));
  EXPECT_EQ(std::string(output.data(), static_cast<std::size_t>(size)),
            std::string(kBaseHelp) + std::string(kDriverHelp, 10));
  EXPECT_EQ(std::string(output.data() + size, 4), "####");
}

TEST_F(ConsoleTest, HelpIntoABufferSmallerThanTheBaseHelp) {
  Started(kUdpConfig);
  std::vector<char> output(24, '#');
  EXPECT_TRUE(protocol->DoCommand("help", output.data(), 20));
  EXPECT_EQ(std::string(output.data(), 20), std::string(kBaseHelp, 20));
  EXPECT_EQ(std::string(output.data() + 20, 4), "####");
}

TEST_F(ConsoleTest, ReplyAsLongAsTheBufferIsLeftUnterminated) {
  Started(kUdpConfig);
  std::vector<char> output(8, '#');
  EXPECT_TRUE(protocol->DoCommand("get_stat", output.data(), 5));
  EXPECT_EQ(std::string(output.data(), 8), "Disco###");
  EXPECT_TRUE(protocol->DoCommand("token_ack", output.data(), 2));
  EXPECT_EQ(std::string(output.data(), 8), "OKsco###");
}

TEST_F(ConsoleTest, ZeroSizedBufferIsNeverWritten) {
  Started(kUdpConfig);
  char canary = '#';
  EXPECT_TRUE(protocol->DoCommand("get", &canary, 0));
  EXPECT_TRUE(protocol->DoCommand("help", &canary, 0));
  EXPECT_FALSE(protocol->DoCommand("connect", &canary, 0));
  EXPECT_EQ(canary, '#');
}

TEST_F(ConsoleTest, QueueCommandsWorkBeforeStart) {
  Create(kUdpConfig);
  EXPECT_EQ(Command("tokens_available"), "0");
  EXPECT_EQ(Command("get_stat"), "Disconnected");
}
