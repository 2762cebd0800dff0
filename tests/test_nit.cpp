// Network information table and its transport streams.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <string>
#include <utility>
#include <vector>

#include "Captures.h"
#include "Ravel_CTableNIT.h"
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
using sb::Text;
using sb::U16;
using sb::U8;

const char kInfoFail[] = "NIT Info Parsing Fail! Maybe data has been corrupted!\n";

// Descriptors of the network loop.
Bytes NetworkName(const std::string& name) { return Descriptor(0x40, Text(name)); }
Bytes SystemManagement(uint8_t id, uint8_t additional) { return Descriptor(0xFE, Bytes{id, additional}); }
Bytes Linkage(unsigned int tsid, unsigned int onid, unsigned int sid, uint8_t type) {
  return Descriptor(0x4A, Cat({U16(tsid), U16(onid), U16(sid), U8(type)}));
}

// Descriptors of a transport stream.
Bytes ServiceList(const std::vector<std::pair<unsigned int, uint8_t>>& services) {
  Bytes body;
  for (const auto& s : services) sb::Append(body, Cat({U16(s.first), U8(s.second)}));
  return Descriptor(0x41, body);
}
Bytes TerrDelivery(unsigned int areaCode, uint8_t guard, uint8_t mode, const std::vector<unsigned int>& freqs) {
  Bytes body = U16((areaCode << 4) | (guard << 2) | mode);
  for (unsigned int f : freqs) sb::Append(body, U16(f));
  return Descriptor(0xFA, body);
}
Bytes PartialReception(unsigned int serviceId) { return Descriptor(0xFB, U16(serviceId)); }
// TS information without transmission type records.
Bytes TSInformation(uint8_t key, const std::string& name) {
  return Descriptor(0xCD, Cat({U8(key), U8(static_cast<uint8_t>(name.size() << 2)), Text(name)}));
}

Bytes TsEntry(unsigned int tsid, unsigned int onid, const std::vector<Bytes>& descriptors) {
  return Cat({U16(tsid), U16(onid), sb::DescriptorLoop(descriptors)});
}

Bytes NitBody(const std::vector<Bytes>& networkDescriptors, const std::vector<Bytes>& entries) {
  Bytes streams = Cat(entries);
  return Cat({sb::DescriptorLoop(networkDescriptors), Length12(static_cast<unsigned int>(streams.size())), streams});
}

Bytes NitSection(const Bytes& body, uint8_t tableId = 0x40, uint8_t version = 1, uint8_t sectionNumber = 0,
                 bool corruptCrc = false) {
  sb::SectionOptions options;
  options.corruptCrc = corruptCrc;
  options.tableId = tableId;
  options.tableIdExtension = 0x7FE1;  // network_id
  options.version = version;
  options.sectionNumber = sectionNumber;
  options.lastSectionNumber = 1;
  return sb::LongSection(options, body);
}

// One line per transport stream with what it holds.
std::string Summary(RavelCTSInfo& ts) {
  char text[160];
  std::snprintf(text, sizeof(text), "tsid=0x%04x onid=0x%04x len=%d", ts.iTransportStreamId, ts.iOriginalNetworkId,
                ts.iTransportDescriptorsLength);
  std::string s = text;
  if (ts.pServiceList) s += " services=" + std::to_string(ts.pServiceList->GetServiceCount());
  if (ts.pTSInformation) s += std::string(" tsname=") + ts.pTSInformation->GetTsName();
  if (ts.pTerrDeliverySystem) s += " freqs=" + std::to_string(ts.pTerrDeliverySystem->GetFrequencyCount());
  if (ts.pPartialReception) s += " partial=" + std::to_string(ts.pPartialReception->GetServiceIdCount());
  return s;
}

std::vector<std::string> Streams(RavelCNIT& nit) {
  std::vector<std::string> list;
  for (int i = 0; i < nit.GetTSInfoCount(); ++i) list.push_back(Summary(*nit.GetTSInfo(i)));
  return list;
}

// The network descriptors held: "name=..|-", "linkage=sid|-", "sm=id|-".
std::string NetworkSummary(RavelCNIT& nit) {
  std::string s = nit.pNetworkName ? std::string("name=") + nit.pNetworkName->GetNetworkName() : "name -";
  s += nit.pLinkage ? " linkage=" + std::to_string(nit.pLinkage->GetServiceId()) : " linkage -";
  s += nit.pSystemManagement ? " sm=" + std::to_string(nit.pSystemManagement->GetBroadcastingIdentifier()) : " sm -";
  return s;
}

