// ARIB STD-B24 8-unit code, the coding of Japanese SI texts, decoded to UTF-8.
#ifndef RAVEL_DUMP_ARIBTEXT_H
#define RAVEL_DUMP_ARIBTEXT_H

#include <cstddef>
#include <string>

namespace ravel_dump {

// A text from the SI's default sets (G0 kanji, G1 alphanumeric, G2 hiragana,
// G3 katakana; G0 in GL, G2 in GR), with the designations, locking and single
// shifts it makes. Alphanumerics are full-width in normal size and half-width
// in middle size (MSZ), as a receiver draws them; APR (CR) is a line break,
// '\n'; other control codes, mosaics, DRCS and macros are dropped. A code its
// set does not assign is U+FFFD.
std::string AribTextToUtf8(const unsigned char* bytes, std::size_t length);

}  // namespace ravel_dump

#endif
