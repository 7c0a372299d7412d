// The plug-in's entry point and its module-wide Factory object.
#include "factory/GetInterfaceFactory.h"
#include "factory/ModuleFactory.h"

// NOLINTNEXTLINE(cppcoreguidelines-avoid-non-const-global-variables)
ModuleFactory Factory;

extern "C" __attribute__((visibility("default"))) IInterfaceFactory* GetInterfaceFactory() {
  return &Factory.interfaceFactory;
}
