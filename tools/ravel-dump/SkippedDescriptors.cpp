#include "SkippedDescriptors.h"

#include <cstdlib>
#include <cstring>
#include <set>

#include "Ravel_CSafeSection.h"

namespace ravel_dump {
namespace {

// Every descriptor of the section's loops, in the order its table's parse reads them.
std::vector<SkippedDescriptor> AllDescriptors(const uint8_t* section, std::size_t size) {
  std::vector<SkippedDescriptor> all;
  RavelCSafeSection::EachDescriptor(
      section, static_cast<int>(size),
      [](int, unsigned char tag, unsigned char length, void* context) {
        static_cast<std::vector<SkippedDescriptor>*>(context)->push_back(SkippedDescriptor{tag, length});
      },
      &all);
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

void MeasureSkippedDescriptors(const uint8_t* section, std::size_t size, std::vector<SkippedDescriptor>& skipped) {
  const std::vector<SkippedDescriptor> all = AllDescriptors(section, size);
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
