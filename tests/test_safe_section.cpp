// Safe entry layer: checks of the count, the declared length, the CRC and the
// structure walk before any parse, the table of tables, and parsing by table_id
// or into the caller's object with the traces of a direct parse.
#include <gtest/gtest.h>

#include <array>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "Captures.h"
#include "CarouselBuilder.h"
#include "Ravel_ByteOrder.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CSafeSection.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_CTableTDT.h"
#include "Ravel_CTableTOT.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TraceRecorder.h"

namespace {

const unsigned int kWarning = 0x40000020u;

Bytes Long(uint8_t tableId, const Bytes& body, uint16_t tableIdExtension = 0x0001, bool privateIndicator = true) {
  sb::SectionOptions o;
  o.tableId = tableId;
  o.tableIdExtension = tableIdExtension;
  o.privateIndicator = privateIndicator;
  return sb::LongSection(o, body);
}

Bytes Pat(const std::vector<std::pair<unsigned int, unsigned int> >& programs, uint8_t tableId = 0x00) {
  Bytes body;
  for (const auto& p : programs) sb::Append(body, sb::Cat({sb::U16(p.first), sb::U16(0xE000 | p.second)}));
  return Long(tableId, body, 0x7ED0, false);
}

Bytes AitSection(const Bytes& body) { return Long(0x74, body, 0x0010); }

// dsmccMessageHeader with `adaptation` bytes of adaptation header; the
// messageLength covers them and `body`, unless `messageLength` is given.
Bytes Message(uint16_t messageId, const Bytes& body, uint8_t adaptation = 0, int messageLength = -1) {
  const size_t length = messageLength >= 0 ? static_cast<size_t>(messageLength) : adaptation + body.size();
  return sb::Cat({Bytes{0x11, 0x03}, sb::U16(messageId), sb::U32(0x80000002u), Bytes{0xFF, adaptation},
                  sb::U16(static_cast<unsigned int>(length)), Bytes(adaptation, 0xA0), body});
}

Bytes DsiBody(unsigned int privateDataLength, const Bytes& privateData) {
  return sb::Cat({Bytes{0x00, 0x01}, sb::U32(0xABCD), sb::U32(0x00010203), sb::U16(0x0421), sb::U16(0x0422),
                  sb::U16(0xE760), sb::U32(0xEEEEEEEE), sb::U16(0), sb::U16(privateDataLength), privateData});
}

// Module records: moduleId 16 | moduleSize 32 | moduleVersion 8 | moduleInfoLength 8 | info.
Bytes DiiBody(unsigned int numberOfModules, const std::vector<Bytes>& infos, unsigned int privateDataLength,
              const Bytes& privateData, unsigned int compatibilityLength = 0) {
  Bytes body = sb::Cat({sb::U32(0x80000002u), sb::U16(4066), sb::U8(3), sb::U8(4), sb::U32(5), sb::U32(0xFFFFFFFFu),
                        sb::U16(compatibilityLength), sb::U16(numberOfModules)});
  for (size_t i = 0; i < infos.size(); ++i) {
    sb::Append(body, sb::Cat({sb::U16(static_cast<unsigned int>(i + 1)), sb::U32(1000), sb::U8(1),
                              sb::U8(static_cast<unsigned int>(infos[i].size())), infos[i]}));
  }
  return sb::Cat({body, sb::U16(privateDataLength), privateData});
}

Bytes DdbBody(const Bytes& block) { return sb::Cat({sb::U16(7), sb::U8(1), sb::U8(0xFF), sb::U16(2), block}); }

Bytes GoodDii() {
  Bytes descriptors = sb::Cat({sb::Descriptor(0x01, sb::Text("text/xml")), sb::Descriptor(0x02, sb::Text("index.bml"))});
  return Message(0x1002, DiiBody(2, {descriptors, {}}, 0, {}));
}

// A DII without modules that ends right after numberOfModules.
Bytes DiiWithoutPrivateDataLength() {
  Bytes body = DiiBody(0, {}, 0, {});
  body.resize(body.size() - 2);
  return body;
}

// The name of the kind the safe layer tells from the first `count` bytes.
const char* KindName(const unsigned char* bytes, int count) {
  return RavelCSafeSection::GetKindName(RavelCSafeSection::GetKind(bytes, count));
}

// A carousel section around a message: table_id 0x3B or 0x3C, then the CRC_32.
Bytes Carousel(uint8_t tableId, const Bytes& message) { return Long(tableId, message, 0x0007); }

Bytes StreamEvents() {
  return Long(0x3D, sb::Descriptor(0x17, sb::Cat({sb::U8(0x7F), sb::U8(0xFE), sb::U32(0x00000001), sb::U8(0xFE),
                                                  sb::U32(0x00000002), sb::U16(1), sb::U16(1)})));
}

// The good sections the checks are tried on: built ones, and the real ones when
// the shared captures are there.
std::vector<Bytes> Fixtures() {
  std::vector<Bytes> fixtures = {Pat({{0, 0x10}, {3, 0x103}, {1, 0x1FC8}}), cb::AitSection("Jogo", "/app", "main.ncl"),
                                 StreamEvents(), Carousel(0x3B, Message(0x1006, DsiBody(3, {1, 2, 3}))),
                                 Carousel(0x3B, GoodDii()), Carousel(0x3C, Message(0x1003, DdbBody({9, 8, 7, 6})))};
  for (const char* name : {"isdbt-japan-psi.sections", "isdb-signalling-mix.sections"}) {
    Bytes contents;
    if (!captures::Load(name, contents)) continue;
    for (const Bytes& section : captures::SplitSections(contents)) fixtures.push_back(section);
  }
  // The stream descriptor, carousel and AIT PIDs of the captures; the first few
  // sections of each table hold every kind of message.
  const std::vector<std::pair<const char*, unsigned int> > carried = {
      {"stream-events-1.ts", 0x0194}, {"stream-events-2.ts", 0x0FA2}, {"object-carousel.ts", 0x076A}, {"ait.ts", 0x1EC5}};
  for (const auto& c : carried) {
    Bytes stream;
    if (!captures::Load(c.first, stream)) continue;
    std::map<unsigned char, int> taken;
    for (const Bytes& section : captures::SectionsOfPid(stream, c.second)) {
      if (taken[section[0]]++ < 3) fixtures.push_back(section);
    }
  }
  return fixtures;
}

// Exactly `count` bytes on the heap, so that a memory checker sees any read past them.
std::unique_ptr<unsigned char[]> Exactly(const Bytes& bytes, size_t count) {
  std::unique_ptr<unsigned char[]> copy(new unsigned char[count == 0 ? 1 : count]);
  for (size_t i = 0; i < count; ++i) copy[i] = bytes[i];
  return copy;
}

Bytes WithByte(Bytes bytes, size_t index, uint8_t value) {
  bytes[index] = value;
  return bytes;
}

Bytes WithSectionLength(Bytes section, int delta) {
  unsigned int length = RavelRead12(&section[1]) + delta;
  section[1] = static_cast<uint8_t>((section[1] & 0xF0) | ((length >> 8) & 0x0F));
  section[2] = static_cast<uint8_t>(length);
  return section;
}

}  // namespace

