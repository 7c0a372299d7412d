// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "factory/ProtocolFactory.h"

#include <gtest/gtest.h>

TEST(ProtocolFactory, Identity) {
  ProtocolFactory factory;
  EXPECT_STREQ(factory.GetImpName(), "ProtFactoryInDLL");
  EXPECT_EQ(factory.GetImpVersion(), 100);
}

TEST(ProtocolFactory, ConvertToAnswersItsTwoNames) {
  ProtocolFactory factory;
  EXPECT_EQ(factory.ConvertTo("ProtocolFactory"), static_cast<IInterface*>(&factory));
  EXPECT_EQ(factory.ConvertTo("IProtocolFactory"), static_cast<IInterface*>(&factory));
}

TEST(ProtocolFactory, ConvertToIProtocolGivesNull) {
  ProtocolFactory factory;
  EXPECT_EQ(factory.ConvertTo("IProtocol"), nullptr);
  EXPECT_EQ(factory.ConvertTo("iprotocolfactory"), nullptr);
  EXPECT_EQ(factory.ConvertTo(""), nullptr);
}

TEST(ProtocolFactory, EmptyNameOrVeltWithMoreCharactersGivesNull) {
  ProtocolFactory factory;
  EXPECT_EQ(factory.CreateProtocol(""), nullptr);
  EXPECT_EQ(factory.CreateProtocol("VELTx"), nullptr);
  EXPECT_EQ(factory.CreateProtocol("VELT "), nullptr);
  EXPECT_EQ(factory.CreateProtocol("VELT2"), nullptr);
  EXPECT_EQ(factory.CreateProtocol("velt"), nullptr);
  EXPECT_EQ(factory.CreateProtocol(nullptr), nullptr);
}

TEST(ProtocolFactory, DeleteProtocolOfNullDoesNothing) {
  ProtocolFactory factory;
  factory.DeleteProtocol(nullptr);
  EXPECT_STREQ(factory.GetImpName(), "ProtFactoryInDLL");
}
