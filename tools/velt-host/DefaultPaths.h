// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

namespace velthost {

// Where velt-host looks for the plug-in and keeps its permanent storage when
// the command line does not say.
class DefaultPaths {
 public:
  static constexpr const char* kPluginFile = "libvelt.so";
  // The plug-in's install folder relative to the program's (the build
  // tells, from the install layout).
  static constexpr const char* kInstalledPluginFolder = VELT_INSTALLED_PLUGIN_FOLDER;

  // The folder of the running program (from /proc/self/exe); empty when it
  // cannot be told.
  static std::string ExecutableFolder();
  // libvelt.so beside the program (as in the build tree), else in the
  // installed plug-in folder (kInstalledPluginFolder from the program's
  // folder); the first when neither exists, so that the error names it.
  static std::string PluginPath(const std::string& executableFolder);
  // $XDG_STATE_HOME/velt/storage.ini when stateHome is an absolute path,
  // else HOME/.local/state/velt/storage.ini; empty when neither is usable.
  static std::string StoragePath(const char* stateHome, const std::string& home);
  // The user's home folder: $HOME, else the password database's entry.
  static std::string Home();
  // Creates folder and its missing parents (new ones readable by the owner
  // only); false with error set when that fails.
  static bool MakeFolders(const std::string& folder, std::string& error);
  static bool IsFolder(const std::string& path);
  // The folder part of a file path ("." for a bare name).
  static std::string FolderOf(const std::string& path);
};

}  // namespace velthost
