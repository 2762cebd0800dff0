#include "Capture.h"

#include <cstdio>

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

Capture::Capture(Stats& stats, TraceOutput& trace) : stats_(stats), trace_(trace), demux_(nullptr) {
  carousel_.SetListener(&objects_);
}

void Capture::SetEvents(LiveEvents* events) {
  events_ = events;
  events->ForwardCarouselTo(&objects_);
  carousel_.SetListener(events);
}

void Capture::OnSection(int pid, const uint8_t* section, std::size_t size) {
  TableKind kind = RavelCSafeSection::GetKind(section, static_cast<int>(size));
  KindStats& kindStats = stats_.Kind(kind);
  // Broadcasters resend PSI/SI many times a second: an unchanged repeat only counts.
  if (registry_.CountRepeat(pid, section, size)) {
    ++kindStats.sections;
    if (events_ != nullptr) events_->OnTableSection(registry_.LastTable());
    return;
  }
  // The one parse of these bytes: the library checks them, then its class parses them.
  std::unique_ptr<RavelCSafeSection> parsed(new RavelCSafeSection);
  std::vector<SkippedDescriptor> skipped;
  RavelSafeResult result;
  {
    TraceOutput::SkipRecordScope record(trace_, skipped);
    result = parsed->Parse(section, static_cast<int>(size));
  }
  switch (result) {
    case kRavelSafeOk:
    case kRavelSafeRefused:
    case kRavelSafeUnknownTable:  // checked, and kept with no object: shown by its header
      break;
    case kRavelSafeCrcError:
      ++stats_.crcFailures;
      ++kindStats.crcFailures;
      stats_.Problem(Where(pid, section) + ": CRC failure");
      return;
    default: {
      const RavelSafeRefusal& refusal = parsed->GetRefusal();
      ++stats_.malformed;
      ++kindStats.malformed;
      stats_.Problem(Where(pid, section) + ": " + refusal.pCheck + " at byte " + std::to_string(refusal.iOffset));
      return;
    }
  }
  ++kindStats.sections;
  ++kindStats.distinct;
  StoredSection& stored = registry_.Add(pid, kind, std::move(parsed), result);
  MeasureSkippedDescriptors(section, size, skipped);
  stored.skipped = std::move(skipped);
  if (result == kRavelSafeOk) {
    UseOnArrival(pid, kind, *stored.parsed, demux_, carousel_);
  }
  if (events_ != nullptr) events_->OnTableSection(registry_.LastTable());
  if (result == kRavelSafeRefused) {
    ++kindStats.parseFailures;
    stats_.Problem(Where(pid, section) + ": the library's parse gave " +
                   std::to_string(stored.parsed->GetParseResult()));
  }
}

}  // namespace ravel_dump
