// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

#include "IProtocolFactory.h"
#include "velt-host/ProtocolHandle.h"
#include "velt-host/ValueShape.h"

namespace velthost {

// One running driver instance of the console: created through the plug-in's
// factory, named (SetIdent: its permanent-storage section), configured and
// started; stopped and deleted when the object goes.
class Instance {
 public:
  // The reply buffer of one console command.
  static constexpr int kReplyBytes = 64 * 1024;
  // The longest tag value, in bytes, that velt-host reads or writes, or lets
  // the instance's console read or write: buffers as long as the tag are
  // allocated for it.
  static constexpr int kLongestValue = 16 * 1024 * 1024;

  // Throws std::runtime_error naming what failed ("cannot configure NAME: "
  // and the protocol's last error, for instance).
  Instance(IProtocolFactory& factory, const std::string& name, const std::string& config);
  Instance(const Instance&) = delete;
  Instance& operator=(const Instance&) = delete;
  Instance(Instance&&) = delete;
  Instance& operator=(Instance&&) = delete;
  ~Instance();

  const std::string& Name() const { return name_; }
  IProtocol& Protocol() const { return handle_.Get(); }

  // Runs one command of the instance's console; reply receives its text (up
  // to its terminator, or the whole buffer when it fills it). Returns the
  // command's result.
  bool Command(const std::string& line, std::string& reply);
  // False with error set when line is a read or write command of the
  // instance's console (its words taken as that console takes them) whose
  // tag's value is longer than kLongestValue; such a line must not be run.
  bool CommandFits(const std::string& line, std::string& error);
  // Reads the tag at uri into value (the tag's length in bytes) and tells
  // its shape; false with error set when the address is refused or the read
  // fails.
  bool Read(const std::string& uri, ValueShape& shape, std::vector<unsigned char>& value,
            std::string& error);
  // Reads the tag at uri and formats its value as its data type.
  bool ReadText(const std::string& uri, std::string& text, std::string& error);
  // Parses text as the tag's data type and writes it.
  bool Write(const std::string& uri, const std::string& text, std::string& error);

 private:
  std::string LastError() const;
  // False with error set when the tag's value is longer than kLongestValue.
  static bool Fits(const ValueShape& shape, const std::string& verb, const std::string& uri,
                   std::string& error);

  std::string name_;
  ProtocolHandle handle_;
  bool started_ = false;
};

}  // namespace velthost
