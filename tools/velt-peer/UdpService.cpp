// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/UdpService.h"

#include <poll.h>
#include <sys/socket.h>

#include <algorithm>

namespace veltpeer {

namespace {

// Larger than any UDP datagram over IPv4 or IPv6 (without jumbograms).
constexpr std::size_t kDatagramSize = 65536;

}  // namespace

UdpService::UdpService(ServiceContext& context, int socket, const Endpoint& fixedDestination)
    : context_(context),
      socket_(socket),
      fixedDestination_(fixedDestination),
      cutter_(context.options.rxPrefix, context.options.rxSuffix),
      buffer_(kDatagramSize) {}

void UdpService::Run() {
  if (context_.emitter.Active() && !fixedDestination_.Empty()) {
    context_.emitter.Begin(StopSignal::Clock::now());
  }
  for (;;) {
    const WaitResult waited = context_.stop.Wait(socket_, POLLIN, context_.emitter.Due());
    if (waited == WaitResult::kStopped) {
      return;
    }
    if (waited == WaitResult::kReady && !ReceiveOne()) {
      return;
    }
    if (StopSignal::Clock::now() >= context_.emitter.Due() && !EmitOne()) {
      return;
    }
  }
}

bool UdpService::ReceiveOne() {
  sockaddr_storage sender{};
  socklen_t length = sizeof sender;
  const ssize_t received = ::recvfrom(socket_, buffer_.data(), buffer_.size(), 0,
                                      reinterpret_cast<sockaddr*>(&sender), &length);
  if (received < 0) {
    // Nothing there after all, or an error report of an earlier send; the
    // socket itself stays usable.
    return true;
  }
  context_.activity.BytesReceived(static_cast<std::size_t>(received));
  lastSender_ = Endpoint(reinterpret_cast<const sockaddr*>(&sender), length);
  if (context_.emitter.Active() && !context_.emitter.Begun()) {
    context_.emitter.Begin(StopSignal::Clock::now());
  }
  const std::string datagram(buffer_.data(), static_cast<std::size_t>(received));
  const std::vector<std::string> frames = cutter_.CutDatagram(datagram);
  // In order, stopping at the first frame after which the simulator is done.
  return std::all_of(frames.begin(), frames.end(),
                     [this](const std::string& frame) { return HandleFrame(frame); });
}

bool UdpService::HandleFrame(const std::string& frame) {
  context_.activity.FrameReceived(frame);
  if (context_.options.echo && !Echo(frame)) {
    return false;
  }
  return !context_.CountHandled();
}

bool UdpService::Echo(const std::string& frame) {
  const FrameWriter::Result result = context_.writer.WriteDatagram(socket_, frame, lastSender_);
  if (result == FrameWriter::Result::kWritten) {
    context_.activity.FrameSent(frame);
  }
  return result != FrameWriter::Result::kStopped;
}

bool UdpService::EmitOne() {
  const std::string token = context_.emitter.Next();
  const FrameWriter::Result result = context_.writer.WriteDatagram(socket_, token, Destination());
  if (result == FrameWriter::Result::kStopped) {
    return false;
  }
  if (result == FrameWriter::Result::kWritten) {
    context_.activity.FrameSent(token);
  }
  return !context_.CountHandled();
}

const Endpoint& UdpService::Destination() const {
  return fixedDestination_.Empty() ? lastSender_ : fixedDestination_;
}

}  // namespace veltpeer
