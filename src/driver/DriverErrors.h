// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

class ProtocolBase;

// The channel's error codes and the fixed texts that go with them, recorded
// as the protocol's last error. The texts of the runtime settings (a value
// that fails its check, a value too long for the reading tag) are kept with
// their setting in the settings table, all under kDriverError.
struct DriverError {
  int code;
  const char* text;
};

// Configuration, address, unsupported operations and most channel errors.
inline constexpr int kDriverError = -1;
// A read or write before Start.
inline constexpr int kNotStartedError = -3;
// The socket could not be set up.
inline constexpr int kSocketError = -6;
// A value could not be converted for the device.
inline constexpr int kConversionError = -9;

inline constexpr DriverError kNotStarted{kNotStartedError, "Protocol not started"};
inline constexpr DriverError kWriteConversion{kConversionError, "write conversion error"};
inline constexpr DriverError kNoSocketFactory{kDriverError,
                                              "Internal error: ISocketFactory2 missing"};
inline constexpr DriverError kIllegalRead{kDriverError, "illegal memtype to read"};
inline constexpr DriverError kIllegalWrite{kDriverError, "illegal memtype to write"};
inline constexpr DriverError kReadOnlyWrite{kDriverError, "writing to read_only type"};
inline constexpr DriverError kWritePastEnd{kDriverError, "writing after the end of memory type"};
inline constexpr DriverError kTokenTooLong{kDriverError, "token too long"};
inline constexpr DriverError kTokenNotHex{kDriverError, "token to send must be in hex format"};
inline constexpr DriverError kProbeSocketFailed{kSocketError, "Can't open connection socket"};
inline constexpr DriverError kBadAdapterAddress{kSocketError, "Incorrect format of IP address"};
inline constexpr DriverError kAdapterLookupFailed{kSocketError, "Can't get IP adapter info"};

// Records error as the protocol's last error; returns false, so a failing
// path can end with `return Fail(protocol, error);`.
bool Fail(ProtocolBase& protocol, const DriverError& error);
