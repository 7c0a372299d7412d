// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/Protocol_VELT.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>
#include <functional>
#include <vector>

#include "config/IPParser.h"
#include "driver/DatagramFraming.h"
#include "driver/DriverConsole.h"
#include "driver/RuntimeParameter.h"
#include "driver/StreamFraming.h"
#include "driver/Tag_VELT.h"
#include "driver/XmlDescription.h"
#include "factory/CompareInterface.h"
#include "factory/HostServices.h"
#include "protlib/HexText.h"
#include "protlib/ProtUtilsN.h"
#include "protlib/ScratchBuffer.h"

namespace {

// The host's task setting for the worker.
constexpr int kWorkerTaskSetting = 3;
constexpr int kDeleteTaskWait = 1000;
constexpr int kIdleSleep = 10;
constexpr int kDatagramTimeout = 20;
constexpr int kDefaultGap = 500;
constexpr int kMaxFailedConnects = 100;
// Work buffers up to this size live on the stack.
constexpr std::size_t kStackBuffer = 128;
using WorkBuffer = ScratchBuffer<kStackBuffer>;

struct MemoryTypeEntry {
  const char* name;
  ICU_Type naturalType;
  int tavuTypes;
  bool readOnly;
  bool writeOnly;
  int maxIndex;
  int blockRead;
  int blockWrite;
};

// The channel's memory types, in registration order.
// clang-format off
const std::array<MemoryTypeEntry, 21> kMemoryTypes = {{
    {"tx_token",          ICU_BYTE,           0x200, false, true,  999999999, 999999999, 999999999},
    {"rx_token",          ICU_BYTE,           0x200, true,  false, 999999999, 999999999, 0},
    {"rx_token_len",      ICU_UNSIGNED_INT,   0x40,  true,  false, 1,    1,    0},
    {"tokens_available",  ICU_UNSIGNED_INT,   0x40,  true,  false, 1,    0,    0},
    {"token_ack",         ICU_BOOLEAN,        0x1,   false, true,  1,    0,    0},
    {"SP_SocketType",     ICU_BYTE,           0x200, false, false, 9999, 9999, 9999},
    {"SP_RemoteIP",       ICU_BYTE,           0x200, false, false, 9999, 9999, 9999},
    {"SP_RemotePort",     ICU_UNSIGNED_SHORT, 0x20,  false, false, 1,    0,    0},
    {"SP_LocalIP",        ICU_BYTE,           0x200, false, false, 9999, 9999, 9999},
    {"SP_LocalPort",      ICU_UNSIGNED_SHORT, 0x20,  false, false, 1,    0,    0},
    {"SP_BroadcastType",  ICU_BYTE,           0x200, false, false, 9999, 9999, 9999},
    {"SP_RxPrefix",       ICU_BYTE,           0x200, false, false, 9999, 9999, 9999},
    {"SP_RxSuffix",       ICU_BYTE,           0x200, false, false, 9999, 9999, 9999},
    {"SP_Gap",            ICU_UNSIGNED_INT,   0x40,  false, false, 1,    0,    0},
    {"SP_TxPrefix",       ICU_BYTE,           0x200, false, false, 9999, 9999, 9999},
    {"SP_TxSuffix",       ICU_BYTE,           0x200, false, false, 9999, 9999, 9999},
    {"SP_HexTokens",      ICU_BOOLEAN,        0x1,   false, false, 1,    0,    0},
    {"SP_TokenQueueSize", ICU_UNSIGNED_INT,   0x40,  false, false, 1,    0,    0},
    {"SP_Done",           ICU_BOOLEAN,        0x1,   false, false, 1,    0,    0},
    {"conn_stat",         ICU_BOOLEAN,        0x1,   true,  false, 1,    0,    0},
    {"connect",           ICU_BOOLEAN,        0x1,   false, false, 1,    0,    0},
}};
// clang-format on

Model BuildModel() {
  // Every type starts from one template and changes only what its entry says.
  MemoryType common;
  common.setNaturalType(ICU_BYTE);
  common.setTavuTypes(0x200);
  common.setMinIndex(0);
  common.setMaxIndex(1);
  Model model("1");
  for (const MemoryTypeEntry& entry : kMemoryTypes) {
    MemoryType type = common;
    type.setName(entry.name);
    type.setNaturalType(entry.naturalType);
    type.setTavuTypes(entry.tavuTypes);
    type.setReadOnly(entry.readOnly);
    type.setWriteOnly(entry.writeOnly);
    type.setMaxIndex(entry.maxIndex);
    type.setBlockReadCount(entry.blockRead);
    type.setBlockWriteCount(entry.blockWrite);
    model.addMemoryType(type);
  }
  model.setMaxDatagramItems(0);
  model.setMaxDatagramLength(0);
  return model;
}

// Writes an integer as the natural type of its memory type (host byte order),
// within room bytes.
void PutInteger(unsigned char* data, int room, int naturalLength, std::int64_t value) {
  if (naturalLength >= 4 && room >= 4) {
    const auto word = static_cast<std::uint32_t>(value);
    std::memcpy(data, &word, sizeof word);
  } else if (naturalLength == 2 && room >= 2) {
    const auto half = static_cast<std::uint16_t>(value);
    std::memcpy(data, &half, sizeof half);
  } else if (room >= 1) {
    data[0] = static_cast<unsigned char>(value);
  }
}

// Reads an integer of the natural type of its memory type (host byte order).
int GetInteger(const unsigned char* data, int room, int naturalLength) {
  if (naturalLength >= 4 && room >= 4) {
    std::int32_t word = 0;
    std::memcpy(&word, data, sizeof word);
    return word;
  }
  if (naturalLength == 2 && room >= 2) {
    std::uint16_t half = 0;
    std::memcpy(&half, data, sizeof half);
    return half;
  }
  return room >= 1 ? data[0] : 0;
}

// The text at the start of data, up to its first zero byte or room.
std::string GetText(const unsigned char* data, int room) {
  const auto* const text = reinterpret_cast<const char*>(data);
  const auto* const zero = static_cast<const char*>(std::memchr(text, 0, room));
  return {text,
          zero == nullptr ? static_cast<std::size_t>(room) : static_cast<std::size_t>(zero - text)};
}

// Writes text up to its first zero byte, terminated; false when it does not
// fit a tag of varLength bytes (the terminator needs room) or the buffer.
bool PutText(unsigned char* data, int room, int varLength, const std::string& text) {
  const std::size_t length = std::strlen(text.c_str());
  if (text.size() >= static_cast<std::size_t>(std::max(varLength, 0)) ||
      length >= static_cast<std::size_t>(std::max(room, 0))) {
    return false;
  }
  std::memcpy(data, text.data(), length);
  data[length] = 0;
  return true;
}

}  // namespace

