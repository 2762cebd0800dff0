// The committed sample capture of a Brazilian one-segment service
// (samples/oneseg-brazil.ts): its packets, every section assembled by the
// library's store and parsed by the class of its table_id, the values as they
// were broadcast, and a fresh run of its generator giving the same bytes.
#include <gtest/gtest.h>

#include <cstring>
#include <fstream>
#include <iterator>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "Ravel_ByteOrder.h"
#include "Ravel_CDescriptorAudioComponent.h"
#include "Ravel_CDescriptorComponent.h"
#include "Ravel_CDescriptorContent.h"
#include "Ravel_CDescriptorLocalTimeOffset.h"
#include "Ravel_CDescriptorShortEvent.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CPCR.h"
#include "Ravel_CTSPktAssembler.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_CTableBIT.h"
#include "Ravel_CTableEIT.h"
#include "Ravel_CTableNIT.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTablePMT.h"
#include "Ravel_CTableSDT.h"
#include "Ravel_CTableStreamEventDescriptor.h"
#include "Ravel_CTableTDT.h"
#include "Ravel_CTableTOT.h"
#include "Ravel_Cfg.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Util.h"
#include "SampleStream.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

namespace {

using th::kCarouselWarning;
using th::kWarning;
const unsigned int kBitLoop = th::kBit;

const char kSampleFile[] = RAVEL_SAMPLES_DIR "/oneseg-brazil.ts";

// The PIDs that carry sections, each fed to a store of its own.
const int kSectionPids[] = {0x0000, 0x0010, 0x0011, 0x0014, 0x0024, 0x0027, 0x0188, 0x018A, 0x018B, 0x1FC8};

Bytes LoadSample() {
  std::ifstream in(kSampleFile, std::ios::binary);
  return Bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
}

struct Assembled {
  std::map<int, std::vector<Bytes> > sections;  // by PID, in arrival order
  TraceLines trace;
  int heldSizeMismatches = 0;
  int storesLeftCollecting = 0;
};

// Feeds every packet of the section PIDs to one RavelCTSPktStore per PID, with
// a fresh output record per packet, as a receiver does.
Assembled Assemble(const Bytes& capture) {
  Assembled result;
  std::map<int, std::unique_ptr<RavelCTSPktStore> > stores;
  for (int pid : kSectionPids) stores[pid].reset(new RavelCTSPktStore);
  TraceRecorder recorder;
  for (size_t at = 0; at + 188 <= capture.size(); at += 188) {
    unsigned char packet[188];
    std::memcpy(packet, &capture[at], 188);
    int pid = ((packet[1] & 0x1F) << 8) | packet[2];
    std::map<int, std::unique_ptr<RavelCTSPktStore> >::iterator store = stores.find(pid);
    if (store == stores.end()) continue;
    RavelCSectionData out;
    int complete = store->second->AddTSPacket(packet, out);
    EXPECT_EQ(out.iSectionCount > 0 ? 1 : 0, complete);
    for (int i = 0; i < out.iSectionCount; ++i) {
      if (RavelSectionSize(out.pSection[i]) != out.iSectionSize[i]) ++result.heldSizeMismatches;
      result.sections[pid].push_back(Bytes(out.pSection[i], out.pSection[i] + out.iSectionSize[i]));
    }
  }
  for (const auto& store : stores) {
    if (store.second->iPacketArray.iCount != 0) ++result.storesLeftCollecting;
  }
  result.trace = recorder.Lines();
  return result;
}

const Assembled& SampleSections() {
  static const Assembled assembled = Assemble(LoadSample());
  return assembled;
}

Bytes SectionOf(int pid, size_t index) {
  const std::vector<Bytes>& list = SampleSections().sections.at(pid);
  return index < list.size() ? list[index] : Bytes();
}

// The AIT traces the section's address; only its place in the text is compared.
std::string WithoutAddress(const std::string& text) {
  std::string::size_type open = text.find("apRawData=[");
  if (open == std::string::npos) return text;
  std::string::size_type close = text.find(']', open);
  return text.substr(0, open) + "apRawData=[ADDRESS" + text.substr(close);
}

struct ParseOutcome {
  int result;
  TraceLines trace;
};

// Parses `data` with a T built empty first, so that the trace is that of the parse alone.
template <class T, class... Args>
ParseOutcome ParseWith(unsigned char* data, Args... args) {
  T object(args...);
  TraceRecorder recorder;
  ParseOutcome outcome = {object.ParseRawData(data), TraceLines()};
  for (const auto& line : recorder.Lines()) outcome.trace.push_back({line.first, WithoutAddress(line.second)});
  return outcome;
}

// Parses one section with the library class of its table_id (for DSM-CC
// sections, of its message id, over the message after the section header).
ParseOutcome ParseByTableId(Bytes section) {
  unsigned char* s = section.data();
  unsigned char* message = s + 8;
  switch (s[0]) {
    case 0x00: return ParseWith<RavelCPAT>(s, nullptr);
    case 0x02: return ParseWith<RavelCPMT>(s, nullptr);
    case 0x40: return ParseWith<RavelCNIT>(s, nullptr);
    case 0x42: return ParseWith<RavelCSDT>(s, nullptr);
    case 0x4E: return ParseWith<RavelCEIT>(s, nullptr);
    case 0x70: return ParseWith<RavelCTDT>(s, nullptr);
    case 0x73: return ParseWith<RavelCTOT>(s, nullptr);
    case 0x74: return ParseWith<RavelCAIT>(s);
    case 0xC4: return ParseWith<RavelCBIT>(s, nullptr);
    case 0x3D: return ParseWith<RavelCDsmccStreamEvent>(s, nullptr);
    case 0x3B:
    case 0x3C:
      // The message classes do not look at the section's CRC_32.
      EXPECT_NE(0, RavelUtil_CheckSectionCRC32(s));
      switch (RavelRead16(message + 2)) {
        case RAVEL_DSMCC_MSG_DSI: return ParseWith<RavelCDsmccDSI>(message, nullptr);
        case RAVEL_DSMCC_MSG_DII: return ParseWith<RavelCDsmccDII>(message, nullptr);
        case RAVEL_DSMCC_MSG_DDB: return ParseWith<RavelCDsmccDDB>(message, nullptr);
      }
  }
  return ParseOutcome{kRavelErrInvalidArgument, TraceLines()};
}

const TraceLines kQuiet;
const TraceLines kBitTrace = {{kBitLoop, "First Descriptor Loop.. Unkown Descriptor Tag=[0xd7]\n"},
                              {kWarning, "BIT BroadcasterDescriptor Parsing.. Unkown Descriptor Tag=[0xd8]\n"}};
const TraceLines kAitTrace = {{kWarning, "RavelCAIT::ParseRawData... apRawData=[ADDRESS]\n"},
                              {kWarning, "RavelCAIT::processDescriptors...\n"},
                              {kWarning, "Detected an APPLICATION_DESCRIPTOR"},
                              {kWarning, "RavelCAIT::processDescriptors...\n"},
                              {kWarning, "Detected an APPLICATION_NAME_DESCRIPTOR"},
                              {kWarning, "Application name = Exemplo"},
                              {kWarning, "RavelCAIT::processDescriptors...\n"},
                              {kWarning, "Detected an APPLICATION_TRANSP_PROT_DESCRIPTOR"},
                              {kWarning, "RavelCAIT::processDescriptors...\n"},
                              {kWarning, "Detected an APPLICATION_GINGA_APP_LOCATION_DESCRIPTOR"},
                              {kWarning, "Application path = /exemplo"},
                              {kWarning, "Application filename = main.ncl"}};
const TraceLines kDsiTrace = {{kCarouselWarning, "RavelCDsmccDSI::ParseRawData... \n"},
                              {kCarouselWarning, "Private data length [16]\n"}};
// The table builds its NPT reference empty before parsing into it, and the
// empty construction reports the null argument at the error level.
const TraceLines kStreamEventTrace = {{0x80000020u, "Invalid Argument!\n"}};
const TraceLines kPresentEitTrace = {{kWarning, "raw genre = 0x0!\n"}};
const TraceLines kFollowingEitTrace = {{kWarning, "raw genre = 0x30!\n"}};

// The carousel's blocks: module 1 (3000 bytes) in blocks 0 to 2, module 2
// (500 bytes) in block 0.
Bytes Ddb(uint16_t moduleId, unsigned int block) {
  for (const Bytes& s : SampleSections().sections.at(0x018A)) {
    if (s[0] == 0x3C && RavelRead16(&s[3]) == moduleId && s[6] == block) return s;
  }
  return Bytes();
}

std::string Text(const char* text) { return text != nullptr ? std::string(text) : std::string("(null)"); }

}  // namespace

