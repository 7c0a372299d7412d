// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "FloodCases.h"

#include <netinet/in.h>
#include <sys/socket.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdint>
#include <string>
#include <thread>
#include <vector>

#include "LoopbackIo.h"
#include "PluginChannel.h"

namespace {

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;

constexpr std::uint64_t kFloodBytes = std::uint64_t{1} << 30;
constexpr unsigned kQueueBound = 100;
constexpr long kLargestGrowthKiB = 64 * 1024;
constexpr std::size_t kDatagram = 1472;

// Random bytes, fast and reproducible (xorshift64*).
class RandomBytes {
 public:
  void Fill(std::vector<unsigned char>& bytes) {
    for (unsigned char& byte : bytes) {
      state_ ^= state_ >> 12U;
      state_ ^= state_ << 25U;
      state_ ^= state_ >> 27U;
      byte = static_cast<unsigned char>((state_ * 0x2545F4914F6CDD1DULL) >> 56U);
    }
  }

 private:
  std::uint64_t state_ = 0x9E3779B97F4A7C15ULL;
};

// While a flood runs: the largest queue seen, the tokens taken and the
// largest resident memory, sampled by a reader that takes a token now and
// then, as a slow panel would.
class FloodWatch {
 public:
  explicit FloodWatch(PluginChannel& channel)
      : thread_([this, &channel] {
          while (!stop_) {
            largestQueue_ =
                std::max(largestQueue_.load(), channel.ReadNumber("?tokens_available?unsignedInt"));
            largestResident_ = std::max(largestResident_.load(), ResidentKiB());
            std::string token;
            if (channel.TakeToken(token)) {
              ++taken_;
            }
            std::this_thread::sleep_for(200us);
          }
        }) {}
  FloodWatch(const FloodWatch&) = delete;
  FloodWatch& operator=(const FloodWatch&) = delete;
  FloodWatch(FloodWatch&&) = delete;
  FloodWatch& operator=(FloodWatch&&) = delete;
  ~FloodWatch() { Stop(); }
  void Stop() {
    stop_ = true;
    if (thread_.joinable()) {
      thread_.join();
    }
  }
  unsigned LargestQueue() const { return largestQueue_; }
  long LargestResidentKiB() const { return largestResident_; }
  unsigned long Taken() const { return taken_; }

 private:
  std::atomic<bool> stop_{false};
  std::atomic<unsigned> largestQueue_{0};
  std::atomic<long> largestResident_{0};
  std::atomic<unsigned long> taken_{0};
  std::thread thread_;
};

void Report(FaultCase& fault, const std::string& what, double seconds, long before,
            const FloodWatch& watch) {
  const long growth = PeakResidentKiB() - before;
  fault.Figure(what + " in " + std::to_string(seconds) + " s (" +
               std::to_string(static_cast<double>(kFloodBytes) / 1048576.0 / seconds) +
               " MiB/s); resident memory before " + std::to_string(before / 1024) + " MiB, peak " +
               std::to_string(PeakResidentKiB() / 1024) + " MiB (growth " +
               std::to_string(growth / 1024) + " MiB); largest queue seen " +
               std::to_string(watch.LargestQueue()) + " of " + std::to_string(kQueueBound) + "; " +
               std::to_string(watch.Taken()) + " tokens taken");
  fault.Expect(watch.LargestQueue() <= kQueueBound, "the queue held more than its bound");
  fault.Expect(growth < kLargestGrowthKiB, "resident memory grew by 64 MiB or more");
}

std::string TcpConfig(std::uint16_t port, const std::string& extra) {
  return "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=" +
         std::to_string(port) + " " + extra;
}

}  // namespace

