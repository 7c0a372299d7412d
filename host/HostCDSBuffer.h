#pragma once

#include "ICDSBuffer.h"

// The shared data-buffer service ("ICDSBuffer"). The plug-in binds it and
// reads nothing but its identity.
class HostCDSBuffer final : public ICDSBuffer {
 public:
  // "HostCDSBuffer".
  const char* GetImpName() const override;
  // 100.
  int GetImpVersion() const override;
};
