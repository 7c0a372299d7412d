// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/DefaultPaths.h"

#include <pwd.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <system_error>
#include <vector>

namespace velthost {

namespace {

bool Exists(const std::string& path) {
  struct stat info {};
  return ::stat(path.c_str(), &info) == 0;
}

}  // namespace

bool DefaultPaths::IsFolder(const std::string& path) {
  struct stat info {};
  return ::stat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode);
}

std::string DefaultPaths::ExecutableFolder() {
  std::vector<char> path(4096);
  const ssize_t length = ::readlink("/proc/self/exe", path.data(), path.size());
  if (length <= 0 || static_cast<std::size_t>(length) >= path.size()) {
    return {};
  }
  return FolderOf(std::string(path.data(), static_cast<std::size_t>(length)));
}

std::string DefaultPaths::FolderOf(const std::string& path) {
  const std::size_t slash = path.rfind('/');
  if (slash == std::string::npos) {
    return ".";
  }
  return slash == 0 ? std::string("/") : path.substr(0, slash);
}

std::string DefaultPaths::PluginPath(const std::string& executableFolder) {
  const std::string folder = executableFolder.empty() ? std::string(".") : executableFolder;
  std::string beside = folder + "/" + kPluginFile;
  std::string installed = folder + "/" + kInstalledPluginFolder + "/" + kPluginFile;
  if (!Exists(beside) && Exists(installed)) {
    return installed;
  }
  return beside;
}

std::string DefaultPaths::StoragePath(const char* stateHome, const std::string& home) {
  if (stateHome != nullptr && stateHome[0] == '/') {
    return std::string(stateHome) + "/velt/storage.ini";
  }
  if (home.empty()) {
    return {};
  }
  return home + "/.local/state/velt/storage.ini";
}

std::string DefaultPaths::Home() {
  const char* const home = std::getenv("HOME");
  if (home != nullptr && home[0] != '\0') {
    return home;
  }
  passwd entry{};
  passwd* found = nullptr;
  std::vector<char> buffer(16384);
  if (::getpwuid_r(::getuid(), &entry, buffer.data(), buffer.size(), &found) == 0 &&
      found != nullptr && found->pw_dir != nullptr) {
    return found->pw_dir;
  }
  return {};
}

bool DefaultPaths::MakeFolders(const std::string& folder, std::string& error) {
  if (folder.empty() || IsFolder(folder)) {
    return true;
  }
  const std::string parent = FolderOf(folder);
  if (parent != folder && !MakeFolders(parent, error)) {
    return false;
  }
  if (::mkdir(folder.c_str(), 0700) != 0 && errno != EEXIST) {
    error = "cannot create the folder " + folder + ": " + std::generic_category().message(errno);
    return false;
  }
  if (!IsFolder(folder)) {
    error = "cannot create the folder " + folder + ": a file of that name is in the way";
    return false;
  }
  return true;
}

}  // namespace velthost
