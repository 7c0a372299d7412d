// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include "IInterfaceFactory.h"
#include "IMultiTask2.h"
#include "IPermanentStorage.h"
#include "IProtModule.h"
#include "IProtocol7.h"
#include "IProtocolFactory.h"
#include "ISocketFactory.h"
#include "ITag.h"
#include "VtableSlot.h"
#include "protlib/ProtocolBase.h"
#include "protlib/TagBase.h"

// A host calls every interface by slot, so these indexes are the plug-in's
// binary interface: a reordering must fail here, never on a panel.
// Slots 0 and 1 of an interface with a virtual destructor are the complete and
// deleting destructors.

namespace {

// Two classes with the same functions declared in opposite orders, one of
// them non-virtual, and a derived class that appends one.
struct Forward {
  virtual ~Forward() = default;
  virtual int First() { return 1; }
  virtual int Second() { return 2; }
  int Plain() { return 0; }
};

struct Reordered {
  virtual ~Reordered() = default;
  virtual int Second() { return 2; }
  virtual int First() { return 1; }
};

struct Appended : Forward {
  virtual int Third() { return 3; }
};

}  // namespace

// The decoding itself, on the ABI of this build (Itanium or ARM): a swap of
// two declarations swaps their slots, a non-virtual function has none, and a
// derived class's own function follows the inherited ones.
TEST(SlotOrder, DecodingTellsAReorderingOnThisAbi) {
  EXPECT_EQ(VtableSlot(&Forward::First), 2);
  EXPECT_EQ(VtableSlot(&Forward::Second), 3);
  EXPECT_EQ(VtableSlot(&Reordered::Second), 2);
  EXPECT_EQ(VtableSlot(&Reordered::First), 3);
  EXPECT_EQ(VtableSlot(&Forward::Plain), -1);
  EXPECT_EQ(VtableSlot(&Appended::Third), 4);
  EXPECT_EQ(VtableSlot(&Appended::Second), 3);
}

TEST(SlotOrder, InterfaceFactoryHasNoDestructorSlots) {
  EXPECT_EQ(VtableSlot(&IInterfaceFactory::CreateInterface), 0);
  EXPECT_EQ(VtableSlot(&IInterfaceFactory::ReleaseInterface), 1);
}

TEST(SlotOrder, ProtocolFactory) {
  EXPECT_EQ(VtableSlot(&IProtocolFactory::ConvertTo), 2);
  EXPECT_EQ(VtableSlot(&IProtocolFactory::GetImpName), 3);
  EXPECT_EQ(VtableSlot(&IProtocolFactory::GetImpVersion), 4);
  EXPECT_EQ(VtableSlot(&IProtocolFactory::CreateProtocol), 5);
  EXPECT_EQ(VtableSlot(&IProtocolFactory::DeleteProtocol), 6);
}

TEST(SlotOrder, ProtModule) {
  EXPECT_EQ(VtableSlot(&IProtModule::ConvertTo), 2);
  EXPECT_EQ(VtableSlot(&IProtModule::GetImpName), 3);
  EXPECT_EQ(VtableSlot(&IProtModule::GetImpVersion), 4);
  EXPECT_EQ(VtableSlot(&IProtModule::Init), 5);
  EXPECT_EQ(VtableSlot(&IProtModule::Close), 6);
  EXPECT_EQ(VtableSlot(&IProtModule::GetLastError), 7);
}

TEST(SlotOrder, Tag) {
  EXPECT_EQ(VtableSlot(&ITag::Clone), 2);
  EXPECT_EQ(VtableSlot(&ITag::GetByteOffset), 3);
  EXPECT_EQ(VtableSlot(&ITag::GetBitIndex), 4);
  EXPECT_EQ(VtableSlot(&ITag::GetVarName), 5);
  EXPECT_EQ(VtableSlot(&ITag::GetVarType), 6);
  EXPECT_EQ(VtableSlot(&ITag::GetVarLength), 7);
  EXPECT_EQ(VtableSlot(&ITag::GetItemType), 8);
  EXPECT_EQ(VtableSlot(&ITag::PackedLen), 9);
  EXPECT_EQ(VtableSlot(&ITag::ConvertVariable), 10);
  EXPECT_EQ(VtableSlot(&ITag::IsReadOnly), 11);
  EXPECT_EQ(VtableSlot(&ITag::IsWriteOnly), 12);
}

