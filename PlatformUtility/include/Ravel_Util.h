// Section CRC_32 (ISO/IEC 13818-1 Annex A): polynomial 0x04C11DB7, initial value
// 0xFFFFFFFF, no final inversion. A whole section, CRC included, sums to 0.
#ifndef RAVEL_UTIL_H
#define RAVEL_UTIL_H

#ifdef __cplusplus
extern "C" {
#endif

// Nonzero when the CRC at the end of the section verifies. The length comes from
// the section's own section_length field (3 + section_length bytes are read).
int RavelUtil_CheckSectionCRC32(const unsigned char* section);

// The running CRC over `length` bytes, starting from `crc` (0xFFFFFFFF for a new sum).
unsigned int RavelUtil_CRC32(unsigned int crc, const unsigned char* data, unsigned int length);

#ifdef __cplusplus
}
#endif

#endif
