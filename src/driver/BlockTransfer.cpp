// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/BlockTransfer.h"

#include <algorithm>
#include <cstring>

#include "driver/DriverErrors.h"
#include "driver/Protocol_VELT.h"
#include "driver/Tag_VELT.h"
#include "protlib/ProtUtilsN.h"
#include "protlib/ScratchBuffer.h"

namespace {

// Work buffers up to this size live on the stack.
constexpr std::size_t kStackBuffer = 128;
using WorkBuffer = ScratchBuffer<kStackBuffer>;

// Where a tag's value lies in its work buffer, in items of the memory type.
struct Span {
  int index;
  // The value's first byte in the buffer.
  long long first;
  long long items;
  // The bytes the items take.
  long long bytes;
  bool bits;
  int naturalLength;
};

Span BaseSpan(const Tag_VELT& tag) {
  const ICU_Type natural = tag.getMemoryType()->getNaturalType();
  return {
      tag.getIndex(), 0, 0, 0, ProtUtilsN::IsBitType(natural), ProtUtilsN::GetDataLength(natural)};
}

// The items that hold length bytes (or bits) of the tag's value.
Span SpanOf(const Tag_VELT& tag, long long length) {
  Span span = BaseSpan(tag);
  span.first = tag.GetByteOffset() - static_cast<long long>(span.index) * span.naturalLength;
  span.items = (span.first + length + span.naturalLength - 1) / span.naturalLength;
  span.bytes = span.items * span.naturalLength;
  return span;
}

// Hands the buffer to step chunk by chunk: step(index, position, count).
template <typename Step>
bool InChunks(const Span& span, int blockCount, unsigned char* work, Step step) {
  const int chunkLimit = std::max(blockCount, 1);
  int index = span.index;
  long long position = 0;
  for (long long left = span.items; left > 0;) {
    const int chunk = static_cast<int>(std::min<long long>(left, chunkLimit));
    // Each chunk's items fit the buffer from position on: whole items for
    // bytes, the bits of one byte at a time for bit types.
    if (!step(index, work + position, chunk)) {
      return false;
    }
    position +=
        span.bits ? (index % 8 + chunk) / 8 : static_cast<long long>(chunk) * span.naturalLength;
    index += chunk;
    left -= chunk;
  }
  return true;
}

// Reads the old value of the items that the new one covers only in part,
// so their other bytes keep it.
bool PreRead(Protocol_VELT& protocol, const Tag_VELT& tag, const Span& span, int packed,
             unsigned char* work) {
  if (span.first == 0 && span.bytes == packed) {
    return true;
  }
  const auto read = [&protocol, &tag](int index, unsigned char* at, int count) {
    return protocol.doReadBlock(&tag, index, at, count);
  };
  if (span.items <= 10 && span.items < tag.getMemoryType()->getBlockReadCount()) {
    return read(span.index, work, static_cast<int>(span.items));
  }
  if (span.first != 0 && !read(span.index, work, 1)) {
    return false;
  }
  return span.items < 2 || (span.first + packed) % span.naturalLength == 0 ||
         read(span.index + static_cast<int>(span.items) - 1,
              work + (span.items - 1) * span.naturalLength, 1);
}

}  // namespace

bool ReadInChunks(Protocol_VELT& protocol, const Tag_VELT& tag, unsigned char* buffer, int length) {
  Span span = BaseSpan(tag);
  if (span.bits) {
    span.items = static_cast<long long>(length) * 8;
    span.index -= span.index % 8;
    span.bytes = length;
  } else {
    span = SpanOf(tag, length);
  }
  if (span.first < 0 || span.first + length > span.bytes) {
    return Fail(protocol, kIllegalRead);
  }
  WorkBuffer work(static_cast<int>(span.bytes));
  const auto read = [&protocol, &tag](int index, unsigned char* at, int count) {
    return protocol.doReadBlock(&tag, index, at, count);
  };
  if (!InChunks(span, tag.getMemoryType()->getBlockReadCount(), work.data(), read)) {
    return false;
  }
  std::memcpy(buffer, work.data() + span.first, static_cast<std::size_t>(length));
  return true;
}

bool WriteInChunks(Protocol_VELT& protocol, const Tag_VELT& tag, const unsigned char* data) {
  const int packed = tag.PackedLen();
  Span span = BaseSpan(tag);
  if (span.bits) {
    span.items = tag.GetVarLength();
    span.bytes = ProtUtilsN::GetLenOfBits(tag.GetBitIndex(), static_cast<int>(span.items));
  } else {
    span = SpanOf(tag, packed);
  }
  if (static_cast<long long>(span.index) + span.items > tag.getMemoryType()->getMaxIndex()) {
    return Fail(protocol, kWritePastEnd);
  }
  if (span.first < 0 || packed < 0) {
    return Fail(protocol, kIllegalWrite);
  }
  // Eight spare zero bytes past the value terminate any text.
  WorkBuffer work(static_cast<int>(std::max<long long>(packed, span.first + span.bytes) + 8));
  if (!PreRead(protocol, tag, span, packed, work.data())) {
    return false;
  }
  if (!tag.ConvertVariable(data, work.data() + span.first, true)) {
    return Fail(protocol, kWriteConversion);
  }
  const auto write = [&protocol, &tag](int index, unsigned char* at, int count) {
    return protocol.doWrite(&tag, index, at, count);
  };
  return InChunks(span, tag.getMemoryType()->getBlockWriteCount(), work.data(), write);
}

int RoomOf(const Tag_VELT& tag, int count) {
  const ICU_Type natural = tag.getMemoryType()->getNaturalType();
  if (ProtUtilsN::IsBitType(natural)) {
    return std::max(1, (count + 7) / 8);
  }
  return count * ProtUtilsN::GetDataLength(natural);
}

bool FitsOneBlockRead(const Tag_VELT& first, const Tag_VELT& second) {
  const MemoryType& type = *first.getMemoryType();
  const int blockRead = type.getBlockReadCount();
  if (blockRead <= 0) {
    return false;
  }
  long long span = 0;
  if (type.getNaturalType() == ICU_BOOLEAN) {
    span = static_cast<long long>(second.getIndex()) + second.GetVarLength() - first.getIndex();
  } else {
    const long long length = ProtUtilsN::GetDataLength(type.getNaturalType());
    long long offset = second.getOffset();
    if (ProtUtilsN::GetBasicType(&second) == ICU_BOOLEAN) {
      offset /= 8;
    }
    span =
        (length + offset * ProtUtilsN::GetBasicLength(&second) + second.PackedLen() - 1) / length +
        second.getIndex() - first.getIndex();
  }
  return span <= blockRead;
}
