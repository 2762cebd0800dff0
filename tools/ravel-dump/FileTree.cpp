#include "FileTree.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "ByteText.h"

namespace ravel_dump {
namespace {

// The longest file name the common file systems take.
const std::size_t kMaxFileName = 255;

std::string Joined(const std::vector<std::string>& components, std::size_t count) {
  std::string path;
  for (std::size_t i = 0; i < count; ++i) path += "/" + EscapeBytes(components[i]);
  return path.empty() ? std::string("/") : path;
}

}  // namespace

std::string FileNameProblem(const std::string& name) {
  if (name.empty()) return "an empty name";
  if (name == "." || name == "..") return "the name \"" + name + "\"";
  if (name.find('\0') != std::string::npos) return "a name with a NUL byte";
  if (name.find('/') != std::string::npos) return "a name with a slash";
  if (name.size() > kMaxFileName) return "a name of " + std::to_string(name.size()) + " bytes";
  return "";
}

FileTreeWriter::~FileTreeWriter() {
  if (root_ >= 0) close(root_);
}

bool FileTreeWriter::Open(const std::string& directory, const char* purpose, std::string& error) {
  std::error_code code;
  std::filesystem::create_directories(directory, code);
  root_ = code ? -1 : open(directory.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
  if (root_ < 0) {
    error = directory + ": cannot make the " + purpose + " directory: " + (code ? code.message() : std::strerror(errno));
    return false;
  }
  rootPath_ = directory;
  return true;
}

int FileTreeWriter::OpenDirectory(const std::vector<std::string>& components, std::size_t count, std::string& error) {
  int fd = dup(root_);
  for (std::size_t i = 0; i < count && fd >= 0; ++i) {
    const std::string& name = components[i];
    std::string problem = FileNameProblem(name);
    if (!problem.empty()) {
      close(fd);
      error = Joined(components, i + 1) + ": " + problem;
      return -1;
    }
    if (mkdirat(fd, name.c_str(), 0777) != 0 && errno != EEXIST) {
      error = Joined(components, i + 1) + ": cannot make the directory: " + std::strerror(errno);
      close(fd);
      return -1;
    }
    int next = openat(fd, name.c_str(), O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC);
    if (next < 0) error = Joined(components, i + 1) + ": not a directory: " + std::strerror(errno);
    close(fd);
    fd = next;
  }
  if (fd < 0 && error.empty()) error = rootPath_ + ": " + std::strerror(errno);
  return fd;
}

bool FileTreeWriter::MakeDirectory(const std::vector<std::string>& components, std::string& error) {
  int fd = OpenDirectory(components, components.size(), error);
  if (fd < 0) return false;
  close(fd);
  return true;
}

bool FileTreeWriter::WriteFile(const std::vector<std::string>& components, const uint8_t* data, std::size_t size,
                               std::string& error) {
  if (components.empty()) {
    error = "/: the root is no file";
    return false;
  }
  const std::string& name = components.back();
  std::string problem = FileNameProblem(name);
  if (!problem.empty()) {
    error = Joined(components, components.size()) + ": " + problem;
    return false;
  }
  int dir = OpenDirectory(components, components.size() - 1, error);
  if (dir < 0) return false;
  char temporary[64];
  int fd = -1;
  // Names of the tree never start with ".ravel-" and a tmp suffix by chance;
  // O_EXCL keeps one that does from being overwritten.
  for (int tries = 0; fd < 0 && tries < 100; ++tries) {
    std::snprintf(temporary, sizeof temporary, ".ravel-%ld-%u.tmp", static_cast<long>(getpid()), temporaries_++);
    fd = openat(dir, temporary, O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, 0666);
    if (fd < 0 && errno != EEXIST) break;
  }
  const std::string where = Joined(components, components.size());
  if (fd < 0) {
    error = where + ": cannot write: " + std::strerror(errno);
    close(dir);
    return false;
  }
  std::size_t done = 0;
  bool ok = true;
  while (ok && done < size) {
    ssize_t n = write(fd, data + done, size - done);
    if (n < 0 && errno == EINTR) continue;
    ok = n > 0;
    if (ok) done += static_cast<std::size_t>(n);
  }
  ok = close(fd) == 0 && ok;
  ok = ok && renameat(dir, temporary, dir, name.c_str()) == 0;
  if (!ok) {
    error = where + ": cannot write: " + std::strerror(errno);
    unlinkat(dir, temporary, 0);
  }
  close(dir);
  return ok;
}

}  // namespace ravel_dump
