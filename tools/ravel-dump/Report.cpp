#include "Report.h"

namespace ravel_dump {

void PrintReport(std::FILE* out, const InputSummary& input, const Stats& stats, const std::vector<PidRole>& roles,
                 const TableRegistry& registry) {
  std::fprintf(out, "ravel-dump report: %s\n", input.name.c_str());
  if (input.sections) {
    std::fprintf(out, "  input: %llu bytes of raw sections\n", static_cast<unsigned long long>(input.bytes));
  } else {
    std::fprintf(out, "  input: %llu packets of %d bytes, %llu bytes skipped, %llu resyncs\n",
                 static_cast<unsigned long long>(input.packets), input.packetSize,
                 static_cast<unsigned long long>(input.skippedBytes), static_cast<unsigned long long>(input.resyncs));
    std::fprintf(out, "  %-6s %10s %10s %8s %9s  %s\n", "PID", "packets", "CC breaks", "TEI", "sections",
                 "read for");
    for (int pid = 0; pid < kPidCount; ++pid) {
      const PidStats& p = stats.pids[pid];
      if (p.packets == 0) continue;
      PidRole role = pid < static_cast<int>(roles.size()) ? roles[pid] : PidRole::kNone;
      std::fprintf(out, "  0x%04x %10llu %10llu %8llu %9llu  %s\n", pid, static_cast<unsigned long long>(p.packets),
                   static_cast<unsigned long long>(p.continuityBreaks),
                   static_cast<unsigned long long>(p.transportErrors), static_cast<unsigned long long>(p.sections),
                   role == PidRole::kNone ? "-" : PidRoleName(role));
    }
  }

  std::fprintf(out,
               "  sections: %llu assembled, %llu CRC failures, %llu length mismatches, %llu malformed, "
               "%llu library panics\n",
               static_cast<unsigned long long>(stats.sectionsAssembled),
               static_cast<unsigned long long>(stats.crcFailures),
               static_cast<unsigned long long>(stats.lengthMismatches),
               static_cast<unsigned long long>(stats.malformed), static_cast<unsigned long long>(stats.panics));
  if (stats.sectionsCut > 0) {
    std::fprintf(out, "  sections cut (a packet lost, or the input ended inside one): %llu\n",
                 static_cast<unsigned long long>(stats.sectionsCut));
  }
  if (stats.receiversStore) {
    std::fprintf(out, "  the receivers' store did not deliver %llu sections whole\n",
                 static_cast<unsigned long long>(stats.lengthMismatches));
  }

  uint64_t tables[kRavelKindCount] = {};
  for (const auto& table : registry.Tables()) ++tables[table->kind];
  std::fprintf(out, "  %-20s %9s %9s %7s %13s %10s %15s\n", "kind", "sections", "distinct", "tables", "CRC failures",
               "malformed", "parse failures");
  for (int k = 0; k < kRavelKindCount; ++k) {
    const KindStats& s = stats.kinds[k];
    if (s.sections == 0 && s.crcFailures == 0 && s.malformed == 0 && tables[k] == 0) continue;
    std::fprintf(out, "  %-20s %9llu %9llu %7llu %13llu %10llu %15llu\n", RavelCSafeSection::GetKindName(static_cast<TableKind>(k)),
                 static_cast<unsigned long long>(s.sections), static_cast<unsigned long long>(s.distinct),
                 static_cast<unsigned long long>(tables[k]), static_cast<unsigned long long>(s.crcFailures),
                 static_cast<unsigned long long>(s.malformed), static_cast<unsigned long long>(s.parseFailures));
  }
  if (!stats.problems.empty()) {
    std::fputs("  problems:\n", out);
    for (const std::string& line : stats.problems) std::fprintf(out, "    %s\n", line.c_str());
  }
}

}  // namespace ravel_dump