TEST(SampleCapture, PacketsAreWholeAndCountOnWithoutBreakOnEveryPid) {
  Bytes capture = LoadSample();
  ASSERT_FALSE(capture.empty()) << kSampleFile << " is missing";
  ASSERT_EQ(0u, capture.size() % 188);
  EXPECT_LT(capture.size(), 100u * 1024);

  struct PidCount {
    int pid;
    int packets;
  } expected[] = {{0x0000, 4},  {0x0010, 3},  {0x0011, 3}, {0x0014, 2}, {0x0024, 1},
                  {0x0027, 4},  {0x0181, 48}, {0x0183, 16}, {0x0188, 2}, {0x018A, 46},
                  {0x018B, 2},  {0x1FC8, 4},  {0x1FFF, 8}};
  std::map<int, int> packets;
  std::map<int, int> lastCounter;
  int breaks = 0;
  for (size_t at = 0; at < capture.size(); at += 188) {
    const uint8_t* p = &capture[at];
    ASSERT_EQ(0x47, p[0]) << "packet " << at / 188;
    EXPECT_EQ(0, p[1] & 0x80) << "transport_error_indicator, packet " << at / 188;
    EXPECT_EQ(0, p[3] & 0xC0) << "scrambling, packet " << at / 188;
    int pid = ((p[1] & 0x1F) << 8) | p[2];
    ++packets[pid];
    if (pid == 0x1FFF || !(p[3] & 0x10)) continue;
    int counter = p[3] & 0x0F;
    if (lastCounter.count(pid) && counter != ((lastCounter[pid] + 1) & 0x0F)) ++breaks;
    lastCounter[pid] = counter;
  }
  EXPECT_EQ(0, breaks);
  std::map<int, int> wanted;
  for (const PidCount& c : expected) wanted[c.pid] = c.packets;
  EXPECT_EQ(wanted, packets);
}