// The framework's tag base keeps ITag's table and appends its own two.
TEST(SlotOrder, TagBase) {
  EXPECT_EQ(VtableSlot(&TagBase::PackedLen), 9);
  EXPECT_EQ(VtableSlot(&TagBase::ConvertVariable), 10);
  EXPECT_EQ(VtableSlot(&TagBase::IsReadOnly), 11);
  EXPECT_EQ(VtableSlot(&TagBase::IsWriteOnly), 12);
  EXPECT_EQ(VtableSlot(&TagBase::Convert), 13);
  EXPECT_EQ(VtableSlot(&TagBase::DoConversion), 14);
}

// Every generation appends to the previous one: the whole table is checked
// through IProtocol7.
TEST(SlotOrder, Protocol7) {
  EXPECT_EQ(VtableSlot(&IProtocol7::ConvertTo), 2) << "ConvertTo";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetImpName), 3) << "GetImpName";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetImpVersion), 4) << "GetImpVersion";
  EXPECT_EQ(VtableSlot(&IProtocol7::Config), 5) << "Config";
  EXPECT_EQ(VtableSlot(&IProtocol7::CreateTag), 6) << "CreateTag";
  EXPECT_EQ(VtableSlot(&IProtocol7::FreeTag), 7) << "FreeTag";
  EXPECT_EQ(VtableSlot(&IProtocol7::CanBeOptimized), 8) << "CanBeOptimized";
  EXPECT_EQ(VtableSlot(&IProtocol7::Start), 9) << "Start";
  EXPECT_EQ(VtableSlot(&IProtocol7::Stop), 10) << "Stop";
  EXPECT_EQ(VtableSlot(&IProtocol7::Read), 11) << "Read";
  EXPECT_EQ(VtableSlot(&IProtocol7::Write), 12) << "Write";
  EXPECT_EQ(VtableSlot(&IProtocol7::ReadBlock), 13) << "ReadBlock";
  EXPECT_EQ(VtableSlot(&IProtocol7::WriteBlock), 14) << "WriteBlock";
  EXPECT_EQ(VtableSlot(&IProtocol7::MaxDatagramItems), 15) << "MaxDatagramItems";
  EXPECT_EQ(VtableSlot(&IProtocol7::MaxDatagramLength), 16) << "MaxDatagramLength";
  EXPECT_EQ(VtableSlot(&IProtocol7::CanCoexistInDatagram), 17) << "CanCoexistInDatagram";
  EXPECT_EQ(VtableSlot(&IProtocol7::ReadDatagram), 18) << "ReadDatagram";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetName), 19) << "GetName";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetNextInstanceName), 20) << "GetNextInstanceName";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetLastError), 21) << "GetLastError";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetLastErrorString), 22) << "GetLastErrorString";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetProtocolVersion), 23) << "GetProtocolVersion";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetProtocolType), 24) << "GetProtocolType";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetProtocolName), 25) << "GetProtocolName";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetInfo), 26) << "GetInfo";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetXml), 27) << "GetXml";
  EXPECT_EQ(VtableSlot(&IProtocol7::IsConverted), 28) << "IsConverted";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetIdent), 29) << "GetIdent";
  EXPECT_EQ(VtableSlot(&IProtocol7::SetIdent), 30) << "SetIdent";
  EXPECT_EQ(VtableSlot(&IProtocol7::DoCommand), 31) << "DoCommand";
  EXPECT_EQ(VtableSlot(&IProtocol7::Extend), 32) << "Extend";
  EXPECT_EQ(VtableSlot(&IProtocol7::CanAddToDatagram), 33) << "CanAddToDatagram";
  EXPECT_EQ(VtableSlot(&IProtocol7::ReadDatagramWithStatus), 34) << "ReadDatagramWithStatus";
  EXPECT_EQ(VtableSlot(&IProtocol7::MultipleReadSupported), 35) << "MultipleReadSupported";
  EXPECT_EQ(VtableSlot(&IProtocol7::MultipleRead), 36) << "MultipleRead";
  EXPECT_EQ(VtableSlot(&IProtocol7::MultipleWriteSupported), 37) << "MultipleWriteSupported";
  EXPECT_EQ(VtableSlot(&IProtocol7::MultipleWrite), 38) << "MultipleWrite";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetNodeID), 39) << "GetNodeID";
  EXPECT_EQ(VtableSlot(&IProtocol7::CanReadBitBlock), 40) << "CanReadBitBlock";
  EXPECT_EQ(VtableSlot(&IProtocol7::ReadBitBlock), 41) << "ReadBitBlock";
  EXPECT_EQ(VtableSlot(&IProtocol7::GetInterface), 42) << "GetInterface";
  EXPECT_EQ(VtableSlot(&IProtocol7::MaxUnusedGap), 43) << "MaxUnusedGap";
  EXPECT_EQ(VtableSlot(&IProtocol7::IsBefore), 44) << "IsBefore";
  EXPECT_EQ(VtableSlot(&IProtocol7::IsAdjacent), 45) << "IsAdjacent";
  EXPECT_EQ(VtableSlot(&IProtocol7::NeedsReadBeforeWrite), 46) << "NeedsReadBeforeWrite";
  EXPECT_EQ(VtableSlot(&IProtocol7::CanWriteDatagrams), 47) << "CanWriteDatagrams";
  EXPECT_EQ(VtableSlot(&IProtocol7::CanAddToWriteDatagram), 48) << "CanAddToWriteDatagram";
  EXPECT_EQ(VtableSlot(&IProtocol7::WriteDatagramWithStatus), 49) << "WriteDatagramWithStatus";
  EXPECT_EQ(VtableSlot(&IProtocol7::CanWriteBitBlock), 50) << "CanWriteBitBlock";
  EXPECT_EQ(VtableSlot(&IProtocol7::WriteBitBlock), 51) << "WriteBitBlock";
  EXPECT_EQ(VtableSlot(&IProtocol7::readObject), 52) << "readObject";
  EXPECT_EQ(VtableSlot(&IProtocol7::writeObject), 53) << "writeObject";
  EXPECT_EQ(VtableSlot(&IProtocol7::vcsGetCapability), 54) << "vcsGetCapability";
  EXPECT_EQ(VtableSlot(&IProtocol7::vcsGetComParams), 55) << "vcsGetComParams";
  EXPECT_EQ(VtableSlot(&IProtocol7::vcsActivateInterleaved), 56) << "vcsActivateInterleaved";
  EXPECT_EQ(VtableSlot(static_cast<void* (IProtocol7::*)(int)>(&IProtocol7::createEventChannel)),
            57)
      << "createEventChannel(int)";
  EXPECT_EQ(VtableSlot(static_cast<void* (IProtocol7::*)(IEventProcessor*)>(
                &IProtocol7::createEventChannel)),
            58)
      << "createEventChannel(IEventProcessor*)";
  EXPECT_EQ(VtableSlot(&IProtocol7::deleteEventChannel), 59) << "deleteEventChannel";
  EXPECT_EQ(VtableSlot(&IProtocol7::addEventSource), 60) << "addEventSource";
  EXPECT_EQ(VtableSlot(&IProtocol7::addAlarmEvents), 61) << "addAlarmEvents";
  EXPECT_EQ(VtableSlot(&IProtocol7::frontEvent), 62) << "frontEvent";
  EXPECT_EQ(VtableSlot(&IProtocol7::popEvent), 63) << "popEvent";
  EXPECT_EQ(VtableSlot(&IProtocol7::createAlarm), 64) << "createAlarm";
  EXPECT_EQ(VtableSlot(&IProtocol7::deleteAlarm), 65) << "deleteAlarm";
  EXPECT_EQ(VtableSlot(&IProtocol7::listAlarms), 66) << "listAlarms";
  EXPECT_EQ(VtableSlot(&IProtocol7::quitAlarm), 67) << "quitAlarm";
  EXPECT_EQ(VtableSlot(&IProtocol7::createTrend), 68) << "createTrend";
  EXPECT_EQ(VtableSlot(&IProtocol7::deleteTrend), 69) << "deleteTrend";
  EXPECT_EQ(VtableSlot(&IProtocol7::readTrend), 70) << "readTrend";
  EXPECT_EQ(VtableSlot(&IProtocol7::hasPlcTimestamp), 71) << "hasPlcTimestamp";
  EXPECT_EQ(VtableSlot(&IProtocol7::readWithTimestamp), 72) << "readWithTimestamp";
  EXPECT_EQ(VtableSlot(&IProtocol7::readBlockWithTimestamp), 73) << "readBlockWithTimestamp";
  EXPECT_EQ(VtableSlot(&IProtocol7::readDatagramWithTimestamp), 74) << "readDatagramWithTimestamp";
  EXPECT_EQ(VtableSlot(&IProtocol7::getTagUriFieldCount), 75) << "getTagUriFieldCount";
  EXPECT_EQ(VtableSlot(&IProtocol7::getTagUriFieldName), 76) << "getTagUriFieldName";
  EXPECT_EQ(VtableSlot(&IProtocol7::getTagUriFieldPosition), 77) << "getTagUriFieldPosition";
  EXPECT_EQ(VtableSlot(&IProtocol7::getTagUriField), 78) << "getTagUriField";
  EXPECT_EQ(VtableSlot(&IProtocol7::readArrayItem), 79) << "readArrayItem";
  EXPECT_EQ(VtableSlot(&IProtocol7::writeArrayItem), 80) << "writeArrayItem";
  EXPECT_EQ(VtableSlot(&IProtocol7::readBitBlockWithTimestamp), 81) << "readBitBlockWithTimestamp";
}