const Bytes kStreamA = TsEntry(0x0001, 0x7FE1, {ServiceList({{0xE760, 0x01}, {0xE761, 0xC0}}), TerrDelivery(0x591, 3, 2, {0x0C68})});
const Bytes kStreamB = TsEntry(0x0002, 0x7FE2, {PartialReception(0xE761), TSInformation(0x05, "Ch")});
const Bytes kStreamEmpty = TsEntry(0x0003, 0x7FE3, {});
const char kSummaryA[] = "tsid=0x0001 onid=0x7fe1 len=14 services=2 freqs=1";
const char kSummaryB[] = "tsid=0x0002 onid=0x7fe2 len=10 tsname=Ch partial=1";
const char kSummaryEmpty[] = "tsid=0x0003 onid=0x7fe3 len=0";

}  // namespace

TEST(NITParse, RefusesNullBadCrcAndForeignTableIds) {
  const Bytes body = NitBody({NetworkName("Rede")}, {kStreamA});
  Bytes good = NitSection(body), badCrc = NitSection(body, 0x40, 1, 0, true), sdtId = NitSection(body, 0x42);
  Bytes bothBad = NitSection(NitBody({}, {}), 0x46, 1, 0, true);
  ASSERT_EQ(1, RavelCNIT(good.data()).GetTSInfoCount());
  tc::ExpectRefusals<RavelCNIT>(good, tc::Refusals("NIT", badCrc, sdtId, "0x42", bothBad),
                                [](RavelCNIT& nit, const tc::Refusal&, TraceRecorder& recorder) {
                                  for (const TraceRecord& t : recorder.Records()) {
                                    EXPECT_EQ("SectionParser/source/Ravel_CTableNIT", t.file);
                                  }
                                  EXPECT_EQ("name - linkage - sm -", NetworkSummary(nit));
                                  EXPECT_EQ(0, nit.GetTSInfoCount());
                                  EXPECT_STREQ("NIT Actual", nit.sTableName.GetString());  // of the last good parse
                                });
}

TEST(NITNetworkLoop, OnlyTagZeroFailsAndTheLastOfATagWins) {
  struct Case {
    const char* label;
    Bytes body;
    int result;
    TraceLines traces;
    std::string network;
    int streams;
  } cases[] = {
      {"length 0: the stream loop length is read from bytes 10 and 11",
       Cat({Length12(0), Length12(static_cast<unsigned int>(kStreamA.size())), kStreamA}), kRavelOk, {},
       "name - linkage - sm -", 1},
      {"a network name of length 0 is kept empty and the walk moves on by 2",
       NitBody({Descriptor(0x40, {}), SystemManagement(0x05, 0)}, {kStreamA}), kRavelOk, {},
       "name= linkage - sm=5", 1},
      {"tag 0 fails the section and drops what was read before it",
       NitBody({NetworkName("Rede"), Descriptor(0x00, {0x01, 0x02})}, {kStreamA}), kRavelErrCorruptSection,
       {{kWarning, Invalid(0x00, 2)}}, "name - linkage - sm -", 0},
      {"tag 0 and length 0", NitBody({SystemManagement(1, 1), Descriptor(0x00, {})}, {kStreamA}),
       kRavelErrCorruptSection, {{kWarning, Invalid(0x00, 0)}}, "name - linkage - sm -", 0},
      {"an unknown tag is traced and skipped",
       NitBody({Descriptor(0xC1, {0x01}), NetworkName("Rede")}, {kStreamA}), kRavelOk,
       {{kWarning, "NIT Body Parsing.. Unkown Descriptor Tag=[0xc1]\n"}}, "name=Rede linkage - sm -", 1},
      {"two of each kind leave the second of each",
       NitBody({NetworkName("first"), Linkage(1, 1, 10, 0), SystemManagement(1, 0), NetworkName("second"),
                Linkage(1, 1, 20, 0), SystemManagement(2, 0)}, {kStreamA}),
       kRavelOk, {}, "name=second linkage=20 sm=2", 1},
      {"the stream loop length follows a descriptor that runs past the network loop",
       Cat({Length12(2), NetworkName("abc"), Length12(static_cast<unsigned int>(kStreamA.size())), kStreamA}),
       kRavelOk, {}, "name=abc linkage - sm -", 1},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = NitSection(c.body);
    TraceRecorder recorder;
    RavelCNIT nit(nullptr);
    EXPECT_EQ(c.result, nit.ParseRawData(section.data()));
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ(c.network, NetworkSummary(nit));
    EXPECT_EQ(c.streams, nit.GetTSInfoCount());
    EXPECT_STREQ("NIT Actual", nit.sTableName.GetString());
  }
}

