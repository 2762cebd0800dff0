// Big-endian field reads and the BCD rule of broadcast times.
#ifndef RAVEL_BYTEORDER_H
#define RAVEL_BYTEORDER_H

inline unsigned short RavelRead16(const unsigned char* p) {
  return static_cast<unsigned short>((p[0] << 8) | p[1]);
}

inline unsigned int RavelRead24(const unsigned char* p) {
  return (static_cast<unsigned int>(p[0]) << 16) | (static_cast<unsigned int>(p[1]) << 8) | p[2];
}

inline unsigned int RavelRead32(const unsigned char* p) {
  return (static_cast<unsigned int>(p[0]) << 24) | (static_cast<unsigned int>(p[1]) << 16) |
         (static_cast<unsigned int>(p[2]) << 8) | p[3];
}

// 12-bit length in the low nibble of p[0] and all of p[1] (section_length,
// descriptors_loop_length and the like).
inline unsigned short RavelRead12(const unsigned char* p) {
  return static_cast<unsigned short>(((p[0] & 0x0F) << 8) | p[1]);
}

// Size of the section starting at `section`: section_length + 3.
inline int RavelSectionSize(const unsigned char* section) { return RavelRead12(section + 1) + 3; }

// BCD rule: the nibbles are not checked, so 0x9A gives 100 and 0xFF gives 165.
inline int RavelBcd(unsigned char value) { return (value >> 4) * 10 + (value & 0x0F); }

#endif
