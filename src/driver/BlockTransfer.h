// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

class Protocol_VELT;
class Tag_VELT;

// The generic block paths of this driver family. A read sizes a zero-filled
// work buffer in whole items of the memory type, fills it chunk by chunk
// through the protocol's doReadBlock (at most the memory type's block read
// count of items per chunk, a count of 0 counting as 1) and copies the
// requested bytes to the host. A write converts the host value into a
// zero-filled work buffer with eight spare zero bytes (so a text is always
// terminated) and hands it to doWrite chunk by chunk. Work buffers of up to
// 128 bytes live on the stack. Failures are recorded as the protocol's last
// error (a failing doReadBlock or doWrite records its own).

bool ReadInChunks(Protocol_VELT& protocol, const Tag_VELT& tag, unsigned char* buffer, int length);
bool WriteInChunks(Protocol_VELT& protocol, const Tag_VELT& tag, const unsigned char* data);
// The bytes that count items of the tag's memory type take in a work
// buffer: whole items, or for a bit type one byte per eight items (at least
// one).
int RoomOf(const Tag_VELT& tag, int count);
// Whether a block read of first may also carry second: the span from
// first's index to the end of second, in items of the memory type's natural
// type, is within the block read count. The tags have the same node and
// memory type, and first's index is not above second's.
bool FitsOneBlockRead(const Tag_VELT& first, const Tag_VELT& second);
