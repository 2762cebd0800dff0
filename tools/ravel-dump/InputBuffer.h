// Bytes of an input read a chunk at a time: before each read, what is not
// consumed yet moves to the front, so that a packet or section cut by the end
// of a chunk is whole after the next read.
#ifndef RAVEL_DUMP_INPUTBUFFER_H
#define RAVEL_DUMP_INPUTBUFFER_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "Input.h"

namespace ravel_dump {

struct InputBuffer {
  explicit InputBuffer(std::size_t capacity) : bytes(capacity) {}

  // Moves the bytes from `pos` on to the front and reads once after them:
  // the bytes read, 0 at the end of the input, negative on a read error
  // (told in `error`).
  long long Refill(InputFile& input, std::string& error);

  std::vector<uint8_t> bytes;
  std::size_t pos = 0;  // first byte not consumed
  std::size_t end = 0;  // end of the bytes read
  uint64_t base = 0;    // input offset of bytes[0]
};

}  // namespace ravel_dump

#endif
