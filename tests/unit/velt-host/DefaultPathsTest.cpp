// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/DefaultPaths.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <fstream>
#include <string>

#include "velt-host/TempFolder.h"

using velthost::DefaultPaths;
using velthost::TempFolder;

namespace {

void Touch(const std::string& path) { std::ofstream(path) << "x"; }

mode_t Mode(const std::string& path) {
  struct stat info {};
  EXPECT_EQ(::stat(path.c_str(), &info), 0) << path;
  return info.st_mode & 0777U;
}

}  // namespace

TEST(DefaultPaths, StorageUnderAnAbsoluteStateHome) {
  EXPECT_EQ(DefaultPaths::StoragePath("/state", "/home/u"), "/state/velt/storage.ini");
}

TEST(DefaultPaths, StorageUnderTheHomeWithoutAUsableStateHome) {
  EXPECT_EQ(DefaultPaths::StoragePath(nullptr, "/home/u"), "/home/u/.local/state/velt/storage.ini");
  EXPECT_EQ(DefaultPaths::StoragePath("", "/home/u"), "/home/u/.local/state/velt/storage.ini");
  EXPECT_EQ(DefaultPaths::StoragePath("relative/state", "/home/u"),
            "/home/u/.local/state/velt/storage.ini");
  EXPECT_EQ(DefaultPaths::StoragePath(nullptr, ""), "");
}

TEST(DefaultPaths, FolderOfAPath) {
  EXPECT_EQ(DefaultPaths::FolderOf("/a/b/c.ini"), "/a/b");
  EXPECT_EQ(DefaultPaths::FolderOf("/c.ini"), "/");
  EXPECT_EQ(DefaultPaths::FolderOf("c.ini"), ".");
  EXPECT_EQ(DefaultPaths::FolderOf("a/c.ini"), "a");
}

TEST(DefaultPaths, PluginBesideTheProgramComesFirst) {
  const TempFolder root("velt-paths");
  const std::string bin = root.File("bin");
  ASSERT_EQ(::mkdir(bin.c_str(), 0700), 0);
  const std::string installed = bin + "/" + DefaultPaths::kInstalledPluginFolder;
  std::string error;
  ASSERT_TRUE(DefaultPaths::MakeFolders(installed, error)) << error;
  // Neither exists: the path beside the program, so that the error names it.
  EXPECT_EQ(DefaultPaths::PluginPath(bin), bin + "/libvelt.so");
  Touch(installed + "/libvelt.so");
  EXPECT_EQ(DefaultPaths::PluginPath(bin), installed + "/libvelt.so");
  Touch(bin + "/libvelt.so");
  EXPECT_EQ(DefaultPaths::PluginPath(bin), bin + "/libvelt.so");
}

TEST(DefaultPaths, ExecutableFolderIsTheTestProgramsFolder) {
  const std::string folder = DefaultPaths::ExecutableFolder();
  ASSERT_FALSE(folder.empty());
  EXPECT_EQ(folder[0], '/');
  EXPECT_TRUE(DefaultPaths::IsFolder(folder));
}

TEST(DefaultPaths, MakeFoldersCreatesTheMissingOnesForTheOwnerOnly) {
  const TempFolder root("velt-paths");
  const std::string deep = root.File("a/b/c");
  std::string error;
  ASSERT_TRUE(DefaultPaths::MakeFolders(deep, error)) << error;
  EXPECT_EQ(error, "");
  EXPECT_TRUE(DefaultPaths::IsFolder(deep));
  EXPECT_EQ(Mode(root.File("a")), 0700U);
  EXPECT_EQ(Mode(deep), 0700U);
  EXPECT_TRUE(DefaultPaths::MakeFolders(deep, error));
}

TEST(DefaultPaths, MakeFoldersReportsAFileInTheWay) {
  const TempFolder root("velt-paths");
  Touch(root.File("file"));
  std::string error;
  EXPECT_FALSE(DefaultPaths::MakeFolders(root.File("file/sub"), error));
  EXPECT_EQ(error, "cannot create the folder " + root.File("file") +
                       ": a file of that name is in the way");
}
