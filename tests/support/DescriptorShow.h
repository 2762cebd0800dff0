// What the descriptor tests share: the body of a descriptor's Show dump and a
// descriptor placed in its section ahead of zeros.
#ifndef RAVEL_TESTS_DESCRIPTORSHOW_H
#define RAVEL_TESTS_DESCRIPTORSHOW_H

#include <algorithm>

#include "Ravel_CDescriptorBase.h"
#include "TestHelpers.h"

namespace th {

// The lines of Show after the banner and the base line.
inline TraceLines BodyLines(RavelCDescriptorBase& descriptor) {
  TraceLines lines = ShowLines(descriptor);
  return TraceLines(lines.begin() + std::min<size_t>(2, lines.size()), lines.end());
}

// Zeros after a descriptor in its section: what a parse reading past its length takes in.
inline Bytes FollowedByZeros(const Bytes& descriptor) { return InSection(descriptor, Bytes(300, 0x00)); }

}  // namespace th

#endif
