// The default output: every distinct table's own dump, in the order first seen.
#include <string>

#include "DescriptorNames.h"
#include "Output.h"
#include "Ravel_CTableBase.h"
#include "TableNames.h"

namespace ravel_dump {
namespace {

std::string Describe(const TableEntry& table, TableMoment moment) {
  char text[256];
  std::string line = std::string("== ") + RavelCSafeSection::GetKindName(table.kind);
  if (table.pid != kNoPid) {
    std::snprintf(text, sizeof text, " on PID 0x%04x", table.pid);
    line += text;
  }
  std::snprintf(text, sizeof text, ": table_id 0x%02x", table.tableId);
  line += text;
  if (table.longForm) {
    std::snprintf(text, sizeof text, ", id 0x%04x, version %d", table.extension, table.version);
    line += text;
    if (RavelCSafeSection::JoinsSections(table.tableId)) {
      if (RavelCSafeSection::IsSegmented(table.tableId)) {
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
  if (moment == TableMoment::kChanged) line += ", changed";
  // Counted by the end only; a table told as it completes was just seen.
  if (moment == TableMoment::kAtEnd) {
    uint64_t times = table.TimesSeen();
    line += ", seen " + std::to_string(times) + (times == 1 ? " time" : " times");
  }
  return line;
}

// The object a table's sections make: the one section's own, or a copy of the
// first joined with the others by the table's operator+=. `refused` lists the
// sections the library's parse refused.
class JoinedTable {
 public:
  explicit JoinedTable(const TableEntry& table) {
    for (const auto& kv : table.sections) {
      const StoredSection& section = kv.second;
      if (section.result == kRavelSafeRefused) {
        refused += ", section " + std::to_string(kv.first) + " refused by the library (" +
                   std::to_string(section.parsed->GetParseResult()) + ")";
      }
      if (!section.Parsed()) continue;
      if (shown_ == nullptr) {
        shown_ = section.parsed.get();
        continue;
      }
      if (!copy_) copy_.reset(RavelCSafeSection::Copy(*shown_->GetTable()));
      if (copy_) RavelCSafeSection::Join(*copy_, *section.parsed->GetTable());
    }
  }
  bool Empty() const { return shown_ == nullptr; }
  void Show() {
    if (copy_) {
      copy_->Show();
    } else if (shown_ != nullptr) {
      shown_->Show();
    }
  }

  std::string refused;

 private:
  RavelCSafeSection* shown_ = nullptr;
  std::unique_ptr<RavelCTableBase> copy_;
};

// A table the library has no class for, as its bytes: offset, 16 bytes in
// hex, and those that are printable ASCII.
void HexDump(const TableEntry& table, std::FILE* out) {
  for (const auto& kv : table.sections) {
    const StoredSection& section = kv.second;
    std::fprintf(out, "  %s section %u, %zu bytes:\n", TableName(table).c_str(), kv.first, section.Size());
    const uint8_t* bytes = section.Bytes();
    for (std::size_t row = 0; row < section.Size(); row += 16) {
      std::string hex, ascii;
      for (std::size_t i = row; i < row + 16; ++i) {
        char text[4] = "   ";
        if (i < section.Size()) {
          std::snprintf(text, sizeof text, " %02x", bytes[i]);
          ascii += bytes[i] >= 0x20 && bytes[i] < 0x7F ? static_cast<char>(bytes[i]) : '.';
        }
        hex += text;
      }
      std::fprintf(out, "    %04zx %s  |%s|\n", row, hex.c_str(), ascii.c_str());
    }
  }
}

// The descriptors the library skipped in the table, which its dump leaves out.
void ListSkipped(const TableEntry& table, std::FILE* out) {
  for (const SkippedCount& c : TableSkipped(table)) {
    const SkippedDescriptor& d = c.descriptor;
    std::fprintf(out, "  skipped descriptor 0x%02x (%s), length %s", d.tag, DescriptorName(d.tag).c_str(),
                 d.length < 0 ? "unknown" : std::to_string(d.length).c_str());
    if (c.times > 1) std::fprintf(out, ", %zu times", c.times);
    std::fputc('\n', out);
  }
}

}  // namespace

void DumpTable(const TableEntry& table, TableMoment moment, TraceOutput& trace, std::FILE* out) {
  std::string line = Describe(table, moment);
  std::unique_ptr<JoinedTable> joined;
  {
    TraceOutput::QuietScope quiet(trace);
    joined.reset(new JoinedTable(table));
  }
  line += joined->refused;
  const bool withoutClass = joined->Empty() && joined->refused.empty();
  if (withoutClass) line += " (no class in the library for this table_id)";
  std::fprintf(out, "%s\n", line.c_str());
  if (!joined->Empty()) {
    TraceOutput::ShowScope show(trace, out);
    joined->Show();
  }
  // The next line (the tool's own) starts on a line of its own, even after
  // a dump whose last line was left open.
  if (!trace.ShowEndedLine()) std::fputc('\n', out);
  if (withoutClass) HexDump(table, out);
  ListSkipped(table, out);
}

void DumpTables(const TableRegistry& registry, const TableFilter& filter, TraceOutput& trace, std::FILE* out) {
  for (const auto& entry : registry.Tables()) {
    if (filter.Accepts(entry->kind, entry->tableId)) DumpTable(*entry, TableMoment::kAtEnd, trace, out);
  }
}

}  // namespace ravel_dump
