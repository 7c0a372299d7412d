// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/PeerCommandLine.h"

#include <sys/socket.h>

#include <algorithm>
#include <array>
#include <limits>

#include "velt-peer/Endpoint.h"
#include "velt-peer/HexText.h"
#include "velt-peer/NumberText.h"

// The build gives the project's version.
#ifndef VELT_VERSION
#error "VELT_VERSION must be defined"
#endif

namespace veltpeer {

namespace {

constexpr std::uint64_t kMaxMilliseconds = 3600000;
constexpr std::uint64_t kMaxCount = std::numeric_limits<std::uint64_t>::max() - 1;
constexpr std::uint64_t kMaxChunk = 1000000000;
constexpr double kMaxRate = 1000000;
constexpr double kMinRate = 0.001;
constexpr double kMaxSeconds = 31536000;

constexpr std::array<const char*, 19> kValueOptions = {
    "--bind",        "--port",           "--to",         "--rx-prefix",  "--rx-suffix",
    "--gap",         "--emit",           "--rate",       "--prefix",     "--suffix",
    "--payload",     "--payload-hex",    "--delay",      "--chunk",      "--chunk-delay",
    "--close-after", "--close-after-ms", "--exit-after", "--max-seconds"};
constexpr std::array<const char*, 3> kFlagOptions = {"--echo", "--text", "--count"};

template <std::size_t N>
bool Listed(const std::string& name, const std::array<const char*, N>& names) {
  return std::find(names.begin(), names.end(), name) != names.end();
}

constexpr const char* kUsage =
    R"(Usage: velt-peer tcp|udp [options]
A device simulator for the Velt Conduit driver. With tcp it listens and
serves one client at a time; with udp it binds one socket. It prints what
arrives, and echoes, emits tokens or misbehaves as the options ask.

Socket:
  --bind ADDR          local address to bind (default 127.0.0.1)
  --port N             local port 0..65535; 0 picks a free one (default 0)
  --to HOST:PORT       udp: where emitted datagrams go (default: the sender of
                       the last datagram received; none are sent before one)
Receiving:
  --rx-prefix HEX      received frames start with these bytes
  --rx-suffix HEX      received frames end with these bytes
  --gap MS             tcp, prefix without suffix: silence that ends a frame
                       (default 500)
  --echo               send every received frame back whole (udp: to its sender)
  --text               print frames as text instead of hex
  --count              print no frame lines, only the totals at the end
Emitting:
  --emit N|forever     emit N tokens (tcp: while a client is connected)
  --rate PER_SECOND    tokens per second, 0 for as fast as possible (default 1)
  --prefix HEX         bytes sent before each token's payload
  --suffix HEX         bytes sent after each token's payload
  --payload TEXT       the payload; {n} becomes the token's number, from 1
                       (default "token {n}")
  --payload-hex HEX    the payload as bytes
Awkward device:
  --delay MS           pause before each echo and each emitted token
  --chunk N            split every write into pieces of N bytes (udp: one
                       datagram per piece)
  --chunk-delay MS     pause between the pieces of a write
  --close-after N      tcp: reset the connection after N frames on it
  --close-after-ms MS  tcp: reset the connection MS after it was accepted
Run limits:
  --exit-after N       end after N frames
  --max-seconds S      end after S seconds (decimals allowed)
  --help               print this help and exit
  --version            print the version and exit

HEX is pairs of hex digits in either case; "none" means no bytes. Options
take their value as the next argument or after "=" (--port=5000). A frame is
counted when it arrives whole or is emitted; an echo belongs to the frame it
answers. Without markers a tcp frame is what one read returns and a udp frame
is one datagram.

Output on stdout, one line per event, flushed at once:
  velt-peer: listening tcp ADDR:PORT    always the first line (udp: velt-peer:
                                        bound udp ADDR:PORT)
  connected ADDR:PORT                   tcp: a client was accepted
  rx HEX                                a frame arrived (rx TEXT with --text)
  tx HEX                                a frame was sent (tx TEXT with --text)
  closed                                tcp: the connection ended
  reset                                 tcp: velt-peer reset the connection
  totals rx_frames=N rx_bytes=N tx_frames=N tx_bytes=N connections=N
                                        with --count, at the end
HEX output is upper case. TEXT shows printable ASCII as is, a backslash as \\
and any other byte as \xHH.

Errors go to stderr. Exit status: 0 after SIGINT, SIGTERM or a run limit;
1 on a runtime error (such as an address in use); 2 on a bad command line.
)";

}  // namespace