Protocol_VELT::Protocol_VELT()
    : runner(piMultiTask, this),
      tokenQueue(piMultiTask != nullptr ? piMultiTask->CreateMutex() : nullptr),
      rxBuffer(kRxBufferSize) {
  memoryManager.addModel(BuildModel());
}

Protocol_VELT::~Protocol_VELT() {
  // A host must stop a channel before deleting it; a running worker would
  // otherwise outlive its channel.
  if (running.load()) {
    Stop();
  }
  IMultiTask2* const multiTask = runner.getMultiTask();
  if (multiTask != nullptr && piMultiTask != nullptr && tokenQueue.Lock() != nullptr) {
    multiTask->DeleteMutex(tokenQueue.Lock());
  }
}

IInterface* Protocol_VELT::ConvertTo(const char* name) {
  static const std::array<const char*, 9> kNames = {"Protocol_VELT", "ProtocolBase", "IProtocol7",
                                                    "IProtocol6",    "IProtocol5",   "IProtocol4",
                                                    "IProtocol3",    "IProtocol2",   "IProtocol"};
  for (const char* candidate : kNames) {
    if (CompareInterface(name, candidate) != 0) {
      return this;
    }
  }
  return nullptr;
}

const char* Protocol_VELT::GetImpName() const { return "Protocol_VELT"; }
int Protocol_VELT::GetImpVersion() const { return 100; }
const char* Protocol_VELT::GetName() const { return "VELT"; }
int Protocol_VELT::GetProtocolVersion() const { return 112; }
int Protocol_VELT::GetProtocolType() const { return 472; }
const char* Protocol_VELT::GetProtocolName() const { return "Velt Conduit"; }
int Protocol_VELT::GetMaxTm(const ITag* /*tag*/) { return 0; }

int Protocol_VELT::GetNodeID(const ITag* tag) {
  const auto* const own = dynamic_cast<const Tag_VELT*>(tag);
  return own == nullptr ? 0 : own->getNode();
}

const char* Protocol_VELT::GetXml() const { return GetXml_VELT(); }

