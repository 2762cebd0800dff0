// Writes a capture whose sections all differ, for timing the path of a section
// that is not a repeat (each one checked, parsed and kept). The sections of a
// source capture are assembled per PID with the library's own store, then
// written again and again, each long section with its own version_number and
// table_id_extension (from a running count) and its CRC_32 made anew, one
// section per run of packets, until the output reaches the size asked for.
// Packets of PES PIDs (audio, video) are left out.
//
//   make-distinct-capture SOURCE.ts OUTPUT.ts MEGABYTES
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "Ravel_ByteOrder.h"
#include "Ravel_CTSPktAssembler.h"
#include "Ravel_Util.h"

namespace {

const int kPacketSize = 188;
const int kPidCount = 8192;

struct Section {
  int pid;
  std::vector<unsigned char> bytes;
};

// A PES packet starts its payload with 00 00 01; a section PID with a pointer_field.
bool StartsPes(const unsigned char* payload, int size) {
  return size >= 3 && payload[0] == 0x00 && payload[1] == 0x00 && payload[2] == 0x01;
}

std::vector<Section> ReadSections(const std::vector<unsigned char>& stream) {
  std::vector<Section> sections;
  std::vector<int> isSectionPid(kPidCount, -1);  // -1 unknown, 0 PES, 1 sections
  std::vector<RavelCTSPktStore> stores(kPidCount);
  unsigned char packet[kPacketSize + 64] = {};  // the store may look past a short payload
  for (std::size_t at = 0; at + kPacketSize <= stream.size(); at += kPacketSize) {
    if (stream[at] != 0x47) continue;
    std::memcpy(packet, &stream[at], kPacketSize);
    const int pid = ((packet[1] & 0x1F) << 8) | packet[2];
    const unsigned int control = (packet[3] >> 4) & 0x03;
    if (pid == 0x1FFF || (control & 0x01) == 0 || (packet[1] & 0x80) != 0) continue;
    int payload = 4 + (control == 0x03 ? 1 + packet[4] : 0);
    if (payload >= kPacketSize) continue;
    if (isSectionPid[pid] < 0 && (packet[1] & 0x40) != 0) {
      isSectionPid[pid] = StartsPes(packet + payload, kPacketSize - payload) ? 0 : 1;
    }
    if (isSectionPid[pid] != 1) continue;
    RavelCSectionData out;
    stores[pid].AddTSPacket(packet, out);
    for (int i = 0; i < out.iSectionCount && i < RAVEL_MAX_ASSEMBLED_SECTIONS; ++i) {
      const unsigned char* section = out.pSection[i];
      if (section == 0 || out.iSectionSize[i] < 3 || section[0] == 0xFF) continue;
      const int size = RavelSectionSize(section);
      if (size > out.iSectionSize[i]) continue;
      sections.push_back(Section{pid, std::vector<unsigned char>(section, section + size)});
    }
  }
  return sections;
}

// The `count`-th section written: its own version and extension, a new CRC_32.
void MakeDistinct(std::vector<unsigned char>& section, unsigned long count) {
  const bool longForm = (section[1] & 0x80) != 0;
  if (!longForm || section.size() < 12) return;
  unsigned int extension = RavelRead16(&section[3]) ^ static_cast<unsigned int>((count >> 5) & 0xFFFF);
  section[3] = static_cast<unsigned char>(extension >> 8);
  section[4] = static_cast<unsigned char>(extension);
  section[5] = static_cast<unsigned char>((section[5] & 0xC1) | ((count & 0x1F) << 1));
  const unsigned int size = static_cast<unsigned int>(section.size());
  unsigned int crc = RavelUtil_CRC32(0xFFFFFFFFu, section.data(), size - 4);
  for (int i = 0; i < 4; ++i) section[size - 4 + i] = static_cast<unsigned char>(crc >> (24 - 8 * i));
}

// One section from the start of a packet (pointer_field 0), stuffed to the end of its last packet.
void WritePackets(std::FILE* out, const Section& section, std::vector<unsigned char>& counters) {
  std::size_t at = 0;
  bool first = true;
  while (at < section.bytes.size()) {
    unsigned char packet[kPacketSize];
    std::memset(packet, 0xFF, sizeof packet);
    packet[0] = 0x47;
    packet[1] = static_cast<unsigned char>((first ? 0x40 : 0x00) | (section.pid >> 8));
    packet[2] = static_cast<unsigned char>(section.pid);
    packet[3] = static_cast<unsigned char>(0x10 | (counters[section.pid]++ & 0x0F));
    int payload = 4;
    if (first) packet[payload++] = 0x00;
    std::size_t take = std::min<std::size_t>(kPacketSize - payload, section.bytes.size() - at);
    std::memcpy(packet + payload, &section.bytes[at], take);
    at += take;
    first = false;
    std::fwrite(packet, 1, sizeof packet, out);
  }
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 4) {
    std::fprintf(stderr, "usage: make-distinct-capture SOURCE.ts OUTPUT.ts MEGABYTES\n");
    return 2;
  }
  std::ifstream in(argv[1], std::ios::binary);
  std::vector<unsigned char> stream((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  std::vector<Section> sections = ReadSections(stream);
  if (sections.empty()) {
    std::fprintf(stderr, "make-distinct-capture: no section in %s\n", argv[1]);
    return 1;
  }
  std::FILE* out = std::fopen(argv[2], "wb");
  if (out == 0) {
    std::fprintf(stderr, "make-distinct-capture: cannot write %s\n", argv[2]);
    return 1;
  }
  const long long target = std::atoll(argv[3]) * 1000000LL;
  std::vector<unsigned char> counters(kPidCount, 0);
  unsigned long count = 0;
  while (std::ftell(out) < target) {
    for (const Section& source : sections) {
      Section section = source;
      MakeDistinct(section.bytes, count++);
      WritePackets(out, section, counters);
    }
  }
  std::printf("%lu sections\n", count);
  return std::fclose(out) == 0 ? 0 : 1;
}
