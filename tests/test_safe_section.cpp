// Safe entry layer: checks of the count, the declared length and the CRC before
// any parse, the zeroed padding after the copy, and parsing by table_id or into
// the caller's object with the traces of a direct parse.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "Captures.h"
#include "Ravel_ByteOrder.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_CTSPktAssembler.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TraceRecorder.h"

namespace {

const unsigned int kWarning = 0x40000020u;
const unsigned int kError = 0x80000020u;

Bytes Pat(const std::vector<std::pair<unsigned int, unsigned int> >& programs, uint8_t tableId = 0x00) {
  Bytes body;
  for (const auto& p : programs) {
    sb::Append(body, sb::U16(p.first));
    sb::Append(body, sb::U16(0xE000 | p.second));
  }
  sb::SectionOptions o;
  o.tableId = tableId;
  o.tableIdExtension = 0x7ED0;
  o.privateIndicator = false;
  return sb::LongSection(o, body);
}

Bytes AitSection(const Bytes& body) {
  sb::SectionOptions o;
  o.tableId = 0x74;
  o.tableIdExtension = 0x0010;
  return sb::LongSection(o, body);
}

// One Ginga application with a name and a location.
Bytes GoodAit() {
  Bytes name = sb::Descriptor(0x01, sb::Cat({sb::Text("por"), sb::U8(4), sb::Text("Jogo")}));
  Bytes location = sb::Descriptor(
      0x07, sb::Cat({sb::U8(4), sb::Text("/app"), sb::U8(0), sb::Text("main.ncl")}));
  Bytes app = sb::Cat({sb::U32(0x0B), sb::U16(0x1AB5), sb::U8(0x01), sb::DescriptorLoop({name, location}, 0xC)});
  return AitSection(sb::Cat({sb::DescriptorLoop({}), sb::DescriptorLoop({app})}));
}

// The good sections the checks are tried on: built ones, and the real ones when
// the shared captures are there.
std::vector<Bytes> Fixtures() {
  std::vector<Bytes> fixtures = {Pat({{0, 0x10}, {3, 0x103}, {1, 0x1FC8}}), GoodAit()};
  for (const char* name : {"isdbt-japan-psi.sections", "isdb-signalling-mix.sections"}) {
    Bytes contents;
    if (!captures::Load(name, contents)) continue;
    for (const Bytes& section : captures::SplitSections(contents)) fixtures.push_back(section);
  }
  return fixtures;
}

// Exactly `count` bytes on the heap, so that a memory checker sees any read past them.
std::unique_ptr<unsigned char[]> Exactly(const Bytes& bytes, size_t count) {
  std::unique_ptr<unsigned char[]> copy(new unsigned char[count == 0 ? 1 : count]);
  for (size_t i = 0; i < count; ++i) copy[i] = bytes[i];
  return copy;
}

Bytes WithSectionLength(Bytes section, int delta) {
  unsigned int length = RavelRead12(&section[1]) + delta;
  section[1] = static_cast<uint8_t>((section[1] & 0xF0) | ((length >> 8) & 0x0F));
  section[2] = static_cast<uint8_t>(length);
  return section;
}

}  // namespace

TEST(SafeSection, RefusesEveryTruncatedPrefixBeforeAnyParse) {
  std::vector<Bytes> fixtures = Fixtures();
  for (size_t f = 0; f < fixtures.size(); ++f) {
    const Bytes& section = fixtures[f];
    ASSERT_EQ(static_cast<size_t>(RavelSectionSize(section.data())), section.size()) << f;
    for (size_t count = 0; count < section.size(); ++count) {
      std::unique_ptr<unsigned char[]> bytes = Exactly(section, count);
      RavelCSafeSection safe;
      TraceRecorder recorder;
      RavelSafeResult expected = count < 3 ? kRavelSafeTooShort : kRavelSafeLengthMismatch;
      ASSERT_EQ(expected, safe.Parse(bytes.get(), static_cast<int>(count))) << f << " " << count;
      RavelCPAT pat(nullptr);
      ASSERT_EQ(expected, safe.ParseInto(bytes.get(), static_cast<int>(count), pat)) << f << " " << count;
      EXPECT_EQ(nullptr, safe.GetTable());
      EXPECT_EQ(nullptr, safe.GetSection());
      EXPECT_EQ(0, safe.GetParseResult());
      EXPECT_TRUE(recorder.Records().empty()) << f << " " << count;
    }
  }
}

