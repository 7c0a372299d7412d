// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdint>
#include <string>

// How the channel's values sit in a tag's work buffer: integers in the
// host's byte order at the width of the memory type's natural type, texts up
// to their first zero byte and terminated by one. room is the number of
// bytes the buffer holds from data on; nothing is written or read past it.

// Writes value at the natural length (4, 2 or 1 bytes; a wider value keeps
// its low bytes).
void PutInteger(unsigned char* data, int room, int naturalLength, std::int64_t value);
// Reads an integer of the natural length (a 2-byte one unsigned).
std::int32_t GetInteger(const unsigned char* data, int room, int naturalLength);
// Writes text up to its first zero byte, terminated; false, with nothing
// written, when it does not fit: the text's whole length must be below
// varLength (the tag's length, which needs room for the terminator) and the
// text up to its zero byte must fit room.
bool PutText(unsigned char* data, int room, int varLength, const std::string& text);
// The text at the start of data, up to its first zero byte or room.
std::string GetText(const unsigned char* data, int room);
