// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/ProtocolBase.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <utility>

#include "binding/CompareInterface.h"
#include "binding/HostServices.h"
#include "protlib/BaseConsole.h"
#include "protlib/BitUtils.h"
#include "protlib/BoundedText.h"
#include "protlib/DataTypes.h"
#include "protlib/ScratchBuffer.h"
#include "protlib/TimeStamp.h"

namespace {

// Device values up to this many bytes are read without an allocation.
constexpr std::size_t kDeviceBytes = 64;
// Arrays up to this many host bytes are accessed item by item without one.
constexpr std::size_t kArrayBytes = 256;

const std::array<const char*, 1> kNoUriFields = {nullptr};

void Stamp(unsigned long long* ts) {
  if (ts != nullptr) {
    *ts = ProtUtilsN::currentTimeStamp();
  }
}

}  // namespace

ProtocolBase::~ProtocolBase() { DeleteTags(); }

// --- tags ---

IInterface* ProtocolBase::ConvertTo(const char* name) {
  static const std::array<const char*, 8> kNames = {"ProtocolBase", "IProtocol7", "IProtocol6",
                                                    "IProtocol5",   "IProtocol4", "IProtocol3",
                                                    "IProtocol2",   "IProtocol"};
  for (const char* known : kNames) {
    if (CompareInterface(name, known) != 0) {
      return static_cast<IProtocol7*>(this);
    }
  }
  return nullptr;
}

ITag* ProtocolBase::CreateTag(const char* uri) {
  TagBase* tag = CreateTagBase(uri);
  if (tag == nullptr) {
    return nullptr;
  }
  const std::lock_guard<std::mutex> hold(stateLock);
  tagList.push_back(tag);
  return tag;
}

void ProtocolBase::FreeTag(ITag* tag) {
  {
    const std::lock_guard<std::mutex> hold(stateLock);
    tagList.remove(tag);
  }
  delete tag;
}

void ProtocolBase::DeleteTags() {
  std::list<ITag*> owned;
  {
    const std::lock_guard<std::mutex> hold(stateLock);
    owned.swap(tagList);
  }
  for (ITag* tag : owned) {
    delete tag;
  }
}

// --- errors and identity ---

void ProtocolBase::SetError(int code, const char* text) {
  std::string replacement = text == nullptr ? std::string() : std::string(text);
  const std::lock_guard<std::mutex> hold(stateLock);
  lastErrorCode = code;
  lastErrorText.swap(replacement);
}

void ProtocolBase::SetTagError(const TagBase* tag) {
  if (tag == nullptr) {
    SetError(-1, "Tag URI error: no tag");
    return;
  }
  const char* address = tag->GetVarName();
  const std::string text =
      "Tag URI error: " + std::string(address == nullptr ? "" : address) + " - " + tag->GetError();
  SetError(-1, text.c_str());
}

int ProtocolBase::GetLastError() const {
  const std::lock_guard<std::mutex> hold(stateLock);
  return lastErrorCode;
}

const char* ProtocolBase::GetLastErrorString() const {
  const std::lock_guard<std::mutex> hold(stateLock);
  std::string& copy = errorCopies[std::this_thread::get_id()];
  copy = lastErrorText;
  return copy.c_str();
}

const char* ProtocolBase::GetNextInstanceName() const { return GetName(); }

const char* ProtocolBase::GetIdent() const {
  return identText.empty() ? GetName() : identText.c_str();
}

void ProtocolBase::SetIdent(const char* ident) { identText = ident == nullptr ? "" : ident; }

// --- reading ---

int ProtocolBase::BitBlockBits(const ITag* tag, int packedLength) {
  return ProtUtilsN::IsBitType(tag) ? tag->GetVarLength() : packedLength * 8;
}

bool ProtocolBase::Read(const ITag* tag, unsigned char* dst) {
  if (tag == nullptr || dst == nullptr) {
    SetError(-1, tag == nullptr ? "no tag given" : "no buffer given");
    return false;
  }
  const int packed = tag->PackedLen();
  if (packed < 0) {
    SetError(-1, "invalid tag length");
    return false;
  }
  ScratchBuffer<kDeviceBytes> device(packed);
  bool read = false;
  if (CanReadBitBlock(tag)) {
    read = ReadBitBlock(tag, device.data(), BitBlockBits(tag, packed));
  } else {
    read = ReadBlock(tag, device.data(), packed);
  }
  if (!read) {
    return false;
  }
  if (!tag->ConvertVariable(device.data(), dst, false)) {
    SetError(-9, "read conversion error");
    return false;
  }
  return true;
}

