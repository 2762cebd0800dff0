#include "Ravel_Util.h"

namespace {

// Slice-by-8 tables of the MSB-first CRC_32: t[k][b] is the CRC of byte b
// followed by k zero bytes. Every table check runs over the whole section (and
// a reader of a capture checks every section it assembles), so this sits on the
// hot path; eight bytes per step keep the table lookups independent.
struct CrcTables {
  unsigned int t[8][256];
  CrcTables() {
    for (unsigned int i = 0; i < 256; ++i) {
      unsigned int crc = i << 24;
      for (int bit = 0; bit < 8; ++bit) crc = (crc & 0x80000000u) ? (crc << 1) ^ 0x04C11DB7u : crc << 1;
      t[0][i] = crc;
    }
    for (unsigned int i = 0; i < 256; ++i) {
      for (int k = 1; k < 8; ++k) t[k][i] = (t[k - 1][i] << 8) ^ t[0][t[k - 1][i] >> 24];
    }
  }
};

const CrcTables& Tables() {
  static const CrcTables tables;
  return tables;
}

inline unsigned int Load32(const unsigned char* data) {
  return (static_cast<unsigned int>(data[0]) << 24) | (static_cast<unsigned int>(data[1]) << 16) |
         (static_cast<unsigned int>(data[2]) << 8) | data[3];
}

}  // namespace

extern "C" unsigned int RavelUtil_CRC32(unsigned int crc, const unsigned char* data, unsigned int length) {
  const CrcTables& tab = Tables();
  while (length >= 8) {
    const unsigned int high = crc ^ Load32(data);
    const unsigned int low = Load32(data + 4);
    crc = tab.t[7][high >> 24] ^ tab.t[6][(high >> 16) & 0xFF] ^ tab.t[5][(high >> 8) & 0xFF] ^ tab.t[4][high & 0xFF] ^
          tab.t[3][low >> 24] ^ tab.t[2][(low >> 16) & 0xFF] ^ tab.t[1][(low >> 8) & 0xFF] ^ tab.t[0][low & 0xFF];
    data += 8;
    length -= 8;
  }
  while (length-- > 0) crc = (crc << 8) ^ tab.t[0][((crc >> 24) ^ *data++) & 0xFF];
  return crc;
}

extern "C" int RavelUtil_CheckSectionCRC32(const unsigned char* section) {
  if (section == 0) return 0;
  unsigned int length = ((section[1] & 0x0Fu) << 8 | section[2]) + 3u;
  return RavelUtil_CRC32(0xFFFFFFFFu, section, length) == 0 ? 1 : 0;
}
