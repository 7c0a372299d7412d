// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/FrameCutter.h"

#include <algorithm>
#include <utility>

namespace veltpeer {

FrameCutter::FrameCutter(std::string prefix, std::string suffix)
    : prefix_(std::move(prefix)), suffix_(std::move(suffix)) {}

void FrameCutter::Feed(const char* data, std::size_t size, std::vector<std::string>& frames) {
  if (size == 0) {
    return;
  }
  if (!Framed()) {
    frames.emplace_back(data, size);
    return;
  }
  buffer_.append(data, size);
  while (SkipOversized() && (inFrame_ || FindStart()) && FindEnd(frames)) {
  }
  if (inFrame_ && buffer_.size() > kMaxFrame) {
    DropOversizedFrame();
  }
}

bool FrameCutter::HasOpenFrame() const {
  return !prefix_.empty() && suffix_.empty() && inFrame_ && !buffer_.empty();
}

void FrameCutter::Flush(std::vector<std::string>& frames) {
  if (HasOpenFrame()) {
    frames.push_back(std::move(buffer_));
    buffer_.clear();
    inFrame_ = false;
    scanFrom_ = 0;
  }
}

void FrameCutter::Reset() {
  buffer_.clear();
  inFrame_ = false;
  skipping_ = false;
  scanFrom_ = 0;
}

bool FrameCutter::SkipOversized() {
  if (!skipping_) {
    return true;
  }
  const std::size_t end = buffer_.find(suffix_);
  if (end == std::string::npos) {
    buffer_.erase(0, buffer_.size() - std::min(buffer_.size(), suffix_.size() - 1));
    return false;
  }
  buffer_.erase(0, end + suffix_.size());
  skipping_ = false;
  return true;
}

bool FrameCutter::FindStart() {
  scanFrom_ = prefix_.size();
  if (prefix_.empty()) {
    if (buffer_.empty()) {
      return false;
    }
    inFrame_ = true;
    return true;
  }
  const std::size_t start = buffer_.find(prefix_);
  if (start == std::string::npos) {
    // Keep what could be the beginning of a prefix split across reads.
    buffer_.erase(0, buffer_.size() - std::min(buffer_.size(), prefix_.size() - 1));
    return false;
  }
  buffer_.erase(0, start);
  inFrame_ = true;
  return true;
}

bool FrameCutter::FindEnd(std::vector<std::string>& frames) {
  // With a suffix the frame ends after it; with a prefix only, the next
  // prefix begins the next frame and stays in the buffer.
  const std::string& marker = suffix_.empty() ? prefix_ : suffix_;
  const std::size_t found = buffer_.find(marker, std::max(scanFrom_, prefix_.size()));
  if (found == std::string::npos) {
    scanFrom_ = ResumePoint(marker.size());
    return false;
  }
  const std::size_t end = suffix_.empty() ? found : found + suffix_.size();
  frames.push_back(buffer_.substr(0, end));
  buffer_.erase(0, end);
  inFrame_ = suffix_.empty();
  scanFrom_ = prefix_.size();
  return true;
}

void FrameCutter::DropOversizedFrame() {
  buffer_.clear();
  inFrame_ = false;
  scanFrom_ = 0;
  // Without a prefix the rest of the dropped frame would pass for a frame of
  // its own, so it is skipped through its suffix.
  skipping_ = prefix_.empty();
}

std::size_t FrameCutter::ResumePoint(std::size_t markerSize) const {
  const std::size_t keep = markerSize - 1;
  const std::size_t from = buffer_.size() > keep ? buffer_.size() - keep : 0;
  return std::max(from, prefix_.size());
}

std::size_t FrameCutter::DatagramFrameEnd(const std::string& datagram,
                                          std::size_t bodyStart) const {
  if (suffix_.empty()) {
    return std::min(datagram.find(prefix_, bodyStart), datagram.size());
  }
  const std::size_t found = datagram.find(suffix_, bodyStart);
  return found == std::string::npos ? std::string::npos : found + suffix_.size();
}

std::vector<std::string> FrameCutter::CutDatagram(const std::string& datagram) const {
  if (!Framed()) {
    return {datagram};
  }
  std::vector<std::string> frames;
  std::size_t position = 0;
  while (position < datagram.size()) {
    std::size_t start = position;
    if (!prefix_.empty()) {
      start = datagram.find(prefix_, position);
      if (start == std::string::npos) {
        break;
      }
    }
    const std::size_t end = DatagramFrameEnd(datagram, start + prefix_.size());
    if (end == std::string::npos) {
      break;
    }
    frames.push_back(datagram.substr(start, end - start));
    position = end;
  }
  return frames;
}

}  // namespace veltpeer