bool ProtocolBase::WriteBlock(const ITag* /*tag*/, const unsigned char* /*buffer*/,
                              int /*length*/) {
  SetError(-3, "Optimized writing not supported");
  return false;
}

bool ProtocolBase::readWithTimestamp(const ITag* tag, unsigned char* dst, unsigned long long* ts) {
  if (!Read(tag, dst)) {
    return false;
  }
  Stamp(ts);
  return true;
}

bool ProtocolBase::readBlockWithTimestamp(const ITag* tag, unsigned char* buffer, int length,
                                          unsigned long long* ts) {
  if (!ReadBlock(tag, buffer, length)) {
    return false;
  }
  Stamp(ts);
  return true;
}

bool ProtocolBase::readBitBlockWithTimestamp(const ITag* tag, unsigned char* buffer, int bits,
                                             unsigned long long* ts) {
  if (!ReadBitBlock(tag, buffer, bits)) {
    return false;
  }
  Stamp(ts);
  return true;
}

// --- datagrams ---

bool ProtocolBase::CanAddToDatagram(const ITag* const* tags, int count, const ITag* newTag) {
  if (count <= 0 || tags == nullptr || newTag == nullptr) {
    return false;
  }
  if (!CanCoexistInDatagram(tags[0], newTag)) {
    return false;
  }
  if (!(MaxDatagramItems(newTag) > count)) {
    return false;
  }
  long long sum = newTag->PackedLen();
  for (int i = 0; i < count; ++i) {
    if (tags[i] == nullptr) {
      return false;
    }
    sum += tags[i]->PackedLen();
  }
  return sum <= MaxDatagramLength(newTag);
}

bool ProtocolBase::ReadDatagramWithStatus(const ITag* const* tags, int count, unsigned char* buffer,
                                          idal_error_t* status) {
  if (!ReadDatagram(tags, count, buffer)) {
    return false;
  }
  if (status != nullptr) {
    std::fill(status, status + std::max(count, 0), idal_error_t{1});
  }
  return true;
}

bool ProtocolBase::readDatagramWithTimestamp(const ITag* const* tags, int count,
                                             unsigned char* buffer, idal_error_t* status,
                                             unsigned long long* ts) {
  if (!ReadDatagramWithStatus(tags, count, buffer, status)) {
    return false;
  }
  if (ts != nullptr) {
    const unsigned long long now = ProtUtilsN::currentTimeStamp();
    std::fill(ts, ts + std::max(count, 0), now);
  }
  return true;
}

// --- array items ---

bool ProtocolBase::readArrayItem(const ITag* tag, int index, unsigned char* dst) {
  return accessArrayItem(tag, index, nullptr, dst);
}

bool ProtocolBase::writeArrayItem(const ITag* tag, int index, const unsigned char* src) {
  return accessArrayItem(tag, index, src, nullptr);
}

// Reads with dst set, writes with src set.
bool ProtocolBase::accessArrayItem(const ITag* tag, int index, const unsigned char* src,
                                   unsigned char* dst) {
  if (tag == nullptr) {
    SetError(-1, "no tag given");
    return false;
  }
  if (tag->GetItemType() == ICU_NONE) {
    SetError(-1, "accessing an array item where the tag is not array");
    return false;
  }
  const long long itemLength = ProtUtilsN::GetBasicLength(tag);
  const int length = tag->GetVarLength();
  if (index < 0 || index >= ProtUtilsN::GetItemCount(tag) ||
      (index + 1LL) * itemLength > std::max(length, 0)) {
    SetError(-1, "accessing array item out of range");
    return false;
  }
  if (src == nullptr && dst == nullptr) {
    SetError(-1, "no buffer given");
    return false;
  }
  ScratchBuffer<kArrayBytes> array(length);
  if (!Read(tag, array.data())) {
    return false;
  }
  unsigned char* item = array.data() + index * itemLength;
  const auto bytes = static_cast<std::size_t>(itemLength);
  if (dst != nullptr) {
    std::memcpy(dst, item, bytes);
    return true;
  }
  std::memcpy(item, src, bytes);
  return Write(tag, array.data());
}

// --- tag address fields ---

const char* const* ProtocolBase::tagUriNames() const { return kNoUriFields.data(); }

