// The summary as JSON for scripts. SI texts (names, event texts) are decoded
// in the summary's coding, line breaks kept; with --raw-text, and for the
// application and carousel names and paths, bytes are escaped as in the text output (\xNN for control bytes and
// bytes that are not UTF-8), so the document is valid UTF-8 whatever the
// broadcast's character coding. Times are ISO 8601 in the broadcast's time base, as
// broadcast; the library's own reading stands beside them where it differs.
#include <tuple>

#include <nlohmann/json.hpp>

#include "ByteText.h"
#include "Epg.h"
#include "Summary.h"
#include "TimeBase.h"

namespace ravel_dump {
namespace {

using nlohmann::json;

json Text(const std::string& text, TextCoding coding) { return DecodeBroadcastText(text, coding); }

json Bytes(const std::string& bytes) { return EscapeBytes(bytes); }

json OrNull(const std::string& text) { return text.empty() ? json(nullptr) : json(text); }

json When(const DateTime& t, int utcOffsetMinutes) { return OrNull(Iso8601(t, utcOffsetMinutes)); }

// The library's own reading of a time (its date rule can give a 32nd day),
// where it differs from the broadcast's.
json LibraryWhen(const DateTime& library, const DateTime& broadcast) {
  const auto fields = [](const DateTime& t) {
    return std::make_tuple(t.valid, t.year, t.month, t.day, t.hour, t.minute, t.second);
  };
  if (!library.valid || fields(library) == fields(broadcast)) return nullptr;
  return json{{"year", library.year},     {"month", library.month},   {"day", library.day},
              {"hour", library.hour},     {"minute", library.minute}, {"second", library.second}};
}

json Pid(int pid) { return pid < 0 ? json(nullptr) : json(pid); }

json Event(const EventSummary& e, const Summary& s) {
  if (!e.valid) return nullptr;
  json ratings = json::array();
  for (const Rating& r : e.ratings)
    ratings.push_back({{"country", Bytes(r.country)},
                       {"raw", r.raw < 0 ? json(nullptr) : json(r.raw)},
                       {"label", OrNull(r.label)},
                       {"content", r.content},
                       {"minimum_age", r.minimumAge}});
  return json{{"event_id", e.eventId},
              {"start", When(e.start, s.utcOffsetMinutes)},
              {"library_start", LibraryWhen(e.libraryStart, e.start)},
              {"duration", {{"hours", e.duration.hours}, {"minutes", e.duration.minutes},
                            {"seconds", e.duration.seconds}}},
              {"running_status", e.runningStatus},
              {"language", Bytes(e.language)},
              {"name", Text(e.name, s.textCoding)},
              {"text", Text(e.text, s.textCoding)},
              {"ratings", ratings}};
}

json EpgEventJson(const EpgEvent& e, const Summary& s) {
  json items = json::array();
  for (const auto& item : e.items)
    items.push_back({{"description", Text(item.first, s.textCoding)}, {"item", Text(item.second, s.textCoding)}});
  json ratings = json::array();
  for (const EpgRating& r : e.ratings)
    ratings.push_back({{"country", Bytes(r.country)}, {"raw", r.raw}, {"label", OrNull(r.label)}});
  json genres = json::array();
  for (const EpgGenre& g : e.genres)
    genres.push_back({{"level1", g.level1}, {"level2", g.level2}, {"name", OrNull(g.name)}});
  return json{{"table_id", e.tableId},
              {"original_network_id", e.originalNetworkId},
              {"transport_stream_id", e.transportStreamId},
              {"service_id", e.serviceId},
              {"actual", e.Actual()},
              {"schedule", e.Schedule()},
              {"event_id", e.eventId},
              {"start", OrNull(Iso8601(e.start, s.utcOffsetMinutes))},
              {"stop", OrNull(Iso8601(EventEnd(e), s.utcOffsetMinutes))},
              {"duration_seconds", e.duration.hours * 3600 + e.duration.minutes * 60 + e.duration.seconds},
              {"running_status", e.runningStatus},
              {"free_ca_mode", e.freeCaMode},
              {"language", Bytes(e.language)},
              {"name", Text(e.name, s.textCoding)},
              {"text", Text(e.text, s.textCoding)},
              {"items", items},
              {"extended_text", Text(e.extendedText, s.textCoding)},
              {"ratings", ratings},
              {"genres", genres}};
}

json DescriptorsJson(const std::vector<std::pair<int, int>>& descriptors) {
  json list = json::array();
  for (const auto& d : descriptors) list.push_back({{"tag", d.first}, {"length", d.second}});
  return list;
}

json ReportJson(const ReportFigures& r) {
  json kinds = json::array();
  for (const KindFigures& k : r.kinds) {
    kinds.push_back({{"kind", k.kind},
                     {"sections", k.sections},
                     {"distinct", k.distinct},
                     {"tables", k.tables},
                     {"crc_failures", k.crcFailures},
                     {"malformed", k.malformed},
                     {"parse_failures", k.parseFailures}});
  }
  return json{{"input", r.rawSections ? "sections" : "transport stream"},
              {"bytes", r.bytes},
              {"packets", r.packets},
              {"skipped_bytes", r.skippedBytes},
              {"resyncs", r.resyncs},
              {"sections_assembled", r.sectionsAssembled},
              {"crc_failures", r.crcFailures},
              {"length_mismatches", r.lengthMismatches},
              {"malformed", r.malformed},
              {"library_panics", r.panics},
              {"sections_cut", r.sectionsCut},
              {"kinds", kinds},
              {"problems", r.problems}};
}

}  // namespace

std::string SummaryJson(const Summary& s) {
  json network = nullptr;
  if (s.network.valid) {
    json streams = json::array();
    for (const TransportStreamSummary& ts : s.network.streams) {
      json services = json::array();
      for (const auto& service : ts.serviceList) services.push_back({{"id", service.first}, {"type", service.second}});
      streams.push_back({{"id", ts.id},
                         {"original_network_id", ts.originalNetworkId},
                         {"name", Text(ts.name, s.textCoding)},
                         {"remote_control_key", ts.remoteControlKey < 0 ? json(nullptr) : json(ts.remoteControlKey)},
                         {"area_code", ts.areaCode < 0 ? json(nullptr) : json(ts.areaCode)},
                         {"guard_interval", ts.guardInterval < 0 ? json(nullptr) : json(ts.guardInterval)},
                         {"transmission_mode", ts.transmissionMode < 0 ? json(nullptr) : json(ts.transmissionMode)},
                         {"frequencies", ts.frequencies},
                         {"partial_reception", ts.partialReception},
                         {"library_partial_reception", ts.libraryPartialReception == ts.partialReception
                                                           ? json(nullptr)
                                                           : json(ts.libraryPartialReception)},
                         {"services", services}});
    }
    network = {{"id", s.network.id}, {"name", Text(s.network.name, s.textCoding)}, {"transport_streams", streams}};
  }

  json services = json::array();
  for (const ServiceSummary& service : s.services) {
    json streams = json::array();
    for (const StreamSummary& stream : service.streams) {
      streams.push_back({{"stream_type", stream.streamType},
                         {"pid", stream.pid},
                         {"component_tag", stream.componentTag < 0 ? json(nullptr) : json(stream.componentTag)}});
    }
    services.push_back({{"id", service.id},
                        {"type", service.type < 0 ? json(nullptr) : json(service.type)},
                        {"name", Text(service.name, s.textCoding)},
                        {"provider", Text(service.provider, s.textCoding)},
                        {"one_segment", service.oneSegment},
                        {"pmt_pid", Pid(service.pmtPid)},
                        {"pcr_pid", Pid(service.pcrPid)},
                        {"video_pid", Pid(service.videoPid)},
                        {"audio_pids", service.audioPids},
                        {"caption_pid", Pid(service.captionPid)},
                        {"streams", streams},
                        {"present", Event(service.present, s)},
                        {"following", Event(service.following, s)}});
  }

  json time = nullptr;
  if (s.time.valid) {
    json offsets = json::array();
    for (const LocalOffset& o : s.time.offsets) {
      offsets.push_back({{"country", Bytes(o.country)},
                         {"region_id", o.regionId},
                         {"polarity", o.polarity},
                         {"offset", {{"hours", o.offsetHours}, {"minutes", o.offsetMinutes}}},
                         {"time_of_change", When(o.timeOfChange, s.utcOffsetMinutes)},
                         {"library_time_of_change", LibraryWhen(o.libraryTimeOfChange, o.timeOfChange)},
                         {"next_offset", {{"hours", o.nextHours}, {"minutes", o.nextMinutes}}}});
    }
    time = {{"source", s.time.source},
            {"time", When(s.time.time, s.utcOffsetMinutes)},
            {"library_time", LibraryWhen(s.time.libraryTime, s.time.time)},
            {"local_time_offsets", offsets}};
  }

  json applications = json::array();
  for (const ApplicationSummary& app : s.applications) {
    applications.push_back({{"pid", Pid(app.pid)},
                            {"application_type", app.applicationType},
                            {"organization_id", app.organizationId},
                            {"application_id", app.applicationId},
                            {"control_code", app.controlCode},
                            {"document_resolution", app.documentResolution},
                            {"name", Bytes(app.name)},
                            {"path", Bytes(app.path)},
                            {"file", Bytes(app.file)},
                            {"entry", app.entryChecked ? Bytes(app.entry) : json(nullptr)},
                            {"entry_present", app.entryChecked ? json(app.entryPresent) : json(nullptr)}});
  }

  json carousels = json::array();
  for (const CarouselSummary& c : s.carousels) {
    json modules = json::array();
    for (const ModuleSummary& m : c.modules) {
      modules.push_back({{"id", m.id},
                         {"size", m.size},
                         {"version", m.version},
                         {"name", Bytes(m.name)},
                         {"blocks_received", m.blocksReceived},
                         {"blocks_total", m.blocksTotal},
                         {"complete", m.complete},
                         {"compressed", m.compressed},
                         {"original_size", m.compressed ? json(m.originalSize) : json(nullptr)},
                         {"problem", m.problem.empty() ? json(nullptr) : json(m.problem)},
                         {"file", m.file.empty() ? json(nullptr) : Bytes(m.file)}});
    }
    carousels.push_back(
        {{"pid", Pid(c.pid)}, {"download_id", c.downloadId}, {"block_size", c.blockSize}, {"modules", modules}});
  }

  json objectCarousels = json::array();
  for (const ObjectCarouselSummary& c : s.objectCarousels) {
    json entries = json::array();
    for (const TreeEntrySummary& e : c.entries) {
      entries.push_back({{"path", Bytes(e.path)},
                         {"kind", e.kind},
                         {"size", e.size},
                         {"module", e.module},
                         {"version", e.version < 0 ? json(nullptr) : json(e.version)},
                         {"complete", e.complete},
                         {"file", e.file.empty() ? json(nullptr) : json(EscapeBytes(e.file))}});
    }
    objectCarousels.push_back({{"pid", Pid(c.pid)}, {"entries", entries}, {"problems", c.problems}});
  }

  json allServices = json::array();
  for (const SdtService& service : s.allServices) {
    allServices.push_back({{"original_network_id", service.originalNetworkId},
                           {"library_original_network_id", service.libraryOriginalNetworkId == service.originalNetworkId
                                                                ? json(nullptr)
                                                                : json(service.libraryOriginalNetworkId)},
                           {"transport_stream_id", service.transportStreamId},
                           {"actual", service.actual},
                           {"id", service.id},
                           {"type", service.type < 0 ? json(nullptr) : json(service.type)},
                           {"name", Text(service.name, s.textCoding)},
                           {"provider", Text(service.provider, s.textCoding)}});
  }

  json streamDescriptors = json::array();
  for (const StreamDescriptorSummary& d : s.streamDescriptors) {
    json entry = {{"pid", Pid(d.pid)}, {"id", d.extension}, {"version", d.version},
                  {"tag", d.tag},      {"name", d.name},      {"length", d.length}};
    if (d.eventId >= 0) {
      entry["event_id"] = d.eventId;
      entry["npt"] = d.npt;
      entry["private_data"] = Bytes(d.privateData);
    } else if (d.stc >= 0) {
      entry["stc_reference"] = d.stc;
      entry["npt_reference"] = d.npt;
      entry["scale"] = {{"numerator", d.scaleNumerator}, {"denominator", d.scaleDenominator}};
    }
    streamDescriptors.push_back(entry);
  }

  json bits = json::array();
  for (const BitSummary& bit : s.bits) {
    json broadcasters = json::array();
    for (const BroadcasterSummary& b : bit.broadcasters)
      broadcasters.push_back({{"id", b.id}, {"descriptors", DescriptorsJson(b.descriptors)}});
    bits.push_back({{"original_network_id", bit.originalNetworkId},
                    {"version", bit.version},
                    {"broadcaster_view_propriety", bit.viewPropriety},
                    {"descriptors", DescriptorsJson(bit.descriptors)},
                    {"broadcasters", broadcasters}});
  }

  json epg = json::array();
  for (const EpgEvent& e : s.epg) epg.push_back(EpgEventJson(e, s));

  json unclassed = json::array();
  for (const UnclassedTableSummary& t : s.tablesWithoutClass) {
    unclassed.push_back({{"name", OrNull(t.name)},
                         {"table_id", t.tableId},
                         {"pid", Pid(t.pid)},
                         {"id", t.extension},
                         {"version", t.version},
                         {"sections", t.sections},
                         {"bytes", t.bytes},
                         {"times_seen", t.timesSeen}});
  }

  json skipped = json::array();
  for (const SkippedDescriptorSummary& d : s.skippedDescriptors) {
    skipped.push_back({{"table", d.table},
                       {"table_id", d.tableId},
                       {"pid", Pid(d.pid)},
                       {"id", d.extension},
                       {"version", d.version},
                       {"tag", d.tag},
                       {"name", d.name},
                       {"length", d.length < 0 ? json(nullptr) : json(d.length)},
                       {"times", d.times}});
  }

  json document = {{"schema_version", kSummarySchemaVersion},
                   {"standard", s.standard},
                   {"standard_reason", s.standardReason},
                   {"time_base", UtcOffsetText(s.utcOffsetMinutes)},
                   {"transport_stream_id", s.transportStreamId < 0 ? json(nullptr) : json(s.transportStreamId)},
                   {"network", network},
                   {"services", services},
                   {"time", time},
                   {"applications", applications},
                   {"carousels", carousels},
                   {"object_carousels", objectCarousels},
                   {"all_services", allServices},
                   {"bits", bits},
                   {"stream_descriptors", streamDescriptors},
                   {"epg", epg},
                   {"tables_without_class", unclassed},
                   {"skipped_descriptors", skipped},
                   {"report", ReportJson(s.report)}};
  return document.dump(2) + "\n";
}

}  // namespace ravel_dump
