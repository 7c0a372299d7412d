// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/ConfigFile.h"

#include <gtest/gtest.h>

#include <fstream>
#include <string>

#include "velt-host/TempFolder.h"

using velthost::ConfigFile;
using velthost::TempFolder;

TEST(ConfigFile, LineBreaksCountAsBlanks) {
  const TempFolder folder("velt-config");
  const std::string path = folder.File("channel.cfg");
  std::ofstream(path) << "CfgVer=1 model=1\nsocketType=TCP\r\nremotePort=5000\n";
  std::string text;
  std::string error;
  ASSERT_TRUE(ConfigFile::Read(path, text, error)) << error;
  EXPECT_EQ(text, "CfgVer=1 model=1 socketType=TCP  remotePort=5000 ");
  EXPECT_EQ(error, "");
}

TEST(ConfigFile, EmptyFileIsAnEmptyString) {
  const TempFolder folder("velt-config");
  const std::string path = folder.File("empty.cfg");
  std::ofstream{path};
  std::string text = "old";
  std::string error;
  ASSERT_TRUE(ConfigFile::Read(path, text, error));
  EXPECT_EQ(text, "");
}

TEST(ConfigFile, MissingFileAndFolderAreErrors) {
  const TempFolder folder("velt-config");
  std::string text = "old";
  std::string error;
  EXPECT_FALSE(ConfigFile::Read(folder.File("absent.cfg"), text, error));
  EXPECT_EQ(error, "cannot read the configuration file " + folder.File("absent.cfg") +
                       ": No such file or directory");
  EXPECT_EQ(text, "old");
  EXPECT_FALSE(ConfigFile::Read(folder.Path(), text, error));
  EXPECT_EQ(error, "cannot read the configuration file " + folder.Path() + ": Is a directory");
}
