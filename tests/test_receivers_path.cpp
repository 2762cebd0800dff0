// The receivers' own path: packets into RavelCTSPktStore, each section taken out
// of RavelCSectionData and parsed straight over the store's buffer (a DSM-CC
// message 8 bytes in). Whatever the lengths in the bytes say, the parse stays
// inside the buffer; under the sanitizers any read beyond it is a failure.
#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "Ravel_CDescriptorExtendedEvent.h"
#include "Ravel_CDescriptorShortEvent.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CReadWindow.h"
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

// An EIT section with `events` events whose descriptor loops hold `descriptors`,
// as broadcast: their lengths may run past the section.
Bytes Eit(uint8_t tableId, int events, const Bytes& descriptors = Bytes()) {
  Bytes body = sb::Cat({sb::U16(0x0421), sb::U16(0x0422), sb::U8(0), sb::U8(tableId)});
  for (int i = 0; i < events; ++i) {
    sb::Append(body, sb::Cat({sb::U16(0x1000 + i), sb::UtcTime(2020, 5, 4, 20, 0, 0), Bytes{0x01, 0x00, 0x00},
                              sb::Length12(static_cast<unsigned int>(descriptors.size()), 0x8), descriptors}));
  }
  sb::SectionOptions options;
  options.tableId = tableId;
  return sb::LongSection(options, body);
}

// The text a descriptor keeps from 200 bytes at `at` in `section`: bytes
// beyond the section read as 0, so the text ends at the first of them.
std::string TextAt(const Bytes& section, const Bytes::const_iterator& at) {
  Bytes text(at, at + std::min<size_t>(200, static_cast<size_t>(section.end() - at)));
  return std::string(text.begin(), std::find(text.begin(), text.end(), 0));
}

}  // namespace

// A section handed out under a size shorter than its header declares (a stale
// size) gets a buffer of the declared length, so that its parse stays inside.
TEST(ReceiversPath, SectionBuffersOwnTheLengthTheirHeaderDeclares) {
  struct Case {
    const char* what;
    Bytes bytes;
    int size, owned;
  } cases[] = {
      {/*what=*/"two bytes declare nothing", /*bytes=*/{0x42, 0xF0}, /*size=*/2, /*owned=*/2},
      {"three bytes declaring 5 more", {0x42, 0xF0, 0x05}, 3, 8},
      {"a size above the declared one stays", {0x42, 0xF0, 0x01, 0x00, 0x00, 0x00}, 6, 6},
  };
  for (const Case& c : cases) EXPECT_EQ(c.owned, RavelCReadWindow::OwnedSize(c.bytes.data(), c.size)) << c.what;
}

// A parse inside another's window (a message inside its section) may not read
// further than the outer window, whatever its own header declares.
TEST(ReceiversPath, AWindowOpenedInsideAnotherKeepsTheNearerEnd) {
  const Bytes section = {0x42, 0xF0, 0x09, 1, 2, 3, 4, 5, 6, 7, 8, 9};  // declares all 12 bytes
  RavelCReadWindow outer(section.data(), section.data() + 6);
  {
    RavelCReadWindow inner(section.data());
    EXPECT_EQ(3, RavelCReadWindow::Readable(section.data() + 3, 9));
  }
  EXPECT_EQ(0, RavelCReadWindow::Readable(section.data() + 6, 1));
}

// The store's buffer goes on after a section with what followed it; a field cut
// by the section end reads zeros for its missing bytes, not those.
TEST(ReceiversPath, AFieldCutByTheSectionEndReadsZerosForItsMissingBytes) {
  // A carousel section whose section_length (11) ends halfway through the
  // message's transactionId (bytes 12 to 15).
  const Bytes buffer = {0x3C, 0xB0, 0x0B, 0x00, 0x07, 0xC1, 0x00, 0x00, 0x11, 0x03, 0x10, 0x03,
                        0xAA, 0xBB, 0xCC, 0xDD, 0xFF, 0x00, 0x00, 0x20};
  TraceRecorder quiet;
  RavelCDsmccBase header(MessageOf(const_cast<unsigned char*>(buffer.data())));
  EXPECT_EQ(0xAABB0000u, header.GetTransactionId());
  EXPECT_EQ(0, header.GetMessageLength());
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

TEST(ReceiversPath, DescriptorsRunningPastTheirSectionReadZerosThereAndStopTheirLoops) {
  const Bytes name = sb::Text("Jornal");  // the last bytes of the descriptor in the section
  struct Case {
    const char* what;
    Bytes descriptors;  // the last one declares more than the section holds
    const char* (*keptText)(RavelCEventInfo& event);   // the text that starts with `name`
    const char* (*textAfter)(RavelCEventInfo& event);  // the next text, whose length lies beyond
  } cases[] = {
      {/*what=*/"short event: event_name_length 200",
       /*descriptors=*/sb::Cat({Bytes{0x4D, 0xF0}, sb::Text("por"), sb::U8(200), name}),
       /*keptText=*/[](RavelCEventInfo& e) { return e.pShortEventDescriptor->GetEventName(); },
       /*textAfter=*/[](RavelCEventInfo& e) { return e.pShortEventDescriptor->GetEventDescription(); }},
      {/*what=*/"extended event: an item of 200 bytes in an item loop of 250, which stops after it",
       /*descriptors=*/
       sb::Cat({Bytes{0x4E, 0xF0, 0x01}, sb::Text("por"), sb::U8(250), sb::U8(1), sb::Text("A"), sb::U8(200), name}),
       /*keptText=*/
       [](RavelCEventInfo& e) {
         RavelCExtendedEventDescriptor* d = e.pExtendedEventDescriptor;
         return d->GetNumOfItems() == 1 ? d->GetItem(0)->GetItem() : "(not one item)";
       },
       /*textAfter=*/[](RavelCEventInfo& e) { return e.pExtendedEventDescriptor->GetText(); }},
  };
  for (const Case& c : cases) {
    Bytes section = Eit(0x4E, 1, c.descriptors);
    Records records = AssembleSections({section});
    ASSERT_EQ(1u, records.size()) << c.what;
    ASSERT_EQ(static_cast<int>(section.size()), records[0]->iSectionSize[0]) << c.what;
    TraceRecorder recorder;
    RavelCEIT eit(records[0]->pSection[0]);
    ASSERT_EQ(1, eit.GetEventCount()) << c.what;
    // The text takes the section's last bytes (its CRC_32), then zeros.
    Bytes::const_iterator textStart = std::search(section.begin(), section.end(), name.begin(), name.end());
    EXPECT_EQ(TextAt(section, textStart), c.keptText(*eit.GetEventInfo(0))) << c.what;
    EXPECT_STREQ("", c.textAfter(*eit.GetEventInfo(0))) << c.what;
    RavelCEIT copy(eit);
    copy.Show();
  }
}
