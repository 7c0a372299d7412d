// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "DurableFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <filesystem>
#include <system_error>
#include <utility>
#include <vector>

#include "FileDescriptor.h"

namespace {

constexpr const char* kTemporaryInfix = ".tmp-";
constexpr std::size_t kTemporaryLetters = 6;  // mkostemp's XXXXXX

std::string Failure(const char* what, int error) {
  return std::string(what) + ": " + std::generic_category().message(error);
}

std::string FolderOf(const std::string& path) {
  const auto slash = path.rfind('/');
  if (slash == std::string::npos) {
    return ".";
  }
  return slash == 0 ? "/" : path.substr(0, slash);
}

std::string NameOf(const std::string& path) {
  const auto slash = path.rfind('/');
  return slash == std::string::npos ? path : path.substr(slash + 1);
}

// What a path that is not a regular file is, for the error text.
std::string KindOf(mode_t mode) {
  if (S_ISDIR(mode)) {
    return "a folder";
  }
  if (S_ISFIFO(mode)) {
    return "a FIFO";
  }
  if (S_ISCHR(mode)) {
    return "a character device";
  }
  if (S_ISBLK(mode)) {
    return "a block device";
  }
  if (S_ISSOCK(mode)) {
    return "a socket";
  }
  return "of an unknown kind";
}

std::string NotRegular(const char* what, mode_t mode) {
  return std::string(what) + ": not a regular file but " + KindOf(mode);
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

// Reads at most limit bytes of fd into contents; 0 or errno.
int ReadAtMost(int fd, std::size_t limit, std::string& contents) {
  contents.clear();
  std::vector<char> chunk(65536);
  while (contents.size() < limit) {
    const std::size_t wanted = std::min(chunk.size(), limit - contents.size());
    const ssize_t n = ::read(fd, chunk.data(), wanted);
    if (n == 0) {
      return 0;
    }
    if (n < 0) {
      if (errno == EINTR) {
        continue;
      }
      return errno;
    }
    contents.append(chunk.data(), static_cast<std::size_t>(n));
  }
  return 0;
}

// An existing path may be replaced only when it is a regular file that may
// be written: a file without any write permission bit is read-only even for
// a process that could replace it (root), since its owner made it so.
bool MayReplace(const std::string& path, const struct stat& existing, std::string& error) {
  if (!S_ISREG(existing.st_mode)) {
    error = NotRegular("cannot replace", existing.st_mode);
    return false;
  }
  if ((existing.st_mode & 0222) == 0) {
    error = Failure("cannot write", EACCES);
    return false;
  }
  if (::access(path.c_str(), W_OK) != 0) {
    error = Failure("cannot write", errno);
    return false;
  }
  return true;
}

bool IsTemporaryOf(const std::string& entry, const std::string& name) {
  const std::string prefix = name + kTemporaryInfix;
  if (entry.size() != prefix.size() + kTemporaryLetters ||
      entry.compare(0, prefix.size(), prefix) != 0) {
    return false;
  }
  for (std::size_t i = prefix.size(); i < entry.size(); ++i) {
    if (std::isalnum(static_cast<unsigned char>(entry[i])) == 0) {
      return false;
    }
  }
  return true;
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

DurableFile::ReadResult DurableFile::Read(const std::string& path, std::size_t largest,
                                          std::string& contents, std::string& error) {
  // A path that is not a regular file is refused before it is opened:
  // opening a device may act on it, and a FIFO would wait for a writer.
  struct stat info {};
  if (::stat(path.c_str(), &info) == 0 && !S_ISREG(info.st_mode)) {
    error = NotRegular("cannot read", info.st_mode);
    return ReadResult::Failed;
  }
  // O_NONBLOCK keeps a FIFO put there since from blocking the open.
  const FileDescriptor fd(::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC));
  if (!fd.Valid()) {
    if (errno == ENOENT) {
      return ReadResult::Missing;
    }
    error = Failure("cannot open", errno);
    return ReadResult::Failed;
  }
  if (::fstat(fd.Get(), &info) != 0) {
    error = Failure("cannot read", errno);
    return ReadResult::Failed;
  }
  if (!S_ISREG(info.st_mode)) {
    error = NotRegular("cannot read", info.st_mode);
    return ReadResult::Failed;
  }
  const std::string tooLarge = "cannot read: larger than " + std::to_string(largest) + " bytes";
  if (static_cast<std::size_t>(info.st_size) > largest) {
    contents.clear();
    error = tooLarge;
    return ReadResult::Failed;
  }
  // The size can change while the file is read; one byte past the bound
  // tells a file that grew too large.
  if (const int code = ReadAtMost(fd.Get(), largest + 1, contents); code != 0) {
    error = Failure("cannot read", code);
    return ReadResult::Failed;
  }
  if (contents.size() > largest) {
    contents.clear();
    error = tooLarge;
    return ReadResult::Failed;
  }
  return ReadResult::Read;
}

bool DurableFile::Replace(const std::string& path, const std::string& contents,
                          std::string& error) {
  struct stat existing {};
  const bool exists = ::stat(path.c_str(), &existing) == 0;
  if (exists && !MayReplace(path, existing, error)) {
    return false;
  }
  std::vector<char> pattern(path.begin(), path.end());
  const std::string suffix = std::string(kTemporaryInfix) + std::string(kTemporaryLetters, 'X');
  pattern.insert(pattern.end(), suffix.begin(), suffix.end());
  pattern.push_back('\0');
  FileDescriptor fd(::mkostemp(pattern.data(), O_CLOEXEC));
  if (!fd.Valid()) {
    error = Failure("cannot create a temporary file", errno);
    return false;
  }
  TemporaryName temporary(pattern.data());
  if (exists) {
    ::fchmod(fd.Get(), existing.st_mode & 07777);
  }
  if (const int code = WriteAll(fd.Get(), contents); code != 0) {
    error = Failure("cannot write", code);
    return false;
  }
  if (const int code = FsyncRetrying(fd.Get()); code != 0) {
    error = Failure("cannot flush", code);
    return false;
  }
  if (const int code = fd.Close(); code != 0) {
    error = Failure("cannot close", code);
    return false;
  }
  if (::rename(temporary.Name().c_str(), path.c_str()) != 0) {
    error = Failure("cannot replace", errno);
    return false;
  }
  temporary.Keep();
  const FileDescriptor folder(::open(FolderOf(path).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  if (!folder.Valid()) {
    error = Failure("cannot open its folder", errno);
    return true;
  }
  if (const int code = FsyncRetrying(folder.Get()); code != 0) {
    error = Failure("cannot flush its folder", code);
    return true;
  }
  error.clear();
  return true;
}

int DurableFile::SweepTemporaries(const std::string& path) {
  const std::string name = NameOf(path);
  std::error_code error;
  std::filesystem::directory_iterator entries(FolderOf(path), error);
  int removed = 0;
  for (; !error && entries != std::filesystem::directory_iterator(); entries.increment(error)) {
    const std::filesystem::directory_entry& entry = *entries;
    std::error_code ignored;
    if (IsTemporaryOf(entry.path().filename().string(), name) &&
        entry.symlink_status(ignored).type() == std::filesystem::file_type::regular &&
        std::filesystem::remove(entry.path(), ignored)) {
      ++removed;
    }
  }
  return removed;
}
