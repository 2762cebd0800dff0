// DSM-CC stream descriptor sections: NPT references and general events.
#include <gtest/gtest.h>

#include <cstdio>
#include <string>
#include <vector>

#include "Ravel_CTableStreamEventDescriptor.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TableChecks.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

const TraceLines::value_type kEmptyNpt = {kError, "Invalid Argument!\n"};
const char kName[] = "Stream Descriptor Event Table";

Bytes StreamSection(const std::vector<Bytes>& descriptors, bool syntaxIndicator = true, bool corruptCrc = false) {
  sb::SectionOptions options;
  options.tableId = 0x3D;
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

Bytes Event(uint16_t id) {
  // group 1, time mode 0, type 1
  return sb::Descriptor(0x40, sb::Cat({Bytes{0x00, 0x10, 0x00, 0, 0, 0, 0, 0, 0x01}, sb::U16(id)}));
}

// The content id of the NPT reference held (-1: none), then the general event ids.
std::vector<int> Held(RavelCDsmccStreamEvent& table) {
  std::vector<int> held{table.GetNPTReference() ? table.GetNPTReference()->GetContentId() : -1};
  for (int i = 0; i < table.GetNumberOfGeneralEvents(); ++i) held.push_back(table.GetGeneralEvent(i)->GetEventMsgId());
  return held;
}

std::string Unknown(int tag) {
  char text[80];
  std::snprintf(text, sizeof(text), "Stream Descriptor Parsing. Unkown Descriptor Tag=[0x%02x]\n", tag);
  return text;
}

}  // namespace

TEST(StreamEventTable, ChecksTheCrcOnlyWhenTheSyntaxIndicatorIsOne) {
  const TraceLines unchecked{{kWarning, "Section Stream Descriptor Parding. CheckSum needed!\n"}};
  struct Case {
    bool syntaxIndicator;
    bool corruptCrc;
    int result;
    TraceLines trace;
  } cases[] = {
      {/*syntaxIndicator=*/true, /*corruptCrc=*/false, kRavelOk, {}},
      {true, true, kRavelErrCorruptSection, {{kWarning, "Stream Descriptor Event: CRC Error!\n"}}},
      // A checksum instead of a CRC: reported as unchecked, never verified.
      {false, true, kRavelOk, unchecked},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(testing::Message() << c.syntaxIndicator << c.corruptCrc);
    Bytes section = StreamSection({Event(7)}, c.syntaxIndicator, c.corruptCrc);
    TraceRecorder recorder;
    RavelCDsmccStreamEvent table(nullptr);
    EXPECT_EQ(c.result, table.ParseRawData(section.data()));
    EXPECT_EQ(c.trace, recorder.Lines());
    // The header is read even when the CRC fails.
    EXPECT_EQ((std::vector<int>{0x3D, c.syntaxIndicator, static_cast<int>(section.size() - 3), 3}),
              (std::vector<int>{table.iTableId, table.bSectionSyntaxIndicator, table.iSectionLength, table.iVersionNumber}));
    // Neither name nor descriptors after a CRC error.
    EXPECT_STREQ(c.result == kRavelOk ? kName : "", table.sTableName.GetString());
    EXPECT_EQ((c.result == kRavelOk ? std::vector<int>{-1, 7} : std::vector<int>{-1}), Held(table));
  }
}

