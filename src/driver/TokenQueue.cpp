// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/TokenQueue.h"

#include <string_view>
#include <utility>

#include "IMultiTask2.h"

namespace {

// The ring's size when it is first needed.
constexpr std::size_t kInitialSlots = 16;
// An emptied ring larger than this is given back.
constexpr std::size_t kKeptSlots = 64;

}  // namespace

TokenQueue::Guard::Guard(TokenQueue& queue) : queue_(queue) {
  if (queue_.queueLock_ != nullptr) {
    queue_.queueLock_->Lock();
  }
}

TokenQueue::Guard::~Guard() {
  if (queue_.queueLock_ != nullptr) {
    queue_.queueLock_->Unlock();
  }
}

void TokenQueue::Guard::addToken(const char* data, std::size_t length) {
  if (queue_.count_ != 0 && queue_.count_ >= queue_.bound_) {
    PopFront();
  }
  std::string& slot = queue_.NextSlot();
  if (!queue_.hex_) {
    slot.assign(data, length);
  } else {
    constexpr std::string_view kDigits = "0123456789ABCDEF";
    slot.resize(length * 2);
    for (std::size_t i = 0; i < length; ++i) {
      const auto byte = static_cast<unsigned char>(data[i]);
      slot[2 * i] = kDigits[byte >> 4U];
      slot[2 * i + 1] = kDigits[byte & 0x0FU];
    }
  }
  ++queue_.count_;
}

void TokenQueue::Guard::setRules(int tokenQueueSize, bool hexTokens) {
  queue_.bound_ = static_cast<unsigned int>(tokenQueueSize);
  queue_.hex_ = hexTokens;
}

void TokenQueue::Guard::PopFront() {
  if (queue_.count_ == 0) {
    return;
  }
  std::string& slot = queue_.slots_[queue_.head_];
  if (slot.capacity() > kKeptCapacity) {
    std::string().swap(slot);
  } else {
    slot.clear();
  }
  queue_.head_ = (queue_.head_ + 1) & (queue_.slots_.size() - 1);
  --queue_.count_;
  if (queue_.count_ == 0 && queue_.slots_.size() > kKeptSlots) {
    Discard();
  }
}

void TokenQueue::Guard::Clear() { Discard(); }

void TokenQueue::Guard::Discard() {
  if (discarded_.empty()) {
    discarded_.swap(queue_.slots_);
  } else {
    queue_.slots_.clear();
  }
  queue_.head_ = 0;
  queue_.count_ = 0;
}

std::string& TokenQueue::NextSlot() {
  if (count_ == slots_.size()) {
    std::vector<std::string> grown(slots_.empty() ? kInitialSlots : slots_.size() * 2);
    for (std::size_t i = 0; i < count_; ++i) {
      grown[i] = std::move(slots_[(head_ + i) & (slots_.size() - 1)]);
    }
    slots_ = std::move(grown);
    head_ = 0;
  }
  return slots_[(head_ + count_) & (slots_.size() - 1)];
}