const char* PeerCommandLine::Usage() { return kUsage; }

std::string PeerCommandLine::Version() { return std::string("velt-peer ") + VELT_VERSION; }

bool PeerCommandLine::Parse(const std::vector<std::string>& arguments) {
  for (const std::string& argument : arguments) {
    if (argument == "--help" || argument == "-h") {
      action_ = Action::kHelp;
      return true;
    }
    if (argument == "--version" || argument == "-V") {
      action_ = Action::kVersion;
      return true;
    }
  }
  action_ = Action::kRun;
  return Collect(arguments) && Interpret() && Combine();
}

bool PeerCommandLine::Fail(const std::string& error) {
  error_ = error;
  return false;
}

bool PeerCommandLine::Collect(const std::vector<std::string>& arguments) {
  for (std::size_t i = 0; i < arguments.size(); ++i) {
    const std::string& argument = arguments[i];
    if (argument.size() < 2 || argument[0] != '-') {
      if (!transport_.empty()) {
        return Fail("unexpected argument '" + argument + "'");
      }
      transport_ = argument;
      continue;
    }
    const std::size_t equals = argument.find('=');
    const std::string name = argument.substr(0, equals);
    const bool takesValue = Listed(name, kValueOptions);
    if (!takesValue && !Listed(name, kFlagOptions)) {
      return Fail("unknown option '" + name + "'");
    }
    if (values_.count(name) != 0) {
      return Fail("option " + name + " given twice");
    }
    if (!takesValue) {
      if (equals != std::string::npos) {
        return Fail("option " + name + " takes no value");
      }
      values_[name] = std::string();
    } else if (equals != std::string::npos) {
      values_[name] = argument.substr(equals + 1);
    } else if (i + 1 < arguments.size()) {
      values_[name] = arguments[++i];
    } else {
      return Fail("option " + name + " needs a value");
    }
  }
  if (transport_.empty()) {
    return Fail("missing transport: tcp or udp");
  }
  if (transport_ != "tcp" && transport_ != "udp") {
    return Fail("unknown transport '" + transport_ + "' (tcp or udp expected)");
  }
  options_.transport = transport_ == "tcp" ? Transport::kTcp : Transport::kUdp;
  return true;
}

