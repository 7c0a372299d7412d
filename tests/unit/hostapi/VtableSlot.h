// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

// The slot index of a virtual member function, read from the pointer to
// member function, which both C++ ABIs the plug-in is built for lay out as
// two words {ptr, adj}:
// - Itanium (x86-64 and the rest): for a virtual function, ptr holds 1 plus
//   the byte offset of its entry in the vtable; adj is the this-adjustment.
// - ARM (armhf and arm64): function addresses may be odd (Thumb), so the
//   virtual flag moves to bit 0 of adj (which holds twice the adjustment);
//   for a virtual function ptr holds the byte offset itself.
// Returns -1 for a non-virtual function. Index 0 is the first entry after the
// vtable's address point (the complete-object destructor when the destructor
// is the first virtual function).
template <typename MemberFunction>
std::ptrdiff_t VtableSlot(MemberFunction function) {
  static_assert(sizeof(MemberFunction) == 2 * sizeof(std::uintptr_t),
                "two-word pointer-to-member-function layout expected");
  std::uintptr_t words[2];
  std::memcpy(words, &function, sizeof words);
#if defined(__arm__) || defined(__aarch64__)
  const bool isVirtual = (words[1] & 1U) != 0;
  const std::uintptr_t offset = words[0];
#else
  const bool isVirtual = (words[0] & 1U) != 0;
  const std::uintptr_t offset = words[0] - 1;
#endif
  if (!isVirtual) {
    return -1;
  }
  return static_cast<std::ptrdiff_t>(offset / sizeof(void*));
}
