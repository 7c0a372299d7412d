// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "ICDSBuffer.h"
#include "IDiag.h"
#include "IDriverInterface.h"
#include "IFastTimer.h"
#include "IMultiTask2.h"
#include "IPermanentStorage.h"
#include "ISerialFactory.h"
#include "ISmux.h"
#include "ISocketFactory.h"

// The host services bound by the module (ProtModule::Init) and given back by
// ProtModule::Close. They are written only there, on the host's loading
// thread, before any driver thread runs and after all have stopped; every
// other part of the library only reads them. Null while the module is not
// initialised or when the host does not offer an optional service.
// NOLINTBEGIN(cppcoreguidelines-avoid-non-const-global-variables): the
// module-wide service pointers are the library's one prescribed global state.
extern IMultiTask2* piMultiTask;
extern ISerialFactory* piSerialFactory;
extern ISocketFactory2* piSocketFactory;
extern ICDSBuffer* piCDSBuffer;
extern IDiag* piDiag;
extern IPermanentStorage* piPermanentStorage;
extern IDriverInterface* piDriverInterface;
extern ISmux* piSmux;
extern IFastTimer* piFastTimer;
// NOLINTEND(cppcoreguidelines-avoid-non-const-global-variables)
