// What the descriptor tests share: every descriptor class, the body of a
// descriptor's Show dump, a descriptor placed in its section ahead of zeros and
// the bit walks of the fixed fields.
#ifndef RAVEL_TESTS_DESCRIPTORSHOW_H
#define RAVEL_TESTS_DESCRIPTORSHOW_H

#include <algorithm>
#include <cstring>
#include <string>
#include <vector>

#include "BitWalk.h"
#include "RavelSectionParser.h"
#include "TestHelpers.h"

namespace th {

using Values = std::vector<int64_t>;
using bitwalk::Base;

// The lines of Show after the banner and the base line.
inline TraceLines BodyLines(RavelCDescriptorBase& descriptor) {
  TraceLines lines = ShowLines(descriptor);
  return TraceLines(lines.begin() + std::min<size_t>(2, lines.size()), lines.end());
}

// Zeros after a descriptor in its section: what a parse reading past its length takes in.
inline Bytes FollowedByZeros(const Bytes& descriptor) { return InSection(descriptor, Bytes(300, 0x00)); }

// An index outside an array of `count`: one panic with the bound trace, and an empty answer.
template <class Getter>
void ExpectBoundPanic(int index, int count, Getter get) {
  TraceRecorder recorder;
  EXPECT_EQ(decltype(get(index)){}, get(index)) << index;
  EXPECT_EQ(1, recorder.PanicCount());
  EXPECT_EQ(BoundOverflow(index, count), recorder.Lines());
}

// Runs every walk with the parses' own traces kept out of the test's output.
template <size_t N>
void RunWalks(const bitwalk::Walk (&walks)[N]) {
  TraceRecorder quiet;
  for (const bitwalk::Walk& walk : walks) bitwalk::Run(walk);
}

}  // namespace th

// A walk's reader: the values `fields` (over the object `d`) of a fresh object of class T.
#define RAVEL_WALK_READER(T, ...) [](unsigned char* raw) -> th::Values { T d(raw); return {__VA_ARGS__}; }

#endif
