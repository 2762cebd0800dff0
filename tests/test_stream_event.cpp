// DSM-CC stream descriptor sections: NPT references and general events.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <type_traits>
#include <vector>

#include "Captures.h"
#include "Ravel_CTableStreamEventDescriptor.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Util.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

const TraceLines::value_type kEmptyNpt = {kError, "Invalid Argument!\n"};

Bytes StreamSection(const std::vector<Bytes>& descriptors, bool syntaxIndicator = true, bool corruptCrc = false) {
  sb::SectionOptions options;
  options.tableId = 0x3D;
  options.tableIdExtension = 0x0001;
  options.version = 3;
  options.syntaxIndicator = syntaxIndicator;
  options.corruptCrc = corruptCrc;
  return sb::LongSection(options, sb::Cat(descriptors));
}

Bytes Npt(uint8_t contentId) {
  // STC_Reference 0x10 and NPT_Reference 0x2000 under set reserved bits, scale 1/1.
  return sb::Descriptor(0x17, Bytes{static_cast<uint8_t>(contentId & 0x7F), 0xFE, 0, 0, 0, 0x10, 0xFF, 0xFF, 0xFF, 0xFE,
                                    0, 0, 0x20, 0, 0, 1, 0, 1});
}

Bytes Event(uint16_t id, const std::string& privateData = "") {
  Bytes body{0x00, 0x10, 0x00, 0, 0, 0, 0, 0, 0x01};  // group 1, time mode 0, type 1
  sb::Append(body, sb::U16(id));
  sb::Append(body, sb::Text(privateData));
  return sb::Descriptor(0x40, body);
}

std::vector<int> EventIds(RavelCDsmccStreamEvent& table) {
  std::vector<int> ids;
  for (int i = 0; i < table.GetNumberOfGeneralEvents(); ++i) ids.push_back(table.GetGeneralEvent(i)->GetEventMsgId());
  return ids;
}

}  // namespace

TEST(StreamEventTable, ChecksTheCrcOnlyWhenTheSyntaxIndicatorIsOne) {
  struct Case {
    const char* what;
    bool syntaxIndicator;
    bool corruptCrc;
    int result;
    TraceLines trace;
    const char* name;
    std::vector<int> events;
  } cases[] = {
      {"good CRC", true, false, kRavelOk, {}, "Stream Descriptor Event Table", {7}},
      {"bad CRC", true, true, kRavelErrCorruptSection, {{kWarning, "Stream Descriptor Event: CRC Error!\n"}}, "", {}},
      // A checksum instead of a CRC: reported as unchecked, never verified.
      {"checksum, good", false, false, kRavelOk, {{kWarning, "Section Stream Descriptor Parding. CheckSum needed!\n"}},
       "Stream Descriptor Event Table", {7}},
      {"checksum, damaged", false, true, kRavelOk,
       {{kWarning, "Section Stream Descriptor Parding. CheckSum needed!\n"}}, "Stream Descriptor Event Table", {7}},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    Bytes section = StreamSection({Event(7)}, c.syntaxIndicator, c.corruptCrc);
    TraceRecorder recorder;
    RavelCDsmccStreamEvent table(nullptr);
    EXPECT_EQ(c.result, table.ParseRawData(section.data()));
    EXPECT_EQ(c.trace, recorder.Lines());
    for (const TraceRecord& r : recorder.Records()) {
      EXPECT_EQ("SectionParser/source/Ravel_CTableStreamEventDescriptor", r.file);
    }
    // The header is read even when the CRC fails.
    EXPECT_EQ(0x3D, table.iTableId);
    EXPECT_EQ(c.syntaxIndicator ? 1 : 0, table.bSectionSyntaxIndicator);
    EXPECT_EQ(section.size() - 3, table.iSectionLength);
    EXPECT_EQ(3, table.iVersionNumber);
    EXPECT_STREQ(c.name, table.sTableName.GetString());
    EXPECT_EQ(c.events, EventIds(table));
  }
}

