// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/Protocol_VELT.h"

#include <array>
#include <cstdint>
#include <cstring>

#include "binding/CompareInterface.h"
#include "binding/HostServices.h"
#include "driver/BlockTransfer.h"
#include "driver/ChannelMemory.h"
#include "driver/DriverConsole.h"
#include "driver/DriverErrors.h"
#include "driver/Tag_VELT.h"
#include "driver/XmlDescription.h"

namespace {

// The host's task setting for the worker.
constexpr int kWorkerTaskSetting = 3;
constexpr int kDeleteTaskWait = 1000;
// Texts may run into the eight spare zero bytes of a write's work buffer.
constexpr int kSpareWriteBytes = 8;

}  // namespace

Protocol_VELT::Protocol_VELT()
    : runner(piMultiTask, this),
      tokenQueue(piMultiTask != nullptr ? piMultiTask->CreateMutex() : nullptr),
      channel(*this, tokenQueue, requests, runner),
      access(*this, tokenQueue, requests, channel, parameters) {
  memoryManager.addModel(BuildChannelModel());
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
    SetError(kDriverError, paramManager.getLastError().c_str());
    return false;
  }
  if (piSocketFactory == nullptr) {
    return Fail(*this, kNoSocketFactory);
  }
  return true;
}

bool Protocol_VELT::Start() {
  if (running.load()) {
    return true;
  }
  const ChannelSettings current = parameters.Load(GetIdent(), *paramManager.getCommonParams());
  {
    // Connect and renewal requests are cleared before the worker exists, so
    // a restarted worker never connects before the host asks for it.
    TokenQueue::Guard held(tokenQueue);
    requests.Start(held, current);
    channel.Reset(held);
  }
  channel.initSocket();
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
  channel.Close();
  return true;
}

void Protocol_VELT::Task() { channel.Task(); }

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
  return !flag && first != nullptr && second != nullptr && first->IsValid() && second->IsValid() &&
         first->getNode() == second->getNode() &&
         first->getMemoryType() == second->getMemoryType() &&
         first->getIndex() <= second->getIndex() && FitsOneBlockRead(*first, *second);
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

bool Protocol_VELT::ReadBlock(const ITag* tag, unsigned char* buffer, int length) {
  if (!running.load()) {
    return Fail(*this, kNotStarted);
  }
  const auto* const own = dynamic_cast<const Tag_VELT*>(tag);
  if (own == nullptr || !own->IsValid() || buffer == nullptr || length < 0) {
    return Fail(*this, kIllegalRead);
  }
  return ReadInChunks(*this, *own, buffer, length);
}

bool Protocol_VELT::Write(const ITag* tag, const unsigned char* data) {
  if (!running.load()) {
    return Fail(*this, kNotStarted);
  }
  const auto* const own = dynamic_cast<const Tag_VELT*>(tag);
  if (own == nullptr || !own->IsValid() || data == nullptr) {
    return Fail(*this, kIllegalWrite);
  }
  if (own->getMemoryType()->isReadOnly()) {
    return Fail(*this, kReadOnlyWrite);
  }
  return WriteInChunks(*this, *own, data);
}

bool Protocol_VELT::doReadBlock(const Tag_VELT* tag, int /*index*/, unsigned char* data,
                                int count) {
  return access.Read(*tag, data, RoomOf(*tag, count));
}

bool Protocol_VELT::doWrite(const Tag_VELT* tag, int /*index*/, const unsigned char* data,
                            int count) {
  return access.Write(*tag, data, RoomOf(*tag, count) + kSpareWriteBytes);
}

bool Protocol_VELT::isConnectRequested() {
  const TokenQueue::Guard held(tokenQueue);
  return requests.ConnectRequested(held);
}