TEST(SafeSection, GivesTheMatchingResultForEachDamage) {
  Bytes pat = Pat({{3, 0x103}, {1, 0x101}});
  Bytes badCrc = WithByte(pat, pat.size() - 1, pat.back() ^ 0x01);
  Bytes unknownTable = WithByte(pat, 0, 0x01);  // CAT: no class
  sb::FixCrc(unknownTable);
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
      {"body byte flipped", WithByte(pat, 9, pat[9] ^ 0x40), kRavelSafeCrcError},
      {"table_id without a class", unknownTable, kRavelSafeUnknownTable},
      {"stuffing after the section is ignored", sb::Cat({pat, Bytes{0xFF, 0xFF, 0x47}}), kRavelSafeOk},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    std::unique_ptr<unsigned char[]> bytes = Exactly(c.bytes, c.bytes.size());
    RavelCSafeSection safe;
    TraceRecorder recorder;
    EXPECT_EQ(c.result, safe.Parse(bytes.get(), static_cast<int>(c.bytes.size())));
    EXPECT_EQ(c.result == kRavelSafeOk, safe.GetTable() != nullptr);
    EXPECT_TRUE(c.result == kRavelSafeOk || recorder.Records().empty());
  }
  RavelCSafeSection safe;
  EXPECT_EQ(kRavelSafeNullInput, safe.Parse(nullptr, 100));
  EXPECT_EQ(kRavelSafeNullInput, safe.Parse(pat.data(), -1));
  EXPECT_EQ(kRavelSafeTooShort, safe.Parse(pat.data(), 2));
  // Load checks the same and keeps the copy of a section of any table_id.
  EXPECT_EQ(kRavelSafeOk, safe.Load(unknownTable.data(), static_cast<int>(unknownTable.size())));
  EXPECT_EQ(static_cast<int>(unknownTable.size()), safe.GetDataSize());
  EXPECT_EQ(kRavelSafeCrcError, safe.Load(badCrc.data(), static_cast<int>(badCrc.size())));
}

