// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <string_view>

#include "HostTypes.h"

// One kind of data area that a tag address can name: its name, the host type
// a tag on it has by default, the data types it admits, its index range, the
// items one block access may carry, and its access and byte-order properties.
// A plain value: copies copy every field. Setters store their argument as
// given; nothing checks one field against another.
class MemoryType {
 public:
  // Natural type boolean, the first 22 data types admitted, every flag false,
  // every count and index 0.
  MemoryType() = default;

  void setName(const std::string& value);
  void setNaturalType(ICU_Type value);
  // The OR of the flags (ProtUtilsN::GetTypeFlag) of the admitted types.
  void setTavuTypes(int value);
  void setSwap2(bool value);
  void setSwap4(bool value);
  void setSwap8(bool value);
  void setBitWrite(bool value);
  void setBitArrayWrite(bool value);
  void setReadOnly(bool value);
  void setWriteOnly(bool value);
  void setInDatagram(bool value);
  void setInternalConversion(bool value);
  void setMinIndex(int value);
  void setMaxIndex(int value);
  void setBlockReadCount(int value);
  void setBlockWriteCount(int value);
  void setBitRead(bool value);

  // A copy of the name.
  std::string getName() const;
  ICU_Type getNaturalType() const;
  int getTavuTypes() const;
  bool isReadOnly() const;
  bool isWriteOnly() const;
  int getMaxIndex() const;
  int getBlockReadCount() const;
  int getBlockWriteCount() const;

  // The remaining properties, named as the protocol description states them.
  bool isSwap2() const;
  bool isSwap4() const;
  bool isSwap8() const;
  bool canBitWrite() const;
  bool canBitArrayWrite() const;
  bool useInDatagram() const;
  bool hasInternalConversion() const;
  int getMinIndex() const;
  bool mustBitRead() const;

  // Exact, case-sensitive comparison with the name, without copying it.
  bool hasName(std::string_view value) const;

 private:
  std::string name;
  ICU_Type naturalType = ICU_BOOLEAN;
  int tavuTypes = 0x3fffff;
  bool swap2 = false;
  bool swap4 = false;
  bool swap8 = false;
  bool bitWrite = false;
  bool bitArrayWrite = false;
  bool readOnly = false;
  bool writeOnly = false;
  bool inDatagram = false;
  bool internalConversion = false;
  int blockReadCount = 0;
  int blockWriteCount = 0;
  int minIndex = 0;
  int maxIndex = 0;
  bool bitRead = false;
};
