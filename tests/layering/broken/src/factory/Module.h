#pragma once

// Allowed: the top layer includes the driver.
#include "driver/Channel.h"
