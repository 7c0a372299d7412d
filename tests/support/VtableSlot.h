#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

// The slot index of a virtual member function, read from the Itanium C++ ABI
// encoding of a pointer to member function: for a virtual function the first
// word holds 1 plus the byte offset of its entry in the vtable. Returns -1 for
// a non-virtual function. Index 0 is the first entry after the vtable's
// address point (the complete-object destructor when the destructor is the
// first virtual function).
template <typename MemberFunction>
std::ptrdiff_t VtableSlot(MemberFunction function) {
  static_assert(sizeof(MemberFunction) == 2 * sizeof(std::uintptr_t),
                "Itanium pointer-to-member-function layout expected");
  std::uintptr_t words[2];
  std::memcpy(words, &function, sizeof words);
  if ((words[0] & 1U) == 0) {
    return -1;
  }
  return static_cast<std::ptrdiff_t>((words[0] - 1) / sizeof(void*));
}
