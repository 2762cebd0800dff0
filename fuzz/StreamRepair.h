// Sections carried by a stream of 188-byte packets, found the way a receiver's
// section store finds them (ISO/IEC 13818-1 2.4.4: pointer_field after
// payload_unit_start_indicator, section_length, 0xFF stuffing), so that a
// mutator can give every complete section a valid CRC_32 again. A receiver
// parses what passes the CRC, and anyone with a transmitter can compute one, so
// mutations must reach the parse operations with their CRC intact.
#ifndef RAVEL_FUZZ_STREAMREPAIR_H
#define RAVEL_FUZZ_STREAMREPAIR_H

#include <cstddef>
#include <cstdint>
#include <map>
#include <vector>

#include "Ravel_Util.h"

namespace fuzz {

const size_t kPacketSize = 188;

namespace detail {

const unsigned char kSyncByte = 0x47;
const unsigned char kStuffingByte = 0xFF;
const unsigned char kTOTTableId = 0x73;  // short section with a CRC_32

// A section in progress on one PID: where each of its bytes lies in the stream.
struct PendingSection {
  std::vector<size_t> offsets;
  bool active = false;
};

inline void WriteCrc(uint8_t* stream, const std::vector<size_t>& offsets, size_t size) {
  std::vector<unsigned char> bytes(size - 4);
  for (size_t i = 0; i < size - 4; ++i) bytes[i] = stream[offsets[i]];
  unsigned int crc = RavelUtil_CRC32(0xFFFFFFFFu, bytes.data(), static_cast<unsigned int>(bytes.size()));
  for (size_t i = 0; i < 4; ++i) stream[offsets[size - 4 + i]] = static_cast<uint8_t>(crc >> (24 - 8 * i));
}

// Takes every complete section off the front of `pending`, repairing its CRC_32
// when it carries one (section_syntax_indicator 1, or the TOT).
inline void TakeSections(uint8_t* stream, PendingSection& pending) {
  while (pending.active && pending.offsets.size() >= 3) {
    if (stream[pending.offsets[0]] == kStuffingByte) {
      pending.offsets.clear();
      pending.active = false;
      return;
    }
    const unsigned char flags = stream[pending.offsets[1]];
    const size_t size = 3 + ((static_cast<size_t>(flags & 0x0F) << 8) | stream[pending.offsets[2]]);
    if (pending.offsets.size() < size) return;
    const bool hasCrc = (flags & 0x80) != 0 || stream[pending.offsets[0]] == kTOTTableId;
    if (hasCrc && size >= 3 + 4) WriteCrc(stream, pending.offsets, size);
    pending.offsets.erase(pending.offsets.begin(), pending.offsets.begin() + static_cast<long>(size));
    if (pending.offsets.empty()) pending.active = false;
  }
}

inline void Append(PendingSection& pending, size_t from, size_t to) {
  for (size_t at = from; at < to; ++at) pending.offsets.push_back(at);
}

}  // namespace detail

// Recomputes, in place, the CRC_32 of every complete section of every PID of the
// packets in `stream` (a shorter tail is left alone).
inline void RepairSectionCrcs(uint8_t* stream, size_t size) {
  std::map<unsigned int, detail::PendingSection> pids;
  for (size_t packet = 0; packet + kPacketSize <= size; packet += kPacketSize) {
    const uint8_t* p = stream + packet;
    if (p[0] != detail::kSyncByte) continue;
    const unsigned int control = (p[3] >> 4) & 0x3;
    if ((control & 0x1) == 0) continue;  // no payload
    size_t at = packet + 4 + ((control & 0x2) ? 1 + p[4] : 0);
    const size_t end = packet + kPacketSize;
    if (at >= end) continue;
    detail::PendingSection& pending = pids[((p[1] & 0x1Fu) << 8) | p[2]];
    if (p[1] & 0x40) {
      const size_t start = at + 1 + stream[at];
      if (start > end) continue;
      if (pending.active) {
        detail::Append(pending, at + 1, start);
        detail::TakeSections(stream, pending);
      }
      pending.offsets.clear();
      pending.active = true;
      at = start;
    } else if (!pending.active) {
      continue;
    }
    detail::Append(pending, at, end);
    detail::TakeSections(stream, pending);
  }
}

}  // namespace fuzz

#endif
