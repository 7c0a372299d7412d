// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include "factory/ProtFactory.h"

TEST(GetInterfaceFactory, AlwaysReturnsTheSameObject) {
  IInterfaceFactory* const first = GetInterfaceFactory();
  ASSERT_NE(first, nullptr);
  EXPECT_EQ(GetInterfaceFactory(), first);
  EXPECT_EQ(first, &Factory.interfaceFactory);
}

TEST(InterfaceFactory, HandsOutTheProtocolFactoryByBothNames) {
  IInterfaceFactory* const factory = GetInterfaceFactory();
  IInterface* const byInterfaceName = factory->CreateInterface("IProtocolFactory");
  EXPECT_EQ(byInterfaceName, static_cast<IInterface*>(&Factory.protocolFactory));
  EXPECT_EQ(factory->CreateInterface("ProtocolFactory"), byInterfaceName);
}

TEST(InterfaceFactory, HandsOutTheModuleByBothNames) {
  IInterfaceFactory* const factory = GetInterfaceFactory();
  IInterface* const module = factory->CreateInterface("IProtModule");
  EXPECT_EQ(module, static_cast<IInterface*>(&Factory.protModule));
  EXPECT_EQ(factory->CreateInterface("ProtModule"), module);
}

TEST(InterfaceFactory, ModuleNameInLowerCaseGivesNull) {
  IInterfaceFactory* const factory = GetInterfaceFactory();
  EXPECT_EQ(factory->CreateInterface("iprotmodule"), nullptr);
  EXPECT_EQ(factory->CreateInterface("protmodule"), nullptr);
}

TEST(InterfaceFactory, UnknownNamesGiveNull) {
  IInterfaceFactory* const factory = GetInterfaceFactory();
  EXPECT_EQ(factory->CreateInterface(""), nullptr);
  EXPECT_EQ(factory->CreateInterface("IProtocolFactory2"), nullptr);
  EXPECT_EQ(factory->CreateInterface("IProtocol"), nullptr);
  EXPECT_EQ(factory->CreateInterface("IInterfaceFactory"), nullptr);
  EXPECT_EQ(factory->CreateInterface(nullptr), nullptr);
}

TEST(InterfaceFactory, SamePointerTwiceAndUsableAfterRelease) {
  IInterfaceFactory* const factory = GetInterfaceFactory();
  IInterface* const first = factory->CreateInterface("IProtocolFactory");
  IInterface* const second = factory->CreateInterface("IProtocolFactory");
  ASSERT_NE(first, nullptr);
  EXPECT_EQ(first, second);
  factory->ReleaseInterface(first);
  auto* const protocolFactory = static_cast<IProtocolFactory*>(second);
  EXPECT_STREQ(protocolFactory->GetImpName(), "ProtFactoryInDLL");
  EXPECT_EQ(factory->CreateInterface("IProtocolFactory"), first);
}