const char* const* Protocol_VELT::tagUriNames() const {
  static const std::array<const char*, 4> kFields = {"node", "memorytype", "datatype", nullptr};
  return kFields.data();
}

char* Protocol_VELT::_jstrcpy(char* dst, const char* src) {
  std::memcpy(dst, src, std::strlen(src) + 1);
  return dst;
}

bool Protocol_VELT::Config(const char* text) {
  if (!paramManager.parse(text == nullptr ? "" : text)) {
    SetError(-1, paramManager.getLastError().c_str());
    return false;
  }
  if (piSocketFactory == nullptr) {
    SetError(-1, "Internal error: ISocketFactory2 missing");
    return false;
  }
  return true;
}

bool Protocol_VELT::Start() {
  if (running.load()) {
    return true;
  }
  const _VELT::CommonParams& configured = *paramManager.getCommonParams();
  ChannelSettings current;
  {
    const std::lock_guard<std::mutex> guard(parametersLock);
    liveParams.setSection(GetIdent());
    liveParams.get("socket_type", -1, configured.socketType, current.socketType);
    liveParams.get("remote_ip_address", -1, configured.remoteIpAddress, current.remoteIp);
    liveParams.get("remote_port", -1, configured.remotePort, current.remotePort);
    liveParams.get("local_ip_address", -1, configured.localIpAddress, current.localIp);
    liveParams.get("local_port", -1, configured.localPort, current.localPort);
    liveParams.get("broadcast_type", -1, configured.broadcastType, current.broadcastType);
    liveParams.get("rx_prefix", -1, configured.rx_prefix, current.rxPrefix);
    liveParams.get("rx_suffix", -1, configured.rx_suffix, current.rxSuffix);
    liveParams.get("gap", -1, configured.gap, current.gap);
    liveParams.get("tx_prefix", -1, configured.tx_prefix, current.txPrefix);
    liveParams.get("tx_suffix", -1, configured.tx_suffix, current.txSuffix);
    liveParams.get("hex_tokens", -1, configured.hex_tokens, current.hexTokens);
    liveParams.get("token_queue_size", -1, configured.token_queue_size, current.tokenQueueSize);
  }
  settings.Update([&current](ChannelSettings& s) { s = current; });
  initSocket(current);
  // Cleared before the worker exists, so a restarted worker never connects
  // before the host asks for it.
  reinitRequired.store(false);
  connected.store(false);
  connectRequested.store(false);
  IMultiTask2* const multiTask = runner.getMultiTask();
  if (runner.getWorkerTask() == nullptr && multiTask != nullptr) {
    ITask* const task = multiTask->CreateTask(&runner, kWorkerTaskSetting);
    runner.setWorkerTask(task);
    if (task != nullptr) {
      multiTask->StartTask(task);
    }
  }
  running.store(true);
  return true;
}

bool Protocol_VELT::Stop() {
  if (!running.load()) {
    return true;
  }
  IMultiTask2* const multiTask = runner.getMultiTask();
  while (ITask* const task = runner.getWorkerTask()) {
    if (multiTask == nullptr || multiTask->DeleteTask(task, kDeleteTaskWait) != 0) {
      runner.setWorkerTask(nullptr);
    }
  }
  running.store(false);
  const std::lock_guard<std::mutex> guard(socketLock);
  if (ISocket* const old = socket.exchange(nullptr); old != nullptr && piSocketFactory != nullptr) {
    piSocketFactory->DeleteSocket(old, 0);
  }
  return true;
}

bool Protocol_VELT::initSocket(const ChannelSettings& current) {
  const std::lock_guard<std::mutex> guard(socketLock);
  ISocketFactory2* const factory = piSocketFactory;
  if (ISocket* const old = socket.exchange(nullptr); old != nullptr && factory != nullptr) {
    factory->DeleteSocket(old, 0);
  }
  localBroadcastAddress = "255.255.255.255";
  socketSettingsUnusable.store(false);
  if (factory == nullptr) {
    return false;
  }
  if (current.broadcastType == "Local") {
    // A public address only picks the adapter that routes to the outside;
    // nothing is ever sent to it.
    const std::string address = current.localIp.empty() ? "8.8.8.8" : current.localIp;
    ISocket* const probe = factory->CreateSocket(0, 0, 0);
    if (probe == nullptr) {
      SetError(-6, "Can't open connection socket");
      return false;
    }
    unsigned int ip = 0;
    if (!parseIpAddress(address.c_str(), ip)) {
      // The probe is deliberately left to the host here: it is never used
      // again.
      socketSettingsUnusable.store(true);
      SetError(-6, "Incorrect format of IP address");
      return false;
    }
    unsigned int adapter = 0;
    unsigned int mask = 0;
    unsigned int unused = 0;
    if (probe->GetAdapterInfo(ip, &adapter, &mask, &unused) == 0) {
      factory->DeleteSocket(probe, 0);
      SetError(-6, "Can't get IP adapter info");
      return false;
    }
    std::array<char, 16> text{};
    ipToString(adapter | ~mask, text.data());
    localBroadcastAddress = text.data();
    factory->DeleteSocket(probe, 0);
  }
  socket.store(factory->CreateSocket(static_cast<unsigned short>(current.localPort),
                                     current.socketType == "TCP" ? 1 : 0, 0));
  return true;
}

