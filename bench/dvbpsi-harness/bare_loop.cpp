// The upper limit of any program that reads a capture: read the file and count
// the packets of each PID, nothing more.
#include <cstdio>

#include "TsFileReader.h"

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: %s FILE.ts\n", argv[0]);
    return 2;
  }
  static unsigned long long perPid[8192];
  unsigned long long bytes = 0;
  bool ok = tsref::ForEachPacket(
      argv[1], [](const uint8_t* p) { ++perPid[((p[1] & 0x1Fu) << 8) | p[2]]; }, bytes);
  if (!ok) return 1;
  unsigned long long packets = 0;
  int pids = 0;
  for (unsigned long long count : perPid) {
    packets += count;
    if (count != 0) ++pids;
  }
  std::printf("bytes %llu packets %llu pids %d\n", bytes, packets, pids);
  return 0;
}
