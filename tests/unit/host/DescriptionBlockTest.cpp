// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "DescriptionBlock.h"

#include <gtest/gtest.h>
#include <zlib.h>

#include <string>
#include <vector>

#include "HostInterfaceFactory.h"
#include "IProtocol.h"
#include "PluginLoader.h"

namespace {

const std::string kDocument =
    "<?xml version=\"1.0\" encoding=\"utf-8\"?>\n<protocol_cfg>\n  <name>VELT</name>\n"
    "</protocol_cfg>\n";
const std::string kTrailer("<<TAVU_XML_END>>\0", 17);

std::string Compress(const std::string& document) {
  uLongf size = compressBound(static_cast<uLong>(document.size()));
  std::string stream(size, '\0');
  const int status = compress(reinterpret_cast<Bytef*>(stream.data()), &size,
                              reinterpret_cast<const Bytef*>(document.data()),
                              static_cast<uLong>(document.size()));
  EXPECT_EQ(status, Z_OK);
  stream.resize(size);
  return stream;
}

// A block from its length line on: "compressedXML=" + stated + NUL, the
// stream, the trailer.
std::string Block(const std::string& stated, const std::string& stream,
                  const std::string& trailer = kTrailer) {
  return "compressedXML=" + stated + std::string(1, '\0') + stream + trailer;
}

std::string Block(const std::string& stream) {
  return Block(std::to_string(stream.size()), stream);
}

}  // namespace

TEST(DescriptionBlock, InflatesExactlyTheStatedLengthIntoTheDocument) {
  const std::string block = Block(Compress(kDocument));
  const DescriptionBlock description(block.c_str());
  EXPECT_TRUE(description.Ok());
  EXPECT_EQ(description.Error(), "");
  EXPECT_EQ(description.Document(), kDocument);
}

TEST(DescriptionBlock, NullPointerIsRefused) {
  const DescriptionBlock description(nullptr);
  EXPECT_FALSE(description.Ok());
  EXPECT_EQ(description.Error(), "the plug-in gives no description");
  EXPECT_EQ(description.Document(), "");
}

TEST(DescriptionBlock, WrongLengthKeyIsRefused) {
  const std::string block = "compressedXLM=12" + std::string(1, '\0') + Compress(kDocument);
  const DescriptionBlock description(block.c_str());
  EXPECT_EQ(description.Error(),
            "the description does not begin with its length line \"compressedXML=\"");
}

TEST(DescriptionBlock, HeaderInsteadOfLengthLineIsRefused) {
  const std::string block = "<<TAVU_XML_START>>Name=VELT" + std::string(1, '\0');
  const DescriptionBlock description(block.c_str());
  EXPECT_EQ(description.Error(),
            "the description does not begin with its length line \"compressedXML=\"");
}

TEST(DescriptionBlock, LengthThatIsNoNumberIsRefused) {
  const std::string stream = Compress(kDocument);
  EXPECT_EQ(DescriptionBlock(Block("12a", stream).c_str()).Error(),
            "the description's length line is not \"compressedXML=\" and a decimal number");
  EXPECT_EQ(DescriptionBlock(Block("-5", stream).c_str()).Error(),
            "the description's length line is not \"compressedXML=\" and a decimal number");
  EXPECT_EQ(DescriptionBlock(Block("1234567890", stream).c_str()).Error(),
            "the description's length line is not \"compressedXML=\" and a decimal number");
}

TEST(DescriptionBlock, MissingOrImplausibleLengthIsRefused) {
  const std::string stream = Compress(kDocument);
  EXPECT_EQ(DescriptionBlock(Block("", stream).c_str()).Error(),
            "the description's length line gives no length");
  EXPECT_EQ(DescriptionBlock(Block("0", stream).c_str()).Error(),
            "the description's stated length 0 is not plausible");
  EXPECT_EQ(DescriptionBlock(Block("16777217", stream).c_str()).Error(),
            "the description's stated length 16777217 is not plausible");
}

TEST(DescriptionBlock, StatedLengthBeyondTheStreamIsRefused) {
  const std::string stream = Compress(kDocument);
  const std::string block = Block(std::to_string(stream.size() + 3), stream);
  const DescriptionBlock description(block.c_str());
  EXPECT_FALSE(description.Ok());
  EXPECT_EQ(description.Error(),
            "the compressed description ends 3 bytes before its stated length of " +
                std::to_string(stream.size() + 3) + " bytes");
  EXPECT_EQ(description.Document(), "");
}

TEST(DescriptionBlock, StatedLengthShortOfTheStreamIsRefused) {
  const std::string stream = Compress(kDocument);
  const std::string block = Block(std::to_string(stream.size() - 4), stream);
  EXPECT_EQ(DescriptionBlock(block.c_str()).Error(),
            "the compressed description goes on past its stated length of " +
                std::to_string(stream.size() - 4) + " bytes");
}

TEST(DescriptionBlock, DamagedStreamIsRefusedWithZlibsReason) {
  std::string stream = Compress(kDocument);
  stream[0] = 0x12;  // no longer a zlib header
  EXPECT_EQ(DescriptionBlock(Block(stream).c_str()).Error(),
            "the compressed description is damaged: incorrect header check");
}

TEST(DescriptionBlock, MissingTrailerIsRefused) {
  const std::string stream = Compress(kDocument);
  const std::string block =
      Block(std::to_string(stream.size()), stream, std::string("<<TAVU_XML_EN>>\0\0", 17));
  const DescriptionBlock description(block.c_str());
  EXPECT_EQ(description.Error(), "the description does not end with \"<<TAVU_XML_END>>\"");
  EXPECT_EQ(description.Document(), "");
}

TEST(DescriptionBlock, ReadsThePluginsOwnDescription) {
  HostInterfaceFactory host("");
  PluginLoader loader(VELT_PLUGIN_PATH, host);
  IProtocol* const protocol = loader.Protocols().CreateProtocol("VELT");
  ASSERT_NE(protocol, nullptr);
  const DescriptionBlock description(protocol->GetXml());
  loader.Protocols().DeleteProtocol(protocol);
  ASSERT_TRUE(description.Ok()) << description.Error();
  EXPECT_EQ(description.Document().rfind("<?xml version=\"1.0\" encoding=\"utf-8\"?>", 0), 0U);
  EXPECT_NE(description.Document().find("<name>VELT</name>"), std::string::npos);
  EXPECT_NE(description.Document().find("<code>472</code>"), std::string::npos);
}
