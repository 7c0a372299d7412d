// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "HostMutex.h"

void HostMutex::Lock() { mutex_.lock(); }

void HostMutex::Unlock() { mutex_.unlock(); }
