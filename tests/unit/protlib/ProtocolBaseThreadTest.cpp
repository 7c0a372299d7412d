// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include <atomic>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "MemoryProtocol.h"

// A driver's worker records errors while the host's tag and console threads
// create, read and free tags and read the last error of the same protocol.
// Run under ThreadSanitizer, this must show no race; every text read back
// must be one that was set whole.
TEST(ProtocolBaseThreads, ErrorsAndTagListAreSafeAcrossThreads) {
  constexpr int kRounds = 2000;
  MemoryProtocol protocol;
  const std::vector<std::string> texts = {
      "Can't open connection socket", "Incorrect format of IP address",
      "a much longer error text that does not fit a short string buffer at all"};
  const std::string tagError = "Tag URI error: bad - address must be offset?datatype[?bit]";
  std::set<std::string> allowed(texts.begin(), texts.end());
  allowed.insert(tagError);
  allowed.insert("");
  std::atomic<int> unexpected{0};

  std::vector<std::thread> threads;
  for (int writer = 0; writer < 2; ++writer) {
    threads.emplace_back([&, writer] {
      for (int i = 0; i < kRounds; ++i) {
        const std::string& text = texts[static_cast<std::size_t>(i + writer) % texts.size()];
        protocol.SetError(-6, text.c_str());
      }
    });
  }
  threads.emplace_back([&] {
    for (int i = 0; i < kRounds; ++i) {
      const char* text = protocol.GetLastErrorString();
      const int code = protocol.GetLastError();
      if (allowed.count(text) == 0 || (code != 1 && code != -6 && code != -1)) {
        ++unexpected;
      }
    }
  });
  for (int host = 0; host < 2; ++host) {
    threads.emplace_back([&] {
      for (int i = 0; i < kRounds; ++i) {
        ITag* tag = protocol.CreateTag("0?int");
        if (tag == nullptr) {
          ++unexpected;
          continue;
        }
        if (protocol.CreateTag("bad") != nullptr) {
          ++unexpected;
        }
        protocol.FreeTag(tag);
      }
    });
  }
  threads.emplace_back([&] {
    char out[64];
    for (int i = 0; i < kRounds / 4; ++i) {
      if (!protocol.DoCommand("read 0?int", out, sizeof out) ||
          !protocol.DoCommand("lasterror", out, sizeof out)) {
        ++unexpected;
      }
    }
  });
  for (std::thread& thread : threads) {
    thread.join();
  }
  EXPECT_EQ(unexpected.load(), 0);
  EXPECT_EQ(allowed.count(protocol.GetLastErrorString()), 1U);
}
