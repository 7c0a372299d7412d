// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

#include "xmlblock/FileDescriptor.h"

// Replaces a file's content in one step: the text goes to a temporary file in
// the same directory, which is flushed to disk and then renamed over the
// target. A reader, or a build that is interrupted, sees either the old file
// or the complete new one, never a half-written one.
//
// Every failure throws std::runtime_error "cannot write 'PATH': STEP: REASON".
// Until commit succeeds, the destructor removes the temporary file and the
// target is left as it was.
class AtomicFile {
 public:
  // Creates the temporary file next to path.
  explicit AtomicFile(const std::string& path);
  AtomicFile(const AtomicFile&) = delete;
  AtomicFile& operator=(const AtomicFile&) = delete;
  AtomicFile(AtomicFile&&) = delete;
  AtomicFile& operator=(AtomicFile&&) = delete;
  ~AtomicFile();

  // Appends to the temporary file.
  void write(const std::string& content);
  // Flushes and closes the temporary file and renames it over the target.
  void commit();

  // The whole sequence for one content.
  static void Write(const std::string& path, const std::string& content);

 private:
  [[noreturn]] void fail(const char* step, int error) const;

  std::string target;
  std::string temporary;
  FileDescriptor file;
  bool committed = false;
};
