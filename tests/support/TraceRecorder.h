// Records every trace call and panic of the library while it is alive, so a test
// can assert the exact sequence of masks and texts. Recorders nest: the newest
// one records, and the one before it records again once the newest is gone.
#ifndef RAVEL_TESTS_TRACERECORDER_H
#define RAVEL_TESTS_TRACERECORDER_H

#include <string>
#include <utility>
#include <vector>

struct TraceRecord {
  unsigned int mask;
  std::string file;
  int line;
  std::string text;
};

typedef std::vector<std::pair<unsigned int, std::string> > TraceLines;

class TraceRecorder {
 public:
  TraceRecorder();
  ~TraceRecorder();

  const std::vector<TraceRecord>& Records() const { return records_; }
  // (mask, text) of every call, in order.
  TraceLines Lines() const;
  // Only the calls whose mask is exactly `mask`.
  std::vector<std::string> TextsAt(unsigned int mask) const;
  // Every text, concatenated.
  std::string Joined() const;
  int PanicCount() const { return panics_; }
  const std::string& LastPanicFile() const { return panicFile_; }
  void Clear();

 private:
  static void OnTrace(unsigned int mask, const char* file, int line, const char* text, void* context);
  static void OnPanic(const char* file, int line, void* context);

  std::vector<TraceRecord> records_;
  int panics_;
  TraceRecorder* previous_;
  static TraceRecorder* current_;
  std::string panicFile_;
};

#endif
