#pragma once

// Breaks: the host interfaces reach into the plug-in.
#include "binding/Services.h"
