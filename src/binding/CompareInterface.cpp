// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "binding/CompareInterface.h"

int CompareInterface(const char* a, const char* b) {
  if (a == nullptr || b == nullptr) {
    return 0;
  }
  for (; *a != '\0'; ++a, ++b) {
    if (*a != *b) {
      return 0;
    }
  }
  return *b == '\0' ? 1 : 0;
}