TEST(NITTransportStreamLoop, BoundedByItsOwnLengthAndFailedByAnyMalformedDescriptor) {
  Bytes badTag = TsEntry(0x0009, 0x7FE9, {ServiceList({{1, 1}}), Descriptor(0x00, {0xAA})});
  Bytes badLength = TsEntry(0x0009, 0x7FE9, {Descriptor(0x41, {})});
  struct Case {
    const char* label;
    Bytes body;
    int result;
    TraceLines traces;
    std::vector<std::string> streams;
    bool networkNameKept;
  } cases[] = {
      {"loop length 0 gives no streams whatever section_length says",
       Cat({sb::DescriptorLoop({NetworkName("N")}), Length12(0), kStreamA}), kRavelOk, {}, {}, true},
      {"the loop length, not section_length, ends the loop",
       Cat({sb::DescriptorLoop({NetworkName("N")}), Length12(static_cast<unsigned int>(kStreamA.size())), kStreamA,
            kStreamB}),
       kRavelOk, {}, {kSummaryA}, true},
      {"the end counts from the length field: an entry that starts in the last two declared bytes is not read",
       Cat({sb::DescriptorLoop({NetworkName("N")}), Length12(static_cast<unsigned int>(kStreamA.size() + 2)), kStreamA,
            kStreamB}),
       kRavelOk, {}, {kSummaryA}, true},
      {"an entry without descriptors takes 6 bytes", NitBody({NetworkName("N")}, {kStreamEmpty, kStreamA}),
       kRavelOk, {}, {kSummaryEmpty, kSummaryA}, true},
      {"an unknown tag in an entry is traced and skipped; of two service lists the second stays",
       NitBody({NetworkName("N")}, {TsEntry(0x0004, 0x7FE4, {Descriptor(0xC0, {0x01}), ServiceList({{5, 1}}),
                                                             ServiceList({{6, 1}, {7, 1}})})}),
       kRavelOk, {{kWarning, "NIT TSInfo Parsing.. Unkown Descriptor Tag=[0xc0]\n"}},
       {"tsid=0x0004 onid=0x7fe4 len=16 services=2"}, true},
      {"tag 0 in an entry fails the whole section", NitBody({NetworkName("N")}, {kStreamA, badTag}),
       kRavelErrCorruptSection, {{kWarning, Invalid(0x00, 1)}, {kWarning, kInfoFail}}, {}, false},
      {"length 0 in an entry fails the whole section, unlike in the network loop",
       NitBody({NetworkName("N")}, {kStreamA, kStreamB, badLength}), kRavelErrCorruptSection,
       {{kWarning, Invalid(0x41, 0)}, {kWarning, kInfoFail}}, {}, false},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = NitSection(c.body);
    RavelCNIT nit(nullptr);
    TraceRecorder recorder;
    EXPECT_EQ(c.result, nit.ParseRawData(section.data()));
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ(c.streams, Streams(nit));
    EXPECT_EQ(c.networkNameKept, nit.pNetworkName != nullptr);
  }
}

