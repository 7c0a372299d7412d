// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

// Whole-file reads and crash-safe whole-file replacement.
class DurableFile {
 public:
  enum class ReadResult { Read, Missing, Failed };

  // Reads the file at path into contents. Missing when it does not exist;
  // Failed with the reason in error when it cannot be read.
  static ReadResult Read(const std::string& path, std::string& contents, std::string& error);

  // Replaces the file at path with contents so that a crash or a kill at any
  // instant leaves either the old file or the new one, never a mix: the text
  // goes to a temporary file beside it, which is flushed to the disk, renamed
  // over path, and the folder is flushed so the rename itself is durable. An
  // existing file's permissions are kept; a new file is readable by its
  // owner only. True once the new file has taken the old one's place; false
  // with the reason in error when the old file is untouched (the temporary
  // file is then removed). When the folder cannot be flushed after the
  // rename the result is true and error still tells why.
  static bool Replace(const std::string& path, const std::string& contents, std::string& error);
};
