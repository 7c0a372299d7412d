// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "IInterfaceFactory.h"

// The plug-in's one exported symbol: the library's interface factory, from
// which the host reaches the protocol factory and the module by name. It
// never fails and always returns the same object.
extern "C" IInterfaceFactory* GetInterfaceFactory();