TEST(SafeSection, GivesTheMatchingResultForEachDamage) {
  Bytes pat = Pat({{3, 0x103}, {1, 0x101}});
  Bytes badCrc = pat;
  badCrc.back() ^= 0x01;
  Bytes unknownTable = pat;
  unknownTable[0] = 0x01;  // CAT: no class here
  sb::FixCrc(unknownTable);
  Bytes trailing = pat;
  trailing.insert(trailing.end(), {0xFF, 0xFF, 0x47});
  struct Case {
    const char* label;
    Bytes bytes;
    RavelSafeResult result;
  } cases[] = {
      {"whole section", pat, kRavelSafeOk},
      {"section_length one more than the bytes hold", WithSectionLength(pat, 1), kRavelSafeLengthMismatch},
      {"section_length at its largest", WithSectionLength(pat, 0x0FFF - RavelRead12(&pat[1])),
       kRavelSafeLengthMismatch},
      {"section_length one less: the CRC is summed over other bytes", WithSectionLength(pat, -1),
       kRavelSafeCrcError},
      {"last CRC bit flipped", badCrc, kRavelSafeCrcError},
      {"body byte flipped", [&] { Bytes b = pat; b[9] ^= 0x40; return b; }(), kRavelSafeCrcError},
      {"table_id without a class", unknownTable, kRavelSafeUnknownTable},
      {"stuffing after the section is ignored", trailing, kRavelSafeOk},
  };
  for (const Case& c : cases) {
    std::unique_ptr<unsigned char[]> bytes = Exactly(c.bytes, c.bytes.size());
    RavelCSafeSection safe;
    TraceRecorder recorder;
    EXPECT_EQ(c.result, safe.Parse(bytes.get(), static_cast<int>(c.bytes.size()))) << c.label;
    EXPECT_EQ(c.result == kRavelSafeOk, safe.GetTable() != nullptr) << c.label;
    if (c.result != kRavelSafeOk) {
      EXPECT_TRUE(recorder.Records().empty()) << c.label;
    }
  }

  RavelCSafeSection safe;
  EXPECT_EQ(kRavelSafeNullInput, safe.Parse(nullptr, 100));
  EXPECT_EQ(kRavelSafeNullInput, safe.Parse(pat.data(), -1));
  EXPECT_EQ(kRavelSafeTooShort, safe.Parse(pat.data(), 2));
  // Load checks the same and keeps the copy of a section of any table_id.
  EXPECT_EQ(kRavelSafeOk, safe.Load(unknownTable.data(), static_cast<int>(unknownTable.size())));
  EXPECT_EQ(static_cast<int>(unknownTable.size()), safe.GetSectionSize());
  EXPECT_EQ(kRavelSafeCrcError, safe.Load(badCrc.data(), static_cast<int>(badCrc.size())));
}

TEST(SafeSection, KnowsWhichTablesItMakesAndWhichVerifyTheirCrc) {
  struct Case {
    unsigned char tableId;
    bool known;
    bool crc;
  } cases[] = {{0x00, true, true}, {0x74, true, true}, {0x01, false, false}, {0xFF, false, false}};
  for (const Case& c : cases) {
    EXPECT_EQ(c.known, RavelCSafeSection::IsKnownTable(c.tableId)) << int(c.tableId);
    EXPECT_EQ(c.crc, RavelCSafeSection::ChecksCrc(c.tableId, 1)) << int(c.tableId);
  }
  EXPECT_STREQ("length mismatch", RavelCSafeSection::GetResultText(kRavelSafeLengthMismatch));
  EXPECT_STREQ("refused by the parser", RavelCSafeSection::GetResultText(kRavelSafeRefused));
}

TEST(SafeSection, ParsesAsADirectParseWouldWithTheSameTraces) {
  for (const Bytes& section : Fixtures()) {
    if (!RavelCSafeSection::IsKnownTable(section[0])) continue;
    RavelCSafeSection safe;
    TraceRecorder viaSafe;
    ASSERT_EQ(kRavelSafeOk, safe.Parse(section.data(), static_cast<int>(section.size()))) << int(section[0]);
    safe.Show();
    TraceLines safeLines = viaSafe.Lines();
    EXPECT_EQ(RavelSectionSize(section.data()), safe.GetSectionSize());

    // A direct parse of the padded copy (the AIT traces the section's address).
    TraceRecorder direct;
    std::unique_ptr<RavelCTableBase> table(safe.CopyTable());
    ASSERT_NE(nullptr, table);
    direct.Clear();
    EXPECT_EQ(kRavelOk, table->ParseRawData(safe.GetSection()));
    table->Show();
    EXPECT_EQ(direct.Lines(), safeLines) << int(section[0]);
  }
}

