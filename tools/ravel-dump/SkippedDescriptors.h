// Descriptors the receivers' library skips: it has no class for the tag in
// that loop, or it refuses the descriptor. The library says so in its traces
// during the one parse of each distinct section; the lengths are read from
// the section's descriptor loops as the library walks them.
#ifndef RAVEL_DUMP_SKIPPEDDESCRIPTORS_H
#define RAVEL_DUMP_SKIPPEDDESCRIPTORS_H

#include <cstddef>
#include <cstdint>
#include <vector>

namespace ravel_dump {

struct SkippedDescriptor {
  uint8_t tag = 0;
  int length = -1;  // -1 where no loop walked here holds it
};

// Whether a library trace tells of a skipped or refused descriptor; if so,
// its tag (and, for a refused one, its length) go to `skipped`.
bool ReadSkippedDescriptorTrace(const char* text, SkippedDescriptor& skipped);

// Gives each skipped descriptor the length of the next descriptor with its
// tag in the section's loops, in the order the library walks them; a
// descriptor told twice (the PMT parses each stream's entry twice) is kept once.
void MeasureSkippedDescriptors(const uint8_t* section, std::size_t size, std::vector<SkippedDescriptor>& skipped);

}  // namespace ravel_dump

#endif
