// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "driver/XmlDescription.h"

#include <gtest/gtest.h>
#include <zlib.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <map>
#include <string>
#include <vector>

#include "MiniXml.h"
#include "config/ParamManager.h"
#include "driver/Protocol_VELT.h"
#include "driver/SettingsTable.h"
#include "protlib/ProtUtilsN.h"

namespace {

const std::string kHeader(
    "<<TAVU_XML_START>>Name=VELT?FullName=Velt Conduit?Version=112?Platform=QX42_LIN\0", 80);
const std::string kLengthKey = "compressedXML=";
const std::string kTrailer("<<TAVU_XML_END>>\0", 17);

using AttributeMap = std::map<std::string, std::string>;

const char* BlockBegin() { return reinterpret_cast<const char*>(Xml_VELT); }
const char* BlockEnd() { return BlockBegin() + XmlSize_VELT; }

// The length line at GetXml_VELT(), without its zero byte; empty when no zero
// byte ends it inside the block.
std::string LengthLine() {
  const char* line = GetXml_VELT();
  const void* zero = std::memchr(line, 0, static_cast<std::size_t>(BlockEnd() - line));
  return zero == nullptr ? std::string() : std::string(line, static_cast<const char*>(zero));
}

// The number the length line gives; 0 when it is not "compressedXML=" and
// decimal digits.
std::size_t StatedLength() {
  const std::string line = LengthLine();
  if (line.compare(0, kLengthKey.size(), kLengthKey) != 0 || line.size() == kLengthKey.size() ||
      line.find_first_not_of("0123456789", kLengthKey.size()) != std::string::npos) {
    return 0;
  }
  return std::stoul(line.substr(kLengthKey.size()));
}

const unsigned char* StreamBegin() {
  return reinterpret_cast<const unsigned char*>(GetXml_VELT()) + LengthLine().size() + 1;
}

struct Inflated {
  int status = Z_OK;
  std::size_t unusedInput = 0;
  std::string output;
};

// Inflates exactly size bytes, as the host does with the stated length.
Inflated Inflate(const unsigned char* data, std::size_t size) {
  Inflated result;
  z_stream stream{};
  if (inflateInit(&stream) != Z_OK) {
    result.status = Z_VERSION_ERROR;
    return result;
  }
  stream.next_in = const_cast<Bytef*>(data);
  stream.avail_in = static_cast<uInt>(size);
  std::vector<char> chunk(4096);
  for (;;) {
    stream.next_out = reinterpret_cast<Bytef*>(chunk.data());
    stream.avail_out = static_cast<uInt>(chunk.size());
    result.status = inflate(&stream, Z_NO_FLUSH);
    result.output.append(chunk.data(), chunk.size() - stream.avail_out);
    if (result.status != Z_OK) {
      break;
    }
  }
  result.unusedInput = stream.avail_in;
  inflateEnd(&stream);
  return result;
}

std::string Document() { return Inflate(StreamBegin(), StatedLength()).output; }

AttributeMap Attributes(const XmlElement& element) {
  AttributeMap map;
  for (const auto& [name, value] : element.attributes()) {
    map[name] = value;
  }
  return map;
}

std::vector<std::string> Texts(const std::vector<const XmlElement*>& elements) {
  std::vector<std::string> texts;
  for (const XmlElement* element : elements) {
    texts.push_back(element->trimmedText());
  }
  return texts;
}

class XmlDocument : public ::testing::Test {
 protected:
  void SetUp() override {
    text = Document();
    ASSERT_TRUE(xml.parse(text)) << xml.error();
  }
  const XmlElement& root() const { return xml.root(); }

