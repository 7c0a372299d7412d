// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>
#include <string>
#include <vector>

#include "protlib/ProtocolBase.h"

// A protocol on the framework's base whose device is a block of memory. It
// supplies only the operations every driver must have and none of the
// optional ones, so every base path runs as it does for a driver without
// them.
//
// Tag addresses are "offset?datatype" or "offset?datatype?bit": the byte
// offset in memory (decimal), a data-type text with optional conversions
// ("unsignedShort(bcd)", "int-8(neg)") and, for bit types, the bit index in
// the first byte (0 to 7). A bad address gives no tag and the error
// "Tag URI error: " + address + " - " + the reason.
//
// Identity: name "MEM", implementation "MemoryProtocol" v.100, protocol type 3,
// protocol version 1, protocol name "Memory test protocol".
class MemoryProtocol : public ProtocolBase {
 public:
  static constexpr int kMemorySize = 4096;

  MemoryProtocol() : memory(kMemorySize, 0) {}
  MemoryProtocol(const MemoryProtocol&) = delete;
  MemoryProtocol& operator=(const MemoryProtocol&) = delete;
  MemoryProtocol(MemoryProtocol&&) = delete;
  MemoryProtocol& operator=(MemoryProtocol&&) = delete;
  ~MemoryProtocol() override = default;

  const char* GetImpName() const override { return "MemoryProtocol"; }
  int GetImpVersion() const override { return 100; }
  bool Config(const char* /*text*/) override { return true; }
  bool CanBeOptimized(const ITag* /*tag1*/, const ITag* /*tag2*/, bool /*flag*/) override {
    return false;
  }
  // Converts the value into memory at the tag's offset; a conversion failure
  // is error -9 "write conversion error".
  bool Write(const ITag* tag, const unsigned char* data) override;
  // Copies length bytes of memory from the tag's offset.
  bool ReadBlock(const ITag* tag, unsigned char* buffer, int length) override;
  const char* GetName() const override { return "MEM"; }
  int GetProtocolVersion() const override { return 1; }
  int GetProtocolType() const override { return 3; }
  const char* GetProtocolName() const override { return "Memory test protocol"; }
  int GetNodeID(const ITag* /*tag*/) override { return 0; }
  TagBase* CreateTagBase(const char* uri) override;
  int GetMaxTm(const ITag* /*tag*/) override { return maxTm; }

  // The device's bytes.
  std::vector<unsigned char> memory;
  // What GetMaxTm answers.
  int maxTm = 25;
  // While set, every ReadBlock fails with error -1 "device read failed".
  bool failReads = false;
  // While set, every Write fails with error -1 "device write failed".
  bool failWrites = false;

  int blockReads() const { return blockReadCount.load(); }
  int lastBlockReadLength() const { return lastReadLength.load(); }
  int writes() const { return writeCount.load(); }

 protected:
  // Whether [offset, offset + length) lies in memory; sets the error if not.
  bool inRange(int offset, long long length);

 private:
  std::atomic<int> blockReadCount{0};
  std::atomic<int> lastReadLength{-1};
  std::atomic<int> writeCount{0};
};
