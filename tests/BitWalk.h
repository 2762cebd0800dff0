// Walks one set bit through the wire bits of a descriptor or record: for each
// bit of a range, a payload that differs from a base payload in exactly that bit
// is parsed, and every decoded field must change by exactly what the bit is
// worth in it (its power of two within the field) and no other field may change.
// A bit that belongs to no field changes nothing.
#ifndef RAVEL_TESTS_BITWALK_H
#define RAVEL_TESTS_BITWALK_H

#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

#include "StreamBuilder.h"

namespace bitwalk {

// `width` wire bits whose most significant one is bit `firstBit`, counted from
// the most significant bit of byte 0 on (bit 16 is the top bit of byte 2).
struct Segment {
  int firstBit;
  int width;
};

// One decoded value and the wire bits it is made of.
struct Field {
  const char* name;
  std::vector<Segment> segments;
};

// Parses `raw` and gives the decoded values, one per field, in the field order.
typedef std::vector<int64_t> (*Reader)(unsigned char* raw);

struct Walk {
  const char* label;
  Bytes base;   // every bit of [fromBit, toBit) is 0 in it
  int fromBit;
  int toBit;
  std::vector<Field> fields;
  Reader read;
};

inline int64_t WorthOf(const Field& field, int bit) {
  int64_t worth = 0;
  for (const Segment& s : field.segments) {
    if (bit >= s.firstBit && bit < s.firstBit + s.width) worth += int64_t(1) << (s.firstBit + s.width - 1 - bit);
  }
  return worth;
}

inline void Run(const Walk& walk) {
  SCOPED_TRACE(walk.label);
  Bytes base = walk.base;
  const std::vector<int64_t> before = walk.read(base.data());
  ASSERT_EQ(walk.fields.size(), before.size());
  for (int bit = walk.fromBit; bit < walk.toBit; ++bit) {
    const uint8_t mask = static_cast<uint8_t>(0x80 >> (bit % 8));
    Bytes raw = walk.base;
    ASSERT_LT(static_cast<size_t>(bit / 8), raw.size());
    ASSERT_EQ(0, raw[bit / 8] & mask) << "bit " << bit << " is set in the base";
    raw[bit / 8] |= mask;
    const std::vector<int64_t> after = walk.read(raw.data());
    for (size_t i = 0; i < walk.fields.size(); ++i) {
      EXPECT_EQ(before[i] + WorthOf(walk.fields[i], bit), after[i])
          << walk.fields[i].name << ", byte " << bit / 8 << " bit mask 0x" << std::hex << int(mask);
    }
  }
}

// A base payload: the given leading bytes, then zeros up to `size` bytes.
inline Bytes Base(const Bytes& leading, size_t size) {
  Bytes raw = leading;
  if (raw.size() < size) raw.resize(size, 0);
  return raw;
}

}  // namespace bitwalk

#endif
