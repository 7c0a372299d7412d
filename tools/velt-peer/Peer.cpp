// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/Peer.h"

#include <sys/socket.h>

#include <cerrno>
#include <system_error>
#include <utility>

#include "velt-peer/ServiceContext.h"
#include "velt-peer/TcpService.h"
#include "velt-peer/UdpService.h"

namespace veltpeer {

namespace {

constexpr int kListenBacklog = 16;
constexpr int kMaxMilliseconds = 3600000;
constexpr double kMaxRate = 1000000;
constexpr double kMinRate = 0.001;
constexpr double kMaxSeconds = 31536000;

const char* TransportName(Transport transport) {
  return transport == Transport::kTcp ? "tcp" : "udp";
}

bool OutOfRange(int milliseconds) { return milliseconds < 0 || milliseconds > kMaxMilliseconds; }

}  // namespace

Peer::Peer(PeerOptions options)
    : options_(std::move(options)), activity_(options_.onEvent, options_.keepFrames) {}

Peer::~Peer() { Stop(); }

Peer::Started Peer::Start() {
  Started started;
  if (started_) {
    started.error = "the simulator was already started or stopped";
    return started;
  }
  started_ = true;
  started.error = CheckOptions();
  Endpoint fixedDestination;
  if (started.error.empty() && !options_.to.empty()) {
    Endpoint::ParseHostPort(options_.to, SOCK_DGRAM, fixedDestination, started.error);
  }
  if (started.error.empty()) {
    started.error = Bind();
  }
  if (started.error.empty() && !fixedDestination.Empty()) {
    const Endpoint local = Endpoint::LocalOf(socket_.Get());
    if (local.Family() != fixedDestination.Family()) {
      started.error = "the destination " + fixedDestination.ToString() +
                      " is not of the bound address's family (" + local.ToString() + ")";
    }
  }
  if (started.error.empty()) {
    stop_.Open(started.error);
  }
  if (!started.error.empty()) {
    socket_.Reset();
    const std::lock_guard<std::mutex> hold(stateLock_);
    finished_ = true;
    return started;
  }
  const Endpoint bound = Endpoint::LocalOf(socket_.Get());
  started.port = bound.Port();
  started.address = bound.ToString();
  if (options_.maxSeconds > 0) {
    stop_.EndAt(StopSignal::Clock::now() + std::chrono::duration_cast<StopSignal::Clock::duration>(
                                               std::chrono::duration<double>(options_.maxSeconds)));
  }
  activity_.Announce(PeerEvent::Kind::kListening, started.address);
  worker_ = std::thread(&Peer::Work, this, fixedDestination);
  return started;
}

void Peer::Stop() {
  started_ = true;
  stop_.Raise();
  if (worker_.joinable()) {
    worker_.join();
  }
  socket_.Reset();
  const std::lock_guard<std::mutex> hold(stateLock_);
  if (!finished_) {
    finished_ = true;
    finishedChanged_.notify_all();
  }
}

bool Peer::Finished() const {
  const std::lock_guard<std::mutex> hold(stateLock_);
  return finished_;
}

bool Peer::WaitFinished(std::chrono::milliseconds timeout) const {
  std::unique_lock<std::mutex> hold(stateLock_);
  return finishedChanged_.wait_for(hold, timeout, [this] { return finished_; });
}

std::string Peer::Failure() const {
  const std::lock_guard<std::mutex> hold(stateLock_);
  return failure_;
}

std::string Peer::CheckOptions() const {
  const PeerOptions& o = options_;
  const bool tcp = o.transport == Transport::kTcp;
  if (tcp && !o.to.empty()) {
    return "a fixed destination applies to udp only";
  }
  if (!tcp && (o.closeAfterFrames != 0 || o.closeAfterMs != 0)) {
    return "closing a connection applies to tcp only";
  }
  if (o.gapMs <= 0 || o.gapMs > kMaxMilliseconds) {
    return "the gap must be 1.." + std::to_string(kMaxMilliseconds) + " ms";
  }
  if (OutOfRange(o.delayMs) || OutOfRange(o.chunkDelayMs) || OutOfRange(o.closeAfterMs)) {
    return "delays must be 0.." + std::to_string(kMaxMilliseconds) + " ms";
  }
  if (!(o.rate == 0 || (o.rate >= kMinRate && o.rate <= kMaxRate))) {
    return "the rate must be 0 (unpaced) or 0.001..1000000 tokens per second";
  }
  if (!(o.maxSeconds >= 0 && o.maxSeconds <= kMaxSeconds)) {
    return "the time limit must be 0..31536000 seconds";
  }
  if (tcp && o.emitCount != 0 && o.txPrefix.empty() && o.txSuffix.empty() && o.payload.empty()) {
    return "an emitted token must not be empty on tcp";
  }
  return {};
}

std::string Peer::Bind() {
  const bool tcp = options_.transport == Transport::kTcp;
  const int type = tcp ? SOCK_STREAM : SOCK_DGRAM;
  const std::string what = std::string("cannot bind ") + TransportName(options_.transport) + " ";
  Endpoint local;
  std::string error;
  if (!Endpoint::Resolve(options_.bindAddress, options_.port, type, local, error)) {
    return what + options_.bindAddress + ":" + std::to_string(options_.port) + ": " + error;
  }
  socket_.Reset(::socket(local.Family(), type | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
  if (!socket_.Valid()) {
    return what + local.ToString() + ": " + std::generic_category().message(errno);
  }
  if (tcp) {
    // A restarted simulator can take its port back while old connections
    // linger in TIME_WAIT; a live listener still makes the bind fail.
    const int on = 1;
    ::setsockopt(socket_.Get(), SOL_SOCKET, SO_REUSEADDR, &on, sizeof on);
  }
  if (::bind(socket_.Get(), local.Address(), local.Length()) != 0 ||
      (tcp && ::listen(socket_.Get(), kListenBacklog) != 0)) {
    const int reason = errno;
    socket_.Reset();
    return what + local.ToString() + ": " + std::generic_category().message(reason);
  }
  return {};
}

void Peer::Work(Endpoint fixedDestination) {
  ServiceContext context(options_, stop_, activity_);
  std::string failure;
  if (options_.transport == Transport::kTcp) {
    failure = TcpService(context, socket_.Get()).Run();
  } else {
    UdpService(context, socket_.Get(), fixedDestination).Run();
  }
  const std::lock_guard<std::mutex> hold(stateLock_);
  failure_ = std::move(failure);
  finished_ = true;
  finishedChanged_.notify_all();
}

}  // namespace veltpeer
