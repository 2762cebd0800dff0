// A checked section copied with a zeroed margin behind it, for the library's
// parse operations (which take a pointer and no length).
#ifndef RAVEL_DUMP_PARSEBUFFER_H
#define RAVEL_DUMP_PARSEBUFFER_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "SectionCheck.h"

namespace ravel_dump {

class ParseBuffer {
 public:
  ParseBuffer(const uint8_t* section, std::size_t size) : bytes_(size + kParsePadding, 0) {
    for (std::size_t i = 0; i < size; ++i) bytes_[i] = section[i];
  }
  explicit ParseBuffer(const std::vector<uint8_t>& section) : ParseBuffer(section.data(), section.size()) {}

  unsigned char* Section() { return bytes_.data(); }
  // The DSM-CC message after the 8-byte section header.
  unsigned char* Message() { return bytes_.data() + 8; }

 private:
  std::vector<unsigned char> bytes_;
};

}  // namespace ravel_dump

#endif
