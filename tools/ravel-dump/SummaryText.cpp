// The summary as text for a person at a terminal.
#include <cstdarg>

#include "ByteText.h"
#include "Summary.h"
#include "TimeBase.h"
#include "Epg.h"
#include "Xmltv.h"

namespace ravel_dump {
namespace {

std::string Format(const char* format, ...) __attribute__((format(printf, 1, 2)));
std::string Format(const char* format, ...) {
  char buffer[512];
  va_list args;
  va_start(args, format);
  std::vsnprintf(buffer, sizeof buffer, format, args);
  va_end(args);
  return buffer;
}

// A broadcast text in the summary's coding, or other bytes of the broadcast as
// they came (kAsBroadcast).
std::string Quoted(const std::string& text, TextCoding coding) { return "\"" + OneLineText(text, coding) + "\""; }

std::string When(const DateTime& t) {
  if (!t.valid) return "?";
  return Format("%04d-%02d-%02d %02d:%02d:%02d", t.year, t.month, t.day, t.hour, t.minute, t.second);
}

std::string Pid(int pid) { return pid < 0 ? std::string("-") : Format("0x%04x", pid); }

const char* GuardName(int guard) {
  static const char* const kNames[] = {"1/32", "1/16", "1/8", "1/4"};
  return guard >= 0 && guard < 4 ? kNames[guard] : "?";
}

void PrintEvent(std::FILE* out, const char* label, const EventSummary& event, TextCoding coding) {
  if (!event.valid) {
    std::fprintf(out, "    %-10s (none)\n", label);
    return;
  }
  std::string line = Format("    %-10s %s for %02d:%02d:%02d ", label, When(event.libraryStart).c_str(),
                            event.duration.hours, event.duration.minutes, event.duration.seconds);
  line += event.name.empty() ? std::string("(no name)") : Quoted(event.name, coding);
  for (const Rating& rating : event.ratings) {
    line += " rating " + EscapeBytes(rating.country);
    if (rating.raw < 0) {
      line += Format(" age %d", rating.minimumAge);
    } else {
      line += " " + (rating.label.empty() ? std::string("undefined") : rating.label) + Format(" (0x%02x)", rating.raw);
      if (rating.label != std::to_string(rating.minimumAge)) line += Format(" [library: age %d]", rating.minimumAge);
    }
    if (rating.content != 0) line += Format(" content 0x%x", rating.content);
  }
  std::fprintf(out, "%s (event 0x%04x)\n", line.c_str(), event.eventId);
}

}  // namespace

const char* ServiceTypeName(int type) {
  switch (type) {
    case 0x01: return "digital TV";
    case 0x02: return "digital radio";
    case 0x0C: return "data broadcast";
    case 0xA1: return "special video";
    case 0xA2: return "special audio";
    case 0xA3: return "special data";
    case 0xA4: return "engineering";
    case 0xA5: return "promotion video";
    case 0xA6: return "promotion audio";
    case 0xA7: return "promotion data";
    case 0xC0: return "data";
    default: return "service";
  }
}

const char* StreamTypeName(int type) {
  switch (type) {
    case 0x01: return "MPEG-1 video";
    case 0x02: return "MPEG-2 video";
    case 0x03: return "MPEG-1 audio";
    case 0x04: return "MPEG-2 audio";
    case 0x05: return "private sections";
    case 0x06: return "PES private data";
    case 0x0B: return "DSM-CC U-N messages";
    case 0x0C: return "DSM-CC stream descriptors";
    case 0x0D: return "DSM-CC sections";
    case 0x0F: return "AAC (ADTS)";
    case 0x11: return "AAC (LATM)";
    case 0x1B: return "H.264 video";
    case 0x24: return "HEVC video";
    default: return "stream";
  }
}

const char* ControlCodeName(uint32_t code) {
  switch (code) {
    case 1: return "autostart";
    case 2: return "present";
    case 3: return "destroy";
    case 4: return "kill";
    case 5: return "prefetch";
    case 6: return "remote";
    case 7: return "disabled";
    case 8: return "playback autostart";
    default: return "?";
  }
}

void PrintSummaryText(const Summary& s, std::FILE* out) {
  std::fprintf(out, "Standard: %s (%s)\n", s.standard.c_str(), s.standardReason.c_str());
  std::fprintf(out, "Time base: UTC%s (times are as broadcast, in local time)\n",
               UtcOffsetText(s.utcOffsetMinutes).c_str());
  if (s.network.valid) {
    std::fprintf(out, "Network: %s (network_id 0x%04x)\n",
                 s.network.name.empty() ? "(no name)" : Quoted(s.network.name, s.textCoding).c_str(), s.network.id);
  } else {
    std::fputs("Network: (no NIT)\n", out);
  }
  if (s.transportStreamId >= 0) std::fprintf(out, "Transport stream: 0x%04x\n", s.transportStreamId);
  for (const TransportStreamSummary& ts : s.network.streams) {
    std::string line = Format("  TS 0x%04x of network 0x%04x", ts.id, ts.originalNetworkId);
    if (!ts.name.empty()) line += " " + Quoted(ts.name, s.textCoding);
    if (ts.remoteControlKey >= 0) line += Format(", remote control key %d", ts.remoteControlKey);
    std::fprintf(out, "%s\n", line.c_str());
    if (ts.areaCode >= 0) {
      std::fprintf(out, "    area code 0x%03x, guard interval %s, mode %d\n", ts.areaCode,
                   GuardName(ts.guardInterval), ts.transmissionMode + 1);
    }
    if (!ts.frequencies.empty()) {
      line = "    frequencies:";
      for (unsigned int f : ts.frequencies) line += Format(" %.3f MHz (%u)", f / 7.0, f);
      std::fprintf(out, "%s\n", line.c_str());
    }
    if (!ts.partialReception.empty() || !ts.libraryPartialReception.empty()) {
      line = "    partial reception:";
      for (int id : ts.partialReception) line += Format(" 0x%04x", id);
      if (ts.partialReception != ts.libraryPartialReception) {
        line += " [library reads";
        for (int id : ts.libraryPartialReception) line += Format(" 0x%02x", id);
        line += "]";
      }
      std::fprintf(out, "%s\n", line.c_str());
    }
    if (!ts.serviceList.empty()) {
      line = "    service list:";
      for (const auto& service : ts.serviceList) line += Format(" 0x%04x/0x%02x", service.first, service.second);
      std::fprintf(out, "%s\n", line.c_str());
    }
  }

  std::fprintf(out, "Services (%zu):\n", s.services.size());
  for (const ServiceSummary& service : s.services) {
    std::string line = Format("  Service 0x%04x", service.id);
    if (service.type >= 0) line += Format(" %s (0x%02x)", ServiceTypeName(service.type), service.type);
    if (service.oneSegment) line += " one-segment";
    if (!service.name.empty()) line += " " + Quoted(service.name, s.textCoding);
    if (!service.provider.empty()) line += " provider " + Quoted(service.provider, s.textCoding);
    std::fprintf(out, "%s\n", line.c_str());
    if (service.pmtPid >= 0) {
      line = "    PMT " + Pid(service.pmtPid) + ", PCR " + Pid(service.pcrPid) + ", video " + Pid(service.videoPid) +
             ", audio";
      if (service.audioPids.empty()) line += " -";
      for (int pid : service.audioPids) line += " " + Pid(pid);
      line += ", captions " + Pid(service.captionPid);
      std::fprintf(out, "%s\n", line.c_str());
      for (const StreamSummary& stream : service.streams) {
        line = Format("      stream 0x%02x %s on %s", stream.streamType, StreamTypeName(stream.streamType),
                      Pid(stream.pid).c_str());
        if (stream.componentTag >= 0) line += Format(", component tag 0x%02x", stream.componentTag);
        std::fprintf(out, "%s\n", line.c_str());
      }
    }
    if (service.present.valid || service.following.valid) {
      PrintEvent(out, "present:", service.present, s.textCoding);
      PrintEvent(out, "following:", service.following, s.textCoding);
    }
  }

  std::fprintf(out, "Services of every transport stream (%zu, from the SDT actual and other):\n", s.allServices.size());
  for (const SdtService& service : s.allServices) {
    std::string line = Format("  network 0x%04x TS 0x%04x service 0x%04x%s", service.originalNetworkId,
                              service.transportStreamId, service.id, service.actual ? " (this stream)" : "");
    if (service.originalNetworkId != service.libraryOriginalNetworkId) {
      line += Format(" [library reads network 0x%04x]", service.libraryOriginalNetworkId);
    }
    if (service.type >= 0) line += Format(" %s (0x%02x)", ServiceTypeName(service.type), service.type);
    if (!service.name.empty()) line += " " + Quoted(service.name, s.textCoding);
    std::fprintf(out, "%s\n", line.c_str());
  }
  std::fprintf(out, "Programme guide: %zu events of %zu services (shown by --epg)\n", s.epg.size(), EpgServiceCount(s.epg));
  for (const BitSummary& bit : s.bits) {
    std::string line = Format("BIT of network 0x%04x version %d, broadcaster view propriety %d", bit.originalNetworkId,
                              bit.version, bit.viewPropriety ? 1 : 0);
    for (const auto& d : bit.descriptors) line += Format(", descriptor 0x%02x (%d bytes)", d.first, d.second);
    std::fprintf(out, "%s\n", line.c_str());
    for (const BroadcasterSummary& broadcaster : bit.broadcasters) {
      line = Format("  broadcaster 0x%02x", broadcaster.id);
      for (const auto& d : broadcaster.descriptors) line += Format(", descriptor 0x%02x (%d bytes)", d.first, d.second);
      std::fprintf(out, "%s\n", line.c_str());
    }
  }
  std::fprintf(out, "Stream descriptors (%zu):\n", s.streamDescriptors.size());
  for (const StreamDescriptorSummary& d : s.streamDescriptors) {
    std::string line = Format("  PID %s id 0x%04x version %d: %s (tag 0x%02x, %zu bytes)", Pid(d.pid).c_str(),
                              d.extension, d.version, d.name.c_str(), d.tag, d.length);
    if (d.eventId >= 0) {
      line += Format(" event 0x%04x at NPT %lld, private data ", d.eventId, d.npt) +
              Quoted(d.privateData, TextCoding::kAsBroadcast);
    } else if (d.stc >= 0) {
      line += Format(" STC %lld = NPT %lld, scale %d/%d", d.stc, d.npt, d.scaleNumerator, d.scaleDenominator);
    }
    std::fprintf(out, "%s\n", line.c_str());
  }
  std::fprintf(out, "Tables without a class in the library (%zu):\n", s.tablesWithoutClass.size());
  for (const UnclassedTableSummary& t : s.tablesWithoutClass) {
    std::string where = t.pid < 0 ? std::string() : " on PID " + Pid(t.pid);
    std::fprintf(out, "  %s%s: table_id 0x%02x, id 0x%04x, version %d, %zu sections, %zu bytes, seen %llu times\n",
                 t.name.empty() ? "other" : t.name.c_str(), where.c_str(), t.tableId, t.extension, t.version, t.sections,
                 t.bytes, static_cast<unsigned long long>(t.timesSeen));
  }

  if (s.time.valid) {
    std::fprintf(out, "Time: %s (%s)\n", When(s.time.libraryTime).c_str(), s.time.source.c_str());
    for (const LocalOffset& o : s.time.offsets) {
      char sign = o.polarity ? '-' : '+';
      std::fprintf(out, "  local time offset %s region %d: %c%02d:%02d, changes %s to %c%02d:%02d\n",
                   EscapeBytes(o.country).c_str(), o.regionId, sign, o.offsetHours, o.offsetMinutes,
                   When(o.libraryTimeOfChange).c_str(), sign, o.nextHours, o.nextMinutes);
    }
  } else {
    std::fputs("Time: (no TDT or TOT)\n", out);
  }

  std::fprintf(out, "Ginga applications (%zu):\n", s.applications.size());
  for (const ApplicationSummary& app : s.applications) {
    std::fprintf(out,
                 "  PID %s type 0x%04x: organization 0x%08x application 0x%04x control %u (%s) name %s path %s "
                 "file %s\n",
                 Pid(app.pid).c_str(), app.applicationType, app.organizationId, app.applicationId, app.controlCode,
                 ControlCodeName(app.controlCode), Quoted(app.name, TextCoding::kAsBroadcast).c_str(), Quoted(app.path, TextCoding::kAsBroadcast).c_str(),
                 Quoted(app.file, TextCoding::kAsBroadcast).c_str());
    if (app.entryChecked) {
      std::fprintf(out, "    entry %s %s\n", Quoted(app.entry, TextCoding::kAsBroadcast).c_str(),
                   app.entryPresent ? "is in the carousel" : "is not in the carousel");
    }
  }

  std::size_t modules = 0;
  for (const CarouselSummary& c : s.carousels) modules += c.modules.size();
  std::fprintf(out, "Carousel modules (%zu):\n", modules);
  for (const CarouselSummary& c : s.carousels) {
    std::fprintf(out, "  PID %s download 0x%08x, block size %d\n", Pid(c.pid).c_str(), c.downloadId, c.blockSize);
    for (const ModuleSummary& m : c.modules) {
      std::string line = Format("    module 0x%04x version %d, %u bytes", m.id, m.version, m.size);
      if (m.compressed) line += Format(" (zlib, %u inflated)", m.originalSize);
      if (!m.name.empty()) line += " " + Quoted(m.name, TextCoding::kAsBroadcast);
      if (m.complete) {
        line += ", complete";
      } else {
        line += Format(", %u of %u blocks", m.blocksReceived, m.blocksTotal);
      }
      if (!m.problem.empty()) line += ", not written: " + m.problem;
      if (!m.file.empty()) line += " -> " + EscapeBytes(m.file);
      std::fprintf(out, "%s\n", line.c_str());
    }
  }

  for (const ObjectCarouselSummary& c : s.objectCarousels) {
    std::fprintf(out, "Object carousel on PID %s (%zu objects):\n", Pid(c.pid).c_str(), c.entries.size());
    for (const TreeEntrySummary& e : c.entries) {
      std::string line = "  " + EscapeBytes(e.path) + " " + e.kind;
      if (e.complete) {
        line += Format(", %llu bytes, module 0x%04x version %d", static_cast<unsigned long long>(e.size), e.module,
                       e.version);
      } else {
        line += Format(", module 0x%04x not complete", e.module);
      }
      if (!e.file.empty()) line += " -> " + EscapeBytes(e.file);
      std::fprintf(out, "%s\n", line.c_str());
    }
    for (const std::string& problem : c.problems) std::fprintf(out, "  problem: %s\n", problem.c_str());
  }
}

std::size_t EpgServiceCount(const std::vector<EpgEvent>& events) {
  std::size_t count = 0;
  for (std::size_t i = 0; i < events.size(); ++i) {
    const EpgEvent& a = events[i];
    count += i == 0 || a.originalNetworkId != events[i - 1].originalNetworkId ||
             a.transportStreamId != events[i - 1].transportStreamId || a.serviceId != events[i - 1].serviceId;
  }
  return count;
}

void PrintEpgText(const Summary& s, std::FILE* out) {
  std::fprintf(out, "Programme guide: %zu events of %zu services (times in UTC%s)\n", s.epg.size(),
               EpgServiceCount(s.epg), UtcOffsetText(s.utcOffsetMinutes).c_str());
  const EpgEvent* previous = nullptr;
  for (const EpgEvent& e : s.epg) {
    bool newService = previous == nullptr || previous->originalNetworkId != e.originalNetworkId ||
                      previous->transportStreamId != e.transportStreamId || previous->serviceId != e.serviceId;
    if (newService) {
      std::string name = ServiceNameOf(s, e.originalNetworkId, e.transportStreamId, e.serviceId);
      std::fprintf(out, "Service 0x%04x%s of TS 0x%04x, network 0x%04x (%s)\n", e.serviceId,
                   name.empty() ? "" : (" " + Quoted(name, s.textCoding)).c_str(), e.transportStreamId,
                   e.originalNetworkId, e.Actual() ? "this stream" : "other stream");
    }
    if (newService || previous->start.year != e.start.year || previous->start.month != e.start.month ||
        previous->start.day != e.start.day) {
      std::fprintf(out, "  %s\n", e.start.valid ? Format("%04d-%02d-%02d", e.start.year, e.start.month, e.start.day).c_str()
                                                 : "(no start time)");
    }
    previous = &e;
    DateTime end = EventEnd(e);
    std::string line = e.start.valid ? Format("    %02d:%02d-%02d:%02d", e.start.hour, e.start.minute, end.hour, end.minute)
                                     : std::string("    --:-----:--");
    line += " " + (e.name.empty() ? std::string("(no name)") : Quoted(e.name, s.textCoding));
    line += Format(" (event 0x%04x, table 0x%02x)", e.eventId, e.tableId);
    for (const EpgGenre& genre : e.genres) {
      line += Format(" genre 0x%x%x", genre.level1, genre.level2);
      if (!genre.name.empty()) line += " " + genre.name;
    }
    for (const EpgRating& rating : e.ratings) {
      line += " rating " + EscapeBytes(rating.country) + " " + (rating.label.empty() ? "?" : rating.label) +
              Format(" (0x%02x)", rating.raw);
    }
    std::fprintf(out, "%s\n", line.c_str());
    if (!e.text.empty()) std::fprintf(out, "      %s\n", OneLineText(e.text, s.textCoding).c_str());
    for (const auto& item : e.items) {
      std::fprintf(out, "      %s: %s\n", OneLineText(item.first, s.textCoding).c_str(),
                   OneLineText(item.second, s.textCoding).c_str());
    }
    if (!e.extendedText.empty()) std::fprintf(out, "      %s\n", OneLineText(e.extendedText, s.textCoding).c_str());
  }
}

}  // namespace ravel_dump
