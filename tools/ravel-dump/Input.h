// The capture to read: a file or standard input ("-"), read in large chunks;
// a pipe, FIFO or device (a DVB adapter's dvr0) read as a stream, handed on as
// it arrives; or a UDP feed (udp://...).
#ifndef RAVEL_DUMP_INPUT_H
#define RAVEL_DUMP_INPUT_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "UdpInput.h"

namespace ravel_dump {

class InputFile {
 public:
  InputFile();
  ~InputFile();
  InputFile(const InputFile&) = delete;
  InputFile& operator=(const InputFile&) = delete;

  // Opens `path` ("-" for standard input). On failure returns false and sets
  // `error` to a one-line reason (missing, unreadable, a directory ...).
  bool Open(const std::string& path, std::string& error);

  // The first `size` bytes (fewer when the input is shorter), read without
  // consuming them, so that a pipe can be looked at before it is read: the
  // reads that follow return these bytes first. False with `error` set on a
  // read error.
  bool Peek(std::size_t size, std::vector<uint8_t>& head, std::string& error);

  // Reads up to `size` bytes: from a file, retrying short reads until `size`
  // bytes or the end; from a stream, what has arrived once something has.
  // Returns the count (0 at the end or once a stop is requested), or -1 with
  // `error` set.
  long long Read(uint8_t* buffer, std::size_t size, std::string& error);

  // Size of a regular file, -1 for a stream (pipe, FIFO, device, UDP).
  long long Size() const { return size_; }
  const std::string& Name() const { return name_; }
  // The UDP feed being read, or null.
  const UdpReceiver* Udp() const { return udp_.get(); }

 private:
  long long ReadFromFile(uint8_t* buffer, std::size_t size, std::string& error);

  int fd_;
  bool ownsFd_;
  long long size_;
  std::string name_;
  std::vector<uint8_t> peeked_;  // bytes read by Peek and not yet returned by Read
  std::size_t peekedPos_;
  std::unique_ptr<UdpReceiver> udp_;
};

}  // namespace ravel_dump

#endif
