// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/Instance.h"

#include <cstring>
#include <stdexcept>

#include "velt-host/ScopedTag.h"
#include "velt-host/TypedValue.h"

namespace velthost {

Instance::Instance(IProtocolFactory& factory, const std::string& name, const std::string& config)
    : name_(name), handle_(factory), reply_(kReplyBytes) {
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

bool Instance::Command(const std::string& line, std::string& reply) {
  reply_[0] = '\0';
  const bool ok = handle_.Get().DoCommand(line.c_str(), reply_.data(), kReplyBytes);
  reply.assign(reply_.data(), strnlen(reply_.data(), reply_.size()));
  return ok;
}

bool Instance::Read(const std::string& uri, ValueShape& shape, std::vector<unsigned char>& value,
                    std::string& error) {
  const ScopedTag tag(handle_.Get(), uri);
  if (tag.Get() == nullptr) {
    error = LastError();
    return false;
  }
  shape = tag.Shape();
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
  if (!TypedValue::Parse(tag.Shape(), text, value, error)) {
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
