// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/BaseConsole.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <set>
#include <string>
#include <vector>

#include "InertServices.h"
#include "MemoryProtocol.h"
#include "TestTagBase.h"
#include "binding/HostServices.h"
#include "protlib/ProtocolBase.h"

namespace {

constexpr char kFill = '\xCC';
constexpr int kCanary = 8;

const std::string kHelp =
    "help - displays this message\n"
    "info - displays information about the protocol version\n"
    "xml  - displays the protocol xml description\n"
    "read uri - reads data pointed by uri string\n"
    "write uri hexData - writes data pointed by uri string\n"
    "lasterror - displays the last protocol error\n"
    "getmaxtm - displays the max time for executing a single read/write access\n";

const std::string kInfo =
    "Protocol: MEM (3) v.1\n"
    "Implementation: MemoryProtocol v.100\n"
    "ProtocolBase v.100\n"
    "ProtLib v.200\n";

struct Outcome {
  bool recognised;
  // outSize bytes of reply area followed by kCanary canary bytes.
  std::string buffer;
};

Outcome Console(ProtocolBase& protocol, const std::string& command, int outSize) {
  std::string buffer(static_cast<std::size_t>(outSize > 0 ? outSize : 0) + kCanary, kFill);
  const bool recognised = protocol.DoCommand(command.c_str(), buffer.data(), outSize);
  return {recognised, buffer};
}

// The buffer after strncpy(out, reply, outSize).
std::string Copied(const std::string& reply, int outSize) {
  std::string buffer(static_cast<std::size_t>(outSize), '\0');
  reply.copy(buffer.data(), std::min(reply.size(), buffer.size()));
  return buffer + std::string(kCanary, kFill);
}

// The buffer after text was written at its start and nothing else.
std::string Written(const std::string& text, int outSize) {
  std::string buffer(static_cast<std::size_t>(outSize) + kCanary, kFill);
  buffer.replace(0, text.size(), text);
  return buffer;
}

// 0, 1, the sizes around the reply's length and a roomy one.
std::vector<int> Sizes(std::size_t length) {
  const int n = static_cast<int>(length);
  std::set<int> sizes{0, 1, n - 1, n, n + 1, n + 40};
  sizes.erase(-1);
  return {sizes.begin(), sizes.end()};
}

void ExpectCopiedAtEverySize(ProtocolBase& protocol, const std::string& command,
                             const std::string& reply) {
  for (int size : Sizes(reply.size())) {
    const Outcome outcome = Console(protocol, command, size);
    EXPECT_TRUE(outcome.recognised) << command << " at " << size;
    EXPECT_EQ(outcome.buffer, Copied(reply, size)) << command << " at " << size;
  }
}

// Records the console's temporary tags and the tag GetMaxTm was asked about.
class TrackingProtocol final : public MemoryProtocol {
 public:
  ITag* CreateTag(const char* uri) override {
    ITag* tag = ProtocolBase::CreateTag(uri);
    if (tag != nullptr) {
      created.push_back(tag);
    }
    return tag;
  }
  void FreeTag(ITag* tag) override {
    freed.push_back(tag);
    ProtocolBase::FreeTag(tag);
  }
  int GetMaxTm(const ITag* tag) override {
    ++maxTmCalls;
    if (tag != nullptr) {
      ++maxTmTagsGiven;
    }
    return 1500;
  }
  std::vector<ITag*> created;
  std::vector<ITag*> freed;
  int maxTmCalls = 0;
  int maxTmTagsGiven = 0;
};

class XmlProtocol final : public MemoryProtocol {
 public:
  const char* GetXml() const override { return "<xml/>"; }
};

class ConvertedProtocol final : public MemoryProtocol {
 public:
  bool IsConverted() const override { return true; }
};

class NamelessProtocol final : public MemoryProtocol {
 public:
  const char* GetImpName() const override { return nullptr; }
};

// Sets the module-wide service pointers for one test and restores them.
class ServicesInstalled {
 public:
  ServicesInstalled(IMultiTask2* multiTask, ISerialFactory* serial, ISocketFactory2* sockets)
      : savedMultiTask(piMultiTask), savedSerial(piSerialFactory), savedSockets(piSocketFactory) {
    piMultiTask = multiTask;
    piSerialFactory = serial;
    piSocketFactory = sockets;
  }
  ServicesInstalled(const ServicesInstalled&) = delete;
  ServicesInstalled& operator=(const ServicesInstalled&) = delete;
  ServicesInstalled(ServicesInstalled&&) = delete;
  ServicesInstalled& operator=(ServicesInstalled&&) = delete;
  ~ServicesInstalled() {
    piMultiTask = savedMultiTask;
    piSerialFactory = savedSerial;
    piSocketFactory = savedSockets;
  }