int ProtocolBase::getTagUriFieldCount() {
  const char* const* names = tagUriNames();
  int count = 0;
  while (names != nullptr && names[count] != nullptr) {
    ++count;
  }
  return count;
}

const char* ProtocolBase::getTagUriFieldName(int index) {
  if (index < 0 || index >= getTagUriFieldCount()) {
    return nullptr;
  }
  return tagUriNames()[index];
}

int ProtocolBase::getTagUriFieldPosition(const char* name) {
  if (name == nullptr) {
    return -1;
  }
  const char* const* names = tagUriNames();
  for (int i = 0; names != nullptr && names[i] != nullptr; ++i) {
    if (std::strcmp(names[i], name) == 0) {
      return i;
    }
  }
  return -1;
}

const char* ProtocolBase::getTagUriField(const ITag* tag, int index, int* length) {
  const char* field = tag == nullptr ? nullptr : tag->GetVarName();
  if (field == nullptr || *field == '\0' || index < 0) {
    return nullptr;
  }
  for (int i = 0; i < index; ++i) {
    field = std::strchr(field, '?');
    if (field == nullptr) {
      return nullptr;
    }
    ++field;
  }
  if (length != nullptr) {
    const char* end = std::strchr(field, '?');
    *length = static_cast<int>(end == nullptr ? std::strlen(field) : end - field);
  }
  return field;
}

// --- tag order ---

bool ProtocolBase::IsBefore(const ITag* a, const ITag* b) {
  if (a == nullptr || b == nullptr) {
    return false;
  }
  return static_cast<unsigned>(a->GetByteOffset()) < static_cast<unsigned>(b->GetByteOffset());
}

bool ProtocolBase::IsAdjacent(const ITag* a, const ITag* b) {
  if (a == nullptr || b == nullptr) {
    return false;
  }
  return ProtUtilsN::getEndingBit(b) == ProtUtilsN::getStartingBit(a);
}

// --- operations the base does not support ---

bool ProtocolBase::readObject(const ITag* /*tag*/, IObjectString* /*object*/) {
  SetError(-1, "read object not supported");
  return false;
}

bool ProtocolBase::writeObject(const ITag* /*tag*/, const IObjectString* /*object*/) {
  SetError(-1, "write object not supported");
  return false;
}

void* ProtocolBase::createEventChannel(int /*queueSize*/) {
  SetError(-1, "protocol does not support event channel");
  return nullptr;
}

void* ProtocolBase::createEventChannel(IEventProcessor* /*processor*/) {
  SetError(-1, "protocol does not support event channel");
  return nullptr;
}

bool ProtocolBase::addEventSource(void* /*channel*/, const ITag* /*tag*/) {
  SetError(-1, "protocol does not support event channel");
  return false;
}

bool ProtocolBase::addAlarmEvents(void* /*channel*/, void* /*alarm*/) {
  SetError(-1, "protocol does not support event channel");
  return false;
}

void* ProtocolBase::createAlarm(const char* /*definition*/) {
  SetError(-1, "protocol does not support alarms");
  return nullptr;
}

void* ProtocolBase::createTrend(const char* /*definition*/) {
  SetError(-1, "protocol does not support trends");
  return nullptr;
}

// --- console and information ---

bool ProtocolBase::DoCommand(const char* command, char* out, int outSize) {
  return BaseConsole(*this).Run(command, out, outSize);
}

// One line per piece of identity; the host services only for a protocol that
// is not converted.
int ProtocolBase::GetInfo(char* out, int outSize) const {
  BoundedText text(out, outSize);
  text << "Protocol: " << GetName() << " (" << GetProtocolType() << ")"
       << " v." << GetProtocolVersion() << "\n";
  text << "Implementation: " << GetImpName() << " v." << GetImpVersion() << "\n";
  text << "ProtocolBase"
       << " v." << 100 << "\n";
  text << "ProtLib v." << ProtUtilsN::GetVersion() << "\n";
  if (!IsConverted()) {
    if (piMultiTask != nullptr) {
      text << piMultiTask->GetImpName() << " v." << piMultiTask->GetImpVersion() << "\n";
    }
    if (piSerialFactory != nullptr) {
      text << piSerialFactory->GetImpName() << " v." << piSerialFactory->GetImpVersion() << "\n";
    }
    if (piSocketFactory != nullptr) {
      text << piSocketFactory->GetImpName() << " v." << piSocketFactory->GetImpVersion() << "\n";
    }
  }
  return text.count();
}