  std::string text;
  MiniXml xml;
};

// ---------------------------------------------------------------- the block

TEST(XmlBlock, HeaderAndItsZeroBytePrecedeTheReturnedPointer) {
  ASSERT_EQ(GetXml_VELT() - BlockBegin(), static_cast<std::ptrdiff_t>(kHeader.size()));
  EXPECT_EQ(std::string(BlockBegin(), kHeader.size()), kHeader);
}

TEST(XmlBlock, LengthLineIsKeyAndDecimalLengthEndedByAZeroByte) {
  const std::string line = LengthLine();
  ASSERT_FALSE(line.empty());
  EXPECT_EQ(line.substr(0, kLengthKey.size()), kLengthKey);
  const std::string digits = line.substr(kLengthKey.size());
  ASSERT_FALSE(digits.empty());
  EXPECT_EQ(digits.find_first_not_of("0123456789"), std::string::npos) << line;
  EXPECT_NE(digits[0], '0') << line;
  EXPECT_EQ(line, kLengthKey + std::to_string(StatedLength()));
  EXPECT_EQ(GetXml_VELT()[line.size()], '\0');
}

TEST(XmlBlock, StreamBeginsWithTheDefaultLevelZlibHeader) {
  ASSERT_GT(StatedLength(), 2U);
  EXPECT_EQ(StreamBegin()[0], 0x78);
  EXPECT_EQ(StreamBegin()[1], 0x9C);
}

TEST(XmlBlock, StatedLengthIsTheByteCountBetweenLengthLineAndTrailer) {
  const auto* trailer = reinterpret_cast<const unsigned char*>(BlockEnd()) - kTrailer.size();
  ASSERT_GE(trailer, StreamBegin());
  EXPECT_EQ(static_cast<std::size_t>(trailer - StreamBegin()), StatedLength());
  EXPECT_EQ(XmlSize_VELT,
            kHeader.size() + LengthLine().size() + 1 + StatedLength() + kTrailer.size());
}

TEST(XmlBlock, TrailerWithItsZeroByteFollowsTheStreamAndEndsTheBlock) {
  const char* afterStream = reinterpret_cast<const char*>(StreamBegin()) + StatedLength();
  ASSERT_EQ(BlockEnd() - afterStream, static_cast<std::ptrdiff_t>(kTrailer.size()));
  EXPECT_EQ(std::string(afterStream, kTrailer.size()), kTrailer);
}

TEST(XmlBlock, InflatingExactlyTheStatedLengthEndsTheStreamWithNothingLeft) {
  const Inflated whole = Inflate(StreamBegin(), StatedLength());
  EXPECT_EQ(whole.status, Z_STREAM_END);
  EXPECT_EQ(whole.unusedInput, 0U);
  ASSERT_GE(whole.output.size(), 16U);
  EXPECT_EQ(whole.output.substr(0, 5), "<?xml");
  EXPECT_EQ(whole.output.substr(whole.output.size() - 16), "</protocol_cfg>\n");
}

TEST(XmlBlock, EveryStatedByteIsPartOfTheStream) {
  // One byte short, the stream has not ended: the length is not generous.
  ASSERT_GT(StatedLength(), 0U);
  const Inflated shortened = Inflate(StreamBegin(), StatedLength() - 1);
  EXPECT_NE(shortened.status, Z_STREAM_END);
}

TEST(XmlBlock, GetXmlReturnsTheSamePointerEveryTime) {
  const char* first = GetXml_VELT();
  for (int call = 0; call < 100; ++call) {
    ASSERT_EQ(GetXml_VELT(), first);
  }
  EXPECT_EQ(first, BlockBegin() + kHeader.size());
}

// ------------------------------------------------------------- the document

TEST_F(XmlDocument, IsUtf8WithAVersionOneDeclarationFirst) {
  const std::string declaration = "<?xml version=\"1.0\" encoding=\"utf-8\"?>\n";
  EXPECT_EQ(text.substr(0, declaration.size()), declaration);
  ASSERT_NE(xml.declaration(), nullptr);
  EXPECT_EQ(Attributes(*xml.declaration()),
            (AttributeMap{{"version", "1.0"}, {"encoding", "utf-8"}}));
  EXPECT_EQ(root().name(), "protocol_cfg");
}

TEST_F(XmlDocument, IsIndentedByTwoSpacesPerLevel) {
  int depth = 0;
  std::size_t lineNumber = 0;
  std::size_t start = 0;
  while (start < text.size()) {
    const std::size_t end = text.find('\n', start);
    const std::string line = text.substr(start, end - start);
    start = end == std::string::npos ? text.size() : end + 1;
    ++lineNumber;
    const std::size_t indent = line.find_first_not_of(' ');
    ASSERT_NE(indent, std::string::npos) << "blank line " << lineNumber;
    const std::string content = line.substr(indent);
    ASSERT_EQ(content[0], '<') << "line " << lineNumber << ": " << line;
    if (content.compare(0, 2, "<?") == 0 || content.compare(0, 4, "<!--") == 0) {
      continue;
    }
    const bool closing = content.compare(0, 2, "</") == 0;
    depth -= closing ? 1 : 0;
    EXPECT_EQ(indent, static_cast<std::size_t>(2 * depth)) << "line " << lineNumber << ": " << line;
    const std::string name = content.substr(1, content.find_first_of(" >/", 1) - 1);
    const bool closesOnItsLine = content.find("</" + name + ">") != std::string::npos ||
                                 content.find("/>") != std::string::npos;
    depth += (!closing && !closesOnItsLine) ? 1 : 0;
  }
  EXPECT_EQ(depth, 0);
}

// The capability and identity elements, in document order, with their text.
std::vector<std::pair<std::string, std::string>> Capabilities() {
  return {{"usesUart", "false"},
          {"usesEthernet", "true"},
          {"usesNetwork", "false"},
          {"usesDatagram", "false"},
          {"canWriteDatagram", "false"},
          {"canMultipleRead", "false"},
          {"canMultipleWrite", "false"},
          {"usesTags", "false"},
          {"isReentrant", "true"},
          {"isConverted", "false"},
          {"isProtgen", "true"},
          {"usesTask", "true"},
          {"usesSemaphore", "true"},
          {"usesDoCommand", "true"},
          {"usesExtend", "true"},
          {"inheritsProtgen", "false"},
          {"usesOfflineOpt", "false"},
          {"name", "VELT"},
          {"display", "Velt Conduit"},
          {"compatibilityCode", ""},
          {"displayDlgTitle", "Velt Conduit"},
          {"VCS", "none"},
          {"arrayItem", "none"},
          {"protGenVer", "214"},
          {"code", "472"},
          {"maxDisplayRows", "14"},
          {"defaultOrt", "30000"},
          {"minimumOrt", "1000"},
          {"defaultRpt", "3"}};
}

TEST_F(XmlDocument, RootHoldsTheCapabilitiesThenTheFiveSections) {
  std::vector<std::string> expected;
  for (const auto& capability : Capabilities()) {
    expected.push_back(capability.first);
  }
  for (const char* section : {"parameters", "memtypes", "tag_uri", "models", "conversions"}) {
    expected.emplace_back(section);
  }
  EXPECT_EQ(root().childNames(), expected);
  EXPECT_TRUE(root().attributes().empty());
  EXPECT_EQ(root().trimmedText(), "");
}

TEST_F(XmlDocument, CapabilityAndIdentityValues) {
  for (const auto& [name, value] : Capabilities()) {
    const XmlElement* element = root().find(name);
    ASSERT_NE(element, nullptr) << name;
    EXPECT_EQ(element->text(), value) << name;
    EXPECT_TRUE(element->attributes().empty()) << name;
    EXPECT_TRUE(element->children().empty()) << name;
  }
}

TEST_F(XmlDocument, IdentityAgreesWithTheBlockHeader) {
  ASSERT_NE(root().find("name"), nullptr);
  ASSERT_NE(root().find("display"), nullptr);
  EXPECT_EQ(root().find("name")->text(), "VELT");
  EXPECT_EQ(root().find("display")->text(), "Velt Conduit");
  EXPECT_NE(kHeader.find("?FullName=" + root().find("display")->text() + "?"), std::string::npos);
  EXPECT_NE(kHeader.find(">Name=" + root().find("name")->text() + "?"), std::string::npos);
}

// ----------------------------------------------------------- the parameters

struct ParameterRow {
  const char* key;
  AttributeMap attributes;
  std::vector<std::pair<std::string, std::string>> children;
};

// group "none", isDistinct false and isNodeProperty false unless given.
AttributeMap Parameter(AttributeMap specific) {
  AttributeMap all = {{"group", "none"}, {"isDistinct", "false"}, {"isNodeProperty", "false"}};
  for (auto& [name, value] : specific) {
    all[name] = value;
  }
  return all;
}

std::vector<ParameterRow> ExpectedParameters() {
  return {
      {"CfgVer",
       Parameter({{"display", "none"},
                  {"type", "prop_integer"},
                  {"default", "1"},
                  {"isMandatory", "true"}}),
       {}},
      {"socketType",
       Parameter({{"display", "Socket type"},
                  {"type", "prop_list"},
                  {"listType", "prop_string"},
                  {"default", "UDP"},
                  {"isMandatory", "true"}}),
       {{"list_entry", "UDP"}, {"list_entry", "TCP"}}},
      {"remoteIpAddress",
       Parameter({{"display", "Remote IP address"},
                  {"type", "prop_hostName"},
                  {"default", "127.0.0.1"},
                  {"isMandatory", "true"}}),
       {}},
      {"remotePort",
       Parameter({{"display", "Remote port"},
                  {"type", "prop_integer"},
                  {"spin", "0"},
                  {"default", "0"},
                  {"min", "0"},
                  {"max", "65535"},
                  {"isMandatory", "true"}}),
       {}},
      {"localIpAddress",
       Parameter({{"display", "Local IP address"},
                  {"type", "prop_hostName"},
                  {"default", "0.0.0.0"},
                  {"defaultValue", "0.0.0.0"},
                  {"isMandatory", "false"}}),
       {}},
      {"localPort",
       Parameter({{"display", "localPort"},
                  {"type", "prop_integer"},
                  {"default", "0"},
                  {"defaultValue", "0"},
                  {"isMandatory", "false"}}),
       {}},
      {"broadcastType",
       Parameter({{"display", "Broadcast type"},
                  {"type", "prop_list"},
                  {"listType", "prop_string"},
                  {"default", "Global"},
                  {"defaultValue", "Global"},
                  {"isMandatory", "false"}}),
       {{"list_entry", "Global"},
        {"list_entry", "Local"},
        {"disable_list_id", "socketType"},
        {"disable_list_entry", "1"}}},
      {"rx_prefix",
       Parameter({{"display", "Rx Token Prefix"},
                  {"type", "prop_string"},
                  {"default", ""},
                  {"defaultValue", ""},
                  {"isMandatory", "false"}}),
       {}},
      {"rx_suffix",
       Parameter({{"display", "Rx Token Suffix"},
                  {"type", "prop_string"},
                  {"default", ""},
                  {"defaultValue", ""},
                  {"isMandatory", "false"}}),
       {}},
      {"gap",
       Parameter({{"display", "Token Gap"},
                  {"type", "prop_integer"},
                  {"default", "0"},
                  {"defaultValue", "0"},
                  {"isMandatory", "false"}}),
       {}},
      {"tx_prefix",
       Parameter({{"display", "Tx Token Prefix"},
                  {"type", "prop_string"},
                  {"default", ""},
                  {"defaultValue", ""},
                  {"isMandatory", "false"}}),
       {}},
      {"tx_suffix",
       Parameter({{"display", "Tx Token Suffix"},
                  {"type", "prop_string"},
                  {"default", ""},
                  {"defaultValue", ""},
                  {"isMandatory", "false"}}),
       {}},
      {"hex_tokens",
       Parameter({{"display", "Hexadecimal Tokens"},
                  {"type", "prop_bool"},
                  {"default", "false"},
                  {"defaultValue", "false"},
                  {"isMandatory", "false"}}),
       {}},
      {"token_queue_size",
       Parameter({{"display", "Token Queue Size"},
                  {"type", "prop_integer"},
                  {"spin", "0"},
                  {"default", "100"},
                  {"defaultValue", "100"},
                  {"min", "1"},
                  {"max", "10000"},
                  {"isMandatory", "false"}}),
       {}},
      {"model",
       Parameter({{"display", "Model"},
                  {"type", "prop_modelRef"},
                  {"default", "1"},
                  {"isNodeProperty", "true"},
                  {"isMandatory", "true"}}),
       {}},
  };
}

TEST_F(XmlDocument, ParametersAreTheFifteenKeysInOrder) {
  const XmlElement* parameters = root().find("parameters");
  ASSERT_NE(parameters, nullptr);
  EXPECT_TRUE(parameters->attributes().empty());
  EXPECT_EQ(parameters->childNames(), std::vector<std::string>(15, "parameter"));
  EXPECT_EQ(Texts(root().findAll("parameters/parameter")),
            (std::vector<std::string>{"CfgVer", "socketType", "remoteIpAddress", "remotePort",
                                      "localIpAddress", "localPort", "broadcastType", "rx_prefix",
                                      "rx_suffix", "gap", "tx_prefix", "tx_suffix", "hex_tokens",
                                      "token_queue_size", "model"}));
}

TEST_F(XmlDocument, EachParameterCarriesExactlyItsAttributes) {
  for (const ParameterRow& row : ExpectedParameters()) {
    const XmlElement* parameter = root().findByText("parameters/parameter", row.key);
    ASSERT_NE(parameter, nullptr) << row.key;
    EXPECT_EQ(Attributes(*parameter), row.attributes) << row.key;
  }
}

TEST_F(XmlDocument, ListEntriesAndTheDisableRuleAreChildElements) {
  for (const ParameterRow& row : ExpectedParameters()) {
    const XmlElement* parameter = root().findByText("parameters/parameter", row.key);
    ASSERT_NE(parameter, nullptr) << row.key;
    std::vector<std::pair<std::string, std::string>> children;
    for (const XmlElement& child : parameter->children()) {
      children.emplace_back(child.name(), child.text());
      EXPECT_TRUE(child.attributes().empty()) << row.key << "/" << child.name();
    }
    EXPECT_EQ(children, row.children) << row.key;
  }
}

TEST_F(XmlDocument, OnlyModelIsANodeProperty) {
  for (const XmlElement* parameter : root().findAll("parameters/parameter")) {
    const bool isModel = parameter->trimmedText() == "model";
    EXPECT_EQ(parameter->attribute("isNodeProperty"), isModel ? "true" : "false")
        << parameter->trimmedText();
  }
}

TEST_F(XmlDocument, MandatoryKeysOfferDefaultsToTheToolOnly) {
  // The parser gives socketType, remoteIpAddress and remotePort no default;
  // the description offers them to the tool without a defaultValue.
  for (const char* key : {"CfgVer", "socketType", "remoteIpAddress", "remotePort", "model"}) {
    const XmlElement* parameter = root().findByText("parameters/parameter", key);
    ASSERT_NE(parameter, nullptr) << key;
    EXPECT_EQ(parameter->attribute("isMandatory"), "true") << key;
    EXPECT_FALSE(parameter->hasAttribute("defaultValue")) << key;
  }
}

// ------------------------------------------------------------- memory types

struct MemoryTypeRow {
  const char* name;
  const char* display;
  const char* naturalType;
  const char* tavuTypes;
  bool readOnly;
  bool writeOnly;
  const char* maxIndex;
  const char* blockRead;
  const char* blockWrite;
};

// Registration order.
const std::vector<MemoryTypeRow>& ExpectedMemoryTypes() {
  static const std::vector<MemoryTypeRow> rows = {
      {"tx_token", "Token To Send", "byte", "0x200", false, true, "999999999", "999999999",
       "999999999"},
      {"rx_token", "Token Received", "byte", "0x200", true, false, "999999999", "999999999", "0"},
      {"rx_token_len", "Length of Token Received", "unsignedInt", "0x40", true, false, "1", "1",
       "0"},
      {"tokens_available", "Tokens Available", "unsignedInt", "0x40", true, false, "1", "0", "0"},
      {"token_ack", "Token Acknowledge", "boolean", "0x1", false, true, "1", "0", "0"},
      {"SP_SocketType", "Socket type", "byte", "0x200", false, false, "9999", "9999", "9999"},
      {"SP_RemoteIP", "Remote IP address", "byte", "0x200", false, false, "9999", "9999", "9999"},
      {"SP_RemotePort", "Remote Port", "unsignedShort", "0x20", false, false, "1", "0", "0"},
      {"SP_LocalIP", "Local IP address", "byte", "0x200", false, false, "9999", "9999", "9999"},
      {"SP_LocalPort", "Local port", "unsignedShort", "0x20", false, false, "1", "0", "0"},
      {"SP_BroadcastType", "Broadcast type", "byte", "0x200", false, false, "9999", "9999", "9999"},
      {"SP_RxPrefix", "Rx Token Prefix", "byte", "0x200", false, false, "9999", "9999", "9999"},
      {"SP_RxSuffix", "Rx Token Suffix", "byte", "0x200", false, false, "9999", "9999", "9999"},
      {"SP_Gap", "Token Gap", "unsignedInt", "0x40", false, false, "1", "0", "0"},
      {"SP_TxPrefix", "Tx Token Prefix", "byte", "0x200", false, false, "9999", "9999", "9999"},
      {"SP_TxSuffix", "Tx Token Suffix", "byte", "0x200", false, false, "9999", "9999", "9999"},
      {"SP_HexTokens", "Hexadecimal Tokens", "boolean", "0x1", false, false, "1", "0", "0"},
      {"SP_TokenQueueSize", "Token Queue Size", "unsignedInt", "0x40", false, false, "1", "0", "0"},
      {"SP_Done", "Done", "boolean", "0x1", false, false, "1", "0", "0"},
      {"conn_stat", "connection status", "boolean", "0x1", true, false, "1", "0", "0"},
      {"connect", "connect", "boolean", "0x1", false, false, "1", "0", "0"},
  };
  return rows;
}

const char* Bool(bool value) { return value ? "true" : "false"; }

AttributeMap MemoryTypeAttributes(const MemoryTypeRow& row) {
  return {{"display", row.display},
          {"naturalType", row.naturalType},
          {"tavuTypes", row.tavuTypes},
          {"min", "0"},
          {"max", row.maxIndex},
          {"blockReadCount", row.blockRead},
          {"blockWriteCount", row.blockWrite},
          {"isReadOnly", Bool(row.readOnly)},
          {"isWriteOnly", Bool(row.writeOnly)},
          {"canBitWrite", "false"},
          {"mustBitRead", "false"},
          {"canBitArrayWrite", "false"},
          {"isSwap2", "false"},
          {"isSwap4", "false"},
          {"isSwap8", "false"},
          {"hasInternalConversion", "false"},
          {"useInDatagram", "false"}};
}

TEST_F(XmlDocument, MemoryTypesAreTheTwentyOneInRegistrationOrder) {
  const XmlElement* memtypes = root().find("memtypes");
  ASSERT_NE(memtypes, nullptr);
  EXPECT_TRUE(memtypes->attributes().empty());
  EXPECT_EQ(memtypes->childNames(), std::vector<std::string>(21, "memtype"));
  std::vector<std::string> names;
  for (const MemoryTypeRow& row : ExpectedMemoryTypes()) {
    names.emplace_back(row.name);
  }
  EXPECT_EQ(Texts(root().findAll("memtypes/memtype")), names);
}

TEST_F(XmlDocument, EachMemoryTypeCarriesExactlyItsAttributes) {
  for (const MemoryTypeRow& row : ExpectedMemoryTypes()) {
    const XmlElement* memtype = root().findByText("memtypes/memtype", row.name);
    ASSERT_NE(memtype, nullptr) << row.name;
    EXPECT_EQ(Attributes(*memtype), MemoryTypeAttributes(row)) << row.name;
    EXPECT_TRUE(memtype->children().empty()) << row.name;
  }
}

// ---------------------------------------------------------------- tag_uri

TEST_F(XmlDocument, TagUriHasTheThreeAddressFields) {
  const AttributeMap common = {{"arrayType", "false"},
                               {"readonly", "true"},
                               {"conversion", "true"},
                               {"ExcludeOnlyIf", "false"}};
  auto field = [&common](AttributeMap specific) {
    specific.insert(common.begin(), common.end());
    return specific;
  };
  const std::vector<std::pair<std::string, AttributeMap>> expected = {
      {"node", field({{"display", "node"},
                      {"type", "prop_nodeRef"},
                      {"group", "network"},
                      {"default", ""},
                      {"defaultValue", ""},
                      {"sub", "false"},
                      {"isMandatory", "false"}})},
      {"memorytype", field({{"display", "Memory Type"},
                            {"type", "prop_memRef"},
                            {"group", "field"},
                            {"default", ""},
                            {"sub", "false"},
                            {"isMandatory", "true"}})},
      {"datatype", field({{"display", "Data Type"},
                          {"type", "prop_tavuType"},
                          {"group", "field"},
                          {"default", "boolean"},
                          {"sub", "true"},
                          {"isMandatory", "true"}})},
  };
  const XmlElement* tagUri = root().find("tag_uri");
  ASSERT_NE(tagUri, nullptr);
  EXPECT_TRUE(tagUri->attributes().empty());
  ASSERT_EQ(tagUri->childNames(), std::vector<std::string>(3, "tag_field"));
  for (std::size_t i = 0; i < expected.size(); ++i) {
    const XmlElement& tagField = tagUri->children()[i];
    EXPECT_EQ(tagField.text(), expected[i].first);
    EXPECT_EQ(Attributes(tagField), expected[i].second) << expected[i].first;
  }
}

// ----------------------------------------------------------------- models

const std::vector<std::string>& ModelOrder() {
  static const std::vector<std::string> order = {
      "tx_token",        "rx_token",    "rx_token_len",  "tokens_available",  "token_ack",
      "connect",         "conn_stat",   "SP_RxPrefix",   "SP_RxSuffix",       "SP_Gap",
      "SP_TxPrefix",     "SP_TxSuffix", "SP_HexTokens",  "SP_TokenQueueSize", "SP_Done",
      "SP_SocketType",   "SP_RemoteIP", "SP_RemotePort", "SP_LocalIP",        "SP_LocalPort",
      "SP_BroadcastType"};
  return order;
}

TEST_F(XmlDocument, OneModelNamedOneWithoutDatagrams) {
  const std::vector<const XmlElement*> models = xml.findAll("protocol_cfg/models/model");
  ASSERT_EQ(models.size(), 1U);
  EXPECT_EQ(root().find("models")->childNames(), std::vector<std::string>{"model"});
  EXPECT_TRUE(root().find("models")->attributes().empty());
  EXPECT_EQ(
      Attributes(*models[0]),
      (AttributeMap{{"display", "default"}, {"datagramCount", "0"}, {"datagramLength", "0"}}));
  EXPECT_EQ(models[0]->trimmedText(), "1");
}

TEST_F(XmlDocument, ModelListsItsMemoryTypesInModelOrder) {
  const XmlElement* model = xml.find("protocol_cfg/models/model");
  ASSERT_NE(model, nullptr);
  EXPECT_EQ(model->childNames(), std::vector<std::string>(21, "memtype_ref"));
  EXPECT_EQ(Texts(model->findAll("memtype_ref")), ModelOrder());
}

TEST_F(XmlDocument, ModelOrderDeliberatelyDiffersFromRegistrationOrder) {
  const std::vector<std::string> registered = Texts(root().findAll("memtypes/memtype"));
  const std::vector<std::string> listed = Texts(root().findAll("models/model/memtype_ref"));
  EXPECT_NE(registered, listed);
  // Same set, different order: connect is registered last but listed sixth.
  EXPECT_EQ(registered.back(), "connect");
  EXPECT_EQ(listed[5], "connect");
  std::vector<std::string> sortedRegistered = registered;
  std::vector<std::string> sortedListed = listed;
  std::sort(sortedRegistered.begin(), sortedRegistered.end());
  std::sort(sortedListed.begin(), sortedListed.end());
  EXPECT_EQ(sortedRegistered, sortedListed);
}

TEST_F(XmlDocument, EachModelReferenceSpansZeroToTheMemoryTypesMaximumIndex) {
  for (const XmlElement* reference : root().findAll("models/model/memtype_ref")) {
    const std::string name = reference->text();
    const XmlElement* memtype = root().findByText("memtypes/memtype", name);
    ASSERT_NE(memtype, nullptr) << name;
    std::string expectedMax;
    for (const MemoryTypeRow& row : ExpectedMemoryTypes()) {
      expectedMax = name == row.name ? row.maxIndex : expectedMax;
    }
    EXPECT_EQ(Attributes(*reference), (AttributeMap{{"min", "0"}, {"max", expectedMax}})) << name;
    EXPECT_EQ(reference->attribute("max"), memtype->attribute("max")) << name;
    EXPECT_TRUE(reference->children().empty()) << name;
  }
}

// ------------------------------------------------------------ conversions

TEST_F(XmlDocument, EndsWithAnEmptyConversionsElement) {
  ASSERT_FALSE(root().children().empty());
  const XmlElement& conversions = root().children().back();
  EXPECT_EQ(conversions.name(), "conversions");
  EXPECT_EQ(Attributes(conversions), (AttributeMap{{"display", "Conversions"}}));
  EXPECT_TRUE(conversions.children().empty());
  EXPECT_EQ(conversions.text(), "");
}

// ------------------------------------------- the description and the code

// The description is checked against what the driver registers and parses,
// read from the code itself, so the two cannot drift apart.
class DescriptionAndCode : public XmlDocument {
 protected:
  static std::string Flag(bool value) { return value ? "true" : "false"; }
  static std::string TypeName(ICU_Type type) {
    return ProtUtilsN::GetTAVUName(type, ProtUtilsN::GetDataLength(type));
  }
  static std::string Hex(int mask) {
    char text[16];
    std::snprintf(text, sizeof text, "0x%x", static_cast<unsigned int>(mask));
    return text;
  }
  static bool Parses(const std::string& extra) {
    _VELT::ParamManager parameters;
    return parameters.parse(
        ("CfgVer=1 model=1 socketType=UDP remoteIpAddress=1.2.3.4 remotePort=1 " + extra).c_str());
  }
  const XmlElement& Parameter(const std::string& key) const {
    const XmlElement* parameter = root().findByText("parameters/parameter", key);
    EXPECT_NE(parameter, nullptr) << key;
    return parameter == nullptr ? root() : *parameter;
  }
  Protocol_VELT protocol;
};

TEST_F(DescriptionAndCode, MemoryTypesAreTheRegisteredOnes) {
  const Model* model = protocol.getMemoryManager().getModel("1");
  ASSERT_NE(model, nullptr);
  const std::vector<const XmlElement*> described = root().findAll("memtypes/memtype");
  const std::vector<MemoryType>& registered = model->getMemoryTypes();
  ASSERT_EQ(described.size(), registered.size());
  for (std::size_t i = 0; i < registered.size(); ++i) {
    const MemoryType& type = registered[i];
    const XmlElement& element = *described[i];
    SCOPED_TRACE(type.getName());
    EXPECT_EQ(element.trimmedText(), type.getName());
    EXPECT_EQ(element.attribute("naturalType"), TypeName(type.getNaturalType()));
    EXPECT_EQ(element.attribute("tavuTypes"), Hex(type.getTavuTypes()));
    EXPECT_EQ(element.attribute("min"), std::to_string(type.getMinIndex()));
    EXPECT_EQ(element.attribute("max"), std::to_string(type.getMaxIndex()));
    EXPECT_EQ(element.attribute("blockReadCount"), std::to_string(type.getBlockReadCount()));
    EXPECT_EQ(element.attribute("blockWriteCount"), std::to_string(type.getBlockWriteCount()));
    EXPECT_EQ(element.attribute("isReadOnly"), Flag(type.isReadOnly()));
    EXPECT_EQ(element.attribute("isWriteOnly"), Flag(type.isWriteOnly()));
    EXPECT_EQ(element.attribute("canBitWrite"), Flag(type.canBitWrite()));
    EXPECT_EQ(element.attribute("mustBitRead"), Flag(type.mustBitRead()));
    EXPECT_EQ(element.attribute("canBitArrayWrite"), Flag(type.canBitArrayWrite()));
    EXPECT_EQ(element.attribute("isSwap2"), Flag(type.isSwap2()));
    EXPECT_EQ(element.attribute("isSwap4"), Flag(type.isSwap4()));
    EXPECT_EQ(element.attribute("isSwap8"), Flag(type.isSwap8()));
    EXPECT_EQ(element.attribute("hasInternalConversion"), Flag(type.hasInternalConversion()));
    EXPECT_EQ(element.attribute("useInDatagram"), Flag(type.useInDatagram()));
  }
}

TEST_F(DescriptionAndCode, ModelIsTheRegisteredOne) {
  const Model* model = protocol.getMemoryManager().getModel("1");
  ASSERT_NE(model, nullptr);
  const XmlElement* element = root().find("models/model");
  ASSERT_NE(element, nullptr);
  EXPECT_EQ(element->trimmedText(), model->getName());
  EXPECT_EQ(element->attribute("datagramCount"), std::to_string(model->getMaxDatagramItems()));
  EXPECT_EQ(element->attribute("datagramLength"), std::to_string(model->getMaxDatagramLength()));
  const std::vector<const XmlElement*> references = element->findAll("memtype_ref");
  EXPECT_EQ(references.size(), model->getMemoryTypes().size());
  for (const XmlElement* reference : references) {
    const MemoryType* type =
        protocol.getMemoryManager().getMemoryType(model->getName(), reference->trimmedText());
    ASSERT_NE(type, nullptr) << reference->trimmedText();
    EXPECT_EQ(reference->attribute("min"), std::to_string(type->getMinIndex()));
    EXPECT_EQ(reference->attribute("max"), std::to_string(type->getMaxIndex()));
  }
}

TEST_F(DescriptionAndCode, IdentityIsTheDriversOwn) {
  EXPECT_EQ(root().find("name")->trimmedText(), protocol.GetName());
  EXPECT_EQ(root().find("display")->trimmedText(), protocol.GetProtocolName());
  EXPECT_EQ(root().find("code")->trimmedText(), std::to_string(protocol.GetProtocolType()));
  const std::string version = "Version=" + std::to_string(protocol.GetProtocolVersion()) + "?";
  EXPECT_NE(kHeader.find(version), std::string::npos);
  EXPECT_EQ(protocol.GetXml(), GetXml_VELT());
}

TEST_F(DescriptionAndCode, AddressFieldsAreTheDriversOwn) {
  const char* const* names = protocol.tagUriNames();
  const std::vector<const XmlElement*> fields = root().findAll("tag_uri/tag_field");
  std::vector<std::string> fromCode;
  for (; *names != nullptr; ++names) {
    fromCode.push_back(*names);
  }
  EXPECT_EQ(Texts(fields), fromCode);
}

TEST_F(DescriptionAndCode, OptionalParameterDefaultsAreTheParsersOwn) {
  _VELT::ParamManager parameters;
  ASSERT_TRUE(
      parameters.parse("CfgVer=1 model=1 socketType=UDP remoteIpAddress=1.2.3.4 remotePort=1"));
  const _VELT::CommonParams& common = *parameters.getCommonParams();
  EXPECT_EQ(Parameter("localIpAddress").attribute("default"), common.localIpAddress);
  EXPECT_EQ(Parameter("localPort").attribute("default"), std::to_string(common.localPort));
  EXPECT_EQ(Parameter("broadcastType").attribute("default"), common.broadcastType);
  EXPECT_EQ(Parameter("rx_prefix").attribute("default"), common.rx_prefix);
  EXPECT_EQ(Parameter("rx_suffix").attribute("default"), common.rx_suffix);
  EXPECT_EQ(Parameter("gap").attribute("default"), std::to_string(common.gap));
  EXPECT_EQ(Parameter("tx_prefix").attribute("default"), common.tx_prefix);
  EXPECT_EQ(Parameter("tx_suffix").attribute("default"), common.tx_suffix);
  EXPECT_EQ(Parameter("hex_tokens").attribute("default"), Flag(common.hex_tokens));
  EXPECT_EQ(Parameter("token_queue_size").attribute("default"),
            std::to_string(common.token_queue_size));
  EXPECT_EQ(Parameter("model").attribute("default"), parameters.getNodeParams(0)->model);
}

TEST_F(DescriptionAndCode, RangesAreTheParsersOwn) {
  const XmlElement& queue = Parameter("token_queue_size");
  const int low = std::stoi(*queue.attribute("min"));
  const int high = std::stoi(*queue.attribute("max"));
  EXPECT_TRUE(Parses("token_queue_size=" + std::to_string(low)));
  EXPECT_TRUE(Parses("token_queue_size=" + std::to_string(high)));
  EXPECT_FALSE(Parses("token_queue_size=" + std::to_string(low - 1)));
  EXPECT_FALSE(Parses("token_queue_size=" + std::to_string(high + 1)));
  const XmlElement& port = Parameter("remotePort");
  const int portHigh = std::stoi(*port.attribute("max"));
  EXPECT_EQ(*port.attribute("min"), "0");
  _VELT::ParamManager parameters;
  EXPECT_TRUE(parameters.parse(("CfgVer=1 model=1 socketType=UDP remoteIpAddress=1.2.3.4 "
                                "remotePort=" +
                                std::to_string(portHigh))
                                   .c_str()));
  EXPECT_FALSE(parameters.parse(("CfgVer=1 model=1 socketType=UDP remoteIpAddress=1.2.3.4 "
                                 "remotePort=" +
                                 std::to_string(portHigh + 1))
                                    .c_str()));
  EXPECT_FALSE(
      parameters.parse("CfgVer=1 model=1 socketType=UDP remoteIpAddress=1.2.3.4 remotePort=-1"));
}

TEST_F(DescriptionAndCode, SocketTypesListedAreTheOnesTheDriverAccepts) {
  const std::vector<const XmlElement*> entries = Parameter("socketType").findAll("list_entry");
  ASSERT_EQ(Texts(entries), (std::vector<std::string>{"UDP", "TCP"}));
  const std::vector<const XmlElement*> broadcast = Parameter("broadcastType").findAll("list_entry");
  ASSERT_EQ(Texts(broadcast), (std::vector<std::string>{"Global", "Local"}));
}
TEST_F(DescriptionAndCode, SettingsTableMatchesTheParametersAndMemoryTypes) {
  // Each runtime setting has its configuration parameter, in Start's order
  // among the parameters, with a type of its kind, and its memory type,
  // typed after its kind too.
  std::vector<std::string> keys;
  for (const XmlElement* parameter : root().findAll("parameters/parameter")) {
    const std::string key = parameter->trimmedText();
    if (key != "CfgVer" && key != "model") {
      keys.push_back(key);
    }
  }
  std::vector<std::string> fromTable;
  for (const SettingRow& row : SettingRows()) {
    SCOPED_TRACE(row.memoryType);
    fromTable.emplace_back(row.configKey);
    const std::string type = *Parameter(row.configKey).attribute("type");
    const XmlElement* memtype = root().findByText("memtypes/memtype", row.memoryType);
    ASSERT_NE(memtype, nullptr);
    const std::string natural = *memtype->attribute("naturalType");
    switch (row.kind) {
      case SettingKind::Text:
        EXPECT_TRUE(type == "prop_string" || type == "prop_hostName" || type == "prop_list");
        EXPECT_EQ(natural, "byte");
        break;
      case SettingKind::Port:
        EXPECT_EQ(type, "prop_integer");
        EXPECT_EQ(natural, "unsignedShort");
        break;
      case SettingKind::Number:
        EXPECT_EQ(type, "prop_integer");
        EXPECT_EQ(natural, "unsignedInt");
        break;
      case SettingKind::Flag:
        EXPECT_EQ(type, "prop_bool");
        EXPECT_EQ(natural, "boolean");
        break;
    }
  }
  EXPECT_EQ(fromTable, keys);
}

TEST_F(DescriptionAndCode, EveryRuntimeParameterMemoryTypeIsASettingOrTheApply) {
  std::vector<std::string> described;
  for (const XmlElement* memtype : root().findAll("memtypes/memtype")) {
    const std::string name = memtype->trimmedText();
    if (name.rfind("SP_", 0) == 0 && name != "SP_Done") {
      described.push_back(name);
    }
  }
  std::vector<std::string> fromTable;
  for (const SettingRow& row : SettingRows()) {
    fromTable.emplace_back(row.memoryType);
  }
  EXPECT_EQ(described, fromTable);
}
}  // namespace