TEST(StreamEventTable, KeepsTheLastNptReferenceAndEveryGeneralEvent) {
  struct Case {
    const char* what;
    std::vector<Bytes> descriptors;
    int result;
    TraceLines trace;
    int nptContentId;  // -1: none held
    std::vector<int> events;
  } cases[] = {
      {"section_length 9: no descriptors", {}, kRavelOk, {}, -1, {}},
      // Each NPT reference is built empty first, and that traces.
      {"one of each", {Npt(5), Event(1)}, kRavelOk, {kEmptyNpt}, 5, {1}},
      {"events in section order", {Event(3), Event(1), Event(2)}, kRavelOk, {}, -1, {3, 1, 2}},
      {"second NPT wins", {Npt(5), Event(1), Npt(6)}, kRavelOk,
       {kEmptyNpt, {kWarning, "Duplicated NPT Reference!\n"}, kEmptyNpt},
       6,
       {1}},
      {"unknown tags skipped", {sb::Descriptor(0x1A, Bytes(10, 0x11)), Event(4), sb::Descriptor(0x17 + 1, Bytes{1})},
       kRavelOk,
       {{kWarning, "Stream Descriptor Parsing. Unkown Descriptor Tag=[0x1a]\n"},
        {kWarning, "Stream Descriptor Parsing. Unkown Descriptor Tag=[0x18]\n"}},
       -1,
       {4}},
      // A zero length releases what was parsed before it.
      {"zero length", {Npt(5), Event(1), sb::Descriptor(0x41, Bytes()), Event(2)}, kRavelErrCorruptSection,
       {kEmptyNpt, {kWarning, "Invalid Descriptor Tag & Length!! descrTag=[0x41], descrLen=[0]\n"}},
       -1,
       {}},
      {"zero tag", {Event(1), sb::Descriptor(0x00, Bytes{1, 2})}, kRavelErrCorruptSection,
       {{kWarning, "Invalid Descriptor Tag & Length!! descrTag=[0x00], descrLen=[2]\n"}},
       -1,
       {}},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    Bytes section = StreamSection(c.descriptors);
    TraceRecorder recorder;
    RavelCDsmccStreamEvent table(nullptr);
    EXPECT_EQ(c.result, table.ParseRawData(section.data()));
    EXPECT_EQ(c.trace, recorder.Lines());
    EXPECT_STREQ("Stream Descriptor Event Table", table.sTableName.GetString());  // named before the loop
    if (c.nptContentId < 0) {
      EXPECT_EQ(nullptr, table.GetNPTReference());
    } else {
      ASSERT_NE(nullptr, table.GetNPTReference());
      EXPECT_EQ(c.nptContentId, table.GetNPTReference()->GetContentId());
    }
    EXPECT_EQ(c.events, EventIds(table));
  }
}

// Callers index the general events through the plain pointer array the table
// declares; the table, not the array, deletes them.
static_assert(std::is_same<decltype(RavelCDsmccStreamEvent::cGeneralEvents),
                           RavelCArray<RavelCGeneralEventDescriptor*> >::value,
              "general events are kept in a RavelCArray of pointers");

TEST(StreamEventTable, CopiesKeepTheNptReferenceButNoGeneralEvent) {
  enum How { kCopyConstruct, kAssign, kAssignToItself };
  struct Case {
    const char* what;
    How how;
    bool keepsNpt;
  } cases[] = {
      {"copy constructor", kCopyConstruct, true}, {"assignment over a table with events", kAssign, true},
      // The target's descriptors are released before the source is read.
      {"assignment to itself", kAssignToItself, false},
  };
  Bytes section = StreamSection({Npt(9), Event(1, "a"), Event(2, "b"), Event(3, "c")});
  Bytes other = StreamSection({Event(8), Event(9)});
  for (const Case& c : cases) {
    SCOPED_TRACE(c.what);
    RavelCDsmccStreamEvent table(section.data());
    table.iSession = 0x5A;
    ASSERT_EQ(3, table.GetNumberOfGeneralEvents());
    RavelCDsmccStreamEvent assigned(other.data());
    TraceRecorder recorder;
    RavelCDsmccStreamEvent* t = &assigned;
    std::unique_ptr<RavelCDsmccStreamEvent> copy;
    if (c.how == kCopyConstruct) {
      copy.reset(new RavelCDsmccStreamEvent(table));
      t = copy.get();
    } else if (c.how == kAssign) {
      assigned = table;
    } else {
      RavelCDsmccStreamEvent& self = table;
      table = self;
      t = &table;
    }
    EXPECT_TRUE(recorder.Records().empty());  // the NPT reference is copied, not parsed again
    EXPECT_EQ(0x5A, t->iSession);
    EXPECT_EQ(0x3D, t->iTableId);
    EXPECT_EQ(section.size() - 3, t->iSectionLength);
    EXPECT_EQ(3, t->iVersionNumber);
    EXPECT_STREQ("Stream Descriptor Event Table", t->sTableName.GetString());
    if (c.keepsNpt) {
      ASSERT_NE(nullptr, t->GetNPTReference());
      EXPECT_NE(table.GetNPTReference(), t->GetNPTReference());
      EXPECT_EQ(9, t->GetNPTReference()->GetContentId());
      EXPECT_EQ(3, table.GetNumberOfGeneralEvents());
    } else {
      EXPECT_EQ(nullptr, t->GetNPTReference());
    }
    EXPECT_EQ(0, t->GetNumberOfGeneralEvents());
  }
}

