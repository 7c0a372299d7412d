// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "DescriptorLimit.h"

#include <sys/resource.h>

#include <cerrno>
#include <system_error>

namespace DescriptorLimit {

namespace {

std::string Reason(int error) { return std::generic_category().message(error); }

}  // namespace

bool Ensure(std::size_t needed, std::string& error) {
  rlimit limit{};
  if (::getrlimit(RLIMIT_NOFILE, &limit) != 0) {
    error = "cannot read the limit of open files: " + Reason(errno);
    return false;
  }
  const auto wanted = static_cast<rlim_t>(needed);
  if (limit.rlim_cur == RLIM_INFINITY || limit.rlim_cur >= wanted) {
    return true;
  }
  if (limit.rlim_max != RLIM_INFINITY && limit.rlim_max < wanted) {
    error = "up to " + std::to_string(needed) + " open files are needed, but the limit is " +
            std::to_string(limit.rlim_max) + " (ulimit -Hn)";
    return false;
  }
  limit.rlim_cur = wanted;
  if (::setrlimit(RLIMIT_NOFILE, &limit) != 0) {
    error =
        "cannot raise the limit of open files to " + std::to_string(needed) + ": " + Reason(errno);
    return false;
  }
  return true;
}

std::size_t Current() {
  rlimit limit{};
  if (::getrlimit(RLIMIT_NOFILE, &limit) != 0) {
    return 0;
  }
  return static_cast<std::size_t>(limit.rlim_cur);
}

}  // namespace DescriptorLimit
