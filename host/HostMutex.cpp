#include "HostMutex.h"

#include "HeldHostLocks.h"

void HostMutex::Lock() {
  mutex_.lock();
  HeldHostLocks::Entered();
}

void HostMutex::Unlock() {
  mutex_.unlock();
  HeldHostLocks::Left();
}
