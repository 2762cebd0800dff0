// Fixed-size character fields (the application descriptors' names and paths, the
// texts of an AIT application record). Such a field is filled from a byte count
// and may be full to its last byte, so it need not hold a terminator. These
// helpers never write past a field, never read past one, and give a terminated
// copy to hand to %s.
#ifndef RAVEL_FIXEDTEXT_H
#define RAVEL_FIXEDTEXT_H

#include <cstddef>
#include <cstring>

// Text bytes in a field: up to its first 0, at most the whole field.
inline std::size_t RavelFixedText_Length(const char* field, std::size_t size) {
  const void* end = std::memchr(field, 0, size);
  return end != 0 ? static_cast<std::size_t>(static_cast<const char*>(end) - field) : size;
}

// Writes `count` bytes at the start of a field, bounded to the field. The bytes
// after them are left as they were (no terminator is written).
inline void RavelFixedText_Write(char* field, std::size_t size, const void* bytes, std::size_t count) {
  if (count > size) count = size;
  if (count > 0) std::memcpy(field, bytes, count);
}

// A terminated copy of a field, for printing.
template <std::size_t N>
class RavelFixedTextPrint {
 public:
  explicit RavelFixedTextPrint(const char (&field)[N]) {
    std::memcpy(szText, field, N);
    szText[N] = '\0';
  }
  const char* Get() const { return szText; }

 private:
  char szText[N + 1];
};

template <std::size_t N>
inline RavelFixedTextPrint<N> RavelFixedText_Print(const char (&field)[N]) {
  return RavelFixedTextPrint<N>(field);
}

#endif
