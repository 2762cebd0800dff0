// The final report on stderr: packets per PID, continuity breaks, CRC
// failures, sections and tables per kind, and the first problems met.
#ifndef RAVEL_DUMP_REPORT_H
#define RAVEL_DUMP_REPORT_H

#include <cstdint>
#include <cstdio>
#include <string>
#include <vector>

#include "Stats.h"
#include "TableRegistry.h"

namespace ravel_dump {

struct InputSummary {
  std::string name;
  bool sections = false;  // a file of raw sections
  uint64_t bytes = 0;
  uint64_t packets = 0;
  int packetSize = 188;
  uint64_t skippedBytes = 0;
  uint64_t resyncs = 0;
};

void PrintReport(std::FILE* out, const InputSummary& input, const Stats& stats, const std::vector<PidRole>& roles,
                 const TableRegistry& registry);

}  // namespace ravel_dump

#endif
