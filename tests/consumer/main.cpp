// Parses a PAT section the way a receiver application does.
#include <RavelSectionParser.h>

#include <cstdio>

int main() {
  // PAT: transport_stream_id 1, program 1 on PMT PID 0x1FC8, CRC_32 at the end.
  unsigned char section[] = {0x00, 0xB0, 0x0D, 0x00, 0x01, 0xC1, 0x00, 0x00,
                             0x00, 0x01, 0xFF, 0xC8, 0x00, 0x00, 0x00, 0x00};
  unsigned int crc = RavelUtil_CRC32(0xFFFFFFFFu, section, sizeof(section) - 4);
  for (int i = 0; i < 4; ++i) section[sizeof(section) - 4 + i] = static_cast<unsigned char>(crc >> (24 - 8 * i));
  RavelCPAT pat(section);
  if (pat.aProgramList.iCount != 1 || pat.aProgramList[0]->iPID != 0x1FC8) return 1;
  std::printf("consumer: PAT with PMT PID 0x%04x\n", pat.aProgramList[0]->iPID);
  return 0;
}
