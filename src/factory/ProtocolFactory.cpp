#include "factory/ProtocolFactory.h"

#include "factory/CompareInterface.h"

IInterface* ProtocolFactory::ConvertTo(const char* name) {
  if (CompareInterface(name, "ProtocolFactory") != 0 ||
      CompareInterface(name, "IProtocolFactory") != 0) {
    return this;
  }
  return nullptr;
}

const char* ProtocolFactory::GetImpName() const { return "ProtFactoryInDLL"; }

int ProtocolFactory::GetImpVersion() const { return 100; }

IProtocol* ProtocolFactory::CreateProtocol(const char* /*name*/) {
  // The token driver registers itself here once it exists; until then no
  // protocol name is known.
  return nullptr;
}

void ProtocolFactory::DeleteProtocol(IProtocol* protocol) { delete protocol; }
