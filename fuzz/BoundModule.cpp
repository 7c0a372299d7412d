// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "BoundModule.h"

#include "Require.h"

BoundModule::BoundModule(IPermanentStorage& storage) {
  host_.Offer("IMultiTask2", &tasks_);
  host_.Offer("ISocketFactory", &sockets_);
  host_.Offer("IPermanentStorage", &storage);
  Require(module_.Init(&host_) == 1, "the module binds the services");
}

BoundModule::~BoundModule() { module_.Close(); }
