// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <memory>
#include <string>
#include <vector>

class ITag;
class ProtocolBase;

// The commands that every protocol answers at the host's diagnostic console:
// "help", "info", "xml", "lasterror", "read uri", "write uri hexData",
// "getmaxtm" and "deletetags". A driver answers its own commands first and
// passes the rest here.
//
// Replies are copied into the caller's buffer as strncpy copies them with the
// full buffer size: a reply of outSize characters or more fills the buffer
// without a terminator, a shorter one is followed by zero bytes up to outSize.
// Two replies are written in place instead, with no padding: "info" (the
// information text, then a terminator when there is room) and a successful
// "read" (two lower-case hexadecimal digits per byte while more than 4
// characters remain, then a line feed and a terminator as far as there is
// room). Nothing is ever written at or after out[outSize]; a negative outSize
// or a null buffer is taken as a buffer of no characters.
class BaseConsole {
 public:
  explicit BaseConsole(ProtocolBase& owner) : protocol(owner) {}

  // Runs one command; true when it was recognised, whatever its outcome.
  // False, with out untouched, for an unknown first word and for an empty or
  // null command text.
  bool Run(const char* command, char* out, int outSize);

  // The help text, one line per command, each ended by a line feed.
  static const char* HelpText();
  // strncpy(out, text, outSize) for a non-negative outSize; a null text
  // copies as the empty text.
  static void CopyReply(char* out, int outSize, const char* text);

 private:
  // Frees a command's temporary tag through the protocol.
  struct TagRelease {
    ProtocolBase* owner;
    void operator()(ITag* tag) const;
  };
  using TemporaryTag = std::unique_ptr<ITag, TagRelease>;

  // The tag a command addresses; null, with the last error as the reply,
  // when the address is refused. The tag never outlives the command.
  TemporaryTag createTag(const std::string& uri, char* out, int outSize);
  void info(char* out, int outSize) const;
  void read(const std::vector<std::string>& words, char* out, int outSize);
  void write(const std::vector<std::string>& words, char* out, int outSize);
  void getMaxTm(char* out, int outSize);

  ProtocolBase& protocol;
};
