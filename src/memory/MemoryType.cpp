// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "memory/MemoryType.h"

void MemoryType::setName(const std::string& value) { name = value; }
void MemoryType::setNaturalType(ICU_Type value) { naturalType = value; }
void MemoryType::setTavuTypes(int value) { tavuTypes = value; }
void MemoryType::setSwap2(bool value) { swap2 = value; }
void MemoryType::setSwap4(bool value) { swap4 = value; }
void MemoryType::setSwap8(bool value) { swap8 = value; }
void MemoryType::setBitWrite(bool value) { bitWrite = value; }
void MemoryType::setBitArrayWrite(bool value) { bitArrayWrite = value; }
void MemoryType::setReadOnly(bool value) { readOnly = value; }
void MemoryType::setWriteOnly(bool value) { writeOnly = value; }
void MemoryType::setInDatagram(bool value) { inDatagram = value; }
void MemoryType::setInternalConversion(bool value) { internalConversion = value; }
void MemoryType::setMinIndex(int value) { minIndex = value; }
void MemoryType::setMaxIndex(int value) { maxIndex = value; }
void MemoryType::setBlockReadCount(int value) { blockReadCount = value; }
void MemoryType::setBlockWriteCount(int value) { blockWriteCount = value; }
void MemoryType::setBitRead(bool value) { bitRead = value; }

std::string MemoryType::getName() const { return name; }
ICU_Type MemoryType::getNaturalType() const { return naturalType; }
int MemoryType::getTavuTypes() const { return tavuTypes; }
bool MemoryType::isReadOnly() const { return readOnly; }
bool MemoryType::isWriteOnly() const { return writeOnly; }
int MemoryType::getMaxIndex() const { return maxIndex; }
int MemoryType::getBlockReadCount() const { return blockReadCount; }
int MemoryType::getBlockWriteCount() const { return blockWriteCount; }

bool MemoryType::isSwap2() const { return swap2; }
bool MemoryType::isSwap4() const { return swap4; }
bool MemoryType::isSwap8() const { return swap8; }
bool MemoryType::canBitWrite() const { return bitWrite; }
bool MemoryType::canBitArrayWrite() const { return bitArrayWrite; }
bool MemoryType::useInDatagram() const { return inDatagram; }
bool MemoryType::hasInternalConversion() const { return internalConversion; }
int MemoryType::getMinIndex() const { return minIndex; }
bool MemoryType::mustBitRead() const { return bitRead; }

bool MemoryType::hasName(std::string_view value) const { return name == value; }
