#include "Ravel_Util.h"

namespace {

// Slice-by-4 tables of the MSB-first CRC_32: every table check runs over the
// whole section, so this sits on the hot path of every parse.
struct CrcTables {
  unsigned int t[4][256];
  CrcTables() {
    for (unsigned int i = 0; i < 256; ++i) {
      unsigned int crc = i << 24;
      for (int bit = 0; bit < 8; ++bit) crc = (crc & 0x80000000u) ? (crc << 1) ^ 0x04C11DB7u : crc << 1;
      t[0][i] = crc;
    }
    for (unsigned int i = 0; i < 256; ++i) {
      for (int k = 1; k < 4; ++k) t[k][i] = (t[k - 1][i] << 8) ^ t[0][t[k - 1][i] >> 24];
    }
  }
};

const CrcTables& Tables() {
  static const CrcTables tables;
  return tables;
}

}  // namespace

extern "C" unsigned int RavelUtil_CRC32(unsigned int crc, const unsigned char* data, unsigned int length) {
  const CrcTables& tab = Tables();
  while (length >= 4) {
    crc ^= (static_cast<unsigned int>(data[0]) << 24) | (static_cast<unsigned int>(data[1]) << 16) |
           (static_cast<unsigned int>(data[2]) << 8) | data[3];
    crc = tab.t[3][crc >> 24] ^ tab.t[2][(crc >> 16) & 0xFF] ^ tab.t[1][(crc >> 8) & 0xFF] ^ tab.t[0][crc & 0xFF];
    data += 4;
    length -= 4;
  }
  while (length-- > 0) crc = (crc << 8) ^ tab.t[0][((crc >> 24) ^ *data++) & 0xFF];
  return crc;
}

extern "C" int RavelUtil_CheckSectionCRC32(const unsigned char* section) {
  if (section == 0) return 0;
  unsigned int length = ((section[1] & 0x0Fu) << 8 | section[2]) + 3u;
  return RavelUtil_CRC32(0xFFFFFFFFu, section, length) == 0 ? 1 : 0;
}