TEST(StreamEventTable, KeepsTheLastNptReferenceAndEveryGeneralEvent) {
  struct Case {
    const char* what;
    std::vector<Bytes> descriptors;
    int result;
    TraceLines trace;
    std::vector<int> held;
  } cases[] = {
      {"section_length 9: no descriptors", {}, kRavelOk, {}, {-1}},
      {"section_length 10: its one byte is a tag", {Bytes{0x1B}}, kRavelOk, {{kWarning, Unknown(0x1B)}}, {-1}},
      // Each NPT reference is built empty first, and that traces.
      {"one of each", {Npt(5), Event(1)}, kRavelOk, {kEmptyNpt}, {5, 1}},
      {"events in section order", {Event(3), Event(1), Event(2)}, kRavelOk, {}, {-1, 3, 1, 2}},
      {"second NPT wins", {Npt(5), Event(1), Npt(6)}, kRavelOk,
       {kEmptyNpt, {kWarning, "Duplicated NPT Reference!\n"}, kEmptyNpt}, {6, 1}},
      // The walk goes on up to the first CRC byte: a lone byte there is a tag.
      {"unknown tags skipped, up to the CRC",
       {sb::Descriptor(0x1A, Bytes(10, 0x11)), Event(4), sb::Descriptor(0x18, Bytes{1}), Bytes{0x1B}}, kRavelOk,
       {{kWarning, Unknown(0x1A)}, {kWarning, Unknown(0x18)}, {kWarning, Unknown(0x1B)}}, {-1, 4}},
      // A zero length releases what was parsed before it.
      {"zero length", {Npt(5), Event(1), sb::Descriptor(0x41, Bytes()), Event(2)}, kRavelErrCorruptSection,
       {kEmptyNpt, {kWarning, Invalid(0x41, 0)}}, {-1}},
      {"zero tag", {Event(1), sb::Descriptor(0x00, Bytes{1, 2})}, kRavelErrCorruptSection,
       {{kWarning, Invalid(0x00, 2)}}, {-1}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.what);
    Bytes section = StreamSection(c.descriptors);
    TraceRecorder recorder;
    RavelCDsmccStreamEvent table(nullptr);
    EXPECT_EQ(c.result, table.ParseRawData(section.data()));
    EXPECT_EQ(c.trace, recorder.Lines());
    EXPECT_STREQ(kName, table.sTableName.GetString());  // named before the loop
    EXPECT_EQ(c.held, Held(table));
    // A later parse starts from scratch; null releases everything.
    Bytes later = StreamSection({Event(9)});
    EXPECT_EQ(kRavelOk, table.ParseRawData(later.data()));
    EXPECT_EQ((std::vector<int>{-1, 9}), Held(table));
    EXPECT_EQ(kRavelErrInvalidArgument, table.ParseRawData(nullptr));
    EXPECT_EQ((std::vector<int>{-1}), Held(table));
  }
}

TEST(StreamEventTable, CopiesKeepTheNptReferenceButNoGeneralEvent) {
  Bytes section = StreamSection({Npt(9), Event(1), Event(2), Event(3)});
  Bytes other = StreamSection({Event(8), Event(9)});
  TraceRecorder recorder;
  tc::ExpectCopies<RavelCDsmccStreamEvent>(
      section.data(), other.data(), [](RavelCDsmccStreamEvent& t) { t.iSession = 0x5A; },
      [&](RavelCDsmccStreamEvent& copy, const TraceLines&) {
        EXPECT_EQ((std::vector<int>{0x5A, 0x3D, static_cast<int>(section.size() - 3), 3}),
                  (std::vector<int>{copy.iSession, copy.iTableId, copy.iSectionLength, copy.iVersionNumber}));
        EXPECT_STREQ(kName, copy.sTableName.GetString());
        EXPECT_EQ((std::vector<int>{9}), Held(copy));
      });
  // Only the source's parse builds an NPT reference: the copies copy theirs.
  EXPECT_EQ((TraceLines{kEmptyNpt}), recorder.Lines());
  // The target's descriptors are released before the source is read.
  RavelCDsmccStreamEvent self(section.data());
  self = self;
  EXPECT_EQ((std::vector<int>{-1}), Held(self));
}

TEST(StreamEventTable, GeneralEventGetterPanicsOutOfRangeAndGivesNull) {
  Bytes section = StreamSection({Event(1)});
  RavelCDsmccStreamEvent table(section.data());
  for (int index : {-1, 1}) {
    TraceRecorder recorder;
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
  Add(expected, HeaderLines(0x3D, kName, 1, section.size() - 3, 0x0001, 3, 1, 0, 0));
  Add(expected, Dump({"# Body Information\n", Banner("NPT Reference Descriptor"), BaseLine(0x17, 18, "NPT Reference Descriptor"),
                      "\t Post Discontinuity Indicator=[0], Dsm_ContentID=[2]\n", "\t STC_Reference=[0x00 0x00 0x00 0x00 0x10]\n",
                      "\t NPT_Reference=[0x00 0x00 0x00 0x20 0x00]\n", "\t Scale Numerator=[1], Scale Denominator=[1]\n",
                      "# The number of General Event Descriptor=[1]\n", Banner("General Event Descriptor"),
                      BaseLine(0x40, 11, "General Event Descriptor"), "\t EventMsgGroupID=[1], TimeMode=[0]\n"}));
  expected.push_back({kWarning, "Unknown Time Mode =[0x0]\n"});
  Add(expected, Dump({"\t EventMsgType=[1], EventMsgID=[0x0102]\n", rule}));
  EXPECT_EQ(expected, ShowLines(table));
}
