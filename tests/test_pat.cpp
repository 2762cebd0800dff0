// Program association table.
#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <utility>
#include <vector>

#include "Ravel_CTablePAT.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TableChecks.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

typedef std::pair<unsigned int, unsigned int> Program;  // program_number, PID
typedef std::vector<Program> Programs;

Bytes PatBody(const Programs& programs) {
  Bytes body;
  for (const Program& p : programs) {
    sb::Append(body, sb::U16(p.first));
    sb::Append(body, sb::U16(0xE000 | p.second));  // reserved bits set, as broadcast
  }
  return body;
}

Bytes PatSection(const Programs& programs, uint16_t transportStreamId = 0x7ED0, uint8_t version = 1,
                 uint8_t tableId = 0x00, bool corruptCrc = false) {
  sb::SectionOptions options;
  options.tableId = tableId;
  options.corruptCrc = corruptCrc;
  options.tableIdExtension = transportStreamId;
  options.version = version;
  options.privateIndicator = false;
  return sb::LongSection(options, PatBody(programs));
}

Programs ListOf(RavelCPAT& pat) {
  Programs list;
  for (int i = 0; i < pat.GetProgramCount(); ++i) {
    RavelCPMTInfo* info = pat.GetPMTInfo(i);
    list.push_back(Program(info->GetProgramNumber(), info->GetPID()));
  }
  return list;
}

}  // namespace

TEST(PATProgramList, SortsByProgramNumberAndPutsTheFirstOneSegPMTLast) {
  struct Case {
    const char* label;
    Programs section;
    Programs list;
    unsigned int networkPid;
  } cases[] = {
      {"by program number", {{3, 0x103}, {1, 0x101}, {2, 0x102}}, {{1, 0x101}, {2, 0x102}, {3, 0x103}}, 0xFFFF},
      {"the first one-seg PMT last, a later one sorted in", {{5, 0x0100}, {1, 0x1FC8}, {3, 0x0101}, {2, 0x1FCA}},
       {{2, 0x1FCA}, {3, 0x0101}, {5, 0x0100}, {1, 0x1FC8}}, 0xFFFF},
      {"the one-seg range ends at 0x1FCF", {{9, 0x1FC7}, {8, 0x1FD0}, {7, 0x1FCF}, {6, 0x0200}},
       {{6, 0x0200}, {8, 0x1FD0}, {9, 0x1FC7}, {7, 0x1FCF}}, 0xFFFF},
      {"equal numbers keep their order", {{4, 0x0100}, {2, 0x0200}, {4, 0x0101}, {4, 0x1FC9}, {4, 0x0102}},
       {{2, 0x0200}, {4, 0x0100}, {4, 0x0101}, {4, 0x0102}, {4, 0x1FC9}}, 0xFFFF},
      {"program 0 gives the network PID and no entry", {{0, 0x0010}, {0x4801, 0x03F0}, {0x4800, 0x01F0}},
       {{0x4800, 0x01F0}, {0x4801, 0x03F0}}, 0x0010},
      {"only the network PID", {{0, 0x1FFF}}, {}, 0x1FFF},
      {"a lone one-seg PMT", {{0x4980, 0x1FC8}}, {{0x4980, 0x1FC8}}, 0xFFFF},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = PatSection(c.section);
    TraceRecorder recorder;
    RavelCPAT pat(section.data());
    EXPECT_TRUE(recorder.Lines().empty());
    EXPECT_EQ(c.list, ListOf(pat));
    EXPECT_EQ(c.networkPid, pat.GetNetworkPID());
    EXPECT_STREQ("PAT", pat.sTableName.GetString());
    EXPECT_EQ(0x7ED0, pat.iTableIdExtension);
  }
}

TEST(PATParse, RefusesNullBadCrcAndForeignTableIds) {
  Bytes good = PatSection({{1, 0x101}});
  Bytes badCrc = PatSection({{1, 0x101}}, 0x0001, 0, 0x00, true), pmtId = PatSection({{1, 0x101}}, 0x4800, 0, 0x02);
  Bytes bothBad = PatSection({{1, 0x101}}, 0x4800, 0, 0x02, true);
  ASSERT_EQ(1, RavelCPAT(good.data()).GetProgramCount());
  // The foreign table_id is printed in decimal.
  tc::ExpectRefusals<RavelCPAT>(good, tc::Refusals("PAT", badCrc, pmtId, "2", bothBad),
                                [](RavelCPAT& pat, const tc::Refusal&, TraceRecorder&) {
                                  EXPECT_EQ(0, pat.GetProgramCount());
                                });
}

