// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/TokenEmitter.h"

#include <string_view>

namespace veltpeer {

namespace {

constexpr std::string_view kCounterPlaceholder = "{n}";

TokenEmitter::Clock::duration PeriodOf(double rate) {
  if (rate <= 0) {
    return TokenEmitter::Clock::duration::zero();
  }
  return std::chrono::duration_cast<TokenEmitter::Clock::duration>(
      std::chrono::duration<double>(1.0 / rate));
}

}  // namespace

TokenEmitter::TokenEmitter(const PeerOptions& options)
    : count_(options.emitCount),
      period_(PeriodOf(options.rate)),
      prefix_(options.txPrefix),
      suffix_(options.txSuffix),
      payload_(options.payload),
      counter_(options.payloadCounter) {}

void TokenEmitter::Begin(Clock::time_point now) {
  begun_ = true;
  due_ = now;
}

TokenEmitter::Clock::time_point TokenEmitter::Due() const {
  return begun_ && Active() ? due_ : Clock::time_point::max();
}

std::string TokenEmitter::Next() {
  ++emitted_;
  due_ += period_;
  return prefix_ + Payload(emitted_) + suffix_;
}

std::string TokenEmitter::Payload(std::uint64_t number) const {
  if (!counter_) {
    return payload_;
  }
  const std::string digits = std::to_string(number);
  std::string out;
  std::size_t from = 0;
  for (;;) {
    const std::size_t at = payload_.find(kCounterPlaceholder, from);
    if (at == std::string::npos) {
      break;
    }
    out.append(payload_, from, at - from);
    out += digits;
    from = at + kCounterPlaceholder.size();
  }
  out.append(payload_, from);
  return out;
}

}  // namespace veltpeer
