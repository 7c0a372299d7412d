#include "HostMutex.h"

void HostMutex::Lock() { mutex_.lock(); }

void HostMutex::Unlock() { mutex_.unlock(); }
