// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "FramingReference.h"

// Runs the channel's framers and the one-byte reference (FramingReference)
// over the same received data, for differential tests and the framing fuzz
// target.
namespace framing_reference {

// The tokens of each pass, pass by pass.
using Passes = std::vector<Tokens>;

// Reference passes until the stream is used up.
Passes ReferencePasses(const Stream& stream, const std::string& prefix, const std::string& suffix);

// The channel's stream receiver over the same stream with a receive buffer of
// bufferSize bytes: each receive delivers the rest of the current piece, cut
// to the buffer, or a silence. Before each receive the pass asks its gate,
// which answers the next entry of interrupts (false past the end); a pass
// ended that way is not a pass of its own, its tokens count to the pass that
// goes on.
Passes ReceiverPasses(const Stream& stream, const std::string& prefix, const std::string& suffix,
                      std::size_t bufferSize, const std::vector<bool>& interrupts);

// The channel's datagram framer over one datagram.
Tokens FramerDatagram(const std::string& datagram, const std::string& prefix,
                      const std::string& suffix);

}  // namespace framing_reference