TEST(NITTransportStreamLoop, EntryParseClearsOnFailureAndReleasesOnReparse) {
  Bytes full = TsEntry(0x0001, 0x7FE1,
                       {ServiceList({{1, 1}}), TSInformation(1, "X"), TerrDelivery(1, 0, 0, {}), PartialReception(1)});
  Bytes zeroLength = Cat({U16(0x0002), U16(0x0003), Length12(7), ServiceList({{1, 1}}), Descriptor(0x40, {})});
  // A descriptor running past the length is still read whole, and ends the loop.
  Bytes pastLength = Cat({U16(0x0002), U16(0x0003), Length12(3), ServiceList({{1, 1}}), Descriptor(0x00, {})});
  struct Case {
    const char* label;
    Bytes* entry;
    int result;
    TraceLines traces;
    std::string summary;
  } cases[] = {
      {"null clears the scalars", nullptr, kRavelErrInvalidArgument, {}, "tsid=0x0000 onid=0x0000 len=0"},
      {"length 0 after a good descriptor clears everything", &zeroLength, kRavelErrCorruptSection,
       {{kWarning, Invalid(0x40, 0)}}, "tsid=0x0000 onid=0x0000 len=0"},
      {"the loop ends when the bytes consumed reach the length", &pastLength, kRavelOk, {},
       "tsid=0x0002 onid=0x0003 len=3 services=1"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCTSInfo ts(full.data());
    ASSERT_EQ("tsid=0x0001 onid=0x7fe1 len=18 services=1 tsname=X freqs=0 partial=1", Summary(ts));
    TraceRecorder recorder;
    EXPECT_EQ(c.result, ts.ParseRawData(c.entry ? c.entry->data() : nullptr));
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ(c.summary, Summary(ts));
  }
}

TEST(NITMerge, SameVersionTakesMissingNetworkDescriptorsAndAppendsStreams) {
  Bytes alpha = NitSection(NitBody({NetworkName("Alpha")}, {kStreamA, kStreamB}), 0x40, 1, 0);
  Bytes beta = NitSection(NitBody({NetworkName("Beta"), Linkage(1, 1, 7, 0), SystemManagement(3, 0)}, {kStreamEmpty}),
                          0x40, 1, 1);
  Bytes bare = NitSection(NitBody({}, {kStreamEmpty}), 0x40, 1, 1);
  Bytes nameless = NitSection(NitBody({}, {kStreamB}), 0x40, 1, 0);
  Bytes delta = NitSection(NitBody({NetworkName("Delta")}, {kStreamEmpty}), 0x40, 2, 1);
  struct Case {
    const char* label;
    Bytes* target;
    Bytes* other;
    TraceLines traces;
    std::string network;
    std::vector<std::string> streams;
  } cases[] = {
      {"another version: a trace and no change", &alpha, &delta,
       {{kError, "Two NIT Information have different information! first one=[1], second one=[2]\n"}},
       "name=Alpha linkage - sm -", {kSummaryA, kSummaryB}},
      {"missing descriptors are taken, a held one is kept", &alpha, &beta, {}, "name=Alpha linkage=7 sm=3",
       {kSummaryA, kSummaryB, kSummaryEmpty}},
      {"a target without a network name takes the other's", &nameless, &beta, {}, "name=Beta linkage=7 sm=3",
       {kSummaryB, kSummaryEmpty}},
      {"a section without descriptors adds only its streams", &alpha, &bare, {}, "name=Alpha linkage - sm -",
       {kSummaryA, kSummaryB, kSummaryEmpty}},
      {"a table merged into itself doubles once", &alpha, nullptr, {}, "name=Alpha linkage - sm -",
       {kSummaryA, kSummaryB, kSummaryA, kSummaryB}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCNIT target(c.target->data());
    EXPECT_EQ(c.traces, tc::MergeInto(target, c.other ? c.other->data() : nullptr,
                                      [](RavelCNIT& nit) { return std::make_pair(NetworkSummary(nit), Streams(nit)); }));
    EXPECT_EQ(c.network, NetworkSummary(target));
    EXPECT_EQ(c.streams, Streams(target));
    EXPECT_EQ((*c.target)[6], target.iSectionNumber);
    EXPECT_EQ(1, target.iVersionNumber);
  }
}

TEST(NITCopy, CopiesHeaderNameDescriptorsAndEveryStreamDeeply) {
  Bytes section = NitSection(
      NitBody({NetworkName("Rede"), Linkage(1, 2, 3, 4), SystemManagement(3, 1)}, {kStreamA, kStreamB}), 0x41, 9, 1);
  Bytes other = NitSection(NitBody({NetworkName("Old")}, {kStreamEmpty}));
  RavelCNIT* source = new RavelCNIT(section.data());
  source->iSession = 0x3C;
  const std::string network = NetworkSummary(*source);
  RavelCNIT assigned(other.data());
  tc::ExpectDeepCopies(source, assigned, ShowLines<RavelCNIT>);
  EXPECT_STREQ("NIT Other", assigned.sTableName.GetString());
  // The streams are released before the copy: a table assigned to itself keeps
  // its network descriptors and loses its streams.
  tc::SelfAssign(assigned);
  EXPECT_EQ(network, NetworkSummary(assigned));
  EXPECT_EQ(0, assigned.GetTSInfoCount());
  RavelCTSInfo tsAssigned(const_cast<uint8_t*>(kStreamB.data()));
  tc::ExpectDeepCopies(new RavelCTSInfo(const_cast<uint8_t*>(kStreamA.data())), tsAssigned, Summary);
}

TEST(NITShow, DumpsHeaderNetworkDescriptorsAndStreamsInTheirOwnOrder) {
  Bytes section = NitSection(NitBody({SystemManagement(0x03, 0x01), NetworkName("Rede"), Linkage(1, 2, 3, 4)},
                                     {TsEntry(0x0001, 0x7FE1, {TerrDelivery(0x591, 3, 2, {0x0C68}),
                                                               PartialReception(0xE761), TSInformation(0x05, "Ch"),
                                                               ServiceList({{0xE760, 0x01}})}),
                                      kStreamEmpty}));
  RavelCNIT nit(section.data());
  EXPECT_EQ(tc::ShortDump("NIT", HeaderLines(0x40, "NIT Actual", 1, 65, 0x7FE1, 1, 1, 0, 1),
          {"# Body Information. [Descriptors]\n", Banner("Linkage Descriptor"), BaseLine(0x4A, 7, "Linkage Descriptor"),
           "\tTransportStreamId=[0x0001], OrginalNetworkId=[0x0002], ServiceId=[0x0003], LinkageType=[0x04]\n",
           Banner("Network Descriptor"), BaseLine(0x40, 4, "Network Name Descriptor"), "\tNetwork Name=[Rede]\n",
           Banner("System Management Descriptor"), BaseLine(0xFE, 2, "System Management Descriptor"),
           "\tBroadcasting Flag=[0x03], Broadcasting Id=[0x03], Additional Ids=[0x01]\n",
           "Transport Stream Information. Size=[2]\n",
           "\tTS Information : TransportStreamId=[0x0001], OrginalNetworkId=[0x7fe1]\n",
           Banner("Service List Descriptor"), BaseLine(0x41, 3, "Service List Descriptor"),
           "\tService List Length=[1]\n", "\t\t[0]th Service Info: Service ID=[0xe760], Service Type=[0x01]\n",
           Banner("TS Information Descriptor"), BaseLine(0xCD, 4, "TS Information Descriptor"),
           "\tRemote Control Key Id=[0x05], Ts Name=[Ch], Tx Type Count=[0]\n",
           Banner("Partial Reception Descriptor", 21), BaseLine(0xFB, 2, "Partial Reception Descriptor"),
           "\tService Id [0] = 231\n", Banner("Terrestrial Delivery Descriptor"),
           BaseLine(0xFA, 4, "Terrestrial Delivery System Descriptor"),
           "\tArea Code=[0x0591], Guard Interval=[0x03], Tx Mode=[0x02], Num Of Freq=[1]\n",
           "\t\tTerrDelSys: Frequency=[3176]\n",
           "\tTS Information : TransportStreamId=[0x0003], OrginalNetworkId=[0x7fe3]\n"}),
      ShowLines(nit));
}

TEST(NITCapture, JapaneseChannelGivesItsNameFrequenciesServicesAndPartialReception) {
  Bytes contents;
  RAVEL_LOAD_CAPTURE_OR_SKIP("isdbt-japan-psi.sections", contents);
  std::vector<Bytes> sections = captures::SplitSections(contents);
  auto nitSection = std::find_if(sections.begin(), sections.end(), [](const Bytes& s) { return s[0] == 0x40; });
  ASSERT_NE(sections.end(), nitSection) << "no NIT section in the capture";
  TraceRecorder recorder;
  RavelCNIT nit(nitSection->data());
  EXPECT_TRUE(recorder.Lines().empty());
  EXPECT_EQ(0x7ED0, nit.iTableIdExtension);
  EXPECT_EQ(13, nit.iVersionNumber);
  EXPECT_EQ("name=\x3d\x29\x45\x44\x23\x30 linkage - sm=3", NetworkSummary(nit));  // broadcast bytes as sent
  ASSERT_EQ(1, nit.GetTSInfoCount());
  RavelCTSInfo* ts = nit.GetTSInfo(0);
  EXPECT_EQ("tsid=0x7ed0 onid=0x7ed0 len=104 services=4 tsname=" + std::string(ts->pTSInformation->GetTsName()) +
                " freqs=25 partial=1",
            Summary(*ts));
  EXPECT_EQ(0x49, ts->pPartialReception->GetServiceId(0));  // the high byte of service 0x4980
}
