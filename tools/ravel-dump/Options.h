// Command line of ravel-dump.
#ifndef RAVEL_DUMP_OPTIONS_H
#define RAVEL_DUMP_OPTIONS_H

#include <string>
#include <vector>

#include "TableKind.h"

namespace ravel_dump {

enum class OutputMode { kDump, kSummary, kJson, kJsonLines, kEpg, kNone };

struct Options {
  std::string input;             // path, "-" for standard input, or udp://...
  bool sections = false;         // the input is concatenated raw sections
  bool receiversStore = false;   // --receiver: sections through RavelCTSPktStore
  OutputMode mode = OutputMode::kDump;
  std::string extractDirectory;  // --extract-modules
  std::string filesDirectory;    // --extract-files
  std::string xmltvFile;         // --xmltv: the programme guide written there
  int standard = -1;             // -1: detected from the capture
  bool rawText = false;          // broadcast texts as broadcast, not decoded
  std::vector<int> pids;         // --pid: read only these, all as section PIDs
  TableFilter tables;            // --table
  unsigned int traceLevels = 0;  // --trace: library trace levels shown on stderr
  bool report = true;            // final report on stderr
  bool progress = true;          // progress bar when stderr is a terminal
};

enum class ParseOutcome { kRun, kExitOk, kUsageError };

// Parses the command line. kExitOk after --help or --version (printed to
// stdout); kUsageError with a one-line `error`.
ParseOutcome ParseOptions(int argc, char** argv, Options& options, std::string& error);

// "dump,warning" / "all" / "0x50000000" into the level bits of a trace mask.
bool ParseTraceLevels(const std::string& text, unsigned int& levels, std::string& error);

}  // namespace ravel_dump

#endif