TEST(SafeSection, TellsEachKindOfSectionApartByItsHeader) {
  const Bytes eitIds = sb::Cat({sb::U16(0x0421), sb::U16(0x0422), sb::U8(0x18), sb::U8(0x4E)});
  struct Case {
    Bytes section;
    const char* kind;
    RavelSafeResult result;
    unsigned int streamIds;  // what tells tables of one table_id and extension apart
    unsigned char segmentLast;
  } cases[] = {
      {/*section=*/Pat({{1, 0x101}}), /*kind=*/"PAT", /*result=*/kRavelSafeOk, /*streamIds=*/0, /*segmentLast=*/0},
      {Long(0x02, sb::Cat({sb::U16(0xE1FF), sb::Length12(0)})), "PMT", kRavelSafeOk, 0, 0},
      {Long(0x42, sb::Cat({sb::U16(0x0421), sb::U8(0xFF)})), "SDT", kRavelSafeOk, 0x0421, 0},
      {Long(0x4E, eitIds), "EIT p/f", kRavelSafeOk, 0x04210422, 0x18},
      {Long(0x46, sb::Cat({sb::U16(0x0421), sb::U8(0xFF)})), "SDT", kRavelSafeOk, 0x0421, 0},
      {Long(0x41, sb::Cat({sb::Length12(0), sb::Length12(0)})), "NIT", kRavelSafeOk, 0, 0},
      {Long(0x4F, eitIds), "EIT p/f", kRavelSafeOk, 0x04210422, 0x18},
      {Long(0x60, eitIds), "EIT schedule", kRavelSafeOk, 0x04210422, 0x18},
      {Long(0x51, eitIds), "EIT schedule", kRavelSafeUnknownTable, 0x04210422, 0x18},
      {Long(0x01, {}), "CAT", kRavelSafeUnknownTable, 0, 0},
      {Carousel(0x3B, GoodDii()), "DII", kRavelSafeOk, 0, 0},
      {Carousel(0x3C, Message(0x1001, DdbBody({}))), "DSM-CC other", kRavelSafeUnknownTable, 0, 0},
      {Long(0x75, {}), "other", kRavelSafeUnknownTable, 0, 0},
      // A TOT marked long has no stream ids; its loop length is still read from byte 8 (here the date).
      {Long(0x73, sb::Cat({sb::UtcTime(2019, 1, 22, 12, 51, 9), sb::Length12(0)})), "TOT", kRavelSafeMalformed,
       0, 0},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.kind);
    std::unique_ptr<unsigned char[]> bytes = Exactly(c.section, c.section.size());
    const int count = static_cast<int>(c.section.size());
    EXPECT_STREQ(c.kind, KindName(bytes.get(), count));
    RavelSectionHeader header;
    ASSERT_TRUE(RavelCSafeSection::ReadHeader(bytes.get(), count, header));
    EXPECT_EQ(c.streamIds, header.iStreamIds);
    EXPECT_EQ(c.segmentLast, header.iSegmentLastSectionNumber);
    RavelCSafeSection safe;
    TraceRecorder recorder;
    EXPECT_EQ(c.result, safe.Parse(bytes.get(), count));
  }
  // The header alone is enough for the stream ids.
  const Bytes sdt = cases[2].section;
  RavelSectionHeader header;
  ASSERT_TRUE(RavelCSafeSection::ReadHeader(Exactly(sdt, 10).get(), 10, header));
  EXPECT_EQ(0x0421u, header.iStreamIds);
  // Bytes that end before the message id leave a carousel section unnamed.
  const Bytes dii = Carousel(0x3B, GoodDii());
  EXPECT_STREQ("DSM-CC other", KindName(dii.data(), 11));
  EXPECT_STREQ("DII", KindName(dii.data(), 12));
  EXPECT_STREQ("other", KindName(nullptr, 12));
  EXPECT_FALSE(RavelCSafeSection::ReadHeader(nullptr, 12, header));
}