TEST(PATParse, EntriesAreReadInFoursUntilTheFirstCrcByte) {
  // section_length 9: no body, nothing read. From 10 on, entries start at byte 8
  // and every 4 bytes while the start lies before the first CRC byte, so a
  // trailing partial entry is read with its last bytes taken from the CRC_32.
  const Bytes entries{0x00, 0x05, 0xE1, 0x23, 0x00, 0x06, 0xE1, 0x24, 0x00};
  struct Case {
    size_t bodySize;  // the first bytes of `entries`
    int entriesRead;
  } cases[] = {{/*bodySize=*/0, /*entriesRead=*/0}, {1, 1}, {3, 1}, {4, 1}, {5, 2}, {8, 2}, {9, 3}};
  for (const Case& c : cases) {
    SCOPED_TRACE(c.bodySize);
    Bytes section = sb::LongSection(sb::SectionOptions(), Bytes(entries.begin(), entries.begin() + c.bodySize));
    RavelCPAT pat(section.data());
    // Each entry read gives a program or, for program_number 0, the network PID.
    EXPECT_EQ(c.entriesRead, pat.GetProgramCount() + (pat.GetNetworkPID() != 0xFFFF ? 1 : 0));
    const Programs list = ListOf(pat);
    EXPECT_EQ(c.bodySize >= 4, std::find(list.begin(), list.end(), Program(5, 0x0123)) != list.end());
  }
}

TEST(PATParse, ReparseReplacesTheListButKeepsAnEarlierNetworkPid) {
  Bytes first = PatSection({{0, 0x0010}, {1, 0x0101}, {2, 0x1FC8}, {3, 0x0103}});
  Bytes second = PatSection({{7, 0x0700}, {6, 0x0600}}, 0x1234, 2);
  Bytes third = PatSection({{0, 0x0020}});
  RavelCPAT pat(first.data());
  ASSERT_EQ(3, pat.GetProgramCount());
  EXPECT_EQ(kRavelOk, pat.ParseRawData(second.data()));
  EXPECT_EQ((Programs{{6, 0x0600}, {7, 0x0700}}), ListOf(pat));
  EXPECT_EQ(0x0010, pat.GetNetworkPID());
  EXPECT_EQ(kRavelOk, pat.ParseRawData(third.data()));
  EXPECT_EQ(0, pat.GetProgramCount());
  EXPECT_EQ(0x0020, pat.GetNetworkPID());
}

TEST(PATCopy, CopiesHeaderNameNetworkPidAndEveryProgram) {
  Bytes section = PatSection({{0, 0x0010}, {5, 0x0100}, {1, 0x1FC8}, {3, 0x0101}});
  Bytes other = PatSection({{9, 0x0900}, {8, 0x0800}, {0, 0x0030}}, 0x0001, 7);
  RavelCPAT* source = new RavelCPAT(section.data());
  source->iSession = 0x5A;
  RavelCPAT assigned(other.data());
  tc::ExpectDeepCopies(source, assigned, ShowLines<RavelCPAT>);
  EXPECT_EQ(0x0010, assigned.GetNetworkPID());
  // Assigning a table to itself clears its programs before the copy.
  tc::SelfAssign(assigned);
  EXPECT_EQ(0, assigned.GetProgramCount());
  EXPECT_EQ(0x0010, assigned.GetNetworkPID());
}

TEST(PATShow, DumpsTheListAndEachEntryAtItsOwnMask) {
  Bytes section = PatSection({{0, 0x0010}, {5, 0x0100}, {1, 0x1FC8}, {3, 0x0101}});
  RavelCPAT pat(section.data());
  EXPECT_EQ(tc::ShortDump("PAT", HeaderLines(0x00, "PAT", 1, 25, 0x7ED0, 1, 1, 0, 0),
                          {"# Body Information\n", "The number of PMT Table Info=[3]\n",
                           "[0]th Table Info: Program Number=[3], PID=[0x101]\n",
                           "[1]th Table Info: Program Number=[5], PID=[0x100]\n",
                           "[2]th Table Info: Program Number=[1], PID=[0x1fc8]\n"}),
            ShowLines(pat));
  EXPECT_EQ((TraceLines{{kWarning, "Program Number=[1], PID=[8136]\n"}}), ShowLines(*pat.GetPMTInfo(2)));
  // A table never parsed: no programs, no network PID, an unknown name.
  TraceRecorder recorder;
  RavelCPAT empty(nullptr);
  EXPECT_TRUE(recorder.Lines().empty());
  EXPECT_EQ(0xFFFF, empty.GetNetworkPID());
  EXPECT_EQ(tc::ShortDump("PAT", EmptyHeaderLines(), {"# Body Information\n", "The number of PMT Table Info=[0]\n"}),
            ShowLines(empty));
}

TEST(PMTInfo, ReadsProgramNumberAndThirteenBitPid) {
  Bytes entry{0xFF, 0xFF, 0xFF, 0xFF};
  RavelCPMTInfo info(entry.data());
  EXPECT_EQ(0xFFFF, info.GetProgramNumber());
  EXPECT_EQ(0x1FFF, info.GetPID());
  // Null clears both.
  EXPECT_EQ(kRavelErrInvalidArgument, info.ParseRawData(nullptr));
  EXPECT_EQ(0, info.GetProgramNumber() + info.GetPID());
}