 private:
  IMultiTask2* savedMultiTask;
  ISerialFactory* savedSerial;
  ISocketFactory2* savedSockets;
};

}  // namespace

// --- recognising commands ---

TEST(BaseConsole, UnknownWordIsFalseAndLeavesOut) {
  MemoryProtocol protocol;
  for (const char* command : {"connect ON", "Help", "helpme", "HELP", " help", "put x", "get"}) {
    for (int size : {0, 1, 64}) {
      const Outcome outcome = Console(protocol, command, size);
      EXPECT_FALSE(outcome.recognised) << command;
      EXPECT_EQ(outcome.buffer, Written("", size)) << command;
    }
  }
}

TEST(BaseConsole, EmptyCommandIsFalseAndLeavesOut) {
  MemoryProtocol protocol;
  const Outcome outcome = Console(protocol, "", 16);
  EXPECT_FALSE(outcome.recognised);
  EXPECT_EQ(outcome.buffer, Written("", 16));
  char out[4] = {'a', 'b', 'c', 'd'};
  EXPECT_FALSE(protocol.DoCommand(nullptr, out, 4));
  EXPECT_EQ(std::string(out, 4), "abcd");
}

TEST(BaseConsole, DeleteTagsIsTrueWritesNothingAndDeletesTheTags) {
  int deletions = 0;
  MemoryProtocol protocol;
  auto* tag = dynamic_cast<TestTagBase*>(protocol.CreateTag("0?int"));
  ASSERT_NE(tag, nullptr);
  tag->countDeletionsIn(&deletions);
  for (int size : {0, 1, 16}) {
    const Outcome outcome = Console(protocol, "deletetags", size);
    EXPECT_TRUE(outcome.recognised);
    EXPECT_EQ(outcome.buffer, Written("", size));
    EXPECT_EQ(deletions, 1);
  }
}

TEST(BaseConsole, NegativeSizeOrNullBufferWritesNothing) {
  MemoryProtocol protocol;
  for (const char* command : {"help", "info", "xml", "lasterror", "read 0?int", "read",
                              "write 0?int 01020304", "write", "getmaxtm", "deletetags"}) {
    const Outcome outcome = Console(protocol, command, -5);
    EXPECT_TRUE(outcome.recognised) << command;
    EXPECT_EQ(outcome.buffer, std::string(kCanary, kFill)) << command;
    EXPECT_TRUE(protocol.DoCommand(command, nullptr, 32)) << command;
  }
}

// --- help, lasterror, xml, getmaxtm ---

TEST(BaseConsoleHelp, HelpTextAtEverySize) {
  MemoryProtocol protocol;
  EXPECT_EQ(kHelp.size(), 346U);
  EXPECT_STREQ(BaseConsole::HelpText(), kHelp.c_str());
  ExpectCopiedAtEverySize(protocol, "help", kHelp);
  ExpectCopiedAtEverySize(protocol, "help me", kHelp);
}

TEST(BaseConsoleHelp, DeleteTagsIsNotListed) {
  EXPECT_EQ(kHelp.find("deletetags"), std::string::npos);
}

TEST(BaseConsoleLastError, CopiesTheLastErrorText) {
  MemoryProtocol protocol;
  protocol.SetError(-6, "Can't get IP adapter info");
  ExpectCopiedAtEverySize(protocol, "lasterror", "Can't get IP adapter info");
  protocol.SetError(1, "");
  ExpectCopiedAtEverySize(protocol, "lasterror", "");
}

TEST(BaseConsoleXml, BaseWithoutDescriptionCopiesTheEmptyText) {
  MemoryProtocol protocol;
  ExpectCopiedAtEverySize(protocol, "xml", "");
}

TEST(BaseConsoleXml, CopiesTheDriversDescription) {
  XmlProtocol protocol;
  ExpectCopiedAtEverySize(protocol, "xml", "<xml/>");
}

TEST(BaseConsoleMaxTm, FormatsTheMaximumTimeOfNoTag) {
  TrackingProtocol protocol;
  ExpectCopiedAtEverySize(protocol, "getmaxtm", "maxtm = 1500 ms\n");
  EXPECT_EQ(protocol.maxTmCalls, static_cast<int>(Sizes(16).size()));
  EXPECT_EQ(protocol.maxTmTagsGiven, 0);
  MemoryProtocol memory;
  memory.maxTm = -3;
  ExpectCopiedAtEverySize(memory, "getmaxtm", "maxtm = -3 ms\n");
}

// --- info ---

