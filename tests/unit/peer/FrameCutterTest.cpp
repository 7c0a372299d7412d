// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/FrameCutter.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

using veltpeer::FrameCutter;
using Frames = std::vector<std::string>;

namespace {

Frames FeedAll(FrameCutter& cutter, const std::vector<std::string>& pieces) {
  Frames frames;
  for (const std::string& piece : pieces) {
    cutter.Feed(piece.data(), piece.size(), frames);
  }
  return frames;
}

const std::string kStx("\x02");
const std::string kEtx("\x03");

}  // namespace

TEST(FrameCutterStream, PrefixAndSuffixSkipLeadingBytesAndKeepMarkers) {
  FrameCutter cutter(kStx, kEtx);
  EXPECT_EQ(FeedAll(cutter, {"\x55\x02\x41\x42\x03"}), Frames({"\x02\x41\x42\x03"}));
}

TEST(FrameCutterStream, SeveralFramesInOneRead) {
  FrameCutter cutter(kStx, kEtx);
  EXPECT_EQ(FeedAll(cutter, {"\x02"
                             "A\x03\x02"
                             "B\x03xx\x02"
                             "C"}),
            Frames({"\x02"
                    "A\x03",
                    "\x02"
                    "B\x03"}));
  EXPECT_EQ(FeedAll(cutter, {"\x03"}), Frames({"\x02"
                                               "C\x03"}));
}

TEST(FrameCutterStream, EmptyBodyIsAFrame) {
  FrameCutter cutter(kStx, kEtx);
  EXPECT_EQ(FeedAll(cutter, {"\x02\x03"}), Frames({"\x02\x03"}));
}

TEST(FrameCutterStream, MultiByteMarkersSplitAcrossReadsAreFound) {
  FrameCutter cutter("<<", "\r\n");
  EXPECT_EQ(FeedAll(cutter, {"junk<", "<ab", "c\r", "\nzz<<d\r\n"}),
            Frames({"<<abc\r\n", "<<d\r\n"}));
}

TEST(FrameCutterStream, SuffixOnlyFramesRunFromTheEndOfThePreviousOne) {
  FrameCutter cutter("", "\n");
  EXPECT_EQ(FeedAll(cutter, {"one\ntw", "o\n\nthree"}), Frames({"one\n", "two\n", "\n"}));
  Frames frames;
  cutter.Flush(frames);
  EXPECT_TRUE(frames.empty());
  EXPECT_EQ(FeedAll(cutter, {"\n"}), Frames({"three\n"}));
}

TEST(FrameCutterStream, PrefixOnlyFrameEndsAtTheNextPrefixOrAtFlush) {
  FrameCutter cutter(kStx, "");
  EXPECT_EQ(FeedAll(cutter, {"\x02\x41\x02\x42"}), Frames({"\x02\x41"}));
  EXPECT_TRUE(cutter.HasOpenFrame());
  Frames frames;
  cutter.Flush(frames);
  EXPECT_EQ(frames, Frames({"\x02\x42"}));
  EXPECT_FALSE(cutter.HasOpenFrame());
}

TEST(FrameCutterStream, PartialFrameWithSuffixSurvivesFlushAndIsDroppedByReset) {
  FrameCutter cutter(kStx, kEtx);
  EXPECT_TRUE(FeedAll(cutter, {"\x02"
                               "AB"})
                  .empty());
  EXPECT_FALSE(cutter.HasOpenFrame());
  Frames frames;
  cutter.Flush(frames);
  EXPECT_TRUE(frames.empty());
  EXPECT_EQ(FeedAll(cutter, {"C\x03"}), Frames({"\x02"
                                                "ABC\x03"}));
  EXPECT_TRUE(FeedAll(cutter, {"\x02"
                               "half"})
                  .empty());
  cutter.Reset();
  EXPECT_EQ(FeedAll(cutter, {"rest\x03\x02"
                             "new\x03"}),
            Frames({"\x02"
                    "new\x03"}));
}

TEST(FrameCutterStream, WithoutMarkersEachReadIsOneFrame) {
  FrameCutter cutter("", "");
  EXPECT_FALSE(cutter.Framed());
  EXPECT_EQ(FeedAll(cutter, {"ab", "", "c"}), Frames({"ab", "c"}));
  EXPECT_FALSE(cutter.HasOpenFrame());
}

TEST(FrameCutterStream, SameMarkerBothEnds) {
  FrameCutter cutter("~", "~");
  EXPECT_EQ(FeedAll(cutter, {"~a~~b~"}), Frames({"~a~", "~b~"}));
}

TEST(FrameCutterStream, OversizedFrameIsDroppedAndCuttingResumes) {
  FrameCutter cutter(kStx, kEtx);
  const std::string body(FrameCutter::kMaxFrame + 10, 'x');
  EXPECT_TRUE(FeedAll(cutter, {"\x02", body}).empty());
  EXPECT_EQ(FeedAll(cutter, {"yy\x03\x02"
                             "ok\x03"}),
            Frames({"\x02"
                    "ok\x03"}));
}

TEST(FrameCutterStream, OversizedSuffixOnlyFrameIsSkippedThroughItsSuffix) {
  FrameCutter cutter("", "\n");
  const std::string body(FrameCutter::kMaxFrame + 10, 'x');
  EXPECT_TRUE(FeedAll(cutter, {body}).empty());
  EXPECT_EQ(FeedAll(cutter, {"tail\nnext\n"}), Frames({"next\n"}));
}

TEST(FrameCutterDatagram, WithoutMarkersTheDatagramIsTheFrame) {
  const FrameCutter cutter("", "");
  EXPECT_EQ(cutter.CutDatagram("abc"), Frames({"abc"}));
  EXPECT_EQ(cutter.CutDatagram(""), Frames({""}));
}

TEST(FrameCutterDatagram, SeveralFramesInOneDatagram) {
  const FrameCutter cutter(kStx, kEtx);
  EXPECT_EQ(cutter.CutDatagram("\x02\x41\x03\x02\x42\x03"),
            Frames({"\x02\x41\x03", "\x02\x42\x03"}));
  EXPECT_EQ(cutter.CutDatagram("\x02\x03"), Frames({"\x02\x03"}));
}

TEST(FrameCutterDatagram, IncompleteFramesAreDroppedAndNothingCarriesOver) {
  const FrameCutter cutter(kStx, kEtx);
  EXPECT_TRUE(cutter.CutDatagram("\x02\x41").empty());
  EXPECT_TRUE(cutter.CutDatagram("\x41\x03").empty());
  EXPECT_EQ(cutter.CutDatagram("z\x02"
                               "A\x03\x02"
                               "B"),
            Frames({"\x02"
                    "A\x03"}));
}

TEST(FrameCutterDatagram, PrefixOnlyAndSuffixOnly) {
  const FrameCutter prefixOnly(kStx, "");
  EXPECT_EQ(prefixOnly.CutDatagram("x\x02"
                                   "A\x02"
                                   "B"),
            Frames({"\x02"
                    "A",
                    "\x02"
                    "B"}));
  const FrameCutter suffixOnly("", kEtx);
  EXPECT_EQ(suffixOnly.CutDatagram("A\x03"
                                   "B\x03"
                                   "C"),
            Frames({"A\x03", "B\x03"}));
}
