#include "CaptureKind.h"

#include <vector>

#include "PacketReader.h"
#include "Ravel_ByteOrder.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_Util.h"

namespace ravel_dump {
namespace {

// Enough for a run of sync bytes at any packet size and for the sections
// checked (at most 4096 bytes each).
const std::size_t kLookWindow = 64u << 10;
// Sections whose lengths and CRCs must agree before a file is taken as sections.
const int kSectionsChecked = 16;
const uint8_t kStuffing = 0xFF;

}  // namespace

bool LooksLikeRawSections(const uint8_t* head, std::size_t size, bool whole) {
  std::size_t pos = 0;
  int checked = 0;
  int crcsVerified = 0;
  while (pos < size && checked < kSectionsChecked) {
    if (head[pos] == kStuffing) {
      ++pos;
      continue;
    }
    if (size - pos < 3) return !whole && crcsVerified > 0;
    std::size_t sectionSize = static_cast<std::size_t>(RavelSectionSize(head + pos));
    // A section cut by the end of what was looked at is judged by those before it.
    if (sectionSize > size - pos) return !whole && crcsVerified > 0;
    if (RavelCSafeSection::CarriesCrc(head + pos)) {
      if (sectionSize < 7 || RavelUtil_CheckSectionCRC32(head + pos) == 0) return false;
      ++crcsVerified;
    }
    ++checked;
    pos += sectionSize;
  }
  return crcsVerified > 0;
}

bool HoldsRawSections(InputFile& input, bool& sections, std::string& error) {
  std::vector<uint8_t> head;
  if (!input.Peek(kLookWindow, head, error)) return false;
  bool whole = head.size() < kLookWindow;
  std::size_t syncAt = 0;
  int stride = 0;
  bool packetsFromTheStart = PacketReader::FindLock(head.data(), head.size(), syncAt, stride) &&
                             syncAt == PacketReader::SyncOffset(stride);
  sections = !packetsFromTheStart && LooksLikeRawSections(head.data(), head.size(), whole);
  return true;
}

}  // namespace ravel_dump