TEST(BaseConsoleInfo, InformationWithoutHostServices) {
  const ServicesInstalled none(nullptr, nullptr, nullptr);
  MemoryProtocol protocol;
  std::string out(200, kFill);
  EXPECT_EQ(protocol.GetInfo(out.data(), 200), static_cast<int>(kInfo.size()));
  EXPECT_EQ(out, Written(kInfo, 200 - kCanary));
}

TEST(BaseConsoleInfo, OneLinePerPresentServiceInOrder) {
  InertMultiTask multiTask;
  InertSerialFactory serial("SerialPorts");
  InertSocketFactory sockets;
  MemoryProtocol protocol;
  char out[300];
  {
    const ServicesInstalled all(&multiTask, &serial, &sockets);
    const int n = protocol.GetInfo(out, 300);
    EXPECT_EQ(std::string(out, static_cast<std::size_t>(n)),
              kInfo + "InertMultiTask v.1\nSerialPorts v.1\nInertSocketFactory v.1\n");
  }
  {
    const ServicesInstalled some(nullptr, &serial, &sockets);
    const int n = protocol.GetInfo(out, 300);
    EXPECT_EQ(std::string(out, static_cast<std::size_t>(n)),
              kInfo + "SerialPorts v.1\nInertSocketFactory v.1\n");
  }
  {
    const ServicesInstalled some(&multiTask, nullptr, nullptr);
    const int n = protocol.GetInfo(out, 300);
    EXPECT_EQ(std::string(out, static_cast<std::size_t>(n)), kInfo + "InertMultiTask v.1\n");
  }
}

TEST(BaseConsoleInfo, ConvertedProtocolOmitsTheServices) {
  InertMultiTask multiTask;
  const ServicesInstalled installed(&multiTask, nullptr, nullptr);
  ConvertedProtocol protocol;
  char out[300];
  const int n = protocol.GetInfo(out, 300);
  EXPECT_EQ(std::string(out, static_cast<std::size_t>(n)), kInfo);
}

TEST(BaseConsoleInfo, NullTextStopsTheText) {
  const ServicesInstalled none(nullptr, nullptr, nullptr);
  NamelessProtocol protocol;
  std::string out(100, kFill);
  const int n = protocol.GetInfo(out.data(), 100);
  const std::string written = "Protocol: MEM (3) v.1\nImplementation: ";
  EXPECT_EQ(n, static_cast<int>(written.size()));
  EXPECT_EQ(out, Written(written, 100 - kCanary));
}

TEST(BaseConsoleInfo, TextIsCutAtTheSizeWithoutTerminator) {
  const ServicesInstalled none(nullptr, nullptr, nullptr);
  MemoryProtocol protocol;
  for (int size : Sizes(kInfo.size())) {
    std::string out(static_cast<std::size_t>(size) + kCanary, kFill);
    const int n = protocol.GetInfo(out.data(), size);
    const std::size_t kept = std::min(kInfo.size(), static_cast<std::size_t>(size));
    EXPECT_EQ(n, static_cast<int>(kept)) << size;
    EXPECT_EQ(out, Written(kInfo.substr(0, kept), size)) << size;
  }
  EXPECT_EQ(protocol.GetInfo(nullptr, 50), 0);
  char one = kFill;
  EXPECT_EQ(protocol.GetInfo(&one, -1), 0);
  EXPECT_EQ(one, kFill);
}

TEST(BaseConsoleInfo, CommandTerminatesWhenThereIsRoom) {
  const ServicesInstalled none(nullptr, nullptr, nullptr);
  MemoryProtocol protocol;
  for (int size : Sizes(kInfo.size())) {
    const Outcome outcome = Console(protocol, "info", size);
    EXPECT_TRUE(outcome.recognised);
    const std::string kept = kInfo.substr(0, static_cast<std::size_t>(size));
    const std::string expected =
        kept.size() < static_cast<std::size_t>(size) ? kept + std::string(1, '\0') : kept;
    EXPECT_EQ(outcome.buffer, Written(expected, size)) << size;
  }
}

// --- read ---

TEST(BaseConsoleRead, MissingOrExtraWordsAnswerMissingParameter) {
  TrackingProtocol protocol;
  const std::string reply = "error: missing parameter (URI string)\n";
  ExpectCopiedAtEverySize(protocol, "read", reply);
  ExpectCopiedAtEverySize(protocol, "read a b", reply);
  ExpectCopiedAtEverySize(protocol, "read  0?int", reply);  // two blanks make an empty word
  ExpectCopiedAtEverySize(protocol, "read 0?int ", reply);
  EXPECT_TRUE(protocol.created.empty());
}

