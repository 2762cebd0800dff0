#include "Capture.h"

#include <cstdio>

#include "SectionCheck.h"

namespace ravel_dump {
namespace {

std::string Where(int pid, const uint8_t* section) {
  char text[64];
  if (pid == kNoPid) {
    std::snprintf(text, sizeof text, "table_id 0x%02x", section[0]);
  } else {
    std::snprintf(text, sizeof text, "PID 0x%04x table_id 0x%02x", pid, section[0]);
  }
  return text;
}

}  // namespace

Capture::Capture(Stats& stats) : stats_(stats), demux_(nullptr) { carousel_.SetListener(&objects_); }

void Capture::OnSection(int pid, const uint8_t* section, std::size_t size) {
  TableKind kind = KindOfSection(section, size);
  KindStats& kindStats = stats_.Kind(kind);
  // Broadcasters resend PSI/SI many times a second: an unchanged repeat only counts.
  if (registry_.CountRepeat(pid, kind, section, size)) {
    ++kindStats.sections;
    return;
  }
  if (SectionHasCrc(section) && !SectionCrcOk(section, size)) {
    ++stats_.crcFailures;
    ++kindStats.crcFailures;
    stats_.Problem(Where(pid, section) + ": CRC failure");
    return;
  }
  std::string reason;
  if (!CheckSectionStructure(section, size, reason)) {
    ++stats_.malformed;
    ++kindStats.malformed;
    stats_.Problem(Where(pid, section) + ": " + reason);
    return;
  }
  ++kindStats.sections;
  StoredSection* stored = registry_.Add(pid, kind, section, size);
  if (stored == nullptr) return;  // a repeat
  ++kindStats.distinct;
  stored->parseResult = ParseOnArrival(pid, kind, section, size, demux_, carousel_);
  if (stored->parseResult != 0) {
    ++kindStats.parseFailures;
    stats_.Problem(Where(pid, section) + ": the library's parse gave " + std::to_string(stored->parseResult));
  }
}

}  // namespace ravel_dump
