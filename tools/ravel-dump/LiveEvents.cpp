#include "LiveEvents.h"

#include <nlohmann/json.hpp>

#include "Output.h"
#include "Ravel_ByteOrder.h"

namespace ravel_dump {
namespace {

using nlohmann::json;

// The date and time of a TDT or TOT (a 16-bit MJD and six BCD digits),
// "2024-05-14 19:00:00", as broadcast, in local time.
std::string BroadcastTime(const StoredSection& section) {
  if (section.Size() < 8) return "";
  const uint8_t* p = section.Bytes() + 3;
  const long mjd = RavelRead16(p);
  // ETSI EN 300 468 annex C.
  const long yp = static_cast<long>((mjd - 15078.2) / 365.25);
  const long mp = static_cast<long>((mjd - 14956.1 - static_cast<long>(yp * 365.25)) / 30.6001);
  const long day = mjd - 14956 - static_cast<long>(yp * 365.25) - static_cast<long>(mp * 30.6001);
  const long k = (mp == 14 || mp == 15) ? 1 : 0;
  auto bcd = [](uint8_t b) { return (b >> 4) * 10 + (b & 0x0F); };
  char text[96];
  std::snprintf(text, sizeof text, "%04ld-%02ld-%02ld %02d:%02d:%02d", 1900 + yp + k, mp - 1 - k * 12, day, bcd(p[2]),
                bcd(p[3]), bcd(p[4]));
  return text;
}

}  // namespace

LiveEvents::LiveEvents(LiveFormat format, const TableFilter& filter, TraceOutput& trace, std::FILE* out)
    : format_(format), filter_(filter), trace_(trace), out_(out) {}

void LiveEvents::Emit(const std::string& line) {
  std::fputs(line.c_str(), out_);
  std::fputc('\n', out_);
  std::fflush(out_);
}

void LiveEvents::OnTableSection(const TableEntry& table) {
  auto told = told_.find(table.identity);
  if (told != told_.end() && told->second == table.serial) return;
  if (!table.Complete()) return;
  const bool change = told != told_.end();
  told_[table.identity] = table.serial;
  if (!filter_.Accepts(table.kind, table.tableId)) return;
  if (format_ == LiveFormat::kDump) {
    if (settle_) settle_();
    DumpTable(table, change ? TableMoment::kChanged : TableMoment::kNew, trace_, out_);
    std::fflush(out_);
    return;
  }
  json event = {{"event", "table"},
                {"change", change},
                {"kind", RavelCSafeSection::GetKindName(table.kind)},
                {"table_id", table.tableId},
                {"sections", table.sections.size()}};
  if (table.pid != kNoPid) event["pid"] = table.pid;
  if (table.longForm) {
    event["id"] = table.extension;
    event["version"] = table.version;
  }
  if (table.kind == kRavelKindTDT || table.kind == kRavelKindTOT) {
    Emit(event.dump());
    event = {{"event", "time"}, {"kind", RavelCSafeSection::GetKindName(table.kind)},
             {"time", BroadcastTime(table.sections.begin()->second)}};
  }
  Emit(event.dump());
}

void LiveEvents::OnProblem(const std::string& line) {
  if (format_ == LiveFormat::kJsonLines) Emit(json({{"event", "problem"}, {"problem", line}}).dump());
}

void LiveEvents::End(const TableRegistry& registry) {
  if (format_ != LiveFormat::kDump) return;
  for (const auto& entry : registry.Tables()) {
    // A complete table was dumped as it completed.
    if (!entry->Complete() && filter_.Accepts(entry->kind, entry->tableId)) {
      DumpTable(*entry, TableMoment::kAtEnd, trace_, out_);
    }
  }
}

void LiveEvents::OnServiceGateway(int pid, const std::vector<uint8_t>& ior) {
  if (next_ != nullptr) next_->OnServiceGateway(pid, ior);
}

void LiveEvents::OnModuleComplete(const CarouselCollector& collector, const ModuleRef& module) {
  if (format_ == LiveFormat::kJsonLines) {
    Emit(json({{"event", "module"},
               {"pid", module.pid},
               {"download_id", module.downloadId},
               {"module_id", module.id},
               {"version", module.version},
               {"file", ModuleFileName(module.pid, module.downloadId, module.id, module.version)}})
             .dump());
  }
  if (next_ != nullptr) next_->OnModuleComplete(collector, module);
}

}  // namespace ravel_dump