TEST(SampleCapture, EverySectionAssemblesAndParsesWithTheClassOfItsTableId) {
  th::StandardScope brazil;
  const Assembled& assembled = SampleSections();
  EXPECT_EQ(TraceLines(), assembled.trace) << "the store reported trouble";
  EXPECT_EQ(0, assembled.heldSizeMismatches);
  EXPECT_EQ(0, assembled.storesLeftCollecting);

  struct Expected {
    uint8_t tableId;
    const TraceLines* trace;
  };
  const Expected dsi = {0x3B, &kDsiTrace}, dii = {0x3B, &kQuiet}, ddb = {0x3C, &kQuiet};
  struct PidSections {
    int pid;
    std::vector<Expected> sections;
  } cases[] = {
      {0x0000, std::vector<Expected>(4, Expected{0x00, &kQuiet})},
      {0x1FC8, std::vector<Expected>(4, Expected{0x02, &kQuiet})},
      {0x0010, std::vector<Expected>(3, Expected{0x40, &kQuiet})},
      {0x0011, std::vector<Expected>(3, Expected{0x42, &kQuiet})},
      {0x0027, {{0x4E, &kPresentEitTrace}, {0x4E, &kFollowingEitTrace}, {0x4E, &kPresentEitTrace},
        {0x4E, &kFollowingEitTrace}}},
      {0x0014, {{0x70, &kQuiet}, {0x73, &kQuiet}}}, {0x0024, {{0xC4, &kBitTrace}}},
      {0x0188, std::vector<Expected>(2, Expected{0x74, &kAitTrace})},
      {0x018A, {dsi, dii, ddb, ddb, ddb, ddb, dsi, dii, ddb, ddb, ddb, ddb}},
      {0x018B, std::vector<Expected>(2, Expected{0x3D, &kStreamEventTrace})},
  };
  size_t pidsWithSections = 0;
  for (const PidSections& c : cases) {
    SCOPED_TRACE(c.pid);
    ASSERT_EQ(1u, assembled.sections.count(c.pid));
    ++pidsWithSections;
    const std::vector<Bytes>& sections = assembled.sections.at(c.pid);
    ASSERT_EQ(c.sections.size(), sections.size());
    for (size_t i = 0; i < sections.size(); ++i) {
      SCOPED_TRACE(i);
      EXPECT_EQ(c.sections[i].tableId, sections[i][0]);
      ParseOutcome outcome = ParseByTableId(sections[i]);
      EXPECT_EQ(kRavelOk, outcome.result);
      EXPECT_EQ(*c.sections[i].trace, outcome.trace);
    }
  }
  EXPECT_EQ(pidsWithSections, assembled.sections.size());
}

