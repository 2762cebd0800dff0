// What the tests share besides the recorder and the stream builder: the trace
// masks, the expected lines of Show dumps, raw descriptors with room behind them
// and the broadcast standard held for one scope.
#ifndef RAVEL_TESTS_TESTHELPERS_H
#define RAVEL_TESTS_TESTHELPERS_H

#include <cstdio>
#include <string>
#include <vector>

#include "Ravel_CDateTime.h"
#include "Ravel_Cfg.h"
#include "StreamBuilder.h"
#include "TraceRecorder.h"

namespace th {

// Trace masks: the parser module's dump, BIT, warning and error levels, the
// carousel module's, and the utility module's warning (array bounds).
const unsigned int kDump = 0x10000020u;
const unsigned int kBit = 0x20000020u;
const unsigned int kWarning = 0x40000020u;
const unsigned int kError = 0x80000020u;
const unsigned int kCarouselDump = 0x10000040u;
const unsigned int kCarouselWarning = 0x40000040u;
const unsigned int kCarouselError = 0x80000040u;
const unsigned int kUtilWarning = 0x40000001u;

// The two frame lines of table dumps.
const std::string kShortRule(49, '#');
const std::string kLongRule(65, '#');
inline std::string Rule(const std::string& rule) { return rule + "\n"; }

// The trace of one Show() call (the recorder nests inside any other).
template <class T>
TraceLines ShowLines(T& object) {
  TraceRecorder recorder;
  object.Show();
  return recorder.Lines();
}

inline TraceLines At(unsigned int mask, const std::vector<std::string>& texts) {
  TraceLines lines;
  for (const std::string& text : texts) lines.push_back(std::make_pair(mask, text));
  return lines;
}
inline TraceLines Dump(const std::vector<std::string>& texts) { return At(kDump, texts); }
inline void Add(TraceLines& lines, const TraceLines& more) { lines.insert(lines.end(), more.begin(), more.end()); }

// "\t=================== words ===================\n" with `closing` '=' after.
inline std::string Banner(const std::string& words, int closing = 19) {
  return "\t=================== " + words + " " + std::string(closing, '=') + "\n";
}

// The descriptor base line of Show.
inline std::string BaseLine(unsigned int tag, unsigned int length, const std::string& name) {
  char text[200];
  std::snprintf(text, sizeof(text), "\tDescriptor Tag=[0x%x], Descriptor Length=[%u], Name=[%s]\n", tag, length,
                name.c_str());
  return text;
}

// The three header lines of a long-form table's Show, at the dump mask.
inline TraceLines HeaderLines(unsigned int tableId, const std::string& name, int syntax, int length,
                              unsigned int extension, int version, int currentNext, int section, int last,
                              unsigned int session = 0) {
  char line[3][200];
  std::snprintf(line[0], sizeof(line[0]), "Session = [0x%02x], Talbe identifier=[0x%02x], Table Name=[%s]\n", session,
                tableId, name.c_str());
  std::snprintf(line[1], sizeof(line[1]), "Section syntax indicator=[%d], Section length=[%d], Any Identifier(?)=[0x%04x]\n",
                syntax, length, extension);
  std::snprintf(line[2], sizeof(line[2]),
                "Version number=[%d], Current next indicator=[%d], Section numbe=[%d], Last section number=[%d]\n",
                version, currentNext, section, last);
  return Dump({line[0], line[1], line[2]});
}
// ... of a table never parsed.
inline TraceLines EmptyHeaderLines() { return HeaderLines(0, "Unknown", 0, 0, 0, 0, 0, 0, 0); }

// "Invalid Descriptor Tag & Length!! ..." of every descriptor loop.
inline std::string Invalid(unsigned int tag, int length) {
  char text[128];
  std::snprintf(text, sizeof(text), "Invalid Descriptor Tag & Length!! descrTag=[0x%02x], descrLen=[%d]\n", tag, length);
  return text;
}

// "Array Bound Overflow! ..." of the array's index check.
inline TraceLines BoundOverflow(int index, int count) {
  return {{kUtilWarning, "Array Bound Overflow! anIndex=[" + std::to_string(index) + "], iCount=[" +
                             std::to_string(count) + "]\n"}};
}

// tag, an explicit length byte, body: for lengths that disagree with the body.
inline Bytes RawDescriptor(uint8_t tag, uint8_t length, const Bytes& body = Bytes()) {
  Bytes d{tag, length};
  sb::Append(d, body);
  return d;
}

// A descriptor as a table hands it to its parse: inside its section, followed
// there by `following` (the section's later bytes, which a parse reading past a
// short length takes in) and the CRC_32. The section is exact: nothing lies
// beyond its last byte. DescriptorIn gives the descriptor's first byte.
inline Bytes InSection(const Bytes& descriptor, const Bytes& following) {
  sb::SectionOptions options;
  options.tableId = 0x4E;
  return sb::LongSection(options, sb::Cat({descriptor, following}));
}

inline unsigned char* DescriptorIn(Bytes& section) { return section.data() + 8; }

// year, month, day, hour, minute, second.
inline std::vector<int> DateOf(const RavelCDateTime& t) {
  return {t.iYear, t.iMonth, t.iDay, t.iHour, t.iMinute, t.iSecond};
}

// Holds a broadcast standard for one scope.
class StandardScope {
 public:
  explicit StandardScope(int standard = RAVEL_STANDARD_BRAZIL) : previous_(RavelCfg_GetStandard()) {
    RavelCfg_SetStandard(standard);
  }
  ~StandardScope() { RavelCfg_SetStandard(previous_); }

 private:
  int previous_;
};

}  // namespace th

#endif
