// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// An apply through the plug-in reaches the storage file in one replacement,
// however many values it carries, before the write of SP_Done returns.

#include <sys/inotify.h>
#include <unistd.h>

#include <array>
#include <string>

#include "ApplyRound.h"
#include "FileDescriptor.h"
#include "HostedChannel.h"

namespace {

// Counts the temporary files renamed away in folder: one per replacement of
// a file there (inotify merges repeated events of the one target name).
class Replacements {
 public:
  explicit Replacements(const std::string& folder)
      : watch_(::inotify_init1(IN_NONBLOCK | IN_CLOEXEC)) {
    ::inotify_add_watch(watch_.Get(), folder.c_str(), IN_MOVED_FROM);
  }
  int Count() {
    std::array<char, 4096> events{};
    for (ssize_t n = 0; (n = ::read(watch_.Get(), events.data(), events.size())) > 0;) {
      for (ssize_t at = 0; at < n;) {
        const auto* event = reinterpret_cast<const inotify_event*>(events.data() + at);
        count_ +=
            event->len > 0 && std::string(event->name).rfind("storage.ini.tmp-", 0) == 0 ? 1 : 0;
        at += static_cast<ssize_t>(sizeof(inotify_event) + event->len);
      }
    }
    return count_;
  }

 private:
  FileDescriptor watch_;
  int count_ = 0;
};

class ApplyStorage : public HostedChannel {
 protected:
  void Stage(const ApplyRound::Staged& value) {
    switch (value.stored.GetType()) {
      case StoredValue::Type::Text:
        ASSERT_TRUE(WriteText(value.uri, value.stored.AsText())) << value.uri;
        break;
      case StoredValue::Type::Boolean:
        ASSERT_TRUE(WriteBool(value.uri, value.stored.AsBoolean())) << value.uri;
        break;
      case StoredValue::Type::Integer:
        ASSERT_TRUE(value.uri.find("unsignedShort") != std::string::npos
                        ? WriteShort(value.uri, value.stored.AsInteger())
                        : WriteInt(value.uri, value.stored.AsInteger()))
            << value.uri;
        break;
    }
  }
};

}  // namespace

TEST_F(ApplyStorage, AnApplyOfThirteenValuesReplacesTheFileOnce) {
  Open("CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9");
  Replacements replacements(folder.Path());
  for (const ApplyRound::Staged& value : ApplyRound::ValuesOf(7, 13)) {
    Stage(value);
  }
  EXPECT_EQ(replacements.Count(), 0);
  ASSERT_TRUE(WriteBool("?SP_Done?boolean", true));
  EXPECT_EQ(replacements.Count(), 1);
  HostPermanentStorage stored(folder.File("storage.ini"));
  int round = -1;
  std::string mix;
  EXPECT_TRUE(ApplyRound::Whole(stored, 13, round, mix)) << mix;
  EXPECT_EQ(round, 7);
  // The same values again change nothing in the file.
  ASSERT_TRUE(WriteBool("?SP_Done?boolean", true));
  EXPECT_EQ(replacements.Count(), 1);
}
