#include "Input.h"

#include <cerrno>
#include <cstring>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "StopSignal.h"

namespace ravel_dump {

InputFile::InputFile() : fd_(-1), ownsFd_(false), size_(-1) {}

InputFile::~InputFile() {
  if (ownsFd_ && fd_ >= 0) close(fd_);
}

bool InputFile::Open(const std::string& path, std::string& error) {
  if (IsUdpUrl(path)) {
    name_ = path;
    udp_.reset(new UdpReceiver);
    return udp_->Open(path, error);
  }
  if (path == "-") {
    fd_ = STDIN_FILENO;
    ownsFd_ = false;
    name_ = "standard input";
  } else {
    name_ = path;
    fd_ = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd_ < 0) {
      error = path + ": " + std::strerror(errno);
      return false;
    }
    ownsFd_ = true;
  }
  struct stat info;
  if (fstat(fd_, &info) != 0) {
    error = name_ + ": " + std::strerror(errno);
    return false;
  }
  if (S_ISDIR(info.st_mode)) {
    error = name_ + ": is a directory";
    return false;
  }
  size_ = S_ISREG(info.st_mode) ? static_cast<long long>(info.st_size) : -1;
  return true;
}

long long InputFile::Read(uint8_t* buffer, std::size_t size, std::string& error) {
  // A stop request is the end of the input: what was read before it is used.
  if (StopRequested()) return 0;
  if (udp_) return udp_->Read(buffer, size, error);
  const bool stream = size_ < 0;
  std::size_t done = 0;
  while (done < size && !(stream && done > 0)) {
    if (stream && !WaitReadable(fd_)) break;
    ssize_t n = read(fd_, buffer + done, size - done);
    if (n < 0) {
      // A DVB device reports a ring buffer overrun once and goes on: the
      // continuity counters show what was lost.
      if (errno == EINTR || (stream && errno == EOVERFLOW)) continue;
      error = name_ + ": " + std::strerror(errno);
      return -1;
    }
    if (n == 0) break;
    done += static_cast<std::size_t>(n);
  }
  return static_cast<long long>(done);
}

}  // namespace ravel_dump
