// The reading loop both reference programs share: the file is read with read(2)
// in 1 MiB chunks and every 188-byte packet that starts with the sync byte is
// handed on; after a lost sync byte the reader moves on byte by byte.
#ifndef RAVEL_BENCH_TSFILEREADER_H
#define RAVEL_BENCH_TSFILEREADER_H

#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <vector>

#include <fcntl.h>
#include <unistd.h>

namespace tsref {

const size_t kPacketSize = 188;
const size_t kChunkSize = 1 << 20;

// Calls onPacket(const uint8_t* packet) for each packet; false (after a message)
// when the file cannot be read.
template <class OnPacket>
bool ForEachPacket(const char* path, OnPacket onPacket, unsigned long long& bytes) {
  int fd = open(path, O_RDONLY | O_CLOEXEC);
  if (fd < 0) {
    std::fprintf(stderr, "%s: %s\n", path, std::strerror(errno));
    return false;
  }
  std::vector<uint8_t> buffer(kChunkSize + kPacketSize);
  size_t held = 0;  // bytes of an incomplete packet kept from the last chunk
  bytes = 0;
  for (;;) {
    ssize_t n = read(fd, buffer.data() + held, kChunkSize);
    if (n < 0) {
      if (errno == EINTR) continue;
      std::fprintf(stderr, "%s: %s\n", path, std::strerror(errno));
      close(fd);
      return false;
    }
    if (n == 0) break;
    bytes += static_cast<unsigned long long>(n);
    const size_t end = held + static_cast<size_t>(n);
    size_t at = 0;
    while (at + kPacketSize <= end) {
      if (buffer[at] != 0x47) {
        ++at;
        continue;
      }
      onPacket(&buffer[at]);
      at += kPacketSize;
    }
    held = end - at;
    std::memmove(buffer.data(), buffer.data() + at, held);
  }
  close(fd);
  return true;
}

}  // namespace tsref

#endif
