#include "AssemblerStreams.h"

namespace streams {

Bytes SectionOfSize(std::size_t size, unsigned int extension, uint8_t tableId) {
  Bytes body(size - 12);
  for (std::size_t i = 0; i < body.size(); ++i) body[i] = static_cast<uint8_t>((i + extension) % 0xF0);
  sb::SectionOptions options;
  options.tableId = tableId;
  options.tableIdExtension = static_cast<uint16_t>(extension);
  return sb::LongSection(options, body);
}

std::vector<Bytes> OnePacketSections() {
  sb::PacketWriter writer(kAssemblerPid);
  for (unsigned int i = 0; i < 256; ++i) writer.AddSection(SectionOfSize(160, i));
  return writer.Packets();
}

std::vector<Bytes> LongSections() {
  sb::PacketWriter writer(kAssemblerPid);
  for (unsigned int i = 0; i < 12; ++i) writer.AddSection(SectionOfSize(4096, i));
  return writer.Packets();
}

std::vector<Bytes> PackedSections() {
  sb::PacketWriter writer(kAssemblerPid);
  std::vector<Bytes> sections;
  for (unsigned int i = 0; i < 1200; ++i) sections.push_back(SectionOfSize(40, i));
  writer.AddPackedSections(sections);
  return writer.Packets();
}

std::vector<Bytes> EitPairs(int pairs) {
  sb::PacketWriter writer(kAssemblerPid);
  for (int i = 0; i < pairs; ++i) {
    const unsigned int service = static_cast<unsigned int>(i) & 0xFFFF;
    writer.AddPackedSections({SectionOfSize(100, service, 0x4E), SectionOfSize(1000, service, 0x50)});
  }
  return writer.Packets();
}

}  // namespace streams
