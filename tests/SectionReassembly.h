// A small section reassembler for tests over captured packets of one PID:
// pointer_field and section_length only, continuity counters ignored, stuffing
// (0xFF) ends the sections of a packet. It stands in for the library's own
// assembler in the tests of the carousel classes.
#ifndef RAVEL_TESTS_SECTIONREASSEMBLY_H
#define RAVEL_TESTS_SECTIONREASSEMBLY_H

#include <cstddef>
#include <vector>

#include "StreamBuilder.h"

namespace reassembly {

inline std::size_t SectionSizeOf(const Bytes& pending) {
  return ((static_cast<std::size_t>(pending[1] & 0x0F) << 8) | pending[2]) + 3;
}

// Moves every complete section at the front of `pending` to `sections`.
inline void TakeComplete(Bytes& pending, bool& inSection, std::vector<Bytes>& sections) {
  while (inSection && pending.size() >= 3) {
    if (pending[0] == 0xFF) {
      inSection = false;
      pending.clear();
      break;
    }
    std::size_t size = SectionSizeOf(pending);
    if (pending.size() < size) break;
    sections.push_back(Bytes(pending.begin(), pending.begin() + size));
    pending.erase(pending.begin(), pending.begin() + size);
    if (pending.empty()) inSection = false;
  }
}

// The sections carried by `packets` (188-byte packets of one PID, in order).
inline std::vector<Bytes> Sections(const std::vector<Bytes>& packets) {
  std::vector<Bytes> sections;
  Bytes pending;
  bool inSection = false;
  for (std::size_t i = 0; i < packets.size(); ++i) {
    const Bytes& p = packets[i];
    if (p.size() != 188 || p[0] != 0x47) continue;
    bool pusi = (p[1] & 0x40) != 0;
    int control = (p[3] >> 4) & 0x03;
    std::size_t at = 4;
    if (control & 0x02) at += 1 + p[4];
    if (!(control & 0x01) || at >= 188) continue;
    if (pusi) {
      std::size_t pointer = p[at];
      std::size_t start = at + 1 + pointer;
      if (start > 188) continue;
      if (inSection) {
        pending.insert(pending.end(), p.begin() + at + 1, p.begin() + start);
        TakeComplete(pending, inSection, sections);
      }
      pending.assign(p.begin() + start, p.end());
      inSection = true;
    } else if (inSection) {
      pending.insert(pending.end(), p.begin() + at, p.end());
    }
    TakeComplete(pending, inSection, sections);
  }
  return sections;
}

// The first PID whose PUSI packets start a section with `tableId`, or -1.
inline int FindPidOfTable(const Bytes& stream, unsigned char tableId) {
  for (std::size_t at = 0; at + 188 <= stream.size(); at += 188) {
    const unsigned char* p = &stream[at];
    if (p[0] != 0x47 || !(p[1] & 0x40)) continue;
    int control = (p[3] >> 4) & 0x03;
    std::size_t payload = 4;
    if (control & 0x02) payload += 1 + p[4];
    if (!(control & 0x01) || payload >= 188) continue;
    std::size_t start = payload + 1 + p[payload];
    if (start < 188 && p[start] == tableId) return ((p[1] & 0x1F) << 8) | p[2];
  }
  return -1;
}

}  // namespace reassembly

#endif
