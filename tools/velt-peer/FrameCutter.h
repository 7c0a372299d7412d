// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace veltpeer {

// Cuts received bytes into whole frames by a prefix and a suffix, markers
// included, so that an echo sends each frame back exactly as it came:
// - prefix and suffix: bytes before a prefix are skipped; a frame runs from
//   the prefix through the first suffix after it;
// - suffix only: a frame runs from the end of the previous one through the
//   next suffix;
// - prefix only: a frame runs from one prefix up to the next prefix; on a
//   stream, silence or the end of the connection also ends it (Flush);
// - neither: a stream frame is whatever one read delivered; a datagram is one
//   frame.
// A stream frame that grows beyond kMaxFrame bytes is dropped.
class FrameCutter {
 public:
  static constexpr std::size_t kMaxFrame = 65536;

  FrameCutter(std::string prefix, std::string suffix);

  bool Framed() const { return !prefix_.empty() || !suffix_.empty(); }

  // Stream: takes the next bytes and appends every frame they complete.
  void Feed(const char* data, std::size_t size, std::vector<std::string>& frames);
  // Stream: true while a prefix-only frame is open, which silence would end.
  bool HasOpenFrame() const;
  // Stream: ends an open prefix-only frame (after silence or at the end of
  // the connection) and appends it. Partial frames awaiting a suffix stay.
  void Flush(std::vector<std::string>& frames);
  // Stream: forgets everything (a new connection begins).
  void Reset();

  // Datagram: the frames of one datagram; nothing is carried over to the
  // next. Bytes after the last complete frame are dropped.
  std::vector<std::string> CutDatagram(const std::string& datagram) const;

 private:
  // Each step consumes one frame or state change from buffer_; false when
  // more bytes are needed.
  bool SkipOversized();
  bool FindStart();
  bool FindEnd(std::vector<std::string>& frames);
  void DropOversizedFrame();
  // Where the next search for a marker of the given size may begin so that a
  // marker split across two reads is still found.
  std::size_t ResumePoint(std::size_t markerSize) const;
  // Datagram: where the frame whose body begins at bodyStart ends (one past
  // its suffix, or the next prefix or the end without a suffix); npos when
  // its suffix is missing.
  std::size_t DatagramFrameEnd(const std::string& datagram, std::size_t bodyStart) const;

  const std::string prefix_;
  const std::string suffix_;
  std::string buffer_;
  bool inFrame_ = false;
  // Suffix-only framing after an oversized frame: skip through the next suffix.
  bool skipping_ = false;
  std::size_t scanFrom_ = 0;
};

}  // namespace veltpeer