TEST(SampleCapture, PatAndPmtGiveTheOneSegmentServicesStreams) {
  th::StandardScope brazil;
  Bytes patSection = SectionOf(0x0000, 0);
  RavelCPAT pat(patSection.data());
  EXPECT_EQ(0x0010, pat.GetNetworkPID());
  ASSERT_EQ(2, pat.GetProgramCount());
  EXPECT_EQ((std::vector<int>{0xE760, 0x01F0, 0xE778, 0x1FC8}),
            (std::vector<int>{pat.GetPMTInfo(0)->GetProgramNumber(), pat.GetPMTInfo(0)->GetPID(),
                              pat.GetPMTInfo(1)->GetProgramNumber(), pat.GetPMTInfo(1)->GetPID()}));
  Bytes section = SectionOf(0x1FC8, 0);
  RavelCPMT pmt(section.data());
  EXPECT_EQ((std::vector<int>{0xE778, 0x0181, 0x0181, 1, 0x0183, 0x0187}),
            (std::vector<int>{pmt.iTableIdExtension, pmt.GetPCRPID(), pmt.GetVideoPID(), pmt.GetAudioPIDCount(),
                              pmt.GetAudioPID(0), pmt.GetCCPID()}));
  ASSERT_NE(nullptr, pmt.GetParentalRating());
  RavelCParentalRating* rating = pmt.GetParentalRating()->GetParentalRating(0);
  EXPECT_STREQ("BRA", rating->GetCountryCode());
  EXPECT_EQ(12, rating->GetMinimumAge());
  // type, PID, component tag, data component id (-1: none)
  const std::vector<std::vector<int>> streams = {{0x1B, 0x0181, 0x81, -1},     {0x11, 0x0183, 0x83, -1},
                                                 {0x06, 0x0187, 0x87, 0x0008}, {0x05, 0x0188, 0x88, 0x00A0},
                                                 {0x0B, 0x018A, 0x8A, 0x00A0}, {0x0C, 0x018B, 0x8B, 0x00A0}};
  ASSERT_EQ(6, pmt.GetMapInfoCount());
  for (int i = 0; i < 6; ++i) {
    RavelCMapInfo* info = pmt.GetMapInfo(i);
    ASSERT_NE(nullptr, info->GetStreamIdentifier());
    EXPECT_EQ(streams[i], (std::vector<int>{info->GetStreamType(), info->GetElementaryPID(),
                                            info->GetStreamIdentifier()->GetComponentTag(),
                                            info->GetDataComponent() ? info->GetDataComponent()->GetDataComponentId() : -1}));
  }
}

TEST(SampleCapture, NitDescribesTheChannelItsServicesAndThePartialReception) {
  th::StandardScope brazil;
  Bytes section = SectionOf(0x0010, 0);
  RavelCNIT nit(section.data());
  EXPECT_EQ("NIT Actual", std::string(nit.sTableName.GetString()));
  EXPECT_EQ(0x0640, nit.iTableIdExtension);
  ASSERT_NE(nullptr, nit.GetNetworkName());
  EXPECT_STREQ("Rede Exemplo", nit.GetNetworkName()->GetNetworkName());
  ASSERT_NE(nullptr, nit.GetSystemManagement());
  // Flag and identifier both come from the low bits of the same byte (0x03).
  EXPECT_EQ(0x03, nit.GetSystemManagement()->GetBroadcastingFlag());
  EXPECT_EQ(0x03, nit.GetSystemManagement()->GetBroadcastingIdentifier());
  EXPECT_EQ(0x01, nit.GetSystemManagement()->GetAdditionalBroadcastingIdentification());
  EXPECT_EQ(nullptr, nit.GetLinkage());

  ASSERT_EQ(1, nit.GetTSInfoCount());
  RavelCTSInfo* ts = nit.GetTSInfo(0);
  EXPECT_EQ(0x0640, ts->GetTransportStreamId());
  ASSERT_NE(nullptr, ts->GetServiceList());
  ASSERT_EQ(2, ts->GetServiceList()->GetServiceCount());
  unsigned short id = 0, type = 0;
  ts->GetServiceList()->GetServiceInfo(1, id, type);
  EXPECT_EQ(0xE778, id);
  EXPECT_EQ(0xC0, type);
  RavelCTSInformationDescriptor* info = ts->GetTSInformation();
  ASSERT_NE(nullptr, info);
  EXPECT_STREQ("Exemplo SP", info->GetTsName());
  ASSERT_EQ(2, info->GetTransmissionTypeCount());
  EXPECT_EQ(0xAF, info->GetTxType(1)->GetTransmissionTypeInfo());
  EXPECT_EQ(0xE778, info->GetTxType(1)->GetServiceId(0));

  // The partial reception list keeps the high byte of each service id.
  ASSERT_NE(nullptr, ts->GetPartialReception());
  ASSERT_EQ(1, ts->GetPartialReception()->GetServiceIdCount());
  EXPECT_EQ(0xE7, ts->GetPartialReception()->GetServiceId(0));

  RavelCTerrDeliverySystemDescriptor* delivery = ts->GetTerrDeliverySystem();
  ASSERT_NE(nullptr, delivery);
  EXPECT_EQ(0xA3D, delivery->GetAreaCode());  // state 20, micro-region 61
  ASSERT_EQ(1, delivery->GetFrequencyCount());
  EXPECT_EQ(3732, delivery->GetFrequency(0));  // (533 + 1/7 MHz) x 7
  EXPECT_EQ(3, delivery->GetRegionId());
}