TagBase* Protocol_VELT::CreateTagBase(const char* uri) {
  auto* const tag = new Tag_VELT(uri, this);
  if (!tag->IsValid()) {
    SetTagError(tag);
    delete tag;
    return nullptr;
  }
  return tag;
}

bool Protocol_VELT::CanBeOptimized(const ITag* tag1, const ITag* tag2, bool flag) {
  const auto* const first = dynamic_cast<const Tag_VELT*>(tag1);
  const auto* const second = dynamic_cast<const Tag_VELT*>(tag2);
  if (flag || first == nullptr || second == nullptr || !first->IsValid() || !second->IsValid() ||
      first->getNode() != second->getNode() || first->getMemoryType() != second->getMemoryType() ||
      first->getIndex() > second->getIndex()) {
    return false;
  }
  const MemoryType& type = *first->getMemoryType();
  const int blockRead = type.getBlockReadCount();
  if (blockRead <= 0) {
    return false;
  }
  long long span = 0;
  if (type.getNaturalType() == ICU_BOOLEAN) {
    span = static_cast<long long>(second->getIndex()) + second->GetVarLength() - first->getIndex();
  } else {
    const long long length = ProtUtilsN::GetDataLength(type.getNaturalType());
    long long offset = second->getOffset();
    if (ProtUtilsN::GetBasicType(second) == ICU_BOOLEAN) {
      offset /= 8;
    }
    span =
        (length + offset * ProtUtilsN::GetBasicLength(second) + second->PackedLen() - 1) / length +
        second->getIndex() - first->getIndex();
  }
  return span <= blockRead;
}

int Protocol_VELT::Extend(int code, void* data) {
  if (data == nullptr) {
    return 0;
  }
  auto* const record = static_cast<unsigned char*>(data);
  if (code == 0) {
    std::int32_t kind = 0;
    std::memcpy(&kind, record, sizeof kind);
    const auto first = static_cast<unsigned char>(kind == 3 ? 1 : 0);
    const std::array<unsigned char, 4> flags = {first, 0, 0, 0};
    std::memcpy(record + sizeof kind, flags.data(), flags.size());
    return 1;
  }
  if (code == 3) {
    return record[68];
  }
  return 0;
}

bool Protocol_VELT::DoCommand(const char* command, char* output, int outputSize) {
  DriverConsole console(*this);
  return console.Run(command == nullptr ? "" : command, output, outputSize);
}

// ---------------------------------------------------------------------------
// The worker.

void Protocol_VELT::sleep(int milliseconds) {
  if (IMultiTask2* const multiTask = runner.getMultiTask(); multiTask != nullptr) {
    multiTask->Sleep(milliseconds);
  }
}

void Protocol_VELT::refreshWorkerSettings() {
  if (settings.Refresh(workerSettings, workerSettingsVersion)) {
    const std::string prefix = fromHex(workerSettings.rxPrefix);
    const std::string suffix = fromHex(workerSettings.rxSuffix);
    workerDatagrams = DatagramFraming(prefix, suffix);
    workerStream = StreamFraming(prefix, suffix);
  }
}

