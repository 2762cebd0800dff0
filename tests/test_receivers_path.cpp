// The receivers' own path: packets into RavelCTSPktStore, each section taken out
// of RavelCSectionData and parsed straight over the store's buffer (a DSM-CC
// message 8 bytes in). Whatever the lengths in the bytes say, the parse stays
// inside the buffer; under the sanitizers any read beyond it is a failure.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "Captures.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CTSPktAssembler.h"
#include "Ravel_CTableEIT.h"
#include "Ravel_CTableTOT.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

namespace {

const uint16_t kPid = 0x0100;

// The records the store fills, one per packet, as a receiver keeps them.
typedef std::vector<std::unique_ptr<RavelCSectionData> > Records;

Records Assemble(const std::vector<Bytes>& packets) {
  Records records;
  RavelCTSPktStore store;
  for (const Bytes& packet : packets) {
    std::unique_ptr<RavelCSectionData> out(new RavelCSectionData());
    if (store.AddTSPacket(packet.data(), *out) != 0) records.push_back(std::move(out));
  }
  return records;
}

Records AssembleSections(const std::vector<Bytes>& sections) {
  sb::PacketWriter writer(kPid);
  writer.AddPackedSections(sections);
  return Assemble(writer.Packets());
}

unsigned char* MessageOf(unsigned char* section) { return section + 8; }

// One EIT event without descriptors: event_id, start time, duration, status and loop length.
Bytes Event(unsigned int id) {
  return sb::Cat({sb::U16(id), sb::UtcTime(2020, 5, 4, 20, 0, 0), Bytes{0x01, 0x00, 0x00}, sb::Length12(0, 0x8)});
}

Bytes Eit(uint8_t tableId, int events) {
  Bytes body = sb::Cat({sb::U16(0x0421), sb::U16(0x0422), sb::U8(0), sb::U8(tableId)});
  for (int i = 0; i < events; ++i) sb::Append(body, Event(0x1000 + i));
  sb::SectionOptions options;
  options.tableId = tableId;
  return sb::LongSection(options, body);
}

}  // namespace

TEST(ReceiversPath, ObjectCarouselDiiParsesOverTheStoreBuffer) {
  Bytes stream;
  RAVEL_LOAD_CAPTURE_OR_SKIP("object-carousel.ts", stream);
  Records records = Assemble(captures::PacketsOfPid(stream, 0x076A));
  int diiCount = 0;
  for (const std::unique_ptr<RavelCSectionData>& record : records) {
    for (int i = 0; i < record->iSectionCount; ++i) {
      unsigned char* section = record->pSection[i];
      if (section[0] != 0x3B || section[10] != 0x10 || section[11] != 0x02) continue;
      TraceRecorder recorder;
      RavelCDsmccDII dii(MessageOf(section));
      ASSERT_EQ(3, dii.GetNumberOfModules());
      for (int m = 0; m < 3; ++m) EXPECT_EQ(28, dii.GetModuleInfo(m)->GetModuleInfoLength());
      RavelCDsmccDII copy(dii);
      copy.Show();
      ++diiCount;
    }
  }
  EXPECT_GT(diiCount, 0);
}

TEST(ReceiversPath, TotLoopLongerThanItsSectionStopsAtTheSectionEnd) {
  // No CRC_32 check protects the TOT: a loop length of 0xFFF in 14 bytes.
  Bytes section =
      sb::ShortSection(0x73, sb::Cat({sb::UtcTime(2021, 7, 1, 12, 30, 15), sb::Length12(0xFFF)}), true);
  ASSERT_EQ(14u, section.size());
  Records records = AssembleSections({section});
  ASSERT_EQ(1u, records.size());
  ASSERT_EQ(14, records[0]->iSectionSize[0]);
  TraceRecorder recorder;
  RavelCTOT tot(records[0]->pSection[0]);
  EXPECT_EQ(0xFFF, tot.iDescriptorsLoopLength);
  EXPECT_EQ(2021, tot.iYear);
  EXPECT_EQ(15, tot.iSecond);
  RavelCTOT copy(tot);
  copy.Show();
}

TEST(ReceiversPath, DdbBlockBeyondItsSectionReadsAsZeros) {
  // messageLength 4072 says a block of 4066 bytes; the 30-byte section ends
  // with the 4 CRC_32 bytes right after the block header.
  Bytes message = sb::Cat({Bytes{0x11, 0x03}, sb::U16(0x1003), sb::U32(0xAB), Bytes{0xFF, 0x00}, sb::U16(4072),
                           sb::U16(0x0002), Bytes{0x07, 0xFF}, sb::U16(5)});
  sb::SectionOptions options;
  options.tableId = 0x3C;
  Bytes section = sb::LongSection(options, message);
  ASSERT_EQ(30u, section.size());
  Records records = AssembleSections({section});
  ASSERT_EQ(1u, records.size());
  RavelCDsmccDDB ddb(MessageOf(records[0]->pSection[0]));
  ASSERT_EQ(4066, ddb.GetBlockDataLen());
  Bytes expected(section.end() - 4, section.end());
  expected.resize(4066, 0x00);
  EXPECT_EQ(expected, Bytes(ddb.GetBlockData(), ddb.GetBlockData() + ddb.GetBlockDataLen()));
}

TEST(ReceiversPath, SectionHandedOutWithTheSizeOfTheOneBeforeFailsItsCrcInsideItsBuffer) {
  // The schedule section starts in the packet where the short one ends, so the
  // store hands it out under the short section's size, before all of it came.
  Bytes presentFollowing = Eit(0x4E, 1);
  Bytes schedule = Eit(0x50, 60);
  Records records = AssembleSections({presentFollowing, schedule});
  ASSERT_EQ(2u, records.size());
  ASSERT_EQ(1, records[1]->iSectionCount);
  EXPECT_EQ(static_cast<int>(presentFollowing.size()), records[1]->iSectionSize[0]);
  EXPECT_EQ(0x50, records[1]->pSection[0][0]);

  RavelCEIT first(records[0]->pSection[0]);
  EXPECT_EQ(1, first.GetEventCount());
  RavelCSectionData copy(*records[1]);
  for (unsigned char* section : {records[1]->pSection[0], copy.pSection[0]}) {
    TraceRecorder recorder;
    RavelCEIT eit(nullptr);
    EXPECT_EQ(kRavelErrCorruptSection, eit.ParseRawData(section));
    EXPECT_EQ(std::vector<std::string>{"EIT Section: CRC Error!\n"}, recorder.TextsAt(th::kWarning));
  }
}