bool PeerCommandLine::Interpret() {
  PeerOptions& o = options_;
  o.echo = Has("--echo");
  text_ = Has("--text");
  countOnly_ = Has("--count");
  if (Has("--bind")) {
    o.bindAddress = values_["--bind"];
    if (o.bindAddress.empty()) {
      return Fail("bad value for --bind: an address is needed");
    }
  }
  std::uint64_t number = 0;
  if (Has("--port")) {
    if (!NumberText::ParseUnsigned(values_["--port"], 65535, number)) {
      return Fail("bad port '" + values_["--port"] + "' (0..65535 expected)");
    }
    o.port = static_cast<std::uint16_t>(number);
  }
  if (Has("--to")) {
    o.to = values_["--to"];
    Endpoint destination;
    std::string error;
    if (!Endpoint::ParseHostPort(o.to, SOCK_DGRAM, destination, error)) {
      return Fail("bad value for --to: " + error);
    }
  }
  if (!ReadHex("--rx-prefix", o.rxPrefix) || !ReadHex("--rx-suffix", o.rxSuffix) ||
      !ReadHex("--prefix", o.txPrefix) || !ReadHex("--suffix", o.txSuffix) ||
      !ReadMilliseconds("--gap", 1, o.gapMs) || !ReadMilliseconds("--delay", 0, o.delayMs) ||
      !ReadMilliseconds("--chunk-delay", 0, o.chunkDelayMs) ||
      !ReadMilliseconds("--close-after-ms", 1, o.closeAfterMs)) {
    return false;
  }
  if (Has("--emit")) {
    if (values_["--emit"] == "forever") {
      o.emitCount = PeerOptions::kForever;
    } else if (!ReadCount("--emit", 1, kMaxCount, o.emitCount,
                          "a count of 1 or more, or forever")) {
      return false;
    }
  }
  if (Has("--rate")) {
    double rate = 0;
    if (!NumberText::ParseDecimal(values_["--rate"], kMaxRate, rate) ||
        (rate != 0 && rate < kMinRate)) {
      return Fail("bad value for --rate: '" + values_["--rate"] +
                  "' (0, or 0.001..1000000 tokens per second, expected)");
    }
    o.rate = rate;
  }
  if (Has("--payload")) {
    o.payload = values_["--payload"];
    o.payloadCounter = true;
  }
  if (Has("--payload-hex")) {
    if (!ReadHex("--payload-hex", o.payload)) {
      return false;
    }
    o.payloadCounter = false;
  }
  if (Has("--chunk")) {
    if (!ReadCount("--chunk", 1, kMaxChunk, number, "1..1000000000 bytes")) {
      return false;
    }
    o.chunkBytes = static_cast<std::size_t>(number);
  }
  if (!ReadCount("--close-after", 1, kMaxCount, o.closeAfterFrames, "a count of 1 or more") ||
      !ReadCount("--exit-after", 1, kMaxCount, o.exitAfterFrames, "a count of 1 or more")) {
    return false;
  }
  if (Has("--max-seconds")) {
    double seconds = 0;
    if (!NumberText::ParseDecimal(values_["--max-seconds"], kMaxSeconds, seconds) || seconds <= 0) {
      return Fail("bad value for --max-seconds: '" + values_["--max-seconds"] +
                  "' (more than 0, at most 31536000, expected)");
    }
    o.maxSeconds = seconds;
  }
  return true;
}

bool PeerCommandLine::Combine() {
  const bool tcp = options_.transport == Transport::kTcp;
  if (tcp && Has("--to")) {
    return Fail("--to applies to udp only");
  }
  for (const char* name : {"--close-after", "--close-after-ms"}) {
    if (!tcp && Has(name)) {
      return Fail(std::string(name) + " applies to tcp only");
    }
  }
  for (const char* name : {"--rate", "--prefix", "--suffix", "--payload", "--payload-hex"}) {
    if (Has(name) && !Has("--emit")) {
      return Fail(std::string(name) + " needs --emit");
    }
  }
  if (Has("--payload") && Has("--payload-hex")) {
    return Fail("--payload and --payload-hex exclude each other");
  }
  if (Has("--chunk-delay") && !Has("--chunk")) {
    return Fail("--chunk-delay needs --chunk");
  }
  if (text_ && countOnly_) {
    return Fail("--text and --count exclude each other");
  }
  if (tcp && options_.emitCount != 0 && options_.txPrefix.empty() && options_.txSuffix.empty() &&
      options_.payload.empty()) {
    return Fail("the emitted token is empty: give --payload, --prefix or --suffix");
  }
  return true;
}

bool PeerCommandLine::ReadHex(const std::string& name, std::string& bytes) {
  if (!Has(name)) {
    return true;
  }
  const std::string& text = values_[name];
  if (!HexText::Decode(text, bytes)) {
    return Fail("bad hex for " + name + ": '" + text +
                "' (pairs of hex digits, or none, expected)");
  }
  return true;
}

bool PeerCommandLine::ReadCount(const std::string& name, std::uint64_t min, std::uint64_t max,
                                std::uint64_t& value, const std::string& expected) {
  if (!Has(name)) {
    return true;
  }
  const std::string& text = values_[name];
  std::uint64_t number = 0;
  if (!NumberText::ParseUnsigned(text, max, number) || number < min) {
    return Fail("bad value for " + name + ": '" + text + "' (" + expected + " expected)");
  }
  value = number;
  return true;
}

bool PeerCommandLine::ReadMilliseconds(const std::string& name, int min, int& value) {
  std::uint64_t number = 0;
  if (!ReadCount(name, static_cast<std::uint64_t>(min), kMaxMilliseconds, number,
                 std::to_string(min) + "..3600000 ms")) {
    return false;
  }
  if (Has(name)) {
    value = static_cast<int>(number);
  }
  return true;
}

}  // namespace veltpeer
