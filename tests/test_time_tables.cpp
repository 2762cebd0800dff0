// Time and date table and time offset table.
#include <gtest/gtest.h>

#include <cstdio>
#include <memory>
#include <string>
#include <vector>

#include "Captures.h"
#include "Ravel_CDescriptorLocalTimeOffset.h"
#include "Ravel_CTableTDT.h"
#include "Ravel_CTableTOT.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

const std::string kRule = Rule(kLongRule);

typedef std::vector<int> Ints;

Bytes TdtSection(const Bytes& time) { return sb::ShortSection(0x70, time, false); }

Bytes TotSection(const Bytes& time, const std::vector<Bytes>& descriptors, bool corruptCrc = false) {
  return sb::ShortSection(0x73, sb::Cat({time, sb::DescriptorLoop(descriptors)}), true, corruptCrc);
}

// One 13-byte entry: country, region and polarity, offset, time of change, next offset.
Bytes LocalTimeOffset(const std::string& country, unsigned int region, unsigned int offsetHour,
                      const Bytes& timeOfChange = sb::UtcTime(2019, 3, 31, 1, 0, 0), unsigned int nextHour = 2) {
  return sb::Cat({sb::Text(country), sb::U8(region << 2 | 0x02), Bytes{sb::Bcd(offsetHour), 0x00}, timeOfChange,
                  Bytes{sb::Bcd(nextHour), 0x00}});
}

Bytes LocalTimeOffsetDescriptor(const std::vector<Bytes>& entries) { return sb::Descriptor(0x58, sb::Cat(entries)); }

Ints DateOf(const RavelCTDT& t) { return {t.iYear, t.iMonth, t.iDay, t.iHour, t.iMinute, t.iSecond}; }
Ints DateOf(const RavelCTOT& t) { return {t.iYear, t.iMonth, t.iDay, t.iHour, t.iMinute, t.iSecond}; }

// Country codes of the entries of the kept descriptor, "-" when there is none.
std::string KeptOffsets(RavelCTOT& tot) {
  if (tot.pLocalTimeOffsetDescriptor == nullptr) return "-";
  std::string s;
  for (int i = 0; i < tot.pLocalTimeOffsetDescriptor->GetNumOfLocalTimeOffsets(); ++i) {
    s += tot.pLocalTimeOffsetDescriptor->GetLocalTimeOffset(i)->GetCountryCode();
    s += " ";
  }
  return s;
}

}  // namespace