void Protocol_VELT::supervise() {
  bool renew = false;
  if (connected.load()) {
    ISocket* const sock = socket.load();
    if ((sock != nullptr && sock->IsBroken() != 0) || !connectRequested.load()) {
      connected.store(false);
      reinitRequired.store(true);
      renew = true;
    }
  }
  if (!renew) {
    renew = reinitRequired.load() || workerSettings.remoteIp != lastRemoteIp ||
            workerSettings.remotePort != lastRemotePort;
  }
  if (!renew) {
    return;
  }
  // The flag is cleared before the settings are read again: an apply that
  // raised it has already stored its settings, and a later one raises it
  // anew for the next pass.
  reinitRequired.store(false);
  connected.store(false);
  refreshWorkerSettings();
  lastRemoteIp = workerSettings.remoteIp;
  lastRemotePort = workerSettings.remotePort;
  initSocket(workerSettings);
}

bool Protocol_VELT::connect() {
  ISocket* const sock = socket.load();
  const bool toSubnet =
      workerSettings.broadcastType == "Local" && workerSettings.remoteIp == "255.255.255.255";
  const std::string& target = toSubnet ? localBroadcastAddress : workerSettings.remoteIp;
  if (sock == nullptr && socketSettingsUnusable.load()) {
    // Making the socket again cannot succeed before the settings change,
    // and each attempt would leave another probe socket behind.
    sleep(kIdleSleep);
    return false;
  }
  // Without a socket the attempt counts as failed, so the socket is made
  // again after the usual number of attempts.
  const int result =
      sock == nullptr
          ? -1
          : sock->Connect(target.c_str(), static_cast<unsigned short>(workerSettings.remotePort));
  if (result != 0) {
    if (++failedConnects > kMaxFailedConnects) {
      reinitRequired.store(true);
      failedConnects = 0;
    }
    sleep(kIdleSleep);
    return false;
  }
  failedConnects = 0;
  connected.store(true);
  return true;
}

void Protocol_VELT::Task() {
  refreshWorkerSettings();
  supervise();
  if (connectRequested.load() && !connected.load() && !connect()) {
    return;
  }
  ISocket* const sock = socket.load();
  if (!connected.load() || sock == nullptr) {
    sleep(kIdleSleep);
    return;
  }
  if (workerSettings.socketType == "UDP") {
    receiveDatagrams(sock);
  } else {
    receiveStream(sock);
  }
}

void Protocol_VELT::queueToken(std::string token) {
  TokenQueue::Guard held(tokenQueue);
  addToken(held, std::move(token));
}

void Protocol_VELT::receiveDatagrams(ISocket* sock) {
  const std::function<void(std::string)> emit = [this](std::string token) {
    queueToken(std::move(token));
  };
  for (;;) {
    const int received = sock->Receive(rxBuffer.data(), kRxBufferSize, kDatagramTimeout);
    if (received < 1) {
      return;
    }
    workerDatagrams.Split(rxBuffer.data(),
                          static_cast<std::size_t>(std::min(received, kRxBufferSize)), emit);
  }
}

void Protocol_VELT::receiveStream(ISocket* sock) {
  const int timeout = workerSettings.gap == 0 ? kDefaultGap : workerSettings.gap;
  workerStream.Pass(
      [sock, timeout](unsigned char& byte) { return sock->Receive(&byte, 1, timeout); },
      [this](std::string token) { queueToken(std::move(token)); });
}

void Protocol_VELT::addToken(TokenQueue::Guard& held, std::string token) {
  const SettingsStore::QueueRules rules = settings.GetQueueRules();
  held.Add(std::move(token), static_cast<unsigned int>(rules.tokenQueueSize), rules.hexTokens);
}

// ---------------------------------------------------------------------------
// Channel operations used by the tag paths and the console.

void Protocol_VELT::setConnectRequested(bool on) { connectRequested.store(on); }

void Protocol_VELT::setRemote(const std::string& ip, int port) {
  settings.Update([&ip, port](ChannelSettings& s) {
    s.remoteIp = ip;
    s.remotePort = port;
  });
}

bool Protocol_VELT::sendToken(const std::string& text, std::string& error) {
  const ChannelSettings current = settings.Get();
  std::string payload;
  if (current.hexTokens) {
    if (!isHex(text.c_str())) {
      error = "token to send must be in hex format";
      return false;
    }
    payload = fromHex(text);
  } else {
    payload = text;
  }
  sendFrame(fromHex(current.txPrefix) + payload + fromHex(current.txSuffix));
  return true;
}

void Protocol_VELT::sendFrame(const std::string& frame) {
  // The send's outcome is not the writer's concern: a channel without a
  // socket or with a broken one still accepts the token.
  const std::lock_guard<std::mutex> guard(socketLock);
  if (ISocket* const sock = socket.load(); sock != nullptr) {
    sock->Send(reinterpret_cast<const unsigned char*>(frame.data()),
               static_cast<int>(frame.size()));
  }
}

