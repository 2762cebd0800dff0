// Where the library's trace calls go while the tool runs. The dump-level texts
// written by a table's Show() are the default output; every other trace is
// shown on stderr only for the levels asked for with --trace.
#ifndef RAVEL_DUMP_TRACEOUTPUT_H
#define RAVEL_DUMP_TRACEOUTPUT_H

#include <cstdio>
#include <string>
#include <vector>

#include "BroadcastText.h"
#include "SkippedDescriptors.h"

namespace ravel_dump {

struct Stats;

const unsigned int kTraceLevelDump = 0x10000000u;
const unsigned int kTraceLevels = 0xF0000000u;

// Installs the trace and panic hooks for the life of the object.
class TraceOutput {
 public:
  TraceOutput(unsigned int levels, Stats& stats);
  ~TraceOutput();
  TraceOutput(const TraceOutput&) = delete;
  TraceOutput& operator=(const TraceOutput&) = delete;

  // While alive, the dump-level texts go (escaped) to `out` instead.
  class ShowScope {
   public:
    ShowScope(TraceOutput& trace, std::FILE* out);
    ~ShowScope();

   private:
    TraceOutput& trace_;
    std::FILE* previous_;
  };

  // The dump's broadcast texts (names, event texts) are shown in `coding`.
  void SetTextCoding(TextCoding coding) { textCoding_ = coding; }

  // Whether the last dump text written ended its line (some dumps leave their
  // last line open).
  bool ShowEndedLine() const { return showEndedLine_; }

  // While alive, the descriptors the library tells it skips go to `skipped`:
  // for the one parse of each distinct section.
  class SkipRecordScope {
   public:
    SkipRecordScope(TraceOutput& trace, std::vector<SkippedDescriptor>& skipped);
    ~SkipRecordScope();

   private:
    TraceOutput& trace_;
    std::vector<SkippedDescriptor>* previous_;
  };

  // While alive, traces are dropped: for the parses that build the outputs,
  // whose traces were shown (with --trace) when the sections first arrived.
  class QuietScope {
   public:
    explicit QuietScope(TraceOutput& trace);
    ~QuietScope();

   private:
    TraceOutput& trace_;
    bool previous_;
  };

 private:
  static void OnTrace(unsigned int mask, const char* file, int line, const char* text, void* context);
  static void OnPanic(const char* file, int line, void* context);

  unsigned int levels_;
  Stats& stats_;
  std::FILE* showOut_;
  bool showEndedLine_;
  bool quiet_;
  std::vector<SkippedDescriptor>* skipped_ = nullptr;
  TextCoding textCoding_ = TextCoding::kAsBroadcast;
};

}  // namespace ravel_dump

#endif
