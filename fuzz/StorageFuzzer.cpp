// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The reference host's storage file (StorageFormat, HostPermanentStorage)
// and the values a channel reads back from it when it starts.
//
// Input: the text of a storage file.
//
// A refused file names a line of the input. An accepted one writes back to
// a text that parses to the same values and writes back the same again.
// Loaded from a file, the storage answers each getter as the value converts;
// a channel started with a section's name as its identity works with the
// values stored there (texts of more than 255 bytes read as empty, as the
// plug-in reads them) and with its configuration where nothing is stored.

#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <system_error>

#include "BoundModule.h"
#include "HostPermanentStorage.h"
#include "Require.h"
#include "StorageError.h"
#include "StorageFormat.h"
#include "driver/Protocol_VELT.h"

namespace {

const char kPath[] = "fuzz.ini";
const char kConfig[] =
    "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=5000 localPort=6000 "
    "broadcastType=Global rx_prefix=02 rx_suffix=03 tx_prefix=04 tx_suffix=05 gap=7 "
    "hex_tokens=false token_queue_size=9";
// The plug-in reads texts into a buffer of this many bytes.
constexpr std::size_t kTextBuffer = 256;
constexpr std::size_t kMostSections = 3;

// A folder of this process for the storage file, removed at exit.
class ScratchFile {
 public:
  ScratchFile() {
    if (::mkdtemp(folder_.data()) == nullptr) {
      std::abort();
    }
  }
  ScratchFile(const ScratchFile&) = delete;
  ScratchFile& operator=(const ScratchFile&) = delete;
  ScratchFile(ScratchFile&&) = delete;
  ScratchFile& operator=(ScratchFile&&) = delete;
  ~ScratchFile() {
    std::error_code ignored;
    std::filesystem::remove_all(folder_, ignored);
  }
  std::string Path() const { return folder_ + "/storage.ini"; }

 private:
  std::string folder_ = "/tmp/velt-fuzz-storage-XXXXXX";
};

const std::string& FilePath() {
  static const ScratchFile file;
  static const std::string path = file.Path();
  return path;
}

bool HoldsZeroByte(const std::string& text) { return text.find('\0') != std::string::npos; }

StoredSections WithoutEmptySections(StoredSections sections) {
  for (auto section = sections.begin(); section != sections.end();) {
    section = section->second.empty() ? sections.erase(section) : std::next(section);
  }
  return sections;
}

void CheckRefusal(const StorageError& error, const std::string& text) {
  const auto lines = static_cast<int>(std::count(text.begin(), text.end(), '\n')) + 1;
  Require(error.Path() == kPath, "a refusal names the file");
  Require(error.Line() >= 1 && error.Line() <= lines, "a refusal names a line of the file");
  Require(!error.Reason().empty() && error.Reason().find('\n') == std::string::npos,
          "a refusal gives its reason on one line");
}

void CheckWrittenBack(const StoredSections& sections) {
  const std::string written = StorageFormat::Serialize(sections);
  StoredSections again;
  try {
    again = StorageFormat::Parse(written, kPath);
  } catch (const StorageError&) {
    Require(false, "what the storage writes parses");
  }
  Require(again == WithoutEmptySections(sections), "what is written back holds the same values");
  Require(StorageFormat::Serialize(again) == written, "writing back again gives the same text");
}

// What the plug-in reads for name, or fallback when nothing is stored.
std::string TextRead(const StoredEntries& entries, const std::string& name,
                     const std::string& fallback) {
  const auto found = entries.find(name);
  if (found == entries.end()) {
    return fallback;
  }
  // The plug-in takes the text up to its first zero byte.
  const std::string text = found->second.AsText();
  return text.size() < kTextBuffer ? std::string(text.c_str()) : std::string();
}

int NumberRead(const StoredEntries& entries, const std::string& name, int fallback) {
  const auto found = entries.find(name);
  return found == entries.end() ? fallback : found->second.AsInteger();
}

bool FlagRead(const StoredEntries& entries, const std::string& name, bool fallback) {
  const auto found = entries.find(name);
  return found == entries.end() ? fallback : found->second.AsBoolean();
}

void CheckGetters(HostPermanentStorage& storage, const StoredSections& sections) {
  for (const auto& [section, entries] : sections) {
    if (HoldsZeroByte(section)) {
      continue;  // the interface's C texts cannot name it
    }
    for (const auto& [name, value] : entries) {
      if (HoldsZeroByte(name)) {
        continue;
      }
      const char* const s = section.c_str();
      const char* const n = name.c_str();
      Require(storage.HasValue(s, n) != 0, "every stored name is found");
      Require(storage.GetIntValue(s, n) == value.AsInteger() &&
                  storage.GetBoolValue(s, n) == value.AsBoolean() &&
                  std::string(storage.GetStringValue(s, n)) == value.AsText().c_str(),
              "a getter answers the stored value converted to its type");
    }
  }
}

// Starts a channel named section over storage and compares its settings
// with the stored values.
void CheckChannelStart(HostPermanentStorage& storage, const std::string& section,
                       const StoredSections& sections) {
  const BoundModule module(storage);
  Protocol_VELT channel;
  // The identity is a C text, cut at a zero byte; an empty one is the
  // driver's name.
  channel.SetIdent(section.c_str());
  const auto found = sections.find(channel.GetIdent());
  const StoredEntries entries = found == sections.end() ? StoredEntries() : found->second;
  Require(channel.Config(kConfig), "the configuration is accepted");
  channel.Start();
  const ChannelSettings read = channel.getSettings();
  Require(read.text(Setting::SocketType) == TextRead(entries, "socket_type", "UDP") &&
              read.text(Setting::RemoteIp) == TextRead(entries, "remote_ip_address", "127.0.0.1") &&
              read.text(Setting::LocalIp) == TextRead(entries, "local_ip_address", "0.0.0.0") &&
              read.text(Setting::BroadcastType) == TextRead(entries, "broadcast_type", "Global") &&
              read.text(Setting::RxPrefix) == TextRead(entries, "rx_prefix", "02") &&
              read.text(Setting::RxSuffix) == TextRead(entries, "rx_suffix", "03") &&
              read.text(Setting::TxPrefix) == TextRead(entries, "tx_prefix", "04") &&
              read.text(Setting::TxSuffix) == TextRead(entries, "tx_suffix", "05"),
          "a channel starts with the stored texts, or its configuration's");
  Require(read.number(Setting::RemotePort) == NumberRead(entries, "remote_port", 5000) &&
              read.number(Setting::LocalPort) == NumberRead(entries, "local_port", 6000) &&
              read.number(Setting::Gap) == NumberRead(entries, "gap", 7) &&
              read.number(Setting::TokenQueueSize) == NumberRead(entries, "token_queue_size", 9) &&
              read.flag(Setting::HexTokens) == FlagRead(entries, "hex_tokens", false),
          "a channel starts with the stored numbers and flag, or its configuration's");
  channel.Stop();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);
  StoredSections sections;
  try {
    sections = StorageFormat::Parse(text, kPath);
  } catch (const StorageError& error) {
    CheckRefusal(error, text);
    return 0;
  }
  CheckWrittenBack(sections);
  std::ofstream(FilePath(), std::ios::binary | std::ios::trunc) << text;
  HostPermanentStorage storage(FilePath());
  CheckGetters(storage, sections);
  std::size_t started = 0;
  for (const auto& entry : sections) {
    if (started++ == kMostSections) {
      break;
    }
    CheckChannelStart(storage, entry.first, sections);
  }
  CheckChannelStart(storage, "VELT", sections);
  return 0;
}