TEST(BaseConsoleRead, FourByteValueIntoEightCharacters) {
  TrackingProtocol protocol;
  const unsigned char value[4] = {0x0A, 0x0B, 0xC0, 0xFF};
  std::memcpy(protocol.memory.data() + 16, value, 4);
  const Outcome outcome = Console(protocol, "read 16?binary-4", 8);
  EXPECT_TRUE(outcome.recognised);
  EXPECT_EQ(outcome.buffer, Written(std::string("0a0b\n\0", 6), 8));
}

TEST(BaseConsoleRead, DigitsStopWhenFourOrFewerCharactersRemain) {
  TrackingProtocol protocol;
  const unsigned char value[4] = {0x0A, 0x0B, 0xC0, 0xFF};
  std::memcpy(protocol.memory.data(), value, 4);
  const std::string nul(1, '\0');
  const std::pair<int, std::string> cases[] = {
      {0, ""},
      {1, "\n"},
      {2, "\n" + nul},
      {4, "\n" + nul},
      {5, "0a\n" + nul},
      {6, "0a\n" + nul},
      {7, "0a0b\n" + nul},
      {9, "0a0bc0\n" + nul},
      {10, "0a0bc0\n" + nul},
      {11, "0a0bc0ff\n" + nul},
      {40, "0a0bc0ff\n" + nul},
  };
  for (const auto& [size, text] : cases) {
    const Outcome outcome = Console(protocol, "read 0?binary-4", size);
    EXPECT_TRUE(outcome.recognised);
    EXPECT_EQ(outcome.buffer, Written(text, size)) << size;
  }
}

TEST(BaseConsoleRead, ValueIsConvertedForTheHost) {
  TrackingProtocol protocol;
  protocol.memory[0] = 0x34;
  protocol.memory[1] = 0x12;
  const Outcome outcome = Console(protocol, "read 0?unsignedShort(bcd)", 32);
  EXPECT_EQ(outcome.buffer, Written(std::string("d204\n\0", 6), 32));  // 1234 = 0x04D2
}

TEST(BaseConsoleRead, ValueLongerThanTheFixedBuffer) {
  TrackingProtocol protocol;
  std::string expected;
  static const char kDigits[] = "0123456789abcdef";
  for (int i = 0; i < 100; ++i) {
    const auto byte = static_cast<unsigned char>(i * 5 + 3);
    protocol.memory[static_cast<std::size_t>(i)] = byte;
    expected += kDigits[byte >> 4];
    expected += kDigits[byte & 0x0F];
  }
  const Outcome outcome = Console(protocol, "read 0?binary-100", 300);
  EXPECT_EQ(outcome.buffer, Written(expected + "\n" + std::string(1, '\0'), 300));
}

TEST(BaseConsoleRead, TheTemporaryTagIsFreed) {
  TrackingProtocol protocol;
  Console(protocol, "read 0?int", 64);
  ASSERT_EQ(protocol.created.size(), 1U);
  EXPECT_EQ(protocol.freed, protocol.created);
  protocol.failReads = true;
  Console(protocol, "read 0?int", 64);
  ASSERT_EQ(protocol.created.size(), 2U);
  EXPECT_EQ(protocol.freed, protocol.created);
}

TEST(BaseConsoleRead, BadAddressAnswersTheLastError) {
  TrackingProtocol protocol;
  const std::string reply = "Tag URI error: 0?integer - integer: data type unknown";
  ExpectCopiedAtEverySize(protocol, "read 0?integer", reply);
  EXPECT_TRUE(protocol.created.empty());
  EXPECT_TRUE(protocol.freed.empty());
  EXPECT_EQ(protocol.GetLastError(), -1);
}

TEST(BaseConsoleRead, FailedReadAnswersTheLastError) {
  TrackingProtocol protocol;
  protocol.failReads = true;
  ExpectCopiedAtEverySize(protocol, "read 0?int", "device read failed");
  EXPECT_EQ(protocol.GetLastError(), -1);
}

TEST(BaseConsoleRead, ConversionFailureAnswersReadConversionError) {
  TrackingProtocol protocol;
  protocol.memory[0] = 0x1A;
  ExpectCopiedAtEverySize(protocol, "read 0?unsignedByte(bcd)", "read conversion error");
  EXPECT_EQ(protocol.GetLastError(), -9);
}

// --- write ---

TEST(BaseConsoleWrite, MissingOrExtraWordsAnswerMissingParameters) {
  TrackingProtocol protocol;
  const std::string reply = "error: missing parameters (URI string + data)\n";
  ExpectCopiedAtEverySize(protocol, "write", reply);
  ExpectCopiedAtEverySize(protocol, "write 0?int", reply);
  ExpectCopiedAtEverySize(protocol, "write 0?int 01020304 05", reply);
  ExpectCopiedAtEverySize(protocol, "write 0?int  01020304", reply);
  EXPECT_TRUE(protocol.created.empty());
  EXPECT_EQ(protocol.writes(), 0);
}