TEST(SafeSection, ParsesAsADirectParseWouldAndRefusesEveryTruncatedPrefix) {
  for (const Bytes& section : Fixtures()) {
    SCOPED_TRACE(static_cast<int>(section[0]));
    ASSERT_EQ(static_cast<size_t>(RavelSectionSize(section.data())), section.size());
    for (size_t count = 0; count < section.size(); ++count) {
      std::unique_ptr<unsigned char[]> bytes = Exactly(section, count);
      RavelCSafeSection cut;
      TraceRecorder silent;
      ASSERT_EQ(count < 3 ? kRavelSafeTooShort : kRavelSafeLengthMismatch, cut.Parse(bytes.get(), static_cast<int>(count)));
      EXPECT_TRUE(cut.GetTable() == nullptr && cut.GetData() == nullptr && silent.Records().empty()) << count;
    }
    if (!RavelCSafeSection::IsKnownTable(section[0])) continue;
    RavelCSafeSection safe;
    TraceRecorder viaSafe;
    ASSERT_EQ(kRavelSafeOk, safe.Parse(section.data(), static_cast<int>(section.size())));
    safe.Show();
    TraceLines safeLines = viaSafe.Lines();
    EXPECT_EQ(RavelSectionSize(section.data()), safe.GetDataSize());
    EXPECT_EQ(0, safe.GetParseResult());

    // A direct parse of the padded copy (some classes trace the address they parse).
    TraceRecorder direct;
    if (safe.GetTDT() != nullptr) {
      RavelCTDT tdt(safe.GetData());
      tdt.Show();
    } else if (safe.GetTOT() != nullptr) {
      std::unique_ptr<RavelCTOT> tot(safe.CopyTOT());
      direct.Clear();
      EXPECT_EQ(kRavelOk, tot->ParseRawData(safe.GetData()));
      tot->Show();
    } else if (safe.GetTable() != nullptr) {
      std::unique_ptr<RavelCTableBase> table(safe.CopyTable());
      ASSERT_NE(nullptr, table);
      direct.Clear();
      EXPECT_EQ(kRavelOk, table->ParseRawData(safe.GetData()));
      table->Show();
    } else if (safe.GetMessage()->iMessageId == 0x1006) {
      EXPECT_EQ(nullptr, safe.CopyMessage());
      RavelCDsmccDSI dsi(safe.GetData() + 8);
      dsi.Show();
    } else {
      std::unique_ptr<RavelCDsmccBase> message(safe.CopyMessage());
      ASSERT_NE(nullptr, message);
      direct.Clear();
      EXPECT_EQ(kRavelOk, message->ParseRawData(safe.GetData() + 8));
      message->Show();
    }
    EXPECT_EQ(direct.Lines(), safeLines);
  }
}

