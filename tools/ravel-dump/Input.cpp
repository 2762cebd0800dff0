#include "Input.h"

#include <cerrno>
#include <algorithm>
#include <cstring>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "StopSignal.h"

namespace ravel_dump {

InputFile::InputFile() : fd_(-1), ownsFd_(false), size_(-1), peekedPos_(0) {}

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

bool InputFile::Peek(std::size_t size, std::vector<uint8_t>& head, std::string& error) {
  std::size_t held = peeked_.size() - peekedPos_;
  if (held < size) {
    peeked_.erase(peeked_.begin(), peeked_.begin() + static_cast<std::ptrdiff_t>(peekedPos_));
    peekedPos_ = 0;
    peeked_.resize(size);
    long long n = ReadFromFile(peeked_.data() + held, size - held, error);
    peeked_.resize(held + static_cast<std::size_t>(std::max(n, 0LL)));
    if (n < 0) return false;
  }
  std::size_t length = std::min(size, peeked_.size() - peekedPos_);
  head.assign(peeked_.begin() + static_cast<std::ptrdiff_t>(peekedPos_),
              peeked_.begin() + static_cast<std::ptrdiff_t>(peekedPos_ + length));
  return true;
}

long long InputFile::Read(uint8_t* buffer, std::size_t size, std::string& error) {
  std::size_t held = std::min(size, peeked_.size() - peekedPos_);
  if (held > 0) {
    std::memcpy(buffer, peeked_.data() + peekedPos_, held);
    peekedPos_ += held;
  }
  if (peekedPos_ == peeked_.size()) {
    peeked_.clear();
    peekedPos_ = 0;
  }
  // A stream hands out what has arrived: the peeked bytes are enough for now.
  if (held > 0 && size_ < 0) return static_cast<long long>(held);
  // A stop request is the end of the input: what was read before it is used.
  if (StopRequested()) return static_cast<long long>(held);
  long long n = ReadFromFile(buffer + held, size - held, error);
  return n < 0 ? n : static_cast<long long>(held) + n;
}

long long InputFile::ReadFromFile(uint8_t* buffer, std::size_t size, std::string& error) {
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
