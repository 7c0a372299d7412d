// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/BaseConsole.h"

#include <array>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string_view>

#include "protlib/HexText.h"
#include "protlib/ProtocolBase.h"
#include "protlib/ScratchBuffer.h"
#include "protlib/TextUtils.h"

namespace {

// Tag values up to this many bytes are read and written without an
// allocation.
constexpr std::size_t kValueBytes = 64;

// Decodes text (two digits per byte, high digit first) into bytes, which holds
// text.size() / 2 bytes. False at the first character that is no digit.
bool DecodeHex(const std::string& text, unsigned char* bytes) {
  for (std::size_t i = 0; i + 1 < text.size(); i += 2) {
    const int high = hexDigitValue(text[i]);
    const int low = hexDigitValue(text[i + 1]);
    if (high < 0 || low < 0) {
      return false;
    }
    bytes[i / 2] = static_cast<unsigned char>((high << 4) | low);
  }
  return true;
}

}  // namespace

const char* BaseConsole::HelpText() {
  return "help - displays this message\n"
         "info - displays information about the protocol version\n"
         "xml  - displays the protocol xml description\n"
         "read uri - reads data pointed by uri string\n"
         "write uri hexData - writes data pointed by uri string\n"
         "lasterror - displays the last protocol error\n"
         "getmaxtm - displays the max time for executing a single read/write access\n";
}

void BaseConsole::CopyReply(char* out, int outSize, const char* text) {
  if (out == nullptr || outSize <= 0) {
    return;
  }
  std::strncpy(out, text == nullptr ? "" : text, static_cast<std::size_t>(outSize));
}

bool BaseConsole::Run(const char* command, char* out, int outSize) {
  if (command == nullptr || *command == '\0') {
    return false;
  }
  if (out == nullptr || outSize < 0) {
    outSize = 0;
  }
  std::vector<std::string> words;
  ProtUtilsN::ParseSubstrings(command, words, ' ');
  const std::string& name = words.front();
  if (name == "help") {
    CopyReply(out, outSize, HelpText());
  } else if (name == "info") {
    info(out, outSize);
  } else if (name == "xml") {
    CopyReply(out, outSize, protocol.GetXml());
  } else if (name == "lasterror") {
    CopyReply(out, outSize, protocol.GetLastErrorString());
  } else if (name == "read") {
    read(words, out, outSize);
  } else if (name == "write") {
    write(words, out, outSize);
  } else if (name == "getmaxtm") {
    getMaxTm(out, outSize);
  } else if (name == "deletetags") {
    protocol.DeleteTags();
  } else {
    return false;
  }
  return true;
}

void BaseConsole::info(char* out, int outSize) const {
  const int written = protocol.GetInfo(out, outSize);
  if (written >= 0 && written < outSize) {
    out[written] = '\0';
  }
}

void BaseConsole::getMaxTm(char* out, int outSize) {
  std::array<char, 48> reply{};
  // Any int fits the reply buffer, so the length is not needed.
  (void)std::snprintf(reply.data(), reply.size(), "maxtm = %d ms\n", protocol.GetMaxTm(nullptr));
  CopyReply(out, outSize, reply.data());
}

BaseConsole::TemporaryTag BaseConsole::createTag(const std::string& uri, char* out, int outSize) {
  TemporaryTag tag(protocol.CreateTag(uri.c_str()), TagRelease{&protocol});
  if (tag == nullptr) {
    CopyReply(out, outSize, protocol.GetLastErrorString());
  }
  return tag;
}

void BaseConsole::TagRelease::operator()(ITag* tag) const { owner->FreeTag(tag); }

// The value goes directly into out as two lower-case digits per byte; before
// each byte the room left is tested, and the digits stop when 4 or fewer
// characters remain. The line feed and the terminator follow as far as the
// room allows.
void BaseConsole::read(const std::vector<std::string>& words, char* out, int outSize) {
  if (words.size() != 2) {
    CopyReply(out, outSize, "error: missing parameter (URI string)\n");
    return;
  }
  const TemporaryTag tag = createTag(words[1], out, outSize);
  if (tag == nullptr) {
    return;
  }
  ScratchBuffer<kValueBytes> value(tag->GetVarLength());
  if (!protocol.Read(tag.get(), value.data())) {
    CopyReply(out, outSize, protocol.GetLastErrorString());
    return;
  }
  constexpr std::string_view kDigits = "0123456789abcdef";
  int position = 0;
  for (int i = 0; i < value.size() && outSize - position > 4; ++i) {
    out[position++] = kDigits[value.data()[i] >> 4];
    out[position++] = kDigits[value.data()[i] & 0x0F];
  }
  if (position < outSize) {
    out[position++] = '\n';
  }
  if (position < outSize) {
    out[position] = '\0';
  }
}

void BaseConsole::write(const std::vector<std::string>& words, char* out, int outSize) {
  if (words.size() != 3) {
    CopyReply(out, outSize, "error: missing parameters (URI string + data)\n");
    return;
  }
  const TemporaryTag tag = createTag(words[1], out, outSize);
  if (tag == nullptr) {
    return;
  }
  const std::string& data = words[2];
  const int length = tag->GetVarLength();
  if (length < 0 || data.size() != 2 * static_cast<std::size_t>(length)) {
    CopyReply(out, outSize, "error: incorrect length of data to write\n");
    return;
  }
  ScratchBuffer<kValueBytes> value(length);
  if (!DecodeHex(data, value.data())) {
    CopyReply(out, outSize, "error: incorrect hex data\n");
    return;
  }
  if (protocol.Write(tag.get(), value.data())) {
    CopyReply(out, outSize, "written ok\n");
  } else {
    CopyReply(out, outSize, protocol.GetLastErrorString());
  }
}