TEST(SampleCapture, SdtNamesBothServicesInBroadcastBytes) {
  Bytes section = SectionOf(0x0011, 0);
  RavelCSDT sdt(section.data());
  EXPECT_EQ(0x0006, sdt.GetOriginalNetworkId());  // byte 8 alone
  struct Service {
    uint16_t id;
    uint8_t schedule, type;
    const char* name;
  } services[] = {{0xE760, 1, 0x01, "Exemplo HD"}, {0xE778, 0, 0xC0, "Exemplo S\xE3o Paulo"}};
  ASSERT_EQ(2, sdt.GetServiceCount());
  for (int i = 0; i < 2; ++i) {
    RavelCServiceDescription* s = sdt.GetServiceDescription(i);
    EXPECT_EQ((std::vector<int>{services[i].id, services[i].schedule, 1, 4, 0, services[i].type}),
              (std::vector<int>{s->GetServiceId(), s->GetEITScheduleFlag(), s->GetEITPresentFollowingFlag(),
                                s->GetRunningStatus(), s->GetFreeCAMode(), s->GetService()->GetServiceType()}));
    EXPECT_EQ("Rede Exemplo", Text(s->GetService()->GetServiceProviderName()));
    EXPECT_EQ(services[i].name, Text(s->GetService()->GetServiceName()));
    EXPECT_EQ(i == 1, s->GetLogoTransmission() != nullptr);
  }
  EXPECT_EQ(3, sdt.GetServiceDescription(1)->GetLogoTransmission()->GetLogoVersion());
}

TEST(SampleCapture, EitCarriesThePresentAndFollowingEventsOfTheOneSegmentService) {
  th::StandardScope brazil;
  Bytes first = SectionOf(0x0027, 0);
  Bytes second = SectionOf(0x0027, 1);
  RavelCEIT eit(first.data());
  RavelCEIT following(second.data());
  EXPECT_EQ("EIT Actual", std::string(eit.sTableName.GetString()));
  EXPECT_EQ(0xE778, eit.iTableIdExtension);
  EXPECT_EQ(0, eit.iSectionNumber);
  EXPECT_EQ(1, following.iSectionNumber);
  EXPECT_EQ(0x0640, eit.iTransportStreamId);
  eit += following;

  struct Event {
    uint16_t id;
    int hour, durationHour, durationMinute;
    uint8_t running;
    const char* name;
    const char* text;
    uint8_t ratingContent, minimumAge, genre;
  } events[] = {
      {0x3A21, 19, 1, 0, 4, "Jornal Exemplo", "Not\xED" "cias de S\xE3o Paulo e do Brasil", 2, 12, 0x00},
      {0x3A22, 20, 1, 15, 1, "Novela Exemplo", "Cap\xEDtulo 42", 0, 14, 0x30},
  };
  ASSERT_EQ(2, eit.GetEventCount());
  for (int i = 0; i < 2; ++i) {
    SCOPED_TRACE(i);
    RavelCEventInfo* e = eit.GetEventInfo(i);
    EXPECT_EQ(events[i].id, e->iEventId);
    EXPECT_EQ((std::vector<int>{2024, 5, 14, events[i].hour, 0, 0}), th::DateOf(e->cStartTime));
    EXPECT_EQ(events[i].durationHour, e->iDurationHour);
    EXPECT_EQ(events[i].durationMinute, e->iDurationMinute);
    EXPECT_EQ(events[i].running, e->iRunningStatus);
    ASSERT_NE(nullptr, e->pShortEventDescriptor);
    EXPECT_STREQ("por", e->pShortEventDescriptor->GetLanguageCode());
    EXPECT_EQ(events[i].name, Text(e->pShortEventDescriptor->GetEventName()));
    EXPECT_EQ(events[i].text, Text(e->pShortEventDescriptor->GetEventDescription()));
    ASSERT_NE(nullptr, e->pParentalRatingDescriptor);
    ASSERT_EQ(1, e->pParentalRatingDescriptor->GetNumOfParentalRatings());
    EXPECT_EQ(events[i].ratingContent, e->pParentalRatingDescriptor->GetParentalRating(0)->GetContent());
    EXPECT_EQ(events[i].minimumAge, e->pParentalRatingDescriptor->GetParentalRating(0)->GetMinimumAge());
    ASSERT_NE(nullptr, e->pComponentDescriptor);
    EXPECT_EQ(0x81, e->pComponentDescriptor->GetComponentTag());
    ASSERT_EQ(1, e->GetAudioComponentCount());
    EXPECT_EQ(0x83, e->GetAudioComponent(0)->GetComponentTag());
    ASSERT_NE(nullptr, e->pContentDescriptor);
    ASSERT_EQ(1, e->pContentDescriptor->GetGenreCount());
    unsigned char level1 = 0xFF, level2 = 0xFF;
    e->pContentDescriptor->GetGenre(0, level1, level2);
    EXPECT_EQ(events[i].genre >> 4, level1);
    EXPECT_EQ(events[i].genre & 0x0F, level2);
  }
}