// ---------------------------------------------------------------------------
// Reading.

int Protocol_VELT::roomOf(const Tag_VELT* tag, int count) {
  const ICU_Type natural = tag->getMemoryType()->getNaturalType();
  if (ProtUtilsN::IsBitType(natural)) {
    return std::max(1, (count + 7) / 8);
  }
  return count * ProtUtilsN::GetDataLength(natural);
}

bool Protocol_VELT::ReadBlock(const ITag* tag, unsigned char* buffer, int length) {
  if (!running.load()) {
    SetError(-3, "Protocol not started");
    return false;
  }
  const auto* const own = dynamic_cast<const Tag_VELT*>(tag);
  if (own == nullptr || !own->IsValid() || buffer == nullptr || length < 0) {
    SetError(-1, "illegal memtype to read");
    return false;
  }
  return readBlock(own, buffer, length);
}

bool Protocol_VELT::readBlock(const Tag_VELT* tag, unsigned char* buffer, int length) {
  const MemoryType& type = *tag->getMemoryType();
  const ICU_Type natural = type.getNaturalType();
  const int naturalLength = ProtUtilsN::GetDataLength(natural);
  const bool bits = ProtUtilsN::IsBitType(natural);
  int index = tag->getIndex();
  long long first = 0;
  long long items = 0;
  std::size_t size = 0;
  if (bits) {
    items = static_cast<long long>(length) * 8;
    index -= index % 8;
    size = static_cast<std::size_t>(length);
  } else {
    first = tag->GetByteOffset() - static_cast<long long>(index) * naturalLength;
    items = (first + length + naturalLength - 1) / naturalLength;
    size = static_cast<std::size_t>(items * naturalLength);
  }
  if (first < 0 || first + length > static_cast<long long>(size)) {
    SetError(-1, "illegal memtype to read");
    return false;
  }
  WorkBuffer work(static_cast<int>(size));
  const int blockRead = std::max(type.getBlockReadCount(), 1);
  std::size_t position = 0;
  for (long long left = items; left > 0;) {
    const int chunk = static_cast<int>(std::min<long long>(left, blockRead));
    // Each chunk's items fit the buffer from position on: whole items for
    // bytes, and the bits of one byte at a time for bit types.
    if (!doReadBlock(tag, index, work.data() + position, chunk)) {
      return false;
    }
    position += bits ? static_cast<std::size_t>((index % 8 + chunk) / 8)
                     : static_cast<std::size_t>(chunk) * naturalLength;
    index += chunk;
    left -= chunk;
  }
  std::memcpy(buffer, work.data() + first, static_cast<std::size_t>(length));
  return true;
}

bool Protocol_VELT::doReadBlock(const Tag_VELT* tag, int /*index*/, unsigned char* data,
                                int count) {
  const int room = roomOf(tag, count);
  if (tag->getIsRuntimeParameter()) {
    const RuntimeParameter* const parameter =
        RuntimeParameter::ForMemoryType(*tag->getMemoryType());
    if (parameter != nullptr) {
      return readParameter(tag, *parameter, data, room);
    }
  }
  TokenQueue::Guard held(tokenQueue);
  return readChannel(held, tag, data, room);
}

bool Protocol_VELT::readChannel(TokenQueue::Guard& held, const Tag_VELT* tag, unsigned char* data,
                                int room) {
  const MemoryType& type = *tag->getMemoryType();
  const int naturalLength = ProtUtilsN::GetDataLength(type.getNaturalType());
  if (type.hasName("rx_token")) {
    if (held.Empty()) {
      data[0] = 0;
      return true;
    }
    // The full stored length counts, even past a zero byte inside the token:
    // the tag must have room for the token and its terminator.
    if (!PutText(data, room, tag->GetVarLength(), held.Front())) {
      SetError(-1, "token too long");
      return false;
    }
    return true;
  }
  if (type.hasName("rx_token_len")) {
    PutInteger(data, room, naturalLength,
               held.Empty() ? 0 : static_cast<std::int64_t>(held.Front().size()));
    return true;
  }
  if (type.hasName("tokens_available")) {
    PutInteger(data, room, naturalLength, static_cast<std::int64_t>(held.Size()));
    return true;
  }
  if (type.hasName("token_ack") || type.hasName("tx_token")) {
    data[0] = 0;
    return true;
  }
  if (type.hasName("conn_stat")) {
    data[0] = connected.load() ? 1 : 0;
    return true;
  }
  if (type.hasName("connect")) {
    data[0] = connectRequested.load() ? 1 : 0;
    return true;
  }
  SetError(-1, "illegal memtype to read");
  return false;
}

