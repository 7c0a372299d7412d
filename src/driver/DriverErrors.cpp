#include "driver/DriverErrors.h"

#include "protlib/ProtocolBase.h"

bool Fail(ProtocolBase& protocol, const DriverError& error) {
  protocol.SetError(error.code, error.text);
  return false;
}