TEST(SampleCapture, TimeBroadcasterAndApplicationTables) {
  Bytes tdtSection = SectionOf(0x0014, 0);
  Bytes totSection = SectionOf(0x0014, 1);
  RavelCTDT tdt(tdtSection.data());
  RavelCTOT tot(totSection.data());
  EXPECT_EQ((std::vector<int>{2024, 5, 14, 22, 30, 0}),
            (std::vector<int>{tdt.iYear, tdt.iMonth, tdt.iDay, tdt.iHour, tdt.iMinute, tdt.iSecond}));
  EXPECT_EQ((std::vector<int>{2024, 5, 14, 22, 30, 1}),
            (std::vector<int>{tot.iYear, tot.iMonth, tot.iDay, tot.iHour, tot.iMinute, tot.iSecond}));
  ASSERT_NE(nullptr, tot.pLocalTimeOffsetDescriptor);
  RavelCLocalTimeOffset* offset = tot.pLocalTimeOffsetDescriptor->GetLocalTimeOffset("bra", 3);
  ASSERT_NE(nullptr, offset);
  EXPECT_EQ((std::vector<int>{1, 3, 0, 2, 0}),
            (std::vector<int>{offset->GetLocalTimeOffsetPolarity(), offset->GetLocalTimeOffsetHour(),
                              offset->GetLocalTimeOffsetMinute(), offset->GetNextTimeOffsetHour(),
                              offset->GetNextTimeOffsetMinute()}));
  EXPECT_EQ((std::vector<int>{2024, 11, 3, 3, 0, 0}), th::DateOf(offset->cTimeOfChange));

  // The BIT keeps the extended broadcaster of its first record only.
  Bytes bitSection = SectionOf(0x0024, 0);
  RavelCBIT bit(bitSection.data());
  EXPECT_EQ((std::vector<int>{0x0640, 1, 15, 2}), (std::vector<int>{bit.iTableIdExtension, bit.GetBroadcasterViewPropriety(),
                                                                    bit.GetFirstDescriptorsLength(), bit.GetBroadcasterCount()}));
  EXPECT_EQ(nullptr, bit.GetBroadcaster(1)->GetExtendedBroadcaster());
  RavelCExtendedBroadcasterDescriptor* extended = bit.GetBroadcaster(0)->GetExtendedBroadcaster();
  ASSERT_NE(nullptr, extended);
  EXPECT_EQ((std::vector<int>{1, 0x0001, 1, 0x01, 1, 0x0640, 0x01}),
            (std::vector<int>{extended->GetBroadcasterType(), extended->GetTerrestrialBroadcasterId(),
                              extended->GetNumberOfAffiliationIds(), extended->GetAffiliationId(0),
                              extended->GetNumberOfBroadcasterIds(), extended->GetOriginalNetworkId(0),
                              extended->GetBroadcasterId(0)}));

  // The AIT signals the Ginga-NCL application and its entry document.
  Bytes aitSection = SectionOf(0x0188, 0);
  RavelCAIT ait;
  ASSERT_EQ(kRavelOk, ait.ParseRawData(aitSection.data()));
  EXPECT_EQ(0x0009, ait.iTableIdExtension);  // Ginga-NCL
  ASSERT_EQ(1, ait.GetApplicationList()->iCount);
  const GingaAITApplicationType& app = ait.GetApplicationList()->ipArray[0];
  EXPECT_EQ((std::vector<unsigned int>{0x0640, 0x0001, 0x01 /* AUTOSTART */, 1}),
            (std::vector<unsigned int>{app.iOrganizationId, app.iApplicationId, app.iApplicationControlCode,
                                       static_cast<unsigned int>(app.iDocumentResolution)}));
  EXPECT_EQ("Exemplo /exemplo main.ncl",
            std::string(app.szAppName) + " " + app.szAppFilePath + " " + app.szAppFileName);
}