TEST(SafeSection, ChecksEveryPartOfADsmccMessageBeforeItsParse) {
  Bytes dii = GoodDii();
  Bytes shortRecords = Message(0x1002, DiiBody(3, {{}, {}}, 0, {}));
  Bytes longInfo = Message(0x1002, DiiBody(1, {Bytes(10, 0x01)}, 0, {}));
  longInfo[12 + 20 + 7] = 200;  // moduleInfoLength of the only record
  struct Case {
    const char* label;
    Bytes message;
    RavelSafeResult result;  // a message the class refuses gives the class's kRavelErrCorruptSection
  } cases[] = {
      {"DSI", Message(0x1006, DsiBody(3, {1, 2, 3})), kRavelSafeOk},
      {"DSI private data past the end", Message(0x1006, DsiBody(4, {1, 2, 3})), kRavelSafeOutsideMessage},
      {"DSI without room for its server id", Message(0x1006, Bytes(20, 0x00)), kRavelSafeOutsideMessage},
      {"DII", dii, kRavelSafeOk},
      {"DII with more modules than records", shortRecords, kRavelSafeOutsideMessage},
      {"DII module info past the end", longInfo, kRavelSafeOutsideMessage},
      {"DII private data past the end", Message(0x1002, DiiBody(0, {}, 3, {1, 2})), kRavelSafeOutsideMessage},
      {"DII with a two-byte compatibility descriptor", Message(0x1002, sb::Cat({DiiBody(0, {}, 0, {}, 2), sb::U16(0)})),
       kRavelSafeOk},
      {"DII compatibility descriptor past the end", Message(0x1002, DiiBody(0, {}, 0, {}, 9)), kRavelSafeOutsideMessage},
      {"DII cut in its download parameters", Message(0x1002, Bytes(17, 0x00)), kRavelSafeOutsideMessage},
      {"DDB", Message(0x1003, DdbBody({1, 2, 3})), kRavelSafeOk},
      {"DDB whose messageLength misses the block header", Message(0x1003, DdbBody({}), 0, 5), kRavelSafeOutsideMessage},
      {"DDB adaptation longer than the message", WithByte(Message(0x1003, DdbBody({})), 9, 200), kRavelSafeOutsideMessage},
      {"DDB of 4097 bytes: the class refuses it", Message(0x1003, DdbBody(Bytes(4097, 0x5A))), kRavelSafeRefused},
      {"unknown message id", Message(0x1001, DdbBody({})), kRavelSafeUnknownTable},
      {"messageLength one more than the bytes", Message(0x1003, DdbBody({1}), 0, 8), kRavelSafeLengthMismatch},
  };
  for (const Case& c : cases) {
    std::unique_ptr<unsigned char[]> bytes = Exactly(c.message, c.message.size());
    RavelCSafeSection safe;
    TraceRecorder recorder;
    SCOPED_TRACE(c.label);
    const int count = static_cast<int>(c.message.size());
    EXPECT_EQ(c.result, safe.ParseMessage(bytes.get(), count));
    EXPECT_EQ(c.result == kRavelSafeRefused ? kRavelSafeOk : c.result, RavelCSafeSection::CheckMessage(bytes.get(), count));
    EXPECT_EQ(c.result == kRavelSafeRefused ? kRavelErrCorruptSection : 0, safe.GetParseResult());
    EXPECT_EQ(c.result == kRavelSafeOk, safe.GetMessage() != nullptr);
    EXPECT_TRUE(c.result == kRavelSafeOk || c.result == kRavelSafeRefused || recorder.Records().empty());
    // The same message in a carousel section gives the same result.
    Bytes section = Carousel(c.message[3] == 0x03 ? 0x3C : 0x3B, c.message);
    if (section.size() <= static_cast<size_t>(RavelCSafeSection::kMaxSectionSize)) {
      EXPECT_EQ(c.result, safe.Parse(section.data(), static_cast<int>(section.size())));
    }
  }
}

TEST(SafeSection, RefusesEveryTruncatedMessageAndAMessageRunningIntoTheCrc) {
  for (const Bytes& message : {Message(0x1006, DsiBody(3, {1, 2, 3})), GoodDii(), Message(0x1003, DdbBody({4, 5}))}) {
    for (size_t count = 0; count < message.size(); ++count) {
      std::unique_ptr<unsigned char[]> bytes = Exactly(message, count);
      RavelCSafeSection safe;
      TraceRecorder recorder;
      RavelCDsmccDDB ddb(nullptr);
      const RavelSafeResult expected = count < 12 ? kRavelSafeTooShort : kRavelSafeLengthMismatch;
      ASSERT_EQ(expected, safe.ParseMessage(bytes.get(), static_cast<int>(count))) << count;
      ASSERT_EQ(expected, safe.ParseMessageInto(bytes.get(), static_cast<int>(count), ddb)) << count;
      ASSERT_EQ(expected, RavelCSafeSection::CheckMessage(bytes.get(), static_cast<int>(count))) << count;
      EXPECT_TRUE(recorder.Records().empty()) << count;
    }
  }
  RavelCSafeSection safe;
  EXPECT_EQ(kRavelSafeNullInput, safe.ParseMessage(nullptr, 12));
  Bytes message = Message(0x1006, DsiBody(0, {}));
  Bytes intoCrc = Carousel(0x3B, Message(0x1006, DsiBody(0, {}), 0, static_cast<int>(message.size()) - 12 + 2));
  EXPECT_EQ(kRavelSafeLengthMismatch, safe.Parse(intoCrc.data(), static_cast<int>(intoCrc.size())));
  Bytes noHeader = Carousel(0x3C, Bytes(11, 0x00));
  EXPECT_EQ(kRavelSafeTooShort, safe.Parse(noHeader.data(), static_cast<int>(noHeader.size())));
}

