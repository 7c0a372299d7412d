// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/StreamFraming.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace {

const char* AsChars(const unsigned char* data) { return reinterpret_cast<const char*>(data); }

}  // namespace

StreamFraming::StreamFraming(std::string prefix, std::string suffix)
    : prefix_(std::move(prefix)), suffix_(std::move(suffix)) {
  // The accumulator never outgrows a dropped frame, or a prefix and one more
  // byte, so it is allocated once.
  accumulator_.reserve(std::max(kDroppedFrameLength, prefix_.size() + 1));
  Restart();
}

void StreamFraming::Restart() {
  accumulator_.clear();
  matched_ = 0;
  synchronised_ = prefix_.empty();
}

StreamFraming::Fed StreamFraming::Feed(const unsigned char* data, std::size_t length,
                                       TokenSink& sink) {
  std::size_t taken = 0;
  if (!synchronised_) {
    taken = Synchronise(data, length);
    if (!synchronised_) {
      return {taken, false};
    }
  }
  Fed body{};
  if (!suffix_.empty()) {
    body = CollectToSuffix(data + taken, length - taken, sink);
  } else if (!prefix_.empty()) {
    body = CollectToPrefix(data + taken, length - taken, sink);
  } else {
    body = CollectToGap(data + taken, length - taken);
  }
  return {taken + body.taken, body.passEnded};
}

void StreamFraming::Gap(TokenSink& sink) {
  if (synchronised_ && suffix_.empty() && accumulator_.size() > prefix_.size()) {
    sink.Token(accumulator_.data() + prefix_.size(), accumulator_.size() - prefix_.size());
  }
  Restart();
}

std::size_t StreamFraming::Synchronise(const unsigned char* data, std::size_t length) {
  const auto first = static_cast<unsigned char>(prefix_[0]);
  std::size_t k = 0;
  while (k < length) {
    if (matched_ == 0) {
      // Nothing matched: only the prefix's first byte can begin a match.
      const void* const hit = std::memchr(data + k, first, length - k);
      if (hit == nullptr) {
        return length;
      }
      k = static_cast<std::size_t>(static_cast<const unsigned char*>(hit) - data) + 1;
      matched_ = 1;
    } else {
      const auto byte = static_cast<char>(data[k++]);
      if (byte == prefix_[matched_]) {
        ++matched_;
      } else {
        matched_ = byte == prefix_[0] ? 1 : 0;
      }
    }
    if (matched_ == prefix_.size()) {
      synchronised_ = true;
      accumulator_.assign(prefix_);
      return k;
    }
  }
  return k;
}

std::size_t StreamFraming::Room() const {
  return accumulator_.size() < kDroppedFrameLength ? kDroppedFrameLength - accumulator_.size() : 1;
}

StreamFraming::Fed StreamFraming::CollectToSuffix(const unsigned char* data, std::size_t length,
                                                  TokenSink& sink) {
  const std::size_t count = std::min(length, Room());
  const std::size_t end = FindEnd(suffix_, prefix_.size() + suffix_.size(), data, count);
  if (end < count) {
    Emit(data, end + 1, prefix_.size(), suffix_.size(), sink);
    Restart();
    return {end + 1, true};
  }
  return {count, AppendDropping(data, count)};
}

StreamFraming::Fed StreamFraming::CollectToPrefix(const unsigned char* data, std::size_t length,
                                                  TokenSink& sink) {
  std::size_t taken = 0;
  for (;;) {
    const std::size_t count = std::min(length - taken, Room());
    // A closing prefix counts only once it does not overlap the leading one.
    const std::size_t end = FindEnd(prefix_, 2 * prefix_.size(), data + taken, count);
    if (end == count) {
      return {taken + count, AppendDropping(data + taken, count)};
    }
    Emit(data + taken, end + 1, prefix_.size(), prefix_.size(), sink);
    // The prefix that closed the token opens the next one.
    accumulator_.assign(prefix_);
    taken += end + 1;
    if (accumulator_.size() >= kDroppedFrameLength) {
      Restart();
      return {taken, true};
    }
  }
}

StreamFraming::Fed StreamFraming::CollectToGap(const unsigned char* data, std::size_t length) {
  const std::size_t count = std::min(length, Room());
  return {count, AppendDropping(data, count)};
}

bool StreamFraming::AppendDropping(const unsigned char* data, std::size_t length) {
  // The length is checked after a byte is taken, so a prefix that fills a
  // frame by itself still takes one byte of body first.
  if (length == 0) {
    return false;
  }
  accumulator_.append(AsChars(data), length);
  if (accumulator_.size() < kDroppedFrameLength) {
    return false;
  }
  Restart();
  return true;
}

std::size_t StreamFraming::FindEnd(const std::string& marker, std::size_t minimum,
                                   const unsigned char* data, std::size_t length) const {
  // Only a byte equal to the marker's last one can complete it.
  const auto last = static_cast<unsigned char>(marker.back());
  for (std::size_t k = 0; k < length; ++k) {
    const void* const hit = std::memchr(data + k, last, length - k);
    if (hit == nullptr) {
      return length;
    }
    k = static_cast<std::size_t>(static_cast<const unsigned char*>(hit) - data);
    if (accumulator_.size() + k + 1 >= minimum && EndsWithAt(marker, data, k)) {
      return k;
    }
  }
  return length;
}

bool StreamFraming::EndsWithAt(const std::string& marker, const unsigned char* data,
                               std::size_t at) const {
  // The marker's tail lies in data up to at, its head (if any) at the end of
  // the accumulator.
  const std::size_t inData = std::min(marker.size(), at + 1);
  const std::size_t inAccumulator = marker.size() - inData;
  if (std::memcmp(marker.data() + inAccumulator, data + at + 1 - inData, inData) != 0) {
    return false;
  }
  return inAccumulator == 0 || (accumulator_.size() >= inAccumulator &&
                                accumulator_.compare(accumulator_.size() - inAccumulator,
                                                     inAccumulator, marker, 0, inAccumulator) == 0);
}

void StreamFraming::Emit(const unsigned char* data, std::size_t count, std::size_t head,
                         std::size_t tail, TokenSink& sink) {
  if (accumulator_.size() == head && count >= tail) {
    // The body lies in data alone: hand it over without copying it.
    sink.Token(AsChars(data), count - tail);
    return;
  }
  accumulator_.append(AsChars(data), count);
  sink.Token(accumulator_.data() + head, accumulator_.size() - head - tail);
}
