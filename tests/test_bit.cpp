// Broadcaster information table and its broadcaster records.
#include <gtest/gtest.h>

#include <cstdio>
#include <memory>
#include <string>
#include <vector>

#include "Ravel_CTableBIT.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TableChecks.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

using sb::Cat;
using sb::Descriptor;
using sb::Length12;
using sb::U16;
using sb::U8;

const char kInfoFail[] = "BIT Info Parsing Fail! Maybe data has been corrupted!\n";

// An unknown tag: every tag of the first loop, at the BIT level, and a record's
// first descriptor, as a warning.
TraceLines::value_type Unknown(bool firstLoop, int tag) {
  char text[96];
  std::snprintf(text, sizeof(text), "%s Unkown Descriptor Tag=[0x%02x]\n",
                firstLoop ? "First Descriptor Loop.." : "BIT BroadcasterDescriptor Parsing..", tag);
  return {firstLoop ? kBit : kWarning, text};
}
TraceLines::value_type FirstLoopUnknown(int tag) { return Unknown(true, tag); }
TraceLines::value_type RecordUnknown(int tag) { return Unknown(false, tag); }

// Extended broadcaster descriptor of type 1 with one broadcaster entry and no affiliations.
Bytes ExtBroadcaster(unsigned int terrestrialId, unsigned int onid = 0x7FE1, uint8_t broadcasterId = 0x05) {
  return Descriptor(0xCE, Cat({U8(0x1F), U16(terrestrialId), U8(0x01), U16(onid), U8(broadcasterId)}));
}
// SI parameter descriptor: read by nothing in this table.
Bytes SiParameter() { return Descriptor(0xD7, Bytes{0x01, 0x02}); }

Bytes Record(uint8_t broadcasterId, const std::vector<Bytes>& descriptors) {
  return Cat({U8(broadcasterId), sb::DescriptorLoop(descriptors)});
}

Bytes BitBody(bool viewPropriety, const std::vector<Bytes>& firstDescriptors, const std::vector<Bytes>& records) {
  Bytes first = Cat(firstDescriptors);
  // 3 reserved bits, broadcaster_view_propriety, then the 12-bit length.
  return Cat({Length12(static_cast<unsigned int>(first.size()), viewPropriety ? 0xF : 0xE), first, Cat(records)});
}

Bytes BitSection(const Bytes& body, uint16_t originalNetworkId = 0x7FE1, uint8_t version = 3, uint8_t tableId = 0xC4) {
  sb::SectionOptions options;
  options.tableId = tableId;
  options.tableIdExtension = originalNetworkId;
  options.version = version;
  return sb::LongSection(options, body);
}

std::string Summary(RavelCBroadcasterDescriptor& record) {
  char text[96];
  std::snprintf(text, sizeof(text), "id=0x%02x len=%d", record.iBroadcasterId, record.iBroadcasterDescriptorsLength);
  std::string s = text;
  if (record.pExtendedBroadcasterDescriptor) {
    std::snprintf(text, sizeof(text), " ext=0x%04x", record.pExtendedBroadcasterDescriptor->GetTerrestrialBroadcasterId());
    s += text;
  }
  return s;
}

std::vector<std::string> Records(RavelCBIT& bit) {
  std::vector<std::string> list;
  for (int i = 0; i < bit.GetBroadcasterCount(); ++i) list.push_back(Summary(*bit.GetBroadcaster(i)));
  return list;
}

std::vector<int> Header(RavelCBIT& bit) {
  return {bit.iTableIdExtension, bit.iVersionNumber, bit.GetBroadcasterViewPropriety(), bit.GetFirstDescriptorsLength(),
          bit.GetBroadcasterCount()};
}

const Bytes kRecordA = Record(0x01, {ExtBroadcaster(0x0A01)});
const Bytes kRecordB = Record(0x02, {ExtBroadcaster(0x0B02), SiParameter()});
const char kSummaryA[] = "id=0x01 len=9 ext=0x0a01";
const char kSummaryB[] = "id=0x02 len=13 ext=0x0b02";

}  // namespace