TEST(SampleCapture, CarouselModulesRebuildFromTheirBlocksAndMatchTheirCrc) {
  Bytes dsiSection = SectionOf(0x018A, 0);
  RavelCDsmccDSI dsi(dsiSection.data() + 8);
  EXPECT_EQ(0x80000000u, dsi.GetTransactionId());
  RavelCNASP& nasp = dsi.GetNASP();
  EXPECT_EQ(0x00000001u, nasp.GetCarouselId());
  EXPECT_EQ(0x0100015Au, nasp.GetSpecifier());
  EXPECT_EQ(0x0640, nasp.GetTransportStreamId());
  EXPECT_EQ(0x0640, nasp.GetOriginalNetworkId());
  EXPECT_EQ(0xE778, nasp.GetServiceId());
  EXPECT_EQ(16, dsi.GetPrivateDataLength());

  Bytes diiSection = SectionOf(0x018A, 1);
  RavelCDsmccDII dii(diiSection.data() + 8);
  EXPECT_EQ(0x80000002u, dii.GetTransactionId());
  EXPECT_EQ(0x00000001u, dii.GetDownloadId());
  EXPECT_EQ(1024, dii.GetBlockSize());
  ASSERT_EQ(2, dii.GetNumberOfModules());

  struct Module {
    uint16_t id;
    unsigned int size;
    const char* type;
    const char* name;
    std::vector<unsigned int> blockLengths;
    std::string begins;
  } modules[] = {{0x0001, 3000, "application/x-ginga-NCL", "main.ncl", {1024, 1024, 952}, "<?xml version"},
                 {0x0002, 500, "application/x-ginga-NCLua", "script.lua", {500}, "-- script.lua"}};
  for (const Module& m : modules) {
    SCOPED_TRACE(m.id);
    RavelCModuleInfo* info = dii.GetModuleInfoByID(m.id);
    ASSERT_NE(nullptr, info);
    EXPECT_EQ(m.size, info->GetModuleSize());
    EXPECT_EQ(1, info->GetModuleVersion());
    ASSERT_NE(nullptr, info->GetTypeDescriptor());
    EXPECT_STREQ(m.type, info->GetTypeDescriptor()->GetType());
    ASSERT_NE(nullptr, info->GetNameDescriptor());
    EXPECT_STREQ(m.name, info->GetNameDescriptor()->GetFileName());
    ASSERT_NE(nullptr, info->GetCRC32Descriptor());

    Bytes module;
    for (unsigned int n = 0; n < m.blockLengths.size(); ++n) {
      Bytes section = Ddb(m.id, n);
      ASSERT_FALSE(section.empty()) << "block " << n;
      EXPECT_EQ(m.blockLengths.size() - 1, section[7]) << "last_section_number";
      RavelCDsmccDDB ddb(section.data() + 8);
      EXPECT_EQ(dii.GetDownloadId(), ddb.GetTransactionId());
      EXPECT_EQ(m.id, ddb.GetModuleId());
      EXPECT_EQ(1, ddb.GetModuleVersion());
      EXPECT_EQ(n, ddb.GetBlockNumber());
      ASSERT_EQ(static_cast<int>(m.blockLengths[n]), ddb.GetBlockDataLen());
      module.insert(module.end(), ddb.GetBlockData(), ddb.GetBlockData() + ddb.GetBlockDataLen());
    }
    ASSERT_EQ(m.size, module.size());
    EXPECT_EQ(m.begins, std::string(module.begin(), module.begin() + m.begins.size()));
    unsigned int crc = RavelUtil_CRC32(0xFFFFFFFFu, module.data(), static_cast<unsigned int>(module.size()));
    const unsigned char* broadcast = info->GetCRC32Descriptor()->aCRC32;
    EXPECT_EQ(crc, RavelRead32(broadcast));
  }
}