TEST(TimeTablesDate, BothTablesDecodeByTheDateRuleAndUncheckedBcd) {
  struct Case {
    const char* label;
    Bytes time;
    Ints date;
  } cases[] = {
      {"MJD 45218", Bytes{0xB0, 0xA2, 0x12, 0x45, 0x00}, {1982, 9, 6, 12, 45, 0}},
      {"1 January 2013 is 32 December 2012", sb::UtcTime(2013, 1, 1, 0, 0, 0), {2012, 12, 32, 0, 0, 0}},
      {"2 January 2013", sb::UtcTime(2013, 1, 2, 0, 0, 0), {2013, 1, 2, 0, 0, 0}},
      {"1 March 2013 is 32 February", sb::UtcTime(2013, 3, 1, 6, 0, 0), {2013, 2, 32, 6, 0, 0}},
      {"MJD 0, no range check", Bytes{0x00, 0x00, 0x00, 0x00, 0x00}, {1859, -1, 19, 0, 0, 0}},
      {"BCD 0xFF 0x9A 0x99", Bytes{0xE4, 0x89, 0xFF, 0x9A, 0x99}, {2019, 1, 22, 165, 100, 99}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes tdtSection = TdtSection(c.time);
    Bytes totSection = TotSection(c.time, {});
    TraceRecorder recorder;
    RavelCTDT tdt(tdtSection.data());
    RavelCTOT tot(totSection.data());
    EXPECT_TRUE(recorder.Lines().empty());
    EXPECT_EQ(c.date, DateOf(tdt));
    EXPECT_EQ(c.date, DateOf(tot));
    EXPECT_EQ(0, tot.iDescriptorsLoopLength);
    EXPECT_EQ(nullptr, tot.pLocalTimeOffsetDescriptor);
  }
}

TEST(TimeTablesParse, NullClearsAndForeignTableIdsKeepTheEarlierTime) {
  Bytes earlier = sb::UtcTime(2013, 1, 1, 10, 20, 30);
  const Ints earlierDate = {2012, 12, 32, 10, 20, 30};
  Bytes tdtSection = TdtSection(earlier);
  Bytes totSection = TotSection(earlier, {LocalTimeOffsetDescriptor({LocalTimeOffset("BRA", 1, 3)})});
  Bytes laterTdt = TdtSection(sb::UtcTime(2020, 4, 5, 0, 0, 0));
  Bytes laterTot = TotSection(sb::UtcTime(2020, 4, 5, 0, 0, 0), {});
  Bytes eitLike = TdtSection(sb::UtcTime(2020, 4, 5, 0, 0, 0));
  eitLike[0] = 0x4E;
  eitLike[1] = 0xF0;  // syntax indicator set: not stored on a refusal

  struct Case {
    const char* label;
    Bytes* section;  // given to both tables
    int tdtResult;
    int totResult;
    TraceLines traces;
  } cases[] = {
      {"null", nullptr, kRavelErrNullSection, kRavelErrNullSection, {}},
      {"a TDT: foreign to the TOT", &laterTdt, kRavelOk, kRavelErrInvalidArgument,
       {{kError, "Table ID isn't for TOT! Table ID=[0x70]\n"}}},
      {"a TOT: foreign to the TDT", &laterTot, kRavelErrInvalidArgument, kRavelOk,
       {{kError, "Table ID isn't for TDT! Table ID=[0x73]\n"}}},
      {"an EIT table_id: foreign to both", &eitLike, kRavelErrInvalidArgument, kRavelErrInvalidArgument,
       {{kError, "Table ID isn't for TDT! Table ID=[0x4e]\n"}, {kError, "Table ID isn't for TOT! Table ID=[0x4e]\n"}}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCTDT tdt(tdtSection.data());
    RavelCTOT tot(totSection.data());
    ASSERT_NE(nullptr, tot.pLocalTimeOffsetDescriptor);
    unsigned char* raw = c.section ? c.section->data() : nullptr;
    TraceRecorder recorder;
    EXPECT_EQ(c.tdtResult, tdt.ParseRawData(raw));
    EXPECT_EQ(c.totResult, tot.ParseRawData(raw));
    EXPECT_EQ(c.traces, recorder.Lines());
    for (const TraceRecord& r : recorder.Records()) {
      const bool tdtLine = r.text.find("TDT") != std::string::npos;
      EXPECT_EQ(tdtLine ? "SectionParser/source/Ravel_CTableTDT" : "SectionParser/source/Ravel_CTableTOT", r.file);
    }
    // The descriptor goes whatever the outcome.
    EXPECT_EQ(nullptr, tot.pLocalTimeOffsetDescriptor);
    EXPECT_STREQ("TDT", tdt.sTableName.GetString());
    EXPECT_STREQ("TOT", tot.sTableName.GetString());
    if (raw == nullptr) {
      for (const Ints& date : {DateOf(tdt), DateOf(tot)}) EXPECT_EQ(Ints(6, 0), date);
      EXPECT_EQ(0, tdt.iTableId);
      EXPECT_EQ(0, tdt.iSectionLength);
      EXPECT_EQ(0, tot.iTableId);
      EXPECT_EQ(0, tot.iSectionLength);
      EXPECT_EQ(0, tot.iDescriptorsLoopLength);
      continue;
    }
    EXPECT_EQ(raw[0], tdt.iTableId);
    EXPECT_EQ(raw[0], tot.iTableId);
    if (c.tdtResult != kRavelOk) {
      EXPECT_EQ(earlierDate, DateOf(tdt));
      EXPECT_EQ(5, tdt.iSectionLength);
      EXPECT_EQ(0, tdt.bSectionSyntaxIndicator);
    }
    if (c.totResult != kRavelOk) {
      EXPECT_EQ(earlierDate, DateOf(tot));
      EXPECT_EQ(totSection.size() - 3, tot.iSectionLength);
      EXPECT_EQ(15, tot.iDescriptorsLoopLength);
      EXPECT_EQ(0, tot.bSectionSyntaxIndicator);
    }
  }
}

TEST(TimeTablesParse, ConstructedOverNullOrAForeignSectionHoldsZeros) {
  Bytes tot = TotSection(sb::UtcTime(2020, 4, 5, 0, 0, 0), {});
  Bytes tdt = TdtSection(sb::UtcTime(2020, 4, 5, 0, 0, 0));
  struct Case {
    const char* label;
    unsigned char* forTdt;
    unsigned char* forTot;
    int tdtTableId;
    int totTableId;
    size_t traces;
  } cases[] = {
      {"null", nullptr, nullptr, 0, 0, 0},
      {"each given the other's section: only the table_id is stored", tot.data(), tdt.data(), 0x73, 0x70, 2},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    TraceRecorder recorder;
    RavelCTDT timeDate(c.forTdt);
    RavelCTOT timeOffset(c.forTot);
    EXPECT_EQ(c.traces, recorder.Lines().size());
    EXPECT_EQ(c.tdtTableId, timeDate.iTableId);
    EXPECT_EQ(c.totTableId, timeOffset.iTableId);
    EXPECT_EQ(Ints(6, 0), DateOf(timeDate));
    EXPECT_EQ(Ints(6, 0), DateOf(timeOffset));
    EXPECT_EQ(0, timeDate.iSectionLength);
    EXPECT_EQ(0, timeOffset.iSectionLength);
    EXPECT_EQ(0, timeOffset.iDescriptorsLoopLength);
    EXPECT_TRUE(timeDate.sTableName.IsEmpty());
    EXPECT_TRUE(timeOffset.sTableName.IsEmpty());
    EXPECT_EQ(nullptr, timeOffset.pLocalTimeOffsetDescriptor);
  }
}

TEST(TOTDescriptors, KeepsTheLastLocalTimeOffsetAndTracesOthers) {
  Bytes fra = LocalTimeOffsetDescriptor({LocalTimeOffset("FRA", 0, 1)});
  Bytes bra = LocalTimeOffsetDescriptor({LocalTimeOffset("BRA", 1, 3), LocalTimeOffset("BRA", 2, 2)});
  struct Case {
    const char* label;
    std::vector<Bytes> descriptors;
    std::string kept;
    std::vector<std::string> warnings;
  } cases[] = {
      {"no descriptors", {}, "-", {}}, {"one", {fra}, "FRA ", {}}, {"two: the second", {fra, bra}, "BRA BRA ", {}},
      {"the second of two after an unknown one", {bra, sb::Descriptor(0x49, Bytes{1, 2, 3}), fra}, "FRA ",
       {"TOT Parsing.. Unknown Descriptor Tag=[0x49]\n"}},
      {"unknown only", {sb::Descriptor(0x49, Bytes{1, 2, 3})}, "-", {"TOT Parsing.. Unknown Descriptor Tag=[0x49]\n"}},
      {"a zero length only steps over tag and length", {Bytes{0x00, 0x00}, Bytes{0x83, 0x00}, fra}, "FRA ",
       {"TOT Parsing.. Unknown Descriptor Tag=[0x00]\n", "TOT Parsing.. Unknown Descriptor Tag=[0x83]\n"}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    for (bool corruptCrc : {false, true}) {
      // The CRC_32 is not verified.
      Bytes section = TotSection(sb::UtcTime(2019, 1, 22, 12, 51, 9), c.descriptors, corruptCrc);
      TraceRecorder recorder;
      RavelCTOT tot(nullptr);
      EXPECT_EQ(kRavelOk, tot.ParseRawData(section.data()));
      EXPECT_EQ(At(kWarning, c.warnings), recorder.Lines());
      EXPECT_EQ(c.kept, KeptOffsets(tot));
      EXPECT_EQ(sb::Cat(c.descriptors).size(), tot.iDescriptorsLoopLength);
      EXPECT_EQ((Ints{2019, 1, 22, 12, 51, 9}), DateOf(tot));
    }
  }

  // A re-parse without the descriptor drops the earlier one.
  Bytes with = TotSection(sb::UtcTime(2019, 1, 22, 12, 51, 9), {fra});
  Bytes without = TotSection(sb::UtcTime(2019, 1, 22, 12, 51, 11), {});
  RavelCTOT tot(with.data());
  ASSERT_EQ("FRA ", KeptOffsets(tot));
  EXPECT_EQ(kRavelOk, tot.ParseRawData(without.data()));
  EXPECT_EQ("-", KeptOffsets(tot));
  EXPECT_EQ(11, tot.iSecond);
}

TEST(TOTCopy, CopiesAreDeepAndSelfAssignmentDropsTheDescriptor) {
  Bytes with = TotSection(sb::UtcTime(2019, 1, 22, 12, 51, 9),
                          {LocalTimeOffsetDescriptor({LocalTimeOffset("FRA", 0, 1), LocalTimeOffset("ESP", 3, 1)})});
  Bytes without = TotSection(sb::UtcTime(2020, 4, 5, 0, 0, 0), {});
  std::unique_ptr<RavelCTOT> source(new RavelCTOT(with.data()));
  RavelCTOT constructed(*source);
  RavelCTOT assigned(without.data());
  assigned = *source;
  source.reset();
  for (RavelCTOT* copy : {&constructed, &assigned}) {
    EXPECT_STREQ("TOT", copy->sTableName.GetString());
    EXPECT_EQ(0x73, copy->iTableId);
    EXPECT_EQ(with.size() - 3, copy->iSectionLength);
    EXPECT_EQ((Ints{2019, 1, 22, 12, 51, 9}), DateOf(*copy));
    EXPECT_EQ(28, copy->iDescriptorsLoopLength);
    EXPECT_EQ("FRA ESP ", KeptOffsets(*copy));
    EXPECT_EQ(3, copy->pLocalTimeOffsetDescriptor->GetLocalTimeOffset(1)->GetCountryRegionId());
  }

  // Assigning a table without a descriptor removes the target's.
  RavelCTOT empty(without.data());
  constructed = empty;
  EXPECT_EQ("-", KeptOffsets(constructed));
  EXPECT_EQ((Ints{2020, 4, 5, 0, 0, 0}), DateOf(constructed));

  RavelCTOT& alias = assigned;
  assigned = alias;
  EXPECT_EQ("-", KeptOffsets(assigned));
  EXPECT_EQ((Ints{2019, 1, 22, 12, 51, 9}), DateOf(assigned));
  EXPECT_EQ(28, assigned.iDescriptorsLoopLength);
}

TEST(TimeTablesShow, ExactDumps) {
  Bytes tdtSection = TdtSection(sb::UtcTime(2013, 1, 1, 9, 5, 0));
  Bytes descriptor = LocalTimeOffsetDescriptor({LocalTimeOffset("BRA", 1, 3)});
  Bytes totSection = TotSection(sb::UtcTime(2019, 1, 22, 12, 51, 9), {descriptor});
  RavelCLocalTimeOffsetDescriptor alone(descriptor.data());
  RavelCTDT tdt(tdtSection.data()), emptyTdt(nullptr);
  RavelCTOT tot(totSection.data()), emptyTot(nullptr);
  auto dump = [](const char* table, const std::vector<std::string>& lines) {
    TraceLines all = Dump({kRule, std::string("###################### ") + table + " Table Information ######################\n",
                           kRule});
    Add(all, Dump(lines));
    return all;
  };
  TraceLines totLines = dump("TOT", {"Talbe identifier=[0x73], Table Name=[TOT]\n",
                                     "Section syntax indicator=[0], Section length=[26]\n", "JST Time =[2019.1.22 - 12:51:9]\n"});
  Add(totLines, ShowLines(alone));
  Add(totLines, Dump({kRule}));
  EXPECT_EQ(totLines, ShowLines(tot));
  EXPECT_EQ(dump("TDT", {"Talbe identifier=[0x70], Table Name=[TDT]\n", "Section syntax indicator=[0], Section length=[5]\n",
                         "TDT =[2012.12.32 - 9:5:0]\n", kRule}),
            ShowLines(tdt));
  EXPECT_EQ(dump("TDT", {"Talbe identifier=[0x00], Table Name=[Unknown]\n", "Section syntax indicator=[0], Section length=[0]\n",
                         "TDT =[0.0.0 - 0:0:0]\n", kRule}),
            ShowLines(emptyTdt));
  EXPECT_EQ(dump("TOT", {"Talbe identifier=[0x00], Table Name=[Unknown]\n", "Section syntax indicator=[0], Section length=[0]\n",
                         "JST Time =[0.0.0 - 0:0:0]\n", kRule}),
            ShowLines(emptyTot));
}

TEST(TimeTablesCapture, DvbEpgTimeSectionsAsBroadcast) {
  Bytes stream;
  RAVEL_LOAD_CAPTURE_OR_SKIP("dvb-epg.ts", stream);
  std::vector<Bytes> sections = captures::SectionsOfPid(stream, 0x14);
  int tdts = 0;
  int tots = 0;
  Ints lastTime;
  TraceRecorder recorder;
  for (Bytes& section : sections) {
    SCOPED_TRACE(tdts + tots);
    RavelCTDT tdt(nullptr);
    RavelCTOT tot(nullptr);
    int tdtResult = tdt.ParseRawData(section.data());
    int totResult = tot.ParseRawData(section.data());
    if (section[0] == 0x70) {
      ++tdts;
      EXPECT_EQ(kRavelOk, tdtResult);
      EXPECT_EQ(kRavelErrInvalidArgument, totResult);
      EXPECT_EQ(5, tdt.iSectionLength);
      // A TDT repeats the time of the TOT just before it.
      EXPECT_EQ(lastTime, DateOf(tdt));
      continue;
    }
    ASSERT_EQ(0x73, section[0]);
    ++tots;
    EXPECT_EQ(kRavelErrInvalidArgument, tdtResult);
    EXPECT_EQ(kRavelOk, totResult);
    EXPECT_EQ(26, tot.iSectionLength);
    EXPECT_EQ(15, tot.iDescriptorsLoopLength);
    lastTime = DateOf(tot);
    EXPECT_EQ((Ints{2019, 1, 22, 12}), Ints(lastTime.begin(), lastTime.begin() + 4));
    ASSERT_NE(nullptr, tot.pLocalTimeOffsetDescriptor);
    ASSERT_EQ(1, tot.pLocalTimeOffsetDescriptor->GetNumOfLocalTimeOffsets());
    RavelCLocalTimeOffset* offset = tot.pLocalTimeOffsetDescriptor->GetLocalTimeOffset(0);
    EXPECT_STREQ("FRA", offset->GetCountryCode());
    EXPECT_EQ(0, offset->GetCountryRegionId());
    EXPECT_EQ(0, offset->GetLocalTimeOffsetPolarity());
    EXPECT_EQ(1, offset->GetLocalTimeOffsetHour());
    EXPECT_EQ((Ints{2019, 3, 31, 1, 0, 0}), th::DateOf(offset->GetTimeOfChange()));
    EXPECT_EQ(2, offset->GetNextTimeOffsetHour());
  }
  EXPECT_EQ(4, tdts);
  EXPECT_EQ(30, tots);
  EXPECT_EQ(Ints({2019, 1, 22, 12, 52, 9}), lastTime);
  // Only the refusals of each other's sections.
  EXPECT_EQ(static_cast<size_t>(tdts + tots), recorder.TextsAt(kError).size());
  EXPECT_EQ(recorder.TextsAt(kError).size(), recorder.Lines().size());
}
