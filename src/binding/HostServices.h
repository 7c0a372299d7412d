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

// The host services the library runs on, one set per loaded library. They
// sit at the bottom of the library, beside the interfaces they point to, so
// that every layer can read them without including the module that fills
// them.
//
// ProtModule::Init binds them and ProtModule::Close gives them back, on the
// host's loading thread, before any driver thread runs and after all have
// stopped; every other part of the library only reads them. Null while the
// module is not initialised, and for an optional service the host does not
// offer (piDiag, piPermanentStorage, piDriverInterface, piSmux, piFastTimer).
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
