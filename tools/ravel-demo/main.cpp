// ravel-demo: builds a small capture (a PAT on PID 0x0000; on PID 0x0100 a
// section spanning several packets, two sections packed into one packet and a
// section whose second packet is lost) and feeds it packet by packet through
// one RavelCTSPktStore per PID, as a receiver does. Every assembled section is
// listed with its table_id, its size and whether its CRC_32 verifies.
#include <cstdio>
#include <map>
#include <vector>

#include "Ravel_CTSPktAssembler.h"
#include "Ravel_PGL.h"
#include "Ravel_Util.h"
#include "StreamBuilder.h"

namespace {

Bytes Body(size_t size, uint8_t first) {
  Bytes body(size);
  for (size_t i = 0; i < size; ++i) body[i] = static_cast<uint8_t>(first + i);
  return body;
}

Bytes Section(uint8_t tableId, uint16_t extension, const Bytes& body) {
  sb::SectionOptions options;
  options.tableId = tableId;
  options.tableIdExtension = extension;
  return sb::LongSection(options, body);
}

void AppendPackets(std::vector<Bytes>& capture, const sb::PacketWriter& writer, size_t skip = static_cast<size_t>(-1)) {
  for (size_t i = 0; i < writer.Packets().size(); ++i) {
    if (i != skip) capture.push_back(writer.Packets()[i]);
  }
}

// The library's messages, printed in line with the listing so that the lost
// packet shows up where it happens.
void PrintTrace(unsigned int mask, const char*, int, const char* text, void*) {
  std::printf("  trace [%08x] %s", mask, text);
}

}  // namespace

int main() {
  RavelPGL_SetTraceHook(PrintTrace, nullptr);

  std::vector<Bytes> capture;

  // PAT: transport_stream_id 1, program 1 with its PMT on PID 0x0100.
  sb::PacketWriter patPid(0x0000);
  patPid.AddSection(Section(0x00, 0x0001, sb::Cat({sb::U16(0x0001), sb::U16(0xE000 | 0x0100)})));
  AppendPackets(capture, patPid);

  sb::PacketWriter sectionPid(0x0100);
  // A 612-byte section over four packets.
  sectionPid.AddSection(Section(0x42, 0x0010, Body(600, 0x00)));
  AppendPackets(capture, sectionPid);
  // Two sections in one packet. The store emits the first at once; the second
  // waits for the next packet and is emitted under the first one's size.
  sectionPid.Clear();
  sectionPid.AddPackedSections({Section(0x4E, 0x0020, Body(28, 0x10)), Section(0x4E, 0x0021, Body(48, 0x20))});
  AppendPackets(capture, sectionPid);
  // A two-packet section whose second packet is lost: the counter jumps.
  sectionPid.Clear();
  sectionPid.AddSection(Section(0x42, 0x0030, Body(250, 0x30)));
  AppendPackets(capture, sectionPid, 1);
  // A last section, started after the gap.
  sectionPid.Clear();
  sectionPid.AddSection(Section(0x40, 0x0040, Body(18, 0x40)));
  AppendPackets(capture, sectionPid);

  std::map<unsigned int, RavelCTSPktStore> stores;
  int sections = 0;
  int verified = 0;
  for (size_t n = 0; n < capture.size(); ++n) {
    const Bytes& packet = capture[n];
    const unsigned int pid = ((packet[1] & 0x1Fu) << 8) | packet[2];
    RavelCSectionData out;
    if (stores[pid].AddTSPacket(packet.data(), out) == 0) continue;
    for (int i = 0; i < out.iSectionCount; ++i) {
      const unsigned char* section = out.pSection[i];
      const int size = out.iSectionSize[i];
      const int ownSize = (((section[1] & 0x0F) << 8) | section[2]) + 3;
      ++sections;
      const char* crc = "CRC BAD";
      if (ownSize > size) {
        crc = "cut short, CRC not checked";
      } else if (RavelUtil_CheckSectionCRC32(section)) {
        crc = "CRC ok";
        ++verified;
      }
      std::printf("packet %2zu PID 0x%04x: table_id 0x%02x, size %4d, section_length+3 %4d, %s\n", n + 1, pid,
                  section[0], size, ownSize, crc);
    }
  }
  std::printf("%zu packets, %d sections assembled, %d with a verified CRC\n", capture.size(), sections, verified);
  RavelPGL_SetTraceHook(nullptr, nullptr);
  return 0;
}
