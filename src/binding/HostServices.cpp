// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "binding/HostServices.h"

// NOLINTBEGIN(cppcoreguidelines-avoid-non-const-global-variables): the
// module-wide service pointers are the library's one prescribed global state.
IMultiTask2* piMultiTask = nullptr;
ISerialFactory* piSerialFactory = nullptr;
ISocketFactory2* piSocketFactory = nullptr;
ICDSBuffer* piCDSBuffer = nullptr;
IDiag* piDiag = nullptr;
IPermanentStorage* piPermanentStorage = nullptr;
IDriverInterface* piDriverInterface = nullptr;
ISmux* piSmux = nullptr;
IFastTimer* piFastTimer = nullptr;
// NOLINTEND(cppcoreguidelines-avoid-non-const-global-variables)