TEST(SafeSection, ARefusalByTheTablesOwnParseLeavesNoTable) {
  // A PMT whose program info loop holds a descriptor of length 0: its CRC is
  // good, the PMT's own parse refuses it.
  Bytes pmt = Long(0x02, sb::Cat({sb::U16(0xE100), sb::Length12(2), Bytes{0x55, 0x00}}));
  RavelCSafeSection safe;
  TraceRecorder recorder;
  EXPECT_EQ(kRavelSafeRefused, safe.Parse(pmt.data(), static_cast<int>(pmt.size())));
  EXPECT_EQ(kRavelErrCorruptSection, safe.GetParseResult());
  EXPECT_EQ(nullptr, safe.GetTable());
  EXPECT_EQ((TraceLines{{kWarning, "Invalid Descriptor Tag & Length!! descrTag=[0x55], descrLen=[0]\n"}}),
            recorder.Lines());

  // The time tables, by table_id or into the caller's object.
  Bytes tdt = sb::ShortSection(0x70, sb::UtcTime(2013, 3, 2, 12, 34, 56), false);
  recorder.Clear();
  ASSERT_EQ(kRavelSafeOk, safe.Parse(tdt.data(), static_cast<int>(tdt.size())));
  ASSERT_NE(nullptr, safe.GetTDT());
  EXPECT_EQ(34, safe.GetTDT()->iMinute);
  EXPECT_EQ(nullptr, safe.GetTable());
  RavelCTOT tot(nullptr);
  EXPECT_EQ(kRavelSafeRefused, safe.ParseInto(tdt.data(), static_cast<int>(tdt.size()), tot));
  EXPECT_EQ(kRavelErrInvalidArgument, safe.GetParseResult());
  EXPECT_EQ(nullptr, safe.GetTDT());
  RavelCTDT time(nullptr);
  EXPECT_EQ(kRavelSafeOk, safe.ParseInto(tdt.data(), static_cast<int>(tdt.size()), time));
  EXPECT_EQ(56, time.iSecond);
}

TEST(SafeSection, TheStructureWalkRefusesLoopsPastTheirParentSayingWhere) {
  struct Case {
    const char* label;
    Bytes section;
    RavelSafeResult result;
    const char* check;
    int offset;
  } cases[] = {
      {/*label=*/"AIT whose loops claim the largest 12-bit length",
       /*section=*/AitSection(sb::Cat({sb::Length12(0x0FFF), sb::Length12(0x0FFF)})),
       /*result=*/kRavelSafeMalformed, /*check=*/"common descriptors run past the section", /*offset=*/8},
      {"AIT application loop past the section", AitSection(sb::Cat({sb::Length12(0), sb::Length12(90)})),
       kRavelSafeMalformed, "application loop runs past the section", 10},
      {"PMT stream descriptor loop past the streams",
       Long(0x02, sb::Cat({sb::U16(0xE100), sb::Length12(0), sb::U8(0x1B), sb::U16(0xE111), sb::Length12(30),
                           sb::Descriptor(0x52, sb::U8(1))})),
       kRavelSafeMalformed, "loop entry runs past its loop's end", 12},
      {"SDT service descriptor loop past the section",
       Long(0x42, sb::Cat({sb::U16(0x0421), sb::U8(0xFF), sb::U16(0x0001), sb::U8(0xFC), sb::Length12(30)})),
       kRavelSafeMalformed, "loop entry runs past its loop's end", 11},
      {"NIT transport stream loop over the CRC_32", Long(0x40, sb::Cat({sb::Length12(0), sb::Length12(4)})),
       kRavelSafeMalformed, "loop runs past its parent's end", 10},
      {"stream descriptor past the section", Long(0x3D, Bytes{0x17, 0x0A, 1, 2}), kRavelSafeMalformed,
       "descriptor runs past its loop's end", 8},
      {"EIT schedule without a class is still walked",
       Long(0x51, sb::Cat({sb::U16(1), sb::U16(1), sb::U8(0), sb::U8(0x51), sb::U16(1), sb::UtcTime(2013, 5, 10, 1, 0, 0),
                           sb::U8(0), sb::U8(0), sb::U8(0), sb::U16(0x8000 | 60)})),
       kRavelSafeMalformed, "loop entry runs past its loop's end", 14},
      {"DII ending after its module count", Carousel(0x3B, Message(0x1002, DiiWithoutPrivateDataLength())),
       kRavelSafeOutsideMessage, "DII private data length cut", 40},
      {"EIT schedule without a class, well formed", Long(0x51, sb::Cat({sb::U16(1), sb::U16(1), sb::U8(0), sb::U8(0x51)})),
       kRavelSafeUnknownTable, "no class for this table_id", 0},
  };
  for (const Case& c : cases) {
    std::unique_ptr<unsigned char[]> bytes = Exactly(c.section, c.section.size());
    RavelCSafeSection safe;
    TraceRecorder recorder;
    EXPECT_EQ(c.result, safe.Parse(bytes.get(), static_cast<int>(c.section.size()))) << c.label;
    EXPECT_EQ(nullptr, safe.GetTable()) << c.label;
    EXPECT_EQ(c.result, safe.GetRefusal().eResult) << c.label;
    EXPECT_STREQ(c.check, safe.GetRefusal().pCheck) << c.label;
    EXPECT_EQ(c.offset, safe.GetRefusal().iOffset) << c.label;
    EXPECT_TRUE(recorder.Records().empty()) << c.label;
  }
}

