// Counters gathered while a capture is read, for the final report.
#ifndef RAVEL_DUMP_STATS_H
#define RAVEL_DUMP_STATS_H

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "TableKind.h"

namespace ravel_dump {

const int kPidCount = 8192;

// What a PID is read for (the first reason it was taken as a section PID).
enum class PidRole : uint8_t {
  kNone,
  kPat,
  kPmt,
  kNit,
  kSdt,
  kEit,
  kTime,
  kBit,
  kAit,
  kCarousel,
  kStreamEvents,
  kRequested,
};
const char* PidRoleName(PidRole role);

struct PidStats {
  uint64_t packets = 0;
  uint64_t continuityBreaks = 0;
  uint64_t transportErrors = 0;
  uint64_t invalidPackets = 0;  // not handed to the assembler (impossible adaptation field)
  uint64_t sections = 0;
};

struct KindStats {
  uint64_t sections = 0;        // sections that passed the checks
  uint64_t distinct = 0;        // of those, not repeats
  uint64_t crcFailures = 0;
  uint64_t malformed = 0;
  uint64_t parseFailures = 0;   // the library refused a checked section
};

struct Stats {
  std::vector<PidStats> pids = std::vector<PidStats>(kPidCount);
  KindStats kinds[kRavelKindCount];

  uint64_t sectionsAssembled = 0;   // what the assemblers (or the section file) gave
  uint64_t lengthMismatches = 0;    // section_length larger than the bytes assembled
  uint64_t sectionsCut = 0;         // started but never whole (a packet lost, the input ended)
  bool receiversStore = false;      // read through the receivers' store (--receiver)
  uint64_t crcFailures = 0;
  uint64_t malformed = 0;
  uint64_t panics = 0;              // array bound reports of the library

  // The first few problems, each on one line, for the report.
  std::vector<std::string> problems;
  void Problem(const std::string& line);
  // Told of every problem as it is met (those past the report's few too).
  std::function<void(const std::string&)> onProblem;

  KindStats& Kind(TableKind kind) { return kinds[kind]; }
};

}  // namespace ravel_dump

#endif
