// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/Instance.h"

#include <cstring>
#include <stdexcept>

#include "velt-host/ScopedTag.h"
#include "velt-host/TypedValue.h"

namespace velthost {

namespace {

// The words of a console command as the instance's console takes them: the
// text up to its first zero byte, split at every single blank, each word
// without surrounding blanks and tabs.
std::vector<std::string> ConsoleWords(const std::string& line) {
  const std::string text = line.substr(0, line.find('\0'));
  std::vector<std::string> words;
  std::size_t start = 0;
  for (;;) {
    const std::size_t blank = text.find(' ', start);
    const std::string word = text.substr(start, blank == std::string::npos ? blank : blank - start);
    const std::size_t first = word.find_first_not_of(" \t");
    words.push_back(first == std::string::npos
                        ? std::string()
                        : word.substr(first, word.find_last_not_of(" \t") - first + 1));
    if (blank == std::string::npos) {
      return words;
    }
    start = blank + 1;
  }
}

}  // namespace

Instance::Instance(IProtocolFactory& factory, const std::string& name, const std::string& config)
    : name_(name), handle_(factory) {
  IProtocol& protocol = handle_.Get();
  protocol.SetIdent(name.c_str());
  if (!protocol.Config(config.c_str())) {
    throw std::runtime_error("cannot configure " + name + ": " + LastError());
  }
  if (!protocol.Start()) {
    throw std::runtime_error("cannot start " + name + ": " + LastError());
  }
  started_ = true;
}

Instance::~Instance() {
  if (started_) {
    handle_.Get().Stop();
  }
}

std::string Instance::LastError() const {
  const char* const text = handle_.Get().GetLastErrorString();
  return text == nullptr ? std::string() : std::string(text);
}

// The reply buffer lives for one command only: kept per instance it would
// hold 64 KiB of every channel resident for nothing.
bool Instance::Command(const std::string& line, std::string& reply) {
  std::vector<char> buffer(kReplyBytes, '\0');
  const bool ok = handle_.Get().DoCommand(line.c_str(), buffer.data(), kReplyBytes);
  reply.assign(buffer.data(), strnlen(buffer.data(), buffer.size()));
  return ok;
}

bool Instance::Fits(const ValueShape& shape, const std::string& verb, const std::string& uri,
                    std::string& error) {
  if (shape.length <= kLongestValue) {
    return true;
  }
  error = "cannot " + verb + " " + uri + ": its value of " + std::to_string(shape.length) +
          " bytes is longer than velt-host's limit of " + std::to_string(kLongestValue) + " bytes";
  return false;
}

bool Instance::CommandFits(const std::string& line, std::string& error) {
  const std::vector<std::string> words = ConsoleWords(line);
  const bool read = words[0] == "read" && words.size() == 2;
  const bool write = words[0] == "write" && words.size() == 3;
  if (!read && !write) {
    return true;
  }
  const ScopedTag tag(handle_.Get(), words[1]);
  return tag.Get() == nullptr || Fits(tag.Shape(), words[0], words[1], error);
}

bool Instance::Read(const std::string& uri, ValueShape& shape, std::vector<unsigned char>& value,
                    std::string& error) {
  const ScopedTag tag(handle_.Get(), uri);
  if (tag.Get() == nullptr) {
    error = LastError();
    return false;
  }
  shape = tag.Shape();
  if (!Fits(shape, "read", uri, error)) {
    return false;
  }
  // One spare byte, so that even a tag of length 0 reads into a buffer.
  value.assign(static_cast<std::size_t>(shape.length < 0 ? 0 : shape.length) + 1, 0);
  if (!handle_.Get().Read(tag.Get(), value.data())) {
    error = "cannot read " + uri + ": " + LastError();
    return false;
  }
  value.pop_back();
  return true;
}

bool Instance::ReadText(const std::string& uri, std::string& text, std::string& error) {
  ValueShape shape;
  std::vector<unsigned char> value;
  if (!Read(uri, shape, value, error)) {
    return false;
  }
  text = TypedValue::Format(shape, value.data());
  return true;
}

bool Instance::Write(const std::string& uri, const std::string& text, std::string& error) {
  const ScopedTag tag(handle_.Get(), uri);
  if (tag.Get() == nullptr) {
    error = LastError();
    return false;
  }
  std::vector<unsigned char> value;
  if (!Fits(tag.Shape(), "write", uri, error) ||
      !TypedValue::Parse(tag.Shape(), text, value, error)) {
    return false;
  }
  value.push_back(0);
  if (!handle_.Get().Write(tag.Get(), value.data())) {
    error = "cannot write " + uri + ": " + LastError();
    return false;
  }
  return true;
}

}  // namespace velthost
