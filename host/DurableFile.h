// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <string>

// Whole-file reads of bounded size and crash-safe whole-file replacement.
// Error texts name what failed and the system's reason ("cannot write: No
// space left on device"); callers add the path.
class DurableFile {
 public:
  enum class ReadResult { Read, Missing, Failed };

  // Reads the regular file at path into contents. Missing when it does not
  // exist; Failed with the reason in error when it cannot be read, is not a
  // regular file (a FIFO or a device is refused without waiting on it or
  // reading it) or holds more than largest bytes (nothing beyond largest + 1
  // bytes is read).
  static ReadResult Read(const std::string& path, std::size_t largest, std::string& contents,
                         std::string& error);

  // Replaces the file at path with contents so that a crash or a kill at any
  // instant leaves either the old file or the new one, never a mix: the text
  // goes to a temporary file beside it (path + ".tmp-XXXXXX"), which is
  // flushed to the disk, renamed over path, and the folder is flushed so the
  // rename itself is durable. An existing file's permissions are kept; a new
  // file is readable by its owner only. An existing path that is not a
  // regular file, or a file that is read-only (no write permission bit set,
  // or not writable by this process), is not replaced. True once the new
  // file has taken the old one's place; false with the reason in error when
  // the old file is untouched (the temporary file is then removed). When
  // the folder cannot be flushed after the rename the result is true and
  // error still tells why.
  static bool Replace(const std::string& path, const std::string& contents, std::string& error);

  // Removes the temporary files that replacements of path left behind when
  // they were killed (path + ".tmp-" and six letters or digits, regular
  // files only). Returns how many were removed.
  static int SweepTemporaries(const std::string& path);
};
