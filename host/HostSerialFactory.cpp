#include "HostSerialFactory.h"

const char* HostSerialFactory::GetImpName() const { return "HostSerialFactory"; }

int HostSerialFactory::GetImpVersion() const { return 100; }
