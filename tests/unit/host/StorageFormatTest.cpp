// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include <string>

#include "StorageError.h"
#include "StorageFormat.h"

namespace {

const std::string kHeader =
    "# Velt Conduit permanent storage. Each [\"section\"] holds lines\n"
    "# \"name\" = TYPE VALUE with TYPE text (a quoted text), bool (true or false)\n"
    "# or int (a signed 32-bit decimal number). In quoted texts \\\\ \\\" \\n \\r \\t\n"
    "# and \\xHH stand for a backslash, a quote and the other control bytes.\n";

// The text of the StorageError that parsing content throws; empty if none.
std::string ParseError(const std::string& content) {
  try {
    StorageFormat::Parse(content, "/data/store.txt");
  } catch (const StorageError& e) {
    return e.what();
  }
  return std::string();
}

}  // namespace

TEST(StorageFormat, QuoteEscapesBackslashQuoteAndControlBytesOnly) {
  EXPECT_EQ(StorageFormat::Quote(""), "\"\"");
  EXPECT_EQ(StorageFormat::Quote("plain text = [ok] # 1"), "\"plain text = [ok] # 1\"");
  EXPECT_EQ(StorageFormat::Quote("a\\b\"c"), "\"a\\\\b\\\"c\"");
  EXPECT_EQ(StorageFormat::Quote("\n\r\t"), "\"\\n\\r\\t\"");
  EXPECT_EQ(StorageFormat::Quote(std::string("\x01\x1F\x7F", 3)), "\"\\x01\\x1F\\x7F\"");
  EXPECT_EQ(StorageFormat::Quote(std::string(1, '\0')), "\"\\x00\"");
  EXPECT_EQ(StorageFormat::Quote("gr\xC3\xBC\xC3\x9F"), "\"gr\xC3\xBC\xC3\x9F\"");
  EXPECT_EQ(StorageFormat::Quote("\xFF"), "\"\xFF\"");
}

TEST(StorageFormat, SerializeWritesOneLinePerValueUnderSectionHeaders) {
  StoredSections sections;
  sections["VELT1"]["remote_port"] = StoredValue::OfInteger(5000);
  sections["VELT1"]["hex_tokens"] = StoredValue::OfBoolean(true);
  sections["VELT1"]["rx_prefix"] = StoredValue::OfText("02");
  sections["B"]["n"] = StoredValue::OfInteger(-2147483647 - 1);
  sections["empty"];
  EXPECT_EQ(StorageFormat::Serialize(sections), kHeader +
                                                    "\n[\"B\"]\n"
                                                    "\"n\" = int -2147483648\n"
                                                    "\n[\"VELT1\"]\n"
                                                    "\"hex_tokens\" = bool true\n"
                                                    "\"remote_port\" = int 5000\n"
                                                    "\"rx_prefix\" = text \"02\"\n");
}

TEST(StorageFormat, SerializeOfNothingIsTheHeaderAlone) {
  EXPECT_EQ(StorageFormat::Serialize(StoredSections()), kHeader);
}

TEST(StorageFormat, EveryByteSurvivesARoundTrip) {
  std::string everyByte;
  for (int c = 0; c < 256; ++c) {
    everyByte += static_cast<char>(c);
  }
  StoredSections sections;
  sections["sec [x] = \"y\" # z"]["name\nwith\rbreaks"] = StoredValue::OfText(everyByte);
  sections[""][""] = StoredValue::OfText("");
  sections["s"]["f"] = StoredValue::OfBoolean(false);
  sections["s"]["max"] = StoredValue::OfInteger(2147483647);
  const StoredSections parsed =
      StorageFormat::Parse(StorageFormat::Serialize(sections), "/data/store.txt");
  EXPECT_EQ(parsed, sections);
}

TEST(StorageFormat, ParseAcceptsBlankLinesCommentsAndSpacing) {
  const StoredSections parsed = StorageFormat::Parse(
      "\n   # a comment\n\t[ \"s\" ]  \r\n  \"a\"=int 7\n\"b\"\t=\tbool false \r\n"
      "\"c\" = text \"x\\x41\\ty\"\n[\"s\"]\n\"d\" = int -0\n",
      "/data/store.txt");
  ASSERT_EQ(parsed.size(), 1U);
  const StoredEntries& entries = parsed.at("s");
  ASSERT_EQ(entries.size(), 4U);
  EXPECT_EQ(entries.at("a"), StoredValue::OfInteger(7));
  EXPECT_EQ(entries.at("b"), StoredValue::OfBoolean(false));
  EXPECT_EQ(entries.at("c"), StoredValue::OfText("xA\ty"));
  EXPECT_EQ(entries.at("d"), StoredValue::OfInteger(0));
}

