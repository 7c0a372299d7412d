#pragma once

// Breaks: the bottom layer reaches up into the configuration.
#include "config/Store.h"