TEST(SampleCapture, StreamDescriptorsGiveTheNptReferenceAndTwoStreamEvents) {
  Bytes section = SectionOf(0x018B, 0);
  TraceRecorder quiet;
  RavelCDsmccStreamEvent table(section.data());
  EXPECT_EQ(0x0001, table.iTableIdExtension);
  RavelCNPTReferenceDescriptor* npt = table.GetNPTReference();
  ASSERT_NE(nullptr, npt);
  EXPECT_EQ(0, npt->GetPostDiscontinuityIndicator());
  EXPECT_EQ(1, npt->GetContentId());
  EXPECT_EQ(Bytes({0x00, 0x20, 0x00, 0x00, 0x00}), Bytes(npt->GetSTCReference(), npt->GetSTCReference() + 5));
  // 30 minutes of NPT at 90 kHz.
  EXPECT_EQ(Bytes({0x00, 0x09, 0xA7, 0xEC, 0x80}), Bytes(npt->GetNPTReference(), npt->GetNPTReference() + 5));
  EXPECT_EQ(1, npt->GetScaleNumerator());
  EXPECT_EQ(1, npt->GetScaleDenominator());

  ASSERT_EQ(2, table.GetNumberOfGeneralEvents());
  RavelCGeneralEventDescriptor* start = table.GetGeneralEvent(0);
  EXPECT_EQ(1, start->GetEventMsgGroupId());
  EXPECT_EQ(2, start->GetTimeMode());
  // Ten seconds later.
  EXPECT_EQ(Bytes({0x00, 0x09, 0xB5, 0xA8, 0x20}), Bytes(start->GetEventMsgNPT(), start->GetEventMsgNPT() + 5));
  EXPECT_EQ(1, start->GetEventMsgType());
  EXPECT_EQ(1, start->GetEventMsgId());
  EXPECT_EQ("inicio", Text(start->GetPrivateData()));

  RavelCGeneralEventDescriptor* quiz = table.GetGeneralEvent(1);
  EXPECT_EQ(1, quiz->GetTimeMode());
  EXPECT_EQ((std::vector<int>{2024, 5, 14, 19, 45, 0}), th::DateOf(quiz->cEventMsgMJDJSTTime));
  EXPECT_EQ(2, quiz->GetEventMsgType());
  EXPECT_EQ(2, quiz->GetEventMsgId());
  EXPECT_EQ("quiz", Text(quiz->GetPrivateData()));
}

TEST(SampleCapture, VideoCarriesAPcrEveryRoundWhichThePcrReaderDoesNotSee) {
  Bytes capture = LoadSample();
  std::vector<uint64_t> pcrs;
  for (size_t at = 0; at + 188 <= capture.size(); at += 188) {
    const uint8_t* p = &capture[at];
    int pid = ((p[1] & 0x1F) << 8) | p[2];
    if (pid != 0x0181 || !(p[3] & 0x20)) continue;
    ASSERT_EQ(7, p[4]);
    ASSERT_EQ(0x10, p[5]);  // PCR_flag
    pcrs.push_back((static_cast<uint64_t>(p[6]) << 25) | (p[7] << 17) | (p[8] << 9) | (p[9] << 1) | (p[10] >> 7));
    // The reader takes its flags from the adaptation_field_length byte (7),
    // so it finds neither a PCR nor an OPCR here.
    unsigned char packet[188];
    std::memcpy(packet, p, 188);
    TraceRecorder recorder;
    RavelCPCR pcr(nullptr);
    EXPECT_EQ(kRavelOk, pcr.ParseRawData(packet));
    EXPECT_EQ(0u, pcr.mPCR);
    EXPECT_EQ(TraceLines(), recorder.Lines());
  }
  ASSERT_EQ(8u, pcrs.size());
  for (size_t i = 0; i < pcrs.size(); ++i) EXPECT_EQ(0x20000000u + 9000 * i, pcrs[i]) << i;
}

TEST(SampleCapture, RegeneratingGivesTheCommittedBytes) {
  Bytes fresh;
  std::string error;
  ASSERT_TRUE(sample::BuildOneSegCapture(fresh, error)) << error;
  Bytes committed = LoadSample();
  ASSERT_EQ(committed.size(), fresh.size())
      << "regenerate with: ravel-make-sample samples/oneseg-brazil.ts, and review the change";
  size_t firstDifference = 0;
  while (firstDifference < fresh.size() && fresh[firstDifference] == committed[firstDifference]) ++firstDifference;
  EXPECT_EQ(fresh.size(), firstDifference) << "first differing byte in packet " << firstDifference / 188
                                            << "; regenerate with: ravel-make-sample samples/oneseg-brazil.ts";
}
