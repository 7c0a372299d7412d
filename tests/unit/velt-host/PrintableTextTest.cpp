// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/PrintableText.h"

#include <gtest/gtest.h>

#include <string>

using velthost::PrintableText;

TEST(PrintableText, PrintableAsciiStaysAsItIs) {
  EXPECT_EQ(PrintableText::Escape("token 1 ~!"), "token 1 ~!");
  EXPECT_EQ(PrintableText::Escape(""), "");
}

TEST(PrintableText, BackslashAndOtherBytesAreEscaped) {
  EXPECT_EQ(PrintableText::Escape("a\\b"), "a\\\\b");
  EXPECT_EQ(PrintableText::Escape(std::string("\x02x\r\n\x7f\xff\0", 7)),
            "\\x02x\\x0D\\x0A\\x7F\\xFF\\x00");
}