TEST(BaseConsoleWrite, MixedCaseDigitsWriteTheirBytes) {
  TrackingProtocol protocol;
  ExpectCopiedAtEverySize(protocol, "write 20?binary-4 0A0b0C0d", "written ok\n");
  const std::vector<unsigned char> written(protocol.memory.begin() + 20,
                                           protocol.memory.begin() + 24);
  EXPECT_EQ(written, (std::vector<unsigned char>{0x0A, 0x0B, 0x0C, 0x0D}));
  EXPECT_EQ(protocol.freed, protocol.created);
}

TEST(BaseConsoleWrite, ValueIsConvertedForTheDevice) {
  TrackingProtocol protocol;
  const Outcome outcome = Console(protocol, "write 0?unsignedShort(bcd) d204", 16);
  EXPECT_EQ(outcome.buffer, Copied("written ok\n", 16));
  EXPECT_EQ(protocol.memory[0], 0x34);
  EXPECT_EQ(protocol.memory[1], 0x12);
}

TEST(BaseConsoleWrite, SixDigitsForFourBytesIsTheWrongLength) {
  TrackingProtocol protocol;
  ExpectCopiedAtEverySize(protocol, "write 0?binary-4 0A0B0C",
                          "error: incorrect length of data to write\n");
  ExpectCopiedAtEverySize(protocol, "write 0?binary-4 0A0B0C0D0E",
                          "error: incorrect length of data to write\n");
  EXPECT_EQ(protocol.writes(), 0);
  EXPECT_EQ(protocol.freed, protocol.created);
}

TEST(BaseConsoleWrite, NonHexCharacterIsIncorrectHexData) {
  TrackingProtocol protocol;
  ExpectCopiedAtEverySize(protocol, "write 0?binary-4 0A0B0C0G", "error: incorrect hex data\n");
  ExpectCopiedAtEverySize(protocol, "write 0?binary-1 x1", "error: incorrect hex data\n");
  ExpectCopiedAtEverySize(protocol, "write 0?binary-1 -1", "error: incorrect hex data\n");
  EXPECT_EQ(protocol.writes(), 0);
  EXPECT_EQ(protocol.memory[0], 0);
  EXPECT_EQ(protocol.freed, protocol.created);
}

TEST(BaseConsoleWrite, BadAddressAnswersTheLastError) {
  TrackingProtocol protocol;
  ExpectCopiedAtEverySize(protocol, "write 0?integer 00",
                          "Tag URI error: 0?integer - integer: data type unknown");
  EXPECT_TRUE(protocol.created.empty());
}

TEST(BaseConsoleWrite, FailedWriteAnswersTheLastError) {
  TrackingProtocol protocol;
  protocol.failWrites = true;
  ExpectCopiedAtEverySize(protocol, "write 0?int 01020304", "device write failed");
  EXPECT_EQ(protocol.freed, protocol.created);
  EXPECT_EQ(protocol.created.size(), Sizes(19).size());
}

TEST(BaseConsoleWrite, ValueLongerThanTheFixedBuffer) {
  TrackingProtocol protocol;
  std::string data;
  for (int i = 0; i < 80; ++i) {
    data += "5e";
  }
  ExpectCopiedAtEverySize(protocol, "write 100?binary-80 " + data, "written ok\n");
  EXPECT_EQ(
      std::vector<unsigned char>(protocol.memory.begin() + 100, protocol.memory.begin() + 180),
      std::vector<unsigned char>(80, 0x5E));
  EXPECT_EQ(protocol.memory[180], 0);
}

TEST(BaseConsoleCopy, CopyReplyIsStrncpyWithTheFullSize) {
  std::string out(12, kFill);
  BaseConsole::CopyReply(out.data(), 4, "abc");
  EXPECT_EQ(out, std::string("abc\0", 4) + std::string(8, kFill));
  BaseConsole::CopyReply(out.data(), 3, "wxyz");
  EXPECT_EQ(out, std::string("wxy\0", 4) + std::string(8, kFill));
  BaseConsole::CopyReply(out.data(), 6, nullptr);
  EXPECT_EQ(out, std::string(6, '\0') + std::string(6, kFill));
  BaseConsole::CopyReply(out.data(), 0, "q");
  BaseConsole::CopyReply(nullptr, 5, "q");
  EXPECT_EQ(out[0], '\0');
}
