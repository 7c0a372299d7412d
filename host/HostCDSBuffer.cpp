#include "HostCDSBuffer.h"

const char* HostCDSBuffer::GetImpName() const { return "HostCDSBuffer"; }

int HostCDSBuffer::GetImpVersion() const { return 100; }