bool Protocol_VELT::readParameter(const Tag_VELT* tag, const RuntimeParameter& parameter,
                                  unsigned char* data, int room) {
  const int naturalLength = ProtUtilsN::GetDataLength(tag->getMemoryType()->getNaturalType());
  const ChannelSettings current = settings.Get();
  const std::lock_guard<std::mutex> guard(parametersLock);
  switch (parameter.kind) {
    case RuntimeParameter::Kind::Text: {
      if (!PutText(data, room, tag->GetVarLength(),
                   valueInForce(parameter, current.*parameter.text))) {
        SetError(-1, parameter.tooLongText);
        return false;
      }
      return true;
    }
    case RuntimeParameter::Kind::Integer:
      PutInteger(data, room, naturalLength, valueInForce(parameter, current.*parameter.integer));
      return true;
    case RuntimeParameter::Kind::Boolean:
      data[0] = valueInForce(parameter, current.*parameter.boolean) ? 1 : 0;
      return true;
    case RuntimeParameter::Kind::Apply:
      data[0] = 0;
      return true;
  }
  return false;
}

// ---------------------------------------------------------------------------
// Writing.

bool Protocol_VELT::Write(const ITag* tag, const unsigned char* data) {
  if (!running.load()) {
    SetError(-3, "Protocol not started");
    return false;
  }
  const auto* const own = dynamic_cast<const Tag_VELT*>(tag);
  if (own == nullptr || !own->IsValid() || data == nullptr) {
    SetError(-1, "illegal memtype to write");
    return false;
  }
  if (own->getMemoryType()->isReadOnly()) {
    SetError(-1, "writing to read_only type");
    return false;
  }
  return writeBlock(own, data);
}

bool Protocol_VELT::writeBlock(const Tag_VELT* tag, const unsigned char* data) {
  const MemoryType& type = *tag->getMemoryType();
  const ICU_Type natural = type.getNaturalType();
  const int naturalLength = ProtUtilsN::GetDataLength(natural);
  const bool bits = ProtUtilsN::IsBitType(natural);
  const int packed = tag->PackedLen();
  int index = tag->getIndex();
  long long first = 0;
  long long items = 0;
  long long span = 0;
  if (bits) {
    items = tag->GetVarLength();
    span = ProtUtilsN::GetLenOfBits(tag->GetBitIndex(), static_cast<int>(items));
  } else {
    first = tag->GetByteOffset() - static_cast<long long>(index) * naturalLength;
    items = (first + packed + naturalLength - 1) / naturalLength;
    span = items * naturalLength;
  }
  if (static_cast<long long>(index) + items > type.getMaxIndex()) {
    SetError(-1, "writing after the end of memory type");
    return false;
  }
  if (first < 0 || packed < 0) {
    SetError(-1, "illegal memtype to write");
    return false;
  }
  // Eight spare zero bytes past the value terminate any text.
  WorkBuffer work(static_cast<int>(std::max<long long>(packed, first + span) + 8));
  const int blockRead = type.getBlockReadCount();
  if (!(first == 0 && span == packed)) {
    // Keep the bytes of partly covered items.
    if (items <= 10 && items < blockRead) {
      if (!doReadBlock(tag, index, work.data(), static_cast<int>(items))) {
        return false;
      }
    } else {
      if (first != 0 && !doReadBlock(tag, index, work.data(), 1)) {
        return false;
      }
      if (items >= 2 && (first + packed) % naturalLength != 0 &&
          !doReadBlock(tag, index + static_cast<int>(items) - 1,
                       work.data() + (items - 1) * naturalLength, 1)) {
        return false;
      }
    }
  }
  if (!tag->ConvertVariable(data, work.data() + first, true)) {
    SetError(-9, "write conversion error");
    return false;
  }
  const int blockWrite = std::max(type.getBlockWriteCount(), 1);
  std::size_t position = 0;
  for (long long left = items; left > 0;) {
    const int chunk = static_cast<int>(std::min<long long>(left, blockWrite));
    if (!doWrite(tag, index, work.data() + position, chunk)) {
      return false;
    }
    position += bits ? static_cast<std::size_t>((index % 8 + chunk) / 8)
                     : static_cast<std::size_t>(chunk) * naturalLength;
    index += chunk;
    left -= chunk;
  }
  return true;
}

