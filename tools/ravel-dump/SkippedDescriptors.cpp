#include "SkippedDescriptors.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <set>

#include "SectionBytes.h"

namespace ravel_dump {
namespace {

const std::size_t kLongHeaderSize = 8;
const std::size_t kCrcSize = 4;

std::size_t TwelveBits(const uint8_t* p) { return static_cast<std::size_t>(((p[0] & 0x0F) << 8) | p[1]); }

// Where a table's descriptor loops are: its own loop (after a 12-bit length),
// then loop entries, each a fixed header holding the 12-bit length of its
// descriptors (ISO/IEC 13818-1, ETSI EN 300 468, ARIB STD-B10, ETSI TS 102 809).
struct LoopLayout {
  TableKind kind;
  int ownLoopLengthAt;      // -1: no loop of its own
  bool entriesLengthFirst;  // a 12-bit length of all entries precedes them
  std::size_t entriesFrom;  // where the entries start when there is no own loop
  std::size_t entryHeader;  // 0: no entries
  std::size_t entryLengthAt;
};

const LoopLayout kLayouts[] = {
    {kRavelKindPMT, 10, false, 0, 5, 3},
    {kRavelKindNIT, 8, true, 0, 6, 4},
    {kRavelKindSDT, -1, false, 11, 5, 3},
    {kRavelKindEITPresentFollowing, -1, false, 14, 12, 10},
    {kRavelKindEITSchedule, -1, false, 14, 12, 10},
    {kRavelKindTOT, 8, false, 0, 0, 0},
    {kRavelKindBIT, 8, false, 0, 3, 1},
    {kRavelKindAIT, 8, true, 0, 9, 7},
};

// Every descriptor of the section's loops, in order.
std::vector<SkippedDescriptor> AllDescriptors(TableKind kind, const uint8_t* s, std::size_t size) {
  std::vector<SkippedDescriptor> all;
  auto walk = [&](std::size_t from, std::size_t length, std::size_t end) {
    if (from >= end) return;
    EachDescriptor(s + from, length < end - from ? length : end - from,
                   [&](uint8_t tag, const uint8_t*, std::size_t bodyLength) {
                     all.push_back(SkippedDescriptor{tag, static_cast<int>(bodyLength)});
                   });
  };
  if (size < kLongHeaderSize + kCrcSize) return all;
  const std::size_t end = size - kCrcSize;
  // The CAT's and the stream descriptor sections' body is one loop.
  if (kind == kRavelKindCAT || kind == kRavelKindStreamEvents) {
    walk(kLongHeaderSize, end - kLongHeaderSize, end);
    return all;
  }
  for (const LoopLayout& layout : kLayouts) {
    if (layout.kind != kind) continue;
    std::size_t at = layout.entriesFrom;
    if (layout.ownLoopLengthAt >= 0) {
      const std::size_t lengthAt = static_cast<std::size_t>(layout.ownLoopLengthAt);
      if (lengthAt + 2 > end) return all;
      const std::size_t length = TwelveBits(s + lengthAt);
      walk(lengthAt + 2, length, end);
      at = lengthAt + 2 + length;
    }
    std::size_t entriesEnd = end;
    if (layout.entriesLengthFirst) {
      if (at + 2 > end) return all;
      entriesEnd = std::min(end, at + 2 + TwelveBits(s + at));
      at += 2;
    }
    while (layout.entryHeader != 0 && at + layout.entryHeader <= entriesEnd) {
      const std::size_t length = TwelveBits(s + at + layout.entryLengthAt);
      walk(at + layout.entryHeader, length, entriesEnd);
      at += layout.entryHeader + length;
    }
  }
  return all;
}

}  // namespace

bool ReadSkippedDescriptorTrace(const char* text, SkippedDescriptor& skipped) {
  // A descriptor class handed a tag not its own tells so too; that is no skip.
  if (text == nullptr || std::strncmp(text, "This Descriptor isn't", 21) == 0) return false;
  const char* tag = std::strstr(text, "Tag=[0x");
  if (tag == nullptr) return false;
  skipped.tag = static_cast<uint8_t>(std::strtoul(tag + 7, nullptr, 16));
  const char* length = std::strstr(text, "descrLen=[");
  skipped.length = length != nullptr ? std::atoi(length + 10) : -1;
  return true;
}

void MeasureSkippedDescriptors(TableKind kind, const uint8_t* section, std::size_t size,
                               std::vector<SkippedDescriptor>& skipped) {
  const std::vector<SkippedDescriptor> all = AllDescriptors(kind, section, size);
  std::vector<SkippedDescriptor> measured;
  std::set<uint8_t> found;
  std::size_t next = 0;
  for (const SkippedDescriptor& told : skipped) {
    std::size_t i = next;
    while (i < all.size() && all[i].tag != told.tag) ++i;
    if (i < all.size()) {
      measured.push_back(all[i]);
      found.insert(told.tag);
      next = i + 1;
    } else if (found.count(told.tag) == 0) {
      measured.push_back(told);  // in a loop not walked here
    }
    // Else told again: the PMT parses each stream's entry twice.
  }
  skipped = measured;
}

}  // namespace ravel_dump
