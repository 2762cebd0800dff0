// Time and date table and time offset table.
#include <gtest/gtest.h>

#include <cstdio>
#include <memory>
#include <string>
#include <vector>

#include "Ravel_CDescriptorLocalTimeOffset.h"
#include "Ravel_CTableTDT.h"
#include "Ravel_CTableTOT.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TableChecks.h"
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

template <class Table>
Ints DateOf(const Table& t) {
  return {t.iYear, t.iMonth, t.iDay, t.iHour, t.iMinute, t.iSecond};
}

// table_id, syntax indicator, section_length, (descriptors_loop_length,) date.
Ints Fields(const RavelCTDT& t) {
  return {t.iTableId, t.bSectionSyntaxIndicator, t.iSectionLength, t.iYear, t.iMonth, t.iDay, t.iHour, t.iMinute, t.iSecond};
}
Ints Fields(const RavelCTOT& t) {
  return {t.iTableId, t.bSectionSyntaxIndicator, t.iSectionLength, t.iDescriptorsLoopLength, t.iYear, t.iMonth,
          t.iDay, t.iHour, t.iMinute, t.iSecond};
}

// Country codes of the entries of the kept descriptor, "-" when there is none.
std::string KeptOffsets(RavelCTOT& tot) {
  if (tot.pLocalTimeOffsetDescriptor == nullptr) return "-";
  std::string s;
  for (int i = 0; i < tot.pLocalTimeOffsetDescriptor->GetNumOfLocalTimeOffsets(); ++i) {
    s += std::string(tot.pLocalTimeOffsetDescriptor->GetLocalTimeOffset(i)->GetCountryCode()) + " ";
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
      {"1 March 2013 is 32 February", sb::UtcTime(2013, 3, 1, 6, 0, 0), {2013, 2, 32, 6, 0, 0}},
      {"MJD 0, no range check", Bytes{0x00, 0x00, 0x00, 0x00, 0x00}, {1859, -1, 19, 0, 0, 0}},
      {"BCD 0xFF 0x9A 0x99", Bytes{0xE4, 0x89, 0xFF, 0x9A, 0x99}, {2019, 1, 22, 165, 100, 99}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes tdtSection = TdtSection(c.time);
    Bytes totSection = TotSection(c.time, {});
    RavelCTDT tdt(tdtSection.data());
    RavelCTOT tot(totSection.data());
    EXPECT_EQ(c.date, DateOf(tdt));
    EXPECT_EQ(c.date, DateOf(tot));
  }
}

TEST(TimeTablesParse, NullClearsAndForeignTableIdsKeepTheEarlierTime) {
  Bytes tdtSection = TdtSection(sb::UtcTime(2013, 1, 1, 10, 20, 30));
  Bytes totSection = TotSection(sb::UtcTime(2013, 1, 1, 10, 20, 30),
                                {LocalTimeOffsetDescriptor({LocalTimeOffset("BRA", 1, 3)})});
  Bytes laterTdt = TdtSection(sb::UtcTime(2020, 4, 5, 0, 0, 0));
  Bytes laterTot = TotSection(sb::UtcTime(2020, 4, 5, 0, 0, 0), {});
  Bytes eitLike = TdtSection(sb::UtcTime(2020, 4, 5, 0, 0, 0));
  eitLike[0] = 0x4E;
  eitLike[1] = 0xF0;  // syntax indicator set: not stored on a refusal
  // table_id, syntax indicator, section_length, loop length (TOT), date.
  const Ints earlierTdt = {-1, 0, 5, 2012, 12, 32, 10, 20, 30};
  const Ints earlierTot = {-1, 0, static_cast<int>(totSection.size() - 3), 15, 2012, 12, 32, 10, 20, 30};
  const Ints laterTdtFields = {0x70, 0, 5, 2020, 4, 5, 0, 0, 0};
  const Ints laterTotFields = {0x73, 0, static_cast<int>(laterTot.size() - 3), 0, 2020, 4, 5, 0, 0, 0};
  struct Case {
    const char* label;
    Bytes* section;  // given to both tables
    int tdtResult;
    int totResult;
    TraceLines traces;
    Ints tdtFields;  // table_id -1: the section's
    Ints totFields;
  } cases[] = {
      {"null", nullptr, kRavelErrNullSection, kRavelErrNullSection, {}, Ints(9, 0), Ints(10, 0)},
      {"a TDT: foreign to the TOT", &laterTdt, kRavelOk, kRavelErrInvalidArgument,
       {{kError, "Table ID isn't for TOT! Table ID=[0x70]\n"}}, laterTdtFields, earlierTot},
      {"a TOT: foreign to the TDT", &laterTot, kRavelErrInvalidArgument, kRavelOk,
       {{kError, "Table ID isn't for TDT! Table ID=[0x73]\n"}}, earlierTdt, laterTotFields},
      {"an EIT table_id: foreign to both", &eitLike, kRavelErrInvalidArgument, kRavelErrInvalidArgument,
       {{kError, "Table ID isn't for TDT! Table ID=[0x4e]\n"}, {kError, "Table ID isn't for TOT! Table ID=[0x4e]\n"}},
       earlierTdt, earlierTot},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCTDT tdt(tdtSection.data());
    RavelCTOT tot(totSection.data());
    ASSERT_NE(nullptr, tot.pLocalTimeOffsetDescriptor);
    unsigned char* raw = c.section ? c.section->data() : nullptr;
    TraceRecorder recorder;
    EXPECT_EQ(c.tdtResult, tdt.ParseRawData(raw));
    EXPECT_EQ(c.totResult, tot.ParseRawData(raw));
    EXPECT_EQ(c.traces, recorder.Lines());
    // The descriptor goes whatever the outcome.
    EXPECT_EQ(nullptr, tot.pLocalTimeOffsetDescriptor);
    EXPECT_STREQ("TDT", tdt.sTableName.GetString());
    EXPECT_STREQ("TOT", tot.sTableName.GetString());
    if (c.tdtFields[0] < 0) c.tdtFields[0] = raw[0];
    if (c.totFields[0] < 0) c.totFields[0] = raw[0];
    EXPECT_EQ(c.tdtFields, Fields(tdt));
    EXPECT_EQ(c.totFields, Fields(tot));
  }
}

// Constructed over null, or over each other's section (only the table_id is
// stored), both hold zeros and no name.
TEST(TimeTablesParse, ConstructedOverNullOrAForeignSectionHoldsZeros) {
  Bytes tot = TotSection(sb::UtcTime(2020, 4, 5, 0, 0, 0), {});
  Bytes tdt = TdtSection(sb::UtcTime(2020, 4, 5, 0, 0, 0));
  for (bool foreign : {false, true}) {
    RavelCTDT timeDate(foreign ? tot.data() : nullptr);
    RavelCTOT timeOffset(foreign ? tdt.data() : nullptr);
    Ints tdtFields(9, 0), totFields(10, 0);
    tdtFields[0] = foreign ? 0x73 : 0;
    totFields[0] = foreign ? 0x70 : 0;
    EXPECT_EQ(tdtFields, Fields(timeDate));
    EXPECT_EQ(totFields, Fields(timeOffset));
    EXPECT_TRUE(timeDate.sTableName.IsEmpty());
    EXPECT_TRUE(timeOffset.sTableName.IsEmpty());
    EXPECT_EQ(nullptr, timeOffset.pLocalTimeOffsetDescriptor);
  }
}

// A TDT whose section_length ends inside its date or time reads the bytes
// beyond it as zero, and touches nothing past the section's own bytes.
TEST(TimeTablesParse, TimeBeyondTheSectionLengthReadsAsZero) {
  struct Case {
    const char* what;
    Bytes cut;     // exactly the bytes section_length covers
    Bytes zeroed;  // the whole TDT, its missing bytes 0
  } cases[] = {
      {/*what=*/"minutes and seconds beyond", /*cut=*/{0x70, 0x70, 0x03, 0xE4, 0x89, 0x12},
       /*zeroed=*/{0x70, 0x70, 0x05, 0xE4, 0x89, 0x12, 0x00, 0x00}},
      {"the date's second byte beyond", {0x70, 0x70, 0x01, 0xE4}, {0x70, 0x70, 0x05, 0xE4, 0x00, 0x00, 0x00, 0x00}},
  };
  for (const Case& c : cases) {
    RavelCTDT cut(const_cast<unsigned char*>(c.cut.data()));
    RavelCTDT zeroed(const_cast<unsigned char*>(c.zeroed.data()));
    EXPECT_EQ(DateOf(zeroed), DateOf(cut)) << c.what;
    EXPECT_EQ(c.cut[2], cut.iSectionLength) << c.what;
  }
}

TEST(TimeTablesName, BothSettersStoreTheNameAndReturnOne) {
  RavelCTDT tdt(nullptr);
  RavelCTOT tot(nullptr);
  EXPECT_EQ((Ints{1, 1}), (Ints{tdt.SetTableName("Time"), tot.SetTableName(RavelCString("Offset"))}));
  EXPECT_EQ("Time Offset", std::string(tdt.sTableName.GetString()) + " " + tot.sTableName.GetString());
  EXPECT_EQ((Ints{1, 1}), (Ints{tdt.SetTableName(RavelCString("T")), tot.SetTableName("O")}));
  EXPECT_EQ("T O", std::string(tdt.sTableName.GetString()) + " " + tot.sTableName.GetString());
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
      {"no descriptors", {}, "-", {}}, {"two: the second", {fra, bra}, "BRA BRA ", {}},
      {"the second of two after an unknown one", {bra, sb::Descriptor(0x49, Bytes{1, 2, 3}), fra}, "FRA ",
       {"TOT Parsing.. Unknown Descriptor Tag=[0x49]\n"}},
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
}

TEST(TOTCopy, CopiesAreDeepAndSelfAssignmentDropsTheDescriptor) {
  Bytes with = TotSection(sb::UtcTime(2019, 1, 22, 12, 51, 9),
                          {LocalTimeOffsetDescriptor({LocalTimeOffset("FRA", 0, 1), LocalTimeOffset("ESP", 3, 1)})});
  Bytes without = TotSection(sb::UtcTime(2020, 4, 5, 0, 0, 0), {});
  const Ints fields = Fields(RavelCTOT(with.data()));
  tc::ExpectCopies<RavelCTOT>(with.data(), without.data(), [](RavelCTOT&) {}, [&](RavelCTOT& copy, const TraceLines&) {
    EXPECT_STREQ("TOT", copy.sTableName.GetString());
    EXPECT_EQ(fields, Fields(copy));
    EXPECT_EQ("FRA ESP ", KeptOffsets(copy));
    EXPECT_EQ(3, copy.pLocalTimeOffsetDescriptor->GetLocalTimeOffset(1)->GetCountryRegionId());
  });
  // Assigning a table without a descriptor removes the target's.
  RavelCTOT target(with.data()), empty(without.data());
  target = empty;
  EXPECT_EQ("-", KeptOffsets(target));
  // Assigning a table to itself releases its descriptor before reading it.
  RavelCTOT self(with.data());
  self = self;
  EXPECT_EQ("-", KeptOffsets(self));
  EXPECT_EQ(fields, Fields(self));
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