bool Protocol_VELT::doWrite(const Tag_VELT* tag, int /*index*/, const unsigned char* data,
                            int count) {
  // Texts may run into the work buffer's spare zero bytes.
  const int room = roomOf(tag, count) + 8;
  if (tag->getIsRuntimeParameter()) {
    const RuntimeParameter* const parameter =
        RuntimeParameter::ForMemoryType(*tag->getMemoryType());
    if (parameter != nullptr) {
      return writeParameter(tag, *parameter, data, room);
    }
  }
  TokenQueue::Guard held(tokenQueue);
  return writeChannel(held, tag, data, room);
}

bool Protocol_VELT::writeChannel(TokenQueue::Guard& held, const Tag_VELT* tag,
                                 const unsigned char* data, int room) {
  const MemoryType& type = *tag->getMemoryType();
  if (type.hasName("token_ack")) {
    // The value written is not looked at: writing 0 acknowledges too.
    held.PopFront();
    return true;
  }
  if (type.hasName("connect")) {
    connectRequested.store(data[0] != 0);
    return true;
  }
  if (type.hasName("tx_token")) {
    std::string error;
    if (!sendToken(GetText(data, room), error)) {
      SetError(-1, error.c_str());
      return false;
    }
    return true;
  }
  SetError(-1, "illegal memtype to write");
  return false;
}

bool Protocol_VELT::writeParameter(const Tag_VELT* tag, const RuntimeParameter& parameter,
                                   const unsigned char* data, int room) {
  const int naturalLength = ProtUtilsN::GetDataLength(tag->getMemoryType()->getNaturalType());
  switch (parameter.kind) {
    case RuntimeParameter::Kind::Text: {
      const std::string value = GetText(data, room);
      if (parameter.accepts != nullptr && !parameter.accepts(value)) {
        SetError(-1, parameter.illegalText);
        return false;
      }
      const std::lock_guard<std::mutex> guard(parametersLock);
      stagedParams.set(parameter.name, -1, value.c_str());
      return true;
    }
    case RuntimeParameter::Kind::Integer: {
      const std::lock_guard<std::mutex> guard(parametersLock);
      stagedParams.set(parameter.name, -1, GetInteger(data, room, naturalLength));
      return true;
    }
    case RuntimeParameter::Kind::Boolean: {
      const std::lock_guard<std::mutex> guard(parametersLock);
      stagedParams.set(parameter.name, -1, data[0] != 0);
      return true;
    }
    case RuntimeParameter::Kind::Apply:
      return applyParameters();
  }
  return false;
}

template <typename Value>
Value Protocol_VELT::valueInForce(const RuntimeParameter& parameter, const Value& working) {
  Value value{};
  if (!stagedParams.get(parameter.name, -1, value)) {
    liveParams.get(parameter.name, -1, working, value);
  }
  return value;
}

template <typename Value>
bool Protocol_VELT::reload(const RuntimeParameter& parameter, Value& setting) {
  Value value = valueInForce(parameter, setting);
  const bool changed = value != setting;
  setting = std::move(value);
  return changed;
}

bool Protocol_VELT::applyParameters() {
  TokenQueue::Guard held(tokenQueue);
  ChannelSettings applied = settings.Get();
  bool renew = false;
  {
    const std::lock_guard<std::mutex> guard(parametersLock);
    stagedParams.activate(liveParams, -1, true);
    for (const RuntimeParameter* const* p = RuntimeParameter::ReloadOrder(); *p != nullptr; ++p) {
      const RuntimeParameter& parameter = **p;
      bool changed = false;
      if (parameter.text != nullptr) {
        changed = reload(parameter, applied.*parameter.text);
      } else if (parameter.integer != nullptr) {
        changed = reload(parameter, applied.*parameter.integer);
      } else if (parameter.boolean != nullptr) {
        changed = reload(parameter, applied.*parameter.boolean);
      }
      renew = renew || (changed && parameter.needsNewSocket);
    }
  }
  // The settings are stored before the worker is told to renew its socket,
  // so the renewal sees them.
  settings.Update([&applied](ChannelSettings& s) { s = applied; });
  if (renew) {
    reinitRequired.store(true);
  }
  // Tokens received under the old settings are discarded.
  held.Clear();
  return true;
}
