#include "driver/Channel.h"

// Breaks: the driver reaches up into the factory.
#include "factory/Module.h"
