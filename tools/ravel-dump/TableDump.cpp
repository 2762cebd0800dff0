// The default output: every distinct table's own dump, in the order first seen.
#include <string>

#include "LibraryTables.h"
#include "Output.h"
#include "ParseBuffer.h"

namespace ravel_dump {
namespace {

std::string Describe(const TableEntry& table) {
  char text[256];
  std::string line = std::string("== ") + KindName(table.kind);
  if (table.pid != kNoPid) {
    std::snprintf(text, sizeof text, " on PID 0x%04x", table.pid);
    line += text;
  }
  std::snprintf(text, sizeof text, ": table_id 0x%02x", table.tableId);
  line += text;
  const StoredSection& first = table.sections.begin()->second;
  bool longForm = first.bytes.size() >= 8 && (first.bytes[1] & 0x80) != 0;
  if (longForm) {
    std::snprintf(text, sizeof text, ", id 0x%04x, version %d", table.extension, table.version);
    line += text;
    if (KindJoinsSections(table.kind)) {
      bool eit = table.kind == TableKind::kEitPf || table.kind == TableKind::kEitSchedule;
      if (eit) {
        // EIT sections come in segments of eight, not all numbers are used.
        std::snprintf(text, sizeof text, ", %zu sections up to number %d", table.sections.size(),
                      table.lastSectionNumber);
      } else {
        std::snprintf(text, sizeof text, ", %zu of %d sections", table.sections.size(), table.lastSectionNumber + 1);
      }
      line += text;
      std::vector<unsigned int> missing = table.Missing();
      if (!missing.empty()) {
        const std::size_t kListed = 8;
        line += " (missing";
        for (std::size_t i = 0; i < missing.size() && i < kListed; ++i) line += " " + std::to_string(missing[i]);
        if (missing.size() > kListed) line += " ...";
        line += ")";
      }
    } else {
      std::snprintf(text, sizeof text, ", section %u of %d", table.sections.begin()->first,
                    table.lastSectionNumber + 1);
      line += text;
    }
  }
  uint64_t times = table.TimesSeen();
  line += ", seen " + std::to_string(times) + (times == 1 ? " time" : " times");
  return line;
}

}  // namespace

void DumpTables(const TableRegistry& registry, const TableFilter& filter, TraceOutput& trace, std::FILE* out) {
  for (const auto& entry : registry.Tables()) {
    const TableEntry& table = *entry;
    if (!filter.Accepts(table.kind, table.tableId)) continue;
    std::string line = Describe(table);
    std::unique_ptr<TableObject> joined;
    std::string refused;
    {
      TraceOutput::QuietScope quiet(trace);
      for (const auto& kv : table.sections) {
        const StoredSection& section = kv.second;
        if (section.parseResult != 0) {
          refused += ", section " + std::to_string(kv.first) + " refused by the library (" +
                     std::to_string(section.parseResult) + ")";
          continue;
        }
        std::unique_ptr<TableObject> object = MakeTableObject(table.kind);
        if (!object) break;
        ParseBuffer buffer(section.bytes);
        object->Parse(buffer.Section());
        if (!joined) {
          joined = std::move(object);
        } else {
          joined->Join(*object);
        }
      }
    }
    line += refused;
    if (!joined && refused.empty()) line += " (no parser for this table)";
    // The tool's own line starts on a line of its own, even after a dump
    // whose last line was left open.
    if (!trace.ShowEndedLine()) std::fputc('\n', out);
    std::fprintf(out, "%s\n", line.c_str());
    if (joined) {
      TraceOutput::ShowScope show(trace, out);
      joined->Show();
    }
  }
  if (!trace.ShowEndedLine()) std::fputc('\n', out);
}

}  // namespace ravel_dump
