// Packet streams of one PID that the section assemblers are tested and
// measured on: sections that fit one packet, sections spread over many
// packets, several sections packed into each packet, and the EIT pairs that a
// store closing a section by the size of the one before it cannot deliver.
#ifndef RAVEL_TESTS_ASSEMBLERSTREAMS_H
#define RAVEL_TESTS_ASSEMBLERSTREAMS_H

#include <cstddef>
#include <vector>

#include "StreamBuilder.h"

namespace streams {

const uint16_t kAssemblerPid = 0x0012;

// Parts of a section as packets carry them.
inline Bytes Head(const Bytes& b, std::size_t count) { return Bytes(b.begin(), b.begin() + count); }
inline Bytes Tail(const Bytes& b, std::size_t from) { return Bytes(b.begin() + from, b.end()); }
inline Bytes Mid(const Bytes& b, std::size_t from, std::size_t count) {
  return Bytes(b.begin() + from, b.begin() + from + count);
}

// A long section of exactly `size` bytes (valid CRC, no 0xFF in its body).
Bytes SectionOfSize(std::size_t size, unsigned int extension, uint8_t tableId = 0x4E);

// 256 sections of 160 bytes, one per packet.
std::vector<Bytes> OnePacketSections();
// 12 sections of 4096 bytes, 23 packets each.
std::vector<Bytes> LongSections();
// 1200 sections of 40 bytes packed back to back: four or five begin in each packet.
std::vector<Bytes> PackedSections();
// `pairs` times: a 100-byte EIT present/following section (0x4E) followed in
// the same packet by a 1000-byte EIT schedule section (0x50), each pair
// starting a packet.
std::vector<Bytes> EitPairs(int pairs);

}  // namespace streams

#endif
