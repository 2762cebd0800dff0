#include "Captures.h"

#include <fstream>
#include <iterator>

#include "Ravel_CTSPktAssembler.h"

namespace captures {

std::string Path(const std::string& name) {
  std::string path = std::string(RAVEL_SHARED_CAPTURES) + "/" + name;
  std::ifstream probe(path.c_str(), std::ios::binary);
  return probe.good() ? path : std::string();
}

bool Load(const std::string& name, Bytes& contents) {
  std::string path = Path(name);
  if (path.empty()) return false;
  std::ifstream in(path.c_str(), std::ios::binary);
  contents.assign(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
  return !contents.empty();
}

std::vector<Bytes> SplitSections(const Bytes& contents) {
  std::vector<Bytes> sections;
  size_t at = 0;
  while (at + 3 <= contents.size()) {
    size_t size = (((contents[at + 1] & 0x0F) << 8) | contents[at + 2]) + 3;
    if (at + size > contents.size()) break;
    sections.push_back(Bytes(contents.begin() + at, contents.begin() + at + size));
    at += size;
  }
  return sections;
}

std::vector<Bytes> PacketsOfPid(const Bytes& stream, unsigned int pid) {
  std::vector<Bytes> packets;
  for (size_t at = 0; at + 188 <= stream.size(); at += 188) {
    if (stream[at] != 0x47) continue;
    unsigned int packetPid = ((stream[at + 1] & 0x1F) << 8) | stream[at + 2];
    if (packetPid == pid) packets.push_back(Bytes(stream.begin() + at, stream.begin() + at + 188));
  }
  return packets;
}

std::vector<Bytes> SectionsOfPid(const Bytes& stream, unsigned int pid) {
  std::vector<Bytes> sections;
  RavelCTSPktStore store;
  for (const Bytes& packet : PacketsOfPid(stream, pid)) {
    RavelCSectionData out;
    store.AddTSPacket(packet.data(), out);
    for (int i = 0; i < out.iSectionCount; ++i) {
      sections.emplace_back(out.pSection[i], out.pSection[i] + out.iSectionSize[i]);
    }
  }
  return sections;
}

}  // namespace captures
