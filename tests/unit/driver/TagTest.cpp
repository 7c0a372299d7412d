// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <memory>
#include <string>
#include <vector>

#include "DriverFixture.h"
#include "driver/Tag_VELT.h"

namespace {

class TagTest : public DriverFixture {
 protected:
  void SetUp() override { Create(kUdpConfig); }

  // The protocol's error for an address that must fail.
  std::string Refused(const std::string& uri) {
    ITag* const tag = protocol->CreateTag(uri.c_str());
    EXPECT_EQ(tag, nullptr) << uri;
    EXPECT_EQ(protocol->GetLastError(), -1);
    return protocol->GetLastErrorString();
  }

  std::unique_ptr<Tag_VELT> Direct(const std::string& uri) {
    return std::make_unique<Tag_VELT>(uri.c_str(), protocol.get());
  }
};

}  // namespace

TEST_F(TagTest, EmptyNodeFieldIsNodeZero) {
  auto tag = Direct("?rx_token?string-10");
  ASSERT_TRUE(tag->IsValid());
  EXPECT_EQ(tag->getNode(), 0);
  EXPECT_EQ(tag->GetVarType(), ICU_STRING);
  EXPECT_EQ(tag->GetVarLength(), 10);
  EXPECT_EQ(tag->GetItemType(), ICU_BYTE);
  EXPECT_STREQ(tag->GetVarName(), "?rx_token?string-10");
}

TEST_F(TagTest, TwoOrFourFieldsAreRefused) {
  const std::string expected =
      "Tag URI error: ?rx_token - there must be 3 tag spe\x63ification fields";
  EXPECT_EQ(Refused("?rx_token"), expected);
  EXPECT_EQ(Refused("?rx_token?string-10?"),
            "Tag URI error: ?rx_token?string-10? - there must be 3 tag spe\x63ification fields");
}

TEST_F(TagTest, BlanksAroundFieldsAreIgnored) {
  auto tag = Direct(" 2 ?  rx_token\t? string-10 ");
  ASSERT_TRUE(tag->IsValid());
  EXPECT_EQ(tag->getNode(), 2);
  EXPECT_EQ(tag->getMemoryType()->getName(), "rx_token");
  EXPECT_EQ(tag->GetVarLength(), 10);
}

TEST_F(TagTest, HexadecimalAndOctalNodeNumbers) {
  EXPECT_EQ(Direct("0x10?connect?boolean")->getNode(), 16);
  EXPECT_EQ(Direct("010?connect?boolean")->getNode(), 8);
}

TEST_F(TagTest, NodeWithoutASectionUsesTheDefaultModel) {
  auto tag = Direct("7?rx_token?string-10");
  ASSERT_TRUE(tag->IsValid());
  EXPECT_EQ(tag->getNodeParams()->nodeId, -1);
  EXPECT_EQ(tag->getNodeParams()->model, "1");
}

TEST_F(TagTest, NodeWhoseModelIsUnknownCannotReachAMemoryType) {
  Create(std::string(kUdpConfig) + " Node5::model=9");
  EXPECT_EQ(Refused("5?rx_token?string-10"),
            "Tag URI error: 5?rx_token?string-10 - Can't access memory type");
  EXPECT_NE(protocol->CreateTag("6?rx_token?string-10"), nullptr);
}

TEST_F(TagTest, UnknownMemoryTypeIsRefused) {
  EXPECT_EQ(Refused("?rx_tokens?string-10"),
            "Tag URI error: ?rx_tokens?string-10 - Can't access memory type");
  EXPECT_EQ(Refused("?RX_TOKEN?string-10"),
            "Tag URI error: ?RX_TOKEN?string-10 - Can't access memory type");
}

TEST_F(TagTest, MissingFieldsInBindingOrder) {
  EXPECT_EQ(Refused("1??"), "Tag URI error: 1?? - memorytype field missing");
  EXPECT_EQ(Refused("1?rx_token?"), "Tag URI error: 1?rx_token? - tavuType field missing");
}

TEST_F(TagTest, UnknownDataType) {
  EXPECT_EQ(Refused("?rx_token?text-10"),
            "Tag URI error: ?rx_token?text-10 - text-10: data type unknown");
  EXPECT_EQ(Refused("?rx_token?string--4"),
            "Tag URI error: ?rx_token?string--4 - string--4: data type unknown");
}

TEST_F(TagTest, BooleanOnTxTokenIsNotAllowed) {
  EXPECT_EQ(Refused("?tx_token?boolean"),
            "Tag URI error: ?tx_token?boolean - not allowed tavu type");
}

TEST_F(TagTest, AllowedTypesFollowEachMask) {
  for (const char* uri : {"?tx_token?string-8",
                          "?rx_token?string-8",
                          "?SP_SocketType?string-4",
                          "?SP_RemoteIP?string-16",
                          "?SP_LocalIP?string-16",
                          "?SP_BroadcastType?string-8",
                          "?SP_RxPrefix?string-8",
                          "?SP_RxSuffix?string-8",
                          "?SP_TxPrefix?string-8",
                          "?SP_TxSuffix?string-8",
                          "?rx_token_len?unsignedInt",
                          "?tokens_available?unsignedInt",
                          "?SP_Gap?unsignedInt",
                          "?SP_TokenQueueSize?unsignedInt",
                          "?SP_RemotePort?unsignedShort",
                          "?SP_LocalPort?unsignedShort",
                          "?token_ack?boolean",
                          "?SP_HexTokens?boolean",
                          "?SP_Done?boolean",
                          "?connect?boolean",
                          "?conn_stat?boolean"}) {
    EXPECT_TRUE(Direct(uri)->IsValid()) << uri;
  }
  for (const char* uri : {"?rx_token_len?int", "?SP_RemotePort?unsignedInt", "?connect?byte",
                          "?SP_Gap?string-4", "?rx_token?binary-8"}) {
    EXPECT_FALSE(Direct(uri)->IsValid()) << uri;
  }
}