// The protocol base keeps IProtocol7's table and appends its own operations.
TEST(SlotOrder, ProtocolBase) {
  EXPECT_EQ(VtableSlot(&ProtocolBase::ConvertTo), 2);
  EXPECT_EQ(VtableSlot(&ProtocolBase::Read), 11);
  EXPECT_EQ(VtableSlot(&ProtocolBase::DoCommand), 31);
  EXPECT_EQ(VtableSlot(&ProtocolBase::readBitBlockWithTimestamp), 81);
  EXPECT_EQ(VtableSlot(&ProtocolBase::CreateTagBase), 82);
  EXPECT_EQ(VtableSlot(&ProtocolBase::GetMaxTm), 83);
  EXPECT_EQ(VtableSlot(&ProtocolBase::tagUriNames), 84);
  EXPECT_EQ(VtableSlot(&ProtocolBase::SetError), -1);
  EXPECT_EQ(VtableSlot(&ProtocolBase::SetTagError), -1);
  EXPECT_EQ(VtableSlot(&ProtocolBase::DeleteTags), -1);
}

TEST(SlotOrder, HostServices) {
  EXPECT_EQ(VtableSlot(&IMultiTask2::GetImpName), 0);
  EXPECT_EQ(VtableSlot(&IMultiTask2::GetImpVersion), 1);
  EXPECT_EQ(VtableSlot(&IMultiTask2::Sleep), 2);
  EXPECT_EQ(VtableSlot(&IMultiTask2::CreateMutex), 3);
  EXPECT_EQ(VtableSlot(&IMultiTask2::DeleteMutex), 4);
  EXPECT_EQ(VtableSlot(&IMultiTask2::CreateTask), 5);
  EXPECT_EQ(VtableSlot(&IMultiTask2::StartTask), 6);
  EXPECT_EQ(VtableSlot(&IMultiTask2::DeleteTask), 7);
  EXPECT_EQ(VtableSlot(&IMutex::Lock), 0);
  EXPECT_EQ(VtableSlot(&IMutex::Unlock), 1);
  EXPECT_EQ(VtableSlot(&ITask::IsStopping), 0);
  EXPECT_EQ(VtableSlot(&ITaskRunner::Task), 2);
  EXPECT_EQ(VtableSlot(&ISocketFactory2::GetImpName), 0);
  EXPECT_EQ(VtableSlot(&ISocketFactory2::GetImpVersion), 1);
  EXPECT_EQ(VtableSlot(&ISocketFactory2::CreateSocket), 2);
  EXPECT_EQ(VtableSlot(&ISocketFactory2::DeleteSocket), 3);
  EXPECT_EQ(VtableSlot(&ISocketFactory2::GetAdapterInfo), 4);
  EXPECT_EQ(VtableSlot(&ISocket::Connect), 0);
  EXPECT_EQ(VtableSlot(&ISocket::IsBroken), 1);
  EXPECT_EQ(VtableSlot(&ISocket::Receive), 2);
  EXPECT_EQ(VtableSlot(&ISocket::GetAdapterInfo), 3);
  EXPECT_EQ(VtableSlot(&ISocket::Send), 4);
  EXPECT_EQ(VtableSlot(&IPermanentStorage2::ConvertTo), 0);
  EXPECT_EQ(VtableSlot(&IPermanentStorage2::SetStringValue), 1);
  EXPECT_EQ(VtableSlot(&IPermanentStorage2::SetBoolValue), 2);
  EXPECT_EQ(VtableSlot(&IPermanentStorage2::SetIntValue), 3);
  EXPECT_EQ(VtableSlot(&IPermanentStorage2::GetStringValue), 4);
  EXPECT_EQ(VtableSlot(&IPermanentStorage2::GetBoolValue), 5);
  EXPECT_EQ(VtableSlot(&IPermanentStorage2::GetIntValue), 6);
  EXPECT_EQ(VtableSlot(&IPermanentStorage2::HasValue), 7);
  EXPECT_EQ(VtableSlot(&IPermanentStorage2::GetStringValueInto), 8);
}