TEST(StorageFormat, ParseOfAnEmptyFileGivesNothing) {
  EXPECT_TRUE(StorageFormat::Parse("", "/data/store.txt").empty());
}

TEST(StorageFormat, ParseErrorsNameThePathTheLineAndTheFault) {
  EXPECT_EQ(ParseError("[\"s\"]\nname = int 1\n"),
            "/data/store.txt:2: expected a [\"section\"] header or a \"name\" = TYPE VALUE entry");
  EXPECT_EQ(ParseError("\"a\" = int 1\n"),
            "/data/store.txt:1: entry before the first [\"section\"] header");
  EXPECT_EQ(ParseError("[\"s\"]\n\n\"a\" = text \"open\n"),
            "/data/store.txt:3: unterminated quoted text");
  EXPECT_EQ(ParseError("[\"s\"]\n\"a\" = text \"bad \\q\"\n"),
            "/data/store.txt:2: unknown escape \\q");
  EXPECT_EQ(ParseError("[\"s\"]\n\"a\" = text \"\\x4\"\n"),
            "/data/store.txt:2: \\x must be followed by two hexadecimal digits");
  EXPECT_EQ(ParseError("[\"s\"]\n\"a\" = float 1.5\n"),
            "/data/store.txt:2: unknown value type 'float' (expected text, bool or int)");
  EXPECT_EQ(ParseError("[\"s\"]\n\"a\" = bool yes\n"),
            "/data/store.txt:2: bad boolean value: 'yes' (expected true or false)");
  EXPECT_EQ(ParseError("[\"s\"]\n\"a\" = int 12x\n"),
            "/data/store.txt:2: bad integer value: '12x'");
  EXPECT_EQ(ParseError("[\"s\"]\n\"a\" = int\n"), "/data/store.txt:2: bad integer value: ''");
  EXPECT_EQ(ParseError("[\"s\"]\n\"a\" = int 2147483648\n"),
            "/data/store.txt:2: integer value out of range: 2147483648");
  EXPECT_EQ(ParseError("[\"s\"]\n\"a\" = int 1 2\n"),
            "/data/store.txt:2: unexpected text at the end of the line");
  EXPECT_EQ(ParseError("[\"s\"\n"), "/data/store.txt:1: expected ']' after the section name");
  EXPECT_EQ(ParseError("[s]\n"), "/data/store.txt:1: expected a quoted text");
  EXPECT_EQ(ParseError("[\"s\"]\n\"a\" int 1\n"), "/data/store.txt:2: expected '=' after the name");
  EXPECT_EQ(ParseError("[\"s\"]\n\"a\" = int 1\n\"a\" = int 2\n"),
            "/data/store.txt:3: name \"a\" given twice in one section");
}

TEST(StorageFormat, StorageErrorKeepsItsParts) {
  const StorageError error("/data/store.txt", 4, "bad");
  EXPECT_EQ(error.Path(), "/data/store.txt");
  EXPECT_EQ(error.Line(), 4);
  EXPECT_EQ(error.Reason(), "bad");
  EXPECT_STREQ(StorageError("/data/store.txt", 0, "cannot read").what(),
               "/data/store.txt: cannot read");
}

TEST(StoredValue, ValuesReadAsAnotherTypeAreConverted) {
  EXPECT_EQ(StoredValue::OfBoolean(true).AsText(), "true");
  EXPECT_EQ(StoredValue::OfBoolean(false).AsInteger(), 0);
  EXPECT_EQ(StoredValue::OfInteger(-12).AsText(), "-12");
  EXPECT_TRUE(StoredValue::OfInteger(-12).AsBoolean());
  EXPECT_FALSE(StoredValue::OfInteger(0).AsBoolean());
  EXPECT_EQ(StoredValue::OfText("42").AsInteger(), 42);
  EXPECT_EQ(StoredValue::OfText("42 ").AsInteger(), 0);
  EXPECT_EQ(StoredValue::OfText("x").AsInteger(), 0);
  EXPECT_TRUE(StoredValue::OfText("true").AsBoolean());
  EXPECT_TRUE(StoredValue::OfText("1").AsBoolean());
  EXPECT_FALSE(StoredValue::OfText("TRUE").AsBoolean());
  EXPECT_FALSE(StoredValue::OfText("0").AsBoolean());
}

TEST(StoredValue, EqualityComparesTypeAndValue) {
  EXPECT_EQ(StoredValue::OfText("1"), StoredValue::OfText("1"));
  EXPECT_NE(StoredValue::OfText("1"), StoredValue::OfInteger(1));
  EXPECT_NE(StoredValue::OfBoolean(true), StoredValue::OfInteger(1));
  EXPECT_NE(StoredValue::OfInteger(1), StoredValue::OfInteger(2));
}
