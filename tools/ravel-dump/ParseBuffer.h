// A checked section handed to the library's parse operations (which take a
// pointer and no length) through the library's safe entry: the section is
// copied with a zeroed margin behind it that every read a parse can make stays
// inside, and a DSM-CC message is checked to hold its parts.
#ifndef RAVEL_DUMP_PARSEBUFFER_H
#define RAVEL_DUMP_PARSEBUFFER_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "Ravel_CSafeSection.h"

namespace ravel_dump {

class ParseBuffer {
 public:
  ParseBuffer(const uint8_t* section, std::size_t size) {
    loaded_ = safe_.Load(section, static_cast<int>(size)) == kRavelSafeOk;
  }
  explicit ParseBuffer(const std::vector<uint8_t>& section) : ParseBuffer(section.data(), section.size()) {}

  // The padded copy, or null when the safe entry refused the section (a parse
  // of null is refused by the class itself).
  unsigned char* Section() { return loaded_ ? safe_.GetData() : nullptr; }
  // The DSM-CC message after the 8-byte section header, or null when it does
  // not hold its parts (module records, block header) inside it.
  unsigned char* Message() {
    if (!loaded_) return nullptr;
    const int count = safe_.GetDataSize() - 8 - 4;
    if (count < 12 || RavelCSafeSection::CheckMessage(safe_.GetData() + 8, count) != kRavelSafeOk) return nullptr;
    return safe_.GetData() + 8;
  }

 private:
  RavelCSafeSection safe_;
  bool loaded_ = false;
};

}  // namespace ravel_dump

#endif
