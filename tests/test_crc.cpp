// The section CRC_32 against a bit-at-a-time reference: every length around
// the eight-byte steps of the table-driven sum, from every alignment and start
// value (so a sum split anywhere agrees too).
#include <gtest/gtest.h>

#include <vector>

#include "Ravel_Util.h"

namespace {

// ISO/IEC 13818-1 Annex A, one bit at a time.
unsigned int BitwiseCrc(unsigned int crc, const unsigned char* data, unsigned int length) {
  for (unsigned int i = 0; i < length; ++i) {
    crc ^= static_cast<unsigned int>(data[i]) << 24;
    for (int bit = 0; bit < 8; ++bit) crc = (crc & 0x80000000u) ? (crc << 1) ^ 0x04C11DB7u : crc << 1;
  }
  return crc;
}

std::vector<unsigned char> Noise(size_t size) {
  std::vector<unsigned char> bytes(size);
  unsigned int state = 0x12345678u;
  for (size_t i = 0; i < size; ++i) {
    state = state * 1103515245u + 12345u;
    bytes[i] = static_cast<unsigned char>(state >> 23);
  }
  return bytes;
}

}  // namespace

TEST(SectionCrcTable, MatchesTheBitwiseSumForEveryLengthAndAlignment) {
  const std::vector<unsigned char> bytes = Noise(4200);
  const unsigned int starts[] = {0xFFFFFFFFu, 0x00000000u, 0x89ABCDEFu};
  for (unsigned int offset = 0; offset < 8; ++offset) {
    for (unsigned int length = 0; length <= 80; ++length) {
      for (unsigned int start : starts) {
        ASSERT_EQ(BitwiseCrc(start, &bytes[offset], length), RavelUtil_CRC32(start, &bytes[offset], length))
            << "offset " << offset << " length " << length << " start " << std::hex << start;
      }
    }
  }
  // The standard's check value: CRC-32/MPEG-2 of "123456789".
  EXPECT_EQ(0x0376E6E7u, RavelUtil_CRC32(0xFFFFFFFFu, reinterpret_cast<const unsigned char*>("123456789"), 9));
  const unsigned int longLengths[] = {183, 184, 1021, 1024, 4093, 4096};
  for (unsigned int length : longLengths) {
    EXPECT_EQ(BitwiseCrc(0xFFFFFFFFu, &bytes[3], length), RavelUtil_CRC32(0xFFFFFFFFu, &bytes[3], length)) << length;
  }
  EXPECT_EQ(0, RavelUtil_CheckSectionCRC32(nullptr));
}