TEST(StreamEventTable, ParsesAgainFromScratchAndReleasesOnNull) {
  TraceRecorder recorder;
  Bytes first = StreamSection({Npt(1), Event(1), Event(2)});
  Bytes second = StreamSection({Event(5)});
  RavelCDsmccStreamEvent table(first.data());
  ASSERT_EQ(kRavelOk, table.ParseRawData(second.data()));
  EXPECT_EQ(nullptr, table.GetNPTReference());
  EXPECT_EQ(std::vector<int>({5}), EventIds(table));
  ASSERT_EQ(kRavelOk, table.ParseRawData(first.data()));
  recorder.Clear();
  EXPECT_EQ(kRavelErrInvalidArgument, table.ParseRawData(nullptr));
  EXPECT_TRUE(recorder.Records().empty());
  EXPECT_EQ(nullptr, table.GetNPTReference());
  EXPECT_EQ(0, table.GetNumberOfGeneralEvents());
}

TEST(StreamEventTable, GeneralEventGetterPanicsOutOfRangeAndGivesNull) {
  Bytes section = StreamSection({Event(1)});
  RavelCDsmccStreamEvent table(section.data());
  TraceRecorder recorder;
  for (int index : {-1, 1}) {
    recorder.Clear();
    EXPECT_EQ(nullptr, table.GetGeneralEvent(index));
    EXPECT_EQ(1, recorder.PanicCount());
    EXPECT_EQ(BoundOverflow(index, 1), recorder.Lines());
  }
}

TEST(StreamEventTable, DumpsHeaderNptReferenceAndEvents) {
  Bytes section = StreamSection({Npt(2), Event(0x0102)});
  TraceRecorder quiet;
  RavelCDsmccStreamEvent table(section.data());
  const std::string rule = Rule(kShortRule);
  TraceLines expected = Dump({rule, "#### DSMCC Stream Descriptor Table Information\n", "# Header Information\n"});
  Add(expected, HeaderLines(0x3D, "Stream Descriptor Event Table", 1, section.size() - 3, 0x0001, 3, 1, 0, 0));
  Add(expected, Dump({"# Body Information\n", Banner("NPT Reference Descriptor"), BaseLine(0x17, 18, "NPT Reference Descriptor"),
                      "\t Post Discontinuity Indicator=[0], Dsm_ContentID=[2]\n", "\t STC_Reference=[0x00 0x00 0x00 0x00 0x10]\n",
                      "\t NPT_Reference=[0x00 0x00 0x00 0x20 0x00]\n", "\t Scale Numerator=[1], Scale Denominator=[1]\n",
                      "# The number of General Event Descriptor=[1]\n", Banner("General Event Descriptor"),
                      BaseLine(0x40, 11, "General Event Descriptor"), "\t EventMsgGroupID=[1], TimeMode=[0]\n"}));
  expected.push_back({kWarning, "Unknown Time Mode =[0x0]\n"});
  Add(expected, Dump({"\t EventMsgType=[1], EventMsgID=[0x0102]\n", rule}));
  EXPECT_EQ(expected, ShowLines(table));
}

// --- Captured stream descriptor sections. ---

TEST(StreamEventCapture, StreamDescriptorSectionsParse) {
  struct Case {
    const char* file;
    unsigned int pid;
    size_t sections;
  } cases[] = {{"stream-events-1.ts", 0x0194, 4}, {"stream-events-2.ts", 0x0FA2, 9}};
  for (const Case& c : cases) {
    SCOPED_TRACE(c.file);
    Bytes stream;
    RAVEL_LOAD_CAPTURE_OR_SKIP(c.file, stream);
    std::vector<Bytes> sections = captures::SectionsOfPid(stream, c.pid);
    ASSERT_EQ(c.sections, sections.size());
    for (Bytes& section : sections) {
      ASSERT_EQ(0x3D, section[0]);
      TraceRecorder recorder;
      RavelCDsmccStreamEvent table(nullptr);
      EXPECT_EQ(kRavelOk, table.ParseRawData(section.data()));
      // These carry DSM-CC stream event descriptors (0x1A), which the table
      // does not keep: each is reported and skipped.
      TraceLines expected{{kWarning, "Stream Descriptor Parsing. Unkown Descriptor Tag=[0x1a]\n"}};
      EXPECT_EQ(expected, recorder.Lines());
      EXPECT_EQ(1, table.bSectionSyntaxIndicator);
      EXPECT_EQ(section.size() - 3, table.iSectionLength);
      EXPECT_STREQ("Stream Descriptor Event Table", table.sTableName.GetString());
      EXPECT_EQ(nullptr, table.GetNPTReference());
      EXPECT_EQ(0, table.GetNumberOfGeneralEvents());
      recorder.Clear();
      table.Show();
      EXPECT_EQ(9u, recorder.Records().size());
    }
  }
}
