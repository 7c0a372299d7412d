// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/StopSignals.h"

#include <poll.h>
#include <pthread.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <stdexcept>
#include <string>
#include <system_error>

namespace velthost {

StopSignals::StopSignals() {
  sigset_t signals;
  sigemptyset(&signals);
  sigaddset(&signals, SIGINT);
  sigaddset(&signals, SIGTERM);
  pthread_sigmask(SIG_BLOCK, &signals, nullptr);
  fd_ = FileDescriptor(::signalfd(-1, &signals, SFD_NONBLOCK | SFD_CLOEXEC));
  if (!fd_.Valid()) {
    throw std::runtime_error(std::string("cannot watch for signals: ") +
                             std::generic_category().message(errno));
  }
}

bool StopSignals::Raised() {
  signalfd_siginfo info{};
  while (::read(fd_.Get(), &info, sizeof info) == static_cast<ssize_t>(sizeof info)) {
    if (signal_ == 0) {
      signal_ = static_cast<int>(info.ssi_signo);
    }
  }
  return signal_ != 0;
}

StopSignals::Event StopSignals::Wait(int fd, std::chrono::milliseconds timeout) {
  if (Raised()) {
    return Event::kSignal;
  }
  std::array<pollfd, 2> entries = {{{fd_.Get(), POLLIN, 0}, {fd, POLLIN, 0}}};
  const nfds_t count = fd < 0 ? 1 : 2;
  const int ready =
      ::poll(entries.data(), count, timeout.count() < 0 ? -1 : static_cast<int>(timeout.count()));
  if (Raised()) {
    return Event::kSignal;
  }
  if (ready > 0 && count == 2 && entries[1].revents != 0) {
    return Event::kInput;
  }
  return Event::kTimeout;
}

}  // namespace velthost
