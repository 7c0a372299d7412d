#include "driver/CreateProtocol_VELT.h"

#include "driver/Protocol_VELT.h"

IProtocol* CreateProtocol_VELT() { return new Protocol_VELT(); }
