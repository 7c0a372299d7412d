// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// The framework's free utilities in one include.
#include "protlib/BitUtils.h"
#include "protlib/DataTypes.h"
#include "protlib/TextUtils.h"
#include "protlib/TimeStamp.h"