void RunTcpFlood(FaultCase& fault, const FaultPrograms& programs) {
  std::uint16_t port = 0;
  const FileDescriptor listener = LoopbackIo::Listen(1, port);
  PluginChannel channel(programs.plugin, "",
                        TcpConfig(port,
                                  "rx_prefix=02 rx_suffix=03 hex_tokens=true "
                                  "token_queue_size=" +
                                      std::to_string(kQueueBound)));
  channel.WriteNumber("?connect?boolean", 1);
  FileDescriptor peer = LoopbackIo::Accept(listener.Get(), 5000ms);
  fault.Expect(peer.Valid(), "the channel did not connect");
  if (!peer.Valid()) {
    return;
  }
  const long before = ResidentKiB();
  ResetPeakMemory();
  const auto started = Clock::now();
  FloodWatch watch(channel);
  RandomBytes random;
  std::vector<unsigned char> chunk(65536);
  for (std::uint64_t sent = 0; sent < kFloodBytes; sent += chunk.size()) {
    random.Fill(chunk);
    LoopbackIo::SendAll(peer.Get(), chunk);
  }
  // A last frame of its own: more than 1000 bytes without a marker end
  // any frame the random bytes left open, then "END". The flood is through
  // when END (in hex) reaches the queue.
  LoopbackIo::SendAll(peer.Get(), LoopbackIo::FromText(std::string(1100, 'A') + "\x02"
                                                                                "END\x03"));
  watch.Stop();
  bool ended = false;
  const auto deadline = Clock::now() + 120s;
  while (!ended && Clock::now() < deadline) {
    std::string token;
    if (channel.TakeToken(token)) {
      ended = token == "454E44";
    } else {
      std::this_thread::sleep_for(1ms);
    }
  }
  const double seconds = std::chrono::duration<double>(Clock::now() - started).count();
  fault.Expect(ended, "the last frame did not arrive");
  Report(fault, "1 GiB of random bytes through TCP with markers 02 and 03", seconds, before, watch);
}

void RunUdpFlood(FaultCase& fault, const FaultPrograms& programs) {
  std::uint16_t senderPort = 0;
  const FileDescriptor sender = LoopbackIo::BindUdp(INADDR_LOOPBACK, senderPort);
  const std::uint16_t channelPort = LoopbackIo::FreeUdpPort();
  PluginChannel channel(programs.plugin, "",
                        "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=" +
                            std::to_string(senderPort) +
                            " localPort=" + std::to_string(channelPort) +
                            " hex_tokens=true token_queue_size=" + std::to_string(kQueueBound));
  fault.Expect(channel.Connect(5000ms), "the channel did not connect");
  const long before = ResidentKiB();
  ResetPeakMemory();
  const auto started = Clock::now();
  FloodWatch watch(channel);
  RandomBytes random;
  std::vector<unsigned char> datagram(kDatagram);
  std::uint64_t datagrams = 0;
  for (std::uint64_t sent = 0; sent < kFloodBytes; sent += datagram.size()) {
    random.Fill(datagram);
    LoopbackIo::SendTo(sender.Get(), channelPort, datagram);
    ++datagrams;
  }
  std::this_thread::sleep_for(200ms);
  const double seconds = std::chrono::duration<double>(Clock::now() - started).count();
  watch.Stop();
  Report(fault,
         "1 GiB of random bytes through UDP in " + std::to_string(datagrams) + " datagrams of " +
             std::to_string(kDatagram) + " bytes",
         seconds, before, watch);
}

void RunQueueOverflow(FaultCase& fault, const FaultPrograms& programs) {
  constexpr int kFrames = 1000;
  constexpr unsigned kBound = 10;
  std::uint16_t port = 0;
  const FileDescriptor listener = LoopbackIo::Listen(1, port);
  PluginChannel channel(
      programs.plugin, "",
      TcpConfig(port, "rx_prefix=02 rx_suffix=03 token_queue_size=" + std::to_string(kBound)));
  channel.WriteNumber("?connect?boolean", 1);
  FileDescriptor peer = LoopbackIo::Accept(listener.Get(), 5000ms);
  fault.Expect(peer.Valid(), "the channel did not connect");
  if (!peer.Valid()) {
    return;
  }
  std::string frames;
  for (int frame = 1; frame <= kFrames; ++frame) {
    frames += "\x02" + std::to_string(frame) + "\x03";
  }
  LoopbackIo::SendAll(peer.Get(), LoopbackIo::FromText(frames));
  // The oldest of the newest ten is 991 once the last frame arrived.
  const std::string oldestKept = std::to_string(kFrames - kBound + 1);
  const auto deadline = Clock::now() + 10s;
  while (Clock::now() < deadline && channel.ReadText("?rx_token?string-8") != oldestKept) {
    std::this_thread::sleep_for(2ms);
  }
  std::vector<std::string> kept;
  std::string token;
  while (channel.TakeToken(token)) {
    kept.push_back(token);
  }
  std::vector<std::string> newest;
  for (int frame = kFrames - static_cast<int>(kBound) + 1; frame <= kFrames; ++frame) {
    newest.push_back(std::to_string(frame));
  }
  fault.Figure(std::to_string(kFrames) + " frames into a queue of " + std::to_string(kBound) +
               ": " + std::to_string(kept.size()) + " kept, from " +
               (kept.empty() ? std::string("none") : kept.front()) + " to " +
               (kept.empty() ? std::string("none") : kept.back()));
  fault.Expect(kept == newest, "the queue did not keep exactly the newest " +
                                   std::to_string(kBound) + " (from " + oldestKept + ")");
}