TEST_F(TagTest, EveryValidTagAnswersOffsetAndBitIndexZero) {
  for (const char* uri : {"?rx_token?string-10", "?connect?boolean", "?SP_RemotePort?unsignedShort",
                          "3?tokens_available?unsignedInt"}) {
    auto tag = Direct(uri);
    ASSERT_TRUE(tag->IsValid()) << uri;
    EXPECT_EQ(tag->GetByteOffset(), 0) << uri;
    EXPECT_EQ(tag->GetBitIndex(), 0) << uri;
  }
}

TEST_F(TagTest, RuntimeParameterFlag) {
  EXPECT_TRUE(Direct("?SP_Done?boolean")->getIsRuntimeParameter());
  EXPECT_TRUE(Direct("?SP_RemoteIP?string-16")->getIsRuntimeParameter());
  EXPECT_FALSE(Direct("?connect?boolean")->getIsRuntimeParameter());
  EXPECT_FALSE(Direct("?rx_token?string-10")->getIsRuntimeParameter());
}

TEST_F(TagTest, AccessFlagsComeFromTheMemoryType) {
  EXPECT_TRUE(Direct("?rx_token?string-4")->IsReadOnly());
  EXPECT_TRUE(Direct("?conn_stat?boolean")->IsReadOnly());
  EXPECT_TRUE(Direct("?tx_token?string-4")->IsWriteOnly());
  EXPECT_TRUE(Direct("?token_ack?boolean")->IsWriteOnly());
  EXPECT_FALSE(Direct("?connect?boolean")->IsReadOnly());
  EXPECT_FALSE(Direct("?connect?boolean")->IsWriteOnly());
}

TEST_F(TagTest, ConversionArgumentsAreKept) {
  auto tag = Direct("?rx_token?string-10(swap2, inv)");
  ASSERT_TRUE(tag->IsValid());
  EXPECT_EQ(tag->GetVarLength(), 10);
  EXPECT_EQ(tag->GetConversions(), (std::vector<std::string>{"swap2", "inv"}));
  std::unique_ptr<ITag> copy(tag->Clone());
  EXPECT_EQ(dynamic_cast<Tag_VELT&>(*copy).GetConversions(),
            (std::vector<std::string>{"swap2", "inv"}));
}

TEST_F(TagTest, CloneCopiesEveryFieldWithoutParsing) {
  auto tag = Direct("0x3?SP_RemoteIP?string-16");
  std::unique_ptr<ITag> copy(tag->Clone());
  auto* const clone = dynamic_cast<Tag_VELT*>(copy.get());
  ASSERT_NE(clone, nullptr);
  EXPECT_TRUE(clone->IsValid());
  EXPECT_STREQ(clone->GetVarName(), "0x3?SP_RemoteIP?string-16");
  EXPECT_EQ(clone->getNode(), 3);
  EXPECT_EQ(clone->GetVarType(), ICU_STRING);
  EXPECT_EQ(clone->GetVarLength(), 16);
  EXPECT_EQ(clone->getMemoryType(), tag->getMemoryType());
  EXPECT_EQ(clone->getNodeParams(), tag->getNodeParams());
  EXPECT_TRUE(clone->getIsRuntimeParameter());
}

TEST_F(TagTest, CanBeOptimizedNeedsTheSameNodeMemoryTypeAndRoom) {
  ITag* const a = Tag("?rx_token?string-10");
  ITag* const b = Tag("?rx_token?string-20");
  ITag* const other = Tag("1?rx_token?string-10");
  ITag* const len = Tag("?rx_token_len?unsignedInt");
  ITag* const len2 = Tag("?rx_token_len?unsignedInt");
  EXPECT_TRUE(protocol->CanBeOptimized(a, b, false));
  EXPECT_FALSE(protocol->CanBeOptimized(a, b, true));
  EXPECT_FALSE(protocol->CanBeOptimized(a, other, false));
  EXPECT_FALSE(protocol->CanBeOptimized(a, len, false));
  // One item of four bytes fits a block read count of 1.
  EXPECT_TRUE(protocol->CanBeOptimized(len, len2, false));
}

TEST_F(TagTest, CanBeOptimizedWithABlockReadCountOfZeroAllowsNothing) {
  ITag* const a = Tag("?tokens_available?unsignedInt");
  ITag* const b = Tag("?tokens_available?unsignedInt");
  EXPECT_FALSE(protocol->CanBeOptimized(a, b, false));
  ITag* const c = Tag("?connect?boolean");
  ITag* const d = Tag("?connect?boolean");
  EXPECT_FALSE(protocol->CanBeOptimized(c, d, false));
}

TEST_F(TagTest, CanBeOptimizedCountsTheSpanAgainstTheBlockReadCount) {
  ITag* const small = Tag("?SP_RemoteIP?string-10");
  ITag* const fits = Tag("?SP_RemoteIP?string-9999");
  ITag* const over = Tag("?SP_RemoteIP?string-10000");
  EXPECT_TRUE(protocol->CanBeOptimized(small, fits, false));
  EXPECT_FALSE(protocol->CanBeOptimized(small, over, false));
}