TEST(SafeSection, KeepsOneBufferOfTheSectionsSizeAndHandsTheTableOver) {
  Bytes ait = cb::AitSection("Jogo", "/app", "main.ncl");
  Bytes pat = Pat({{1, 0x101}});
  RavelCSafeSection safe;
  TraceRecorder recorder;
  ASSERT_EQ(kRavelSafeOk, safe.Parse(ait.data(), static_cast<int>(ait.size())));
  unsigned char* buffer = safe.GetData();
  // The table can be taken over and outlives the safe object's next section.
  std::unique_ptr<RavelCTableBase> taken(safe.TakeTable());
  EXPECT_EQ(nullptr, safe.GetTable());
  ASSERT_EQ(kRavelSafeOk, safe.Parse(pat.data(), static_cast<int>(pat.size())));
  // A smaller section goes to the same buffer, the rest of the last one zeroed.
  EXPECT_EQ(buffer, safe.GetData());
  EXPECT_EQ(static_cast<int>(pat.size()), safe.GetDataSize());
  for (size_t i = pat.size(); i < ait.size(); ++i) ASSERT_EQ(0, buffer[i]) << i;
  EXPECT_EQ(0x74, taken->iTableId);
  EXPECT_EQ(1, static_cast<RavelCAIT*>(taken.get())->GetApplicationList()->iCount);
}

TEST(SafeSection, TellsEachDescriptorInTheOrderTheParseReadsThem) {
  typedef std::array<int, 3> Told;  // offset, tag, length
  // Program info, then two streams of one descriptor each.
  const Bytes twoStreams = Long(0x02, sb::Cat({sb::U16(0xE100), sb::DescriptorLoop({sb::Descriptor(0x09, {1, 2})}),
                                               sb::U8(0x1B), sb::U16(0xE111), sb::DescriptorLoop({sb::Descriptor(0x52, {7})}),
                                               sb::U8(0x1B), sb::U16(0xE112),
                                               sb::DescriptorLoop({sb::Descriptor(0xFD, {1, 2, 3})})}));
  // Program-info loop of 6 bytes whose second descriptor says 5.
  const Bytes overrun = Long(0x02, sb::Cat({sb::U16(0xE100), sb::Length12(6), sb::Descriptor(0x09, {1, 2}), Bytes{0x0A, 5}}));
  struct Case {
    const char* name;
    Bytes section;
    bool walked;
    std::vector<Told> told;
  } cases[] = {
      {/*name=*/"PMT program info then each stream", /*section=*/twoStreams, /*walked=*/true,
       /*told=*/{{{12, 0x09, 2}}, {{21, 0x52, 1}}, {{29, 0xFD, 3}}}},
      {"second descriptor past its loop", overrun, false, {{{12, 0x09, 2}}}},
      {"bytes shorter than the section", Bytes(twoStreams.begin(), twoStreams.end() - 1), false, {}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    std::vector<Told> told;
    auto visit = [](int offset, unsigned char tag, unsigned char length, void* context) {
      static_cast<std::vector<Told>*>(context)->push_back(Told{{offset, tag, length}});
    };
    EXPECT_EQ(c.walked, RavelCSafeSection::EachDescriptor(c.section.data(), static_cast<int>(c.section.size()), visit, &told));
    EXPECT_EQ(c.told, told);
  }
}
