// Where a trace hook is told a trace comes from: the source path of the call
// site and its line, also when a shared helper traces on behalf of its caller.
#include <gtest/gtest.h>

#include <fstream>
#include <functional>
#include <string>

#include "Ravel_CArray.h"
#include "Ravel_CDescriptorService.h"
#include "Ravel_CDsmccMsgBase.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTablePMT.h"
#include "Ravel_CTableTDT.h"
#include "StreamBuilder.h"
#include "TraceRecorder.h"

namespace {

// The 1-based line of the first line of `<source root>/<path>` (a source or, under include/, a header)
// holding `marker`; 0 if none.
int LineOf(const std::string& path, const std::string& marker) {
  const bool header = path.find("/include/") != std::string::npos;
  std::ifstream source(std::string(RAVEL_SOURCE_DIR) + "/" + path + (header ? ".h" : ".cpp"));
  std::string line;
  for (int number = 1; std::getline(source, line); ++number) {
    if (line.find(marker) != std::string::npos) return number;
  }
  return 0;
}

Bytes Section(uint8_t tableId, const Bytes& body, uint8_t version = 0) {
  sb::SectionOptions options;
  options.tableId = tableId;
  options.version = version;
  return sb::LongSection(options, body);
}

Bytes EmptyPmt(uint8_t version) { return Section(0x02, sb::Cat({sb::U16(0xE100), sb::Length12(0)}), version); }

}  // namespace

TEST(TraceLocation, IsTheCallSiteOfTheTraceEvenThroughASharedHelper) {
  struct Case {
    const char* label;
    std::function<void()> trigger;
    const char* text;       // the start of the trace looked at
    const char* file;       // the path the hook receives
    const char* marker;     // text on the line of the call site
  } cases[] = {
      // The message lies 8 bytes into its carousel section, as a receiver hands it.
      {.label = "a class's own trace",
       .trigger = [] { Bytes s = Section(0x3B, sb::Cat({sb::U8(0x11), sb::U8(0x03), sb::U16(0x1001), sb::U32(1),
                                                        sb::U8(0xFF), sb::U8(0), sb::U16(0)}));
                       RavelCDsmccBase message(s.data() + 8); },
       .text = "Unknown DSMCC Type!", .file = "SectionParser/source/Ravel_CDsmccMsgBase",
       .marker = "\"Unknown DSMCC Type!"},
      {.label = "the shared descriptor header parse, for the service descriptor",
       .trigger = [] { Bytes d = sb::Cat({sb::U8(0x49), sb::U8(0)}); RavelCServiceDescriptor service(d.data()); },
       .text = "This Descriptor isn't Service Descriptor!", .file = "SectionParser/source/Ravel_CDescriptorService",
       .marker = "ParseHeader(raw, kKind, __LINE__)"},
      {.label = "the array template, from the line of the access check",
       .trigger = [] { RavelCArray<int> empty; empty[3]; },
       .text = "Array Bound Overflow!", .file = "SectionParser/../CommonUtility/include/Ravel_CArray",
       .marker = "RAVEL_CARRAY_TRACE(\"Array Bound Overflow!"},
      {.label = "the CRC check every table shares, for the PAT",
       .trigger = [] { sb::SectionOptions o; o.corruptCrc = true;
                       Bytes s = sb::LongSection(o, sb::Cat({sb::U16(1), sb::U16(0xE100)})); RavelCPAT pat(s.data()); },
       .text = "PAT Section: CRC Error!", .file = "SectionParser/source/Ravel_CTablePAT",
       .marker = "\"PAT Section: CRC Error!"},
      {.label = "the header and time parse of TDT and TOT, for the TDT",
       .trigger = [] { Bytes tot = sb::ShortSection(0x73, sb::UtcTime(2024, 5, 6, 7, 8, 9), true); RavelCTDT tdt(tot.data()); },
       .text = "Table ID isn't for TDT!", .file = "SectionParser/source/Ravel_CTableTDT",
       .marker = "RavelTimeTable_ParseHeaderAndTime("},
      {.label = "the version check of a join, for the PMT",
       .trigger = [] { Bytes first = EmptyPmt(1), second = EmptyPmt(2);
                       RavelCPMT target(first.data()), other(second.data()); target += other; },
       .text = "Two PMT Information", .file = "SectionParser/source/Ravel_CTablePMT",
       .marker = "RAVEL_TABLE_MERGE_CHECK_VERSION(*this, other, \"PMT\")"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    TraceRecorder recorder;
    c.trigger();
    const TraceRecord* found = nullptr;
    for (const TraceRecord& r : recorder.Records()) {
      if (r.text.compare(0, std::string(c.text).size(), c.text) == 0) found = &r;
    }
    ASSERT_NE(nullptr, found);
    EXPECT_EQ(c.file, found->file);
    const int expectedLine = LineOf(c.file, c.marker);
    ASSERT_NE(0, expectedLine);
    EXPECT_EQ(expectedLine, found->line);
  }
}
