// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <array>
#include <cstddef>
#include <cstring>
#include <vector>

// A zero-filled byte buffer for the duration of one call. Up to StackBytes
// bytes it lives inside the object (so on the caller's stack, and the common
// short values cost no allocation); a longer one is allocated once for the
// call and freed with the object. A negative size is taken as 0.
template <std::size_t StackBytes>
class ScratchBuffer {
 public:
  explicit ScratchBuffer(int size) : length(size < 0 ? 0 : size) {
    const auto bytes = static_cast<std::size_t>(length);
    if (bytes <= StackBytes) {
      std::memset(local.data(), 0, bytes);
      start = local.data();
    } else {
      heap.assign(bytes, 0);
      start = heap.data();
    }
  }
  ScratchBuffer(const ScratchBuffer&) = delete;
  ScratchBuffer& operator=(const ScratchBuffer&) = delete;
  ScratchBuffer(ScratchBuffer&&) = delete;
  ScratchBuffer& operator=(ScratchBuffer&&) = delete;
  ~ScratchBuffer() = default;

  unsigned char* data() { return start; }
  const unsigned char* data() const { return start; }
  int size() const { return length; }
  // True when the bytes were allocated because they did not fit StackBytes.
  bool onHeap() const { return !heap.empty(); }

 private:
  std::array<unsigned char, StackBytes> local;
  std::vector<unsigned char> heap;
  unsigned char* start = nullptr;
  int length;
};