TEST(BITParse, KeepsTheExtendedBroadcasterOfEachRecordAndTracesTheFirstLoop) {
  Bytes section = BitSection(BitBody(true, {SiParameter()}, {kRecordA, kRecordB}));
  TraceRecorder recorder;
  RavelCBIT bit(section.data());
  EXPECT_EQ((TraceLines{FirstLoopUnknown(0xD7)}), recorder.Lines());
  EXPECT_STREQ("BIT", bit.sTableName.GetString());
  EXPECT_EQ((std::vector<int>{0x7FE1, 3, 1, 4, 2}), Header(bit));
  EXPECT_EQ((std::vector<std::string>{kSummaryA, kSummaryB}), Records(bit));
  EXPECT_EQ(0x05, bit.GetBroadcaster(0)->GetExtendedBroadcaster()->GetBroadcasterId(0));
}

TEST(BITParse, RefusesNullBadCrcAndForeignTableIds) {
  RavelCBIT empty(nullptr);  // constructed over null: all zero, no name
  EXPECT_EQ((std::vector<int>{0, 0, 0, 0, 0}), Header(empty));
  EXPECT_TRUE(empty.sTableName.IsEmpty());

  Bytes good = BitSection(BitBody(true, {SiParameter()}, {kRecordA}));
  sb::SectionOptions bad;
  bad.tableId = 0xC4;
  bad.tableIdExtension = 0x1234;
  bad.corruptCrc = true;
  Bytes badCrc = sb::LongSection(bad, BitBody(false, {}, {kRecordB}));
  Bytes nitId = BitSection(BitBody(false, {}, {kRecordB}), 0x1234, 3, 0x40);
  bad.tableId = 0x00;
  Bytes bothBad = sb::LongSection(bad, BitBody(false, {}, {kRecordB}));
  // Only a foreign table_id's header is read; the body fields belong to the last accepted section.
  tc::ExpectRefusals<RavelCBIT>(good, tc::Refusals("BIT", badCrc, nitId, "0x40", bothBad),
                                [&](RavelCBIT& bit, const tc::Refusal& r, TraceRecorder&) {
                                  const bool foreign = r.section == &nitId;
                                  EXPECT_EQ(foreign ? 0x40 : 0xC4, bit.iTableId);
                                  EXPECT_EQ((std::vector<int>{foreign ? 0x1234 : 0x7FE1, 3, 1, 4, 0}), Header(bit));
                                  EXPECT_STREQ("BIT", bit.sTableName.GetString());
                                });
}

