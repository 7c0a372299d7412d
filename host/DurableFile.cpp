// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "DurableFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <system_error>
#include <utility>
#include <vector>

#include "FileDescriptor.h"

namespace {

std::string Failure(const std::string& path, const char* what, int error) {
  return path + ": " + what + ": " + std::generic_category().message(error);
}

std::string FolderOf(const std::string& path) {
  const auto slash = path.rfind('/');
  if (slash == std::string::npos) {
    return ".";
  }
  return slash == 0 ? "/" : path.substr(0, slash);
}

// Writes all of data; 0 or errno.
int WriteAll(int fd, const std::string& data) {
  std::size_t done = 0;
  while (done < data.size()) {
    const ssize_t n = ::write(fd, data.data() + done, data.size() - done);
    if (n < 0) {
      if (errno == EINTR) {
        continue;
      }
      return errno;
    }
    done += static_cast<std::size_t>(n);
  }
  return 0;
}

int FsyncRetrying(int fd) {
  int rc = 0;
  do {
    rc = ::fsync(fd);
  } while (rc != 0 && errno == EINTR);
  return rc == 0 ? 0 : errno;
}

// Removes the temporary file unless the rename took it.
class TemporaryName {
 public:
  explicit TemporaryName(std::string name) : name_(std::move(name)) {}
  TemporaryName(const TemporaryName&) = delete;
  TemporaryName& operator=(const TemporaryName&) = delete;
  TemporaryName(TemporaryName&&) = delete;
  TemporaryName& operator=(TemporaryName&&) = delete;
  ~TemporaryName() {
    if (!kept_) {
      ::unlink(name_.c_str());
    }
  }
  const std::string& Name() const { return name_; }
  void Keep() { kept_ = true; }

 private:
  std::string name_;
  bool kept_ = false;
};

}  // namespace

DurableFile::ReadResult DurableFile::Read(const std::string& path, std::string& contents,
                                          std::string& error) {
  const FileDescriptor fd(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
  if (!fd.Valid()) {
    if (errno == ENOENT) {
      return ReadResult::Missing;
    }
    error = std::string("cannot open: ") + std::generic_category().message(errno);
    return ReadResult::Failed;
  }
  contents.clear();
  std::vector<char> chunk(65536);
  for (;;) {
    const ssize_t n = ::read(fd.Get(), chunk.data(), chunk.size());
    if (n == 0) {
      return ReadResult::Read;
    }
    if (n < 0) {
      if (errno == EINTR) {
        continue;
      }
      error = std::string("cannot read: ") + std::generic_category().message(errno);
      return ReadResult::Failed;
    }
    contents.append(chunk.data(), static_cast<std::size_t>(n));
  }
}

bool DurableFile::Replace(const std::string& path, const std::string& contents,
                          std::string& error) {
  std::vector<char> pattern(path.begin(), path.end());
  const std::string suffix = ".tmp-XXXXXX";
  pattern.insert(pattern.end(), suffix.begin(), suffix.end());
  pattern.push_back('\0');
  FileDescriptor fd(::mkostemp(pattern.data(), O_CLOEXEC));
  if (!fd.Valid()) {
    error = Failure(path, "cannot create a temporary file", errno);
    return false;
  }
  TemporaryName temporary(pattern.data());
  struct stat existing {};
  if (::stat(path.c_str(), &existing) == 0) {
    ::fchmod(fd.Get(), existing.st_mode & 07777);
  }
  if (const int code = WriteAll(fd.Get(), contents); code != 0) {
    error = Failure(path, "cannot write", code);
    return false;
  }
  if (const int code = FsyncRetrying(fd.Get()); code != 0) {
    error = Failure(path, "cannot flush", code);
    return false;
  }
  if (const int code = fd.Close(); code != 0) {
    error = Failure(path, "cannot close", code);
    return false;
  }
  if (::rename(temporary.Name().c_str(), path.c_str()) != 0) {
    error = Failure(path, "cannot replace", errno);
    return false;
  }
  temporary.Keep();
  const FileDescriptor folder(::open(FolderOf(path).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  if (!folder.Valid()) {
    error = Failure(path, "cannot open its folder", errno);
    return true;
  }
  if (const int code = FsyncRetrying(folder.Get()); code != 0) {
    error = Failure(path, "cannot flush its folder", code);
    return true;
  }
  return true;
}