TEST(SafeSection, ParsesIntoTheCallersObjectAndReportsItsRefusal) {
  Bytes pat = Pat({{3, 0x103}, {0, 0x10}, {1, 0x101}});
  RavelCSafeSection safe;
  RavelCPAT table(nullptr);
  ASSERT_EQ(kRavelSafeOk, safe.ParseInto(pat.data(), static_cast<int>(pat.size()), table));
  ASSERT_EQ(2, table.GetProgramCount());
  EXPECT_EQ(1, table.GetPMTInfo(0)->GetProgramNumber());
  EXPECT_EQ(0x10, table.GetNetworkPID());
  EXPECT_EQ(nullptr, safe.GetTable());

  // A table_id the caller's class does not take: its own message and result.
  Bytes foreign = Pat({{3, 0x103}}, 0x7F);
  TraceRecorder recorder;
  EXPECT_EQ(kRavelSafeRefused, safe.ParseInto(foreign.data(), static_cast<int>(foreign.size()), table));
  EXPECT_EQ(kRavelErrInvalidArgument, safe.GetParseResult());
  EXPECT_EQ((TraceLines{{kError, "Table ID isn't for PAT! Table ID=[127]\n"}}), recorder.Lines());
  EXPECT_EQ(0, table.GetProgramCount());
}

TEST(SafeSection, InnerLengthsPastTheSectionReadOnlyTheZeroedPadding) {
  // An application loop that declares the largest 12-bit length in a short
  // section with a good CRC: the AIT walks it, and its records, in the padding.
  Bytes section = AitSection(sb::Cat({sb::Length12(0x0FFF), sb::Length12(0x0FFF)}));
  std::unique_ptr<unsigned char[]> bytes = Exactly(section, section.size());
  RavelCSafeSection safe;
  TraceRecorder recorder;
  ASSERT_EQ(kRavelSafeOk, safe.Parse(bytes.get(), static_cast<int>(section.size())));
  for (int i = 0; i < RavelCSafeSection::kPadding; ++i) {
    ASSERT_EQ(0, safe.GetSection()[safe.GetSectionSize() + i]) << i;
  }
  RavelCAIT* ait = static_cast<RavelCAIT*>(safe.GetTable());
  // Each zeroed application is 9 bytes with an empty descriptor loop.
  EXPECT_EQ((0x0FFF + 8) / 9, ait->GetApplicationList()->iCount);
  EXPECT_EQ(3, (*ait->GetApplicationList())[0].iDocumentResolution);

  // The table can be taken over and outlives the safe object's next section.
  std::unique_ptr<RavelCTableBase> taken(safe.TakeTable());
  EXPECT_EQ(nullptr, safe.GetTable());
  EXPECT_EQ(kRavelSafeTooShort, safe.Parse(bytes.get(), 1));
  EXPECT_EQ(0x74, taken->iTableId);
}

TEST(SafeSection, TakesEveryAitSectionOfTheRealCaptureFromTheAssembler) {
  Bytes stream;
  RAVEL_LOAD_CAPTURE_OR_SKIP("ait.ts", stream);
  TraceRecorder recorder;
  int parsed = 0;
  // The AIT PIDs of the capture are found by table_id, not known in advance.
  for (unsigned int pid = 0x20; pid < 0x1FFF; ++pid) {
    std::vector<Bytes> packets = captures::PacketsOfPid(stream, pid);
    if (packets.empty()) continue;
    RavelCTSPktStore store;
    for (const Bytes& packet : packets) {
      RavelCSectionData out;
      store.AddTSPacket(packet.data(), out);
      for (int i = 0; i < out.iSectionCount; ++i) {
        if (out.pSection[i][0] != 0x74) continue;
        RavelCSafeSection safe;
        RavelSafeResult result = safe.Parse(out.pSection[i], out.iSectionSize[i]);
        EXPECT_EQ(kRavelSafeOk, result) << RavelCSafeSection::GetResultText(result);
        parsed += result == kRavelSafeOk;
      }
    }
  }
  EXPECT_GT(parsed, 0);
}