TEST(BITLoops, FirstLoopIsOnlyTracedAndEachRecordKeepsItsFirstDescriptor) {
  // Descriptors length 0: the record's "first descriptor" is the next record's
  // broadcaster_id and the reserved nibble of its length, and the next record
  // starts 3 bytes on.
  Bytes emptyRecord = Cat({U8(0x07), Length12(0)});
  struct Case {
    const char* label;
    Bytes body;
    int result;
    TraceLines traces;
    std::vector<std::string> records;
  } cases[] = {
      {"first loop of length 0: not walked", BitBody(false, {}, {kRecordA}), kRavelOk, {}, {kSummaryA}},
      {"every tag of the first loop is traced, known ones too",
       BitBody(false, {SiParameter(), ExtBroadcaster(0x0C03), Descriptor(0x40, {0x41})}, {kRecordA}), kRavelOk,
       {FirstLoopUnknown(0xD7), FirstLoopUnknown(0xCE), FirstLoopUnknown(0x40)}, {kSummaryA}},
      {"tag 0 in the first loop fails the section", BitBody(false, {SiParameter(), Descriptor(0x00, {0x01})}, {kRecordA}),
       kRavelErrCorruptSection, {FirstLoopUnknown(0xD7), {kWarning, Invalid(0x00, 1)}}, {}},
      {"length 0 in the first loop fails the section", BitBody(false, {Descriptor(0xD7, {})}, {kRecordA}),
       kRavelErrCorruptSection, {{kWarning, Invalid(0xD7, 0)}}, {}},
      {"an extended broadcaster second, after another tag, is not kept",
       BitBody(false, {}, {Record(0x03, {Descriptor(0xC5, {0x00}), ExtBroadcaster(0x0D04)})}), kRavelOk,
       {RecordUnknown(0xC5)}, {"id=0x03 len=12"}},
      {"a malformed second descriptor is never read",
       BitBody(false, {}, {Record(0x03, {ExtBroadcaster(0x0D04), Descriptor(0x00, {})})}), kRavelOk, {},
       {"id=0x03 len=11 ext=0x0d04"}},
      {"descriptors length 0 reads the next record's first two bytes", BitBody(false, {}, {emptyRecord, kRecordB}),
       kRavelOk, {RecordUnknown(0x02)}, {"id=0x07 len=0", kSummaryB}},
      {"a first descriptor with tag 0 fails the section and drops earlier records",
       BitBody(false, {}, {kRecordA, Record(0x04, {Descriptor(0x00, {0x01})})}), kRavelErrCorruptSection,
       {{kWarning, Invalid(0x00, 1)}, {kWarning, kInfoFail}}, {}},
      {"a first descriptor of length 0 fails the section",
       BitBody(false, {}, {kRecordA, kRecordB, Record(0x04, {Descriptor(0xCE, {})})}), kRavelErrCorruptSection,
       {{kWarning, Invalid(0xCE, 0)}, {kWarning, kInfoFail}}, {}},
      {"section_length 11 + first_descriptors_length: no records", BitBody(true, {SiParameter()}, {}), kRavelOk,
       {FirstLoopUnknown(0xD7)}, {}},
      // first_descriptors_length 8 with 4 bytes before the CRC_32: the loop length
      // 15 - 11 - 8 wraps, and the first loop already ends with the section.
      {"a first loop past the section end leaves no records", Cat({Length12(8, 0xE), Bytes{0xD7, 0x06, 0x01, 0x02}}),
       kRavelOk, {FirstLoopUnknown(0xD7)}, {}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = BitSection(c.body);
    RavelCBIT bit(nullptr);
    TraceRecorder recorder;
    EXPECT_EQ(c.result, bit.ParseRawData(section.data()));
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ(c.records, Records(bit));
    EXPECT_STREQ("BIT", bit.sTableName.GetString());
  }
}

TEST(BITBroadcasterLoop, RecordParseClearsOnFailureAndReleasesOnReparse) {
  Bytes recordA = kRecordA, badTag = Cat({U8(0x09), Length12(3), Descriptor(0x00, {0x01})});
  Bytes other = Record(0x0A, {SiParameter()});
  RavelCBroadcasterDescriptor record(recordA.data());
  TraceRecorder recorder;
  EXPECT_EQ(kRavelOk, record.ParseRawData(other.data()));
  EXPECT_EQ("id=0x0a len=4", Summary(record));  // another tag releases the held descriptor
  EXPECT_EQ(kRavelErrCorruptSection, record.ParseRawData(badTag.data()));
  EXPECT_EQ("id=0x00 len=0", Summary(record));
  EXPECT_EQ((TraceLines{RecordUnknown(0xD7), {kWarning, Invalid(0x00, 1)}}), recorder.Lines());
  ASSERT_EQ(kRavelOk, record.ParseRawData(recordA.data()));
  EXPECT_EQ(kRavelErrInvalidArgument, record.ParseRawData(nullptr));
  EXPECT_EQ("id=0x00 len=0", Summary(record));
}

TEST(BITMerge, AppendsCopiesOfEveryRecordWithoutComparingAnything) {
  Bytes first = BitSection(BitBody(false, {}, {kRecordA, kRecordB}), 0x7FE1, 3);
  Bytes otherNetwork = BitSection(BitBody(true, {SiParameter()}, {Record(0x05, {ExtBroadcaster(0x0E05)})}), 0x0001, 9);
  RavelCBIT target(first.data());
  std::unique_ptr<RavelCBIT> other(new RavelCBIT(otherNetwork.data()));
  TraceRecorder recorder;
  target += target;  // doubles every record once
  EXPECT_EQ(&target, &(target += *other));  // another network and version mix in
  other.reset();                            // the merged records are copies
  EXPECT_TRUE(recorder.Lines().empty());
  EXPECT_EQ((std::vector<std::string>{kSummaryA, kSummaryB, kSummaryA, kSummaryB, "id=0x05 len=9 ext=0x0e05"}),
            Records(target));
  EXPECT_EQ((std::vector<int>{0x7FE1, 3, 0, 0, 5}), Header(target));
}

TEST(BITCopy, CopiesHeaderFieldsAndEveryRecordDeeply) {
  Bytes section = BitSection(BitBody(true, {SiParameter()}, {kRecordA, kRecordB}), 0x7FE2, 6);
  Bytes other = BitSection(BitBody(false, {}, {Record(0x05, {ExtBroadcaster(0x0E05)})}), 0x0001, 1);
  tc::ExpectCopies<RavelCBIT>(section.data(), other.data(), [](RavelCBIT& t) { t.iSession = 0x11; },
                               [](RavelCBIT& copy, const TraceLines& shown) { EXPECT_EQ(shown, ShowLines(copy)); });
  Bytes record = kRecordB;
  tc::ExpectCopies<RavelCBroadcasterDescriptor>(record.data(), Bytes(kRecordA).data(), [](RavelCBroadcasterDescriptor&) {},
                                                 [](RavelCBroadcasterDescriptor& copy, const TraceLines&) {
                                                   EXPECT_EQ(kSummaryB, Summary(copy));
                                                 });
  // The records are deleted before the copy: a table assigned to itself has none.
  RavelCBIT self(section.data());
  self = self;
  EXPECT_EQ(0, self.GetBroadcasterCount());
  EXPECT_EQ(4, self.GetFirstDescriptorsLength());
}

TEST(BITShow, DumpsBannersHeaderProprietyAndNumberedRecords) {
  Bytes section = BitSection(BitBody(true, {SiParameter()}, {kRecordA, Record(0x2B, {SiParameter()})}), 0x7FE1, 3);
  RavelCBIT bit(section.data());
  const std::string frame = Rule(kLongRule);
  TraceLines expected = Dump({frame, "###################### BIT Table Information ######################\n", frame,
                              "####################### Header Information ########################\n"});
  Add(expected, HeaderLines(0xC4, "BIT", 1, 34, 0x7FE1, 3, 1, 0, 0));
  Add(expected, Dump({frame, "####################### Body Information #######################\n",
                      "Broadcaster View Propriety=[1]\n", "Broadcaster Descriptor Array Size=[2]\n",
                      "##################### Broadcaster Descriptor [0] #####################\n",
                      "\tTS Information : BroadcasterID=[0x0001], BroadcasterDescriptorLen=[0x0009]\n",
                      Banner("Extended Broadcaster Descriptor"), BaseLine(0xCE, 7, "Extended Braodcaster Descriptor"),
                      "\tiBroadcasterType=[0x1], Affiliation ID Nums=[0], Broadcaster ID Nums=[1]\n",
                      "\t\t[0]th Org Network Id=[32737], Broadcaster ID=[5]\n",
                      "##################### Broadcaster Descriptor [1] #####################\n",
                      "\tTS Information : BroadcasterID=[0x002b], BroadcasterDescriptorLen=[0x0004]\n",
                      Rule(kShortRule)}));
  EXPECT_EQ(expected, ShowLines(bit));
}
