// DSM-CC data carousel messages: the message header, DSI, DII and DDB.
#include <gtest/gtest.h>

#include <cstdio>
#include <map>
#include <memory>
#include <string>

#include "Captures.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CDsmccMsgBase.h"
#include "Ravel_CNASP.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

using sb::Cat;
using sb::U16;
using sb::U32;

// dsmccMessageHeader / dsmccDownloadDataHeader with its adaptation bytes.
Bytes Header(uint16_t messageId, uint32_t transactionId, uint8_t adaptationLength, uint16_t messageLength,
             uint8_t dsmccType = 0x03) {
  Bytes h = Cat({{0x11, dsmccType}, U16(messageId), U32(transactionId), {0xFF, adaptationLength}, U16(messageLength)});
  for (int i = 0; i < adaptationLength; ++i) h.push_back(static_cast<uint8_t>(0xA0 + i));
  return h;
}

// A message as a receiver hands it over: 8 bytes into its section (table_id
// 0x3C for a DDB, 0x3B otherwise), which ends with the CRC_32 after it.
Bytes InSection(uint16_t messageId, uint8_t adaptationLength, const Bytes& body) {
  sb::SectionOptions options;
  options.tableId = messageId == 0x1003 ? 0x3C : 0x3B;
  const uint32_t transactionId = messageId == 0x1003 ? 0x000000AB : 0x80000002u;
  return sb::LongSection(options, Cat({Header(messageId, transactionId, adaptationLength,
                                              static_cast<uint16_t>(adaptationLength + body.size())), body}));
}

unsigned char* MessageOf(const Bytes& section) { return const_cast<unsigned char*>(section.data()) + 8; }

// Bytes of the message: the section less its 8 header bytes and its CRC_32.
size_t MessageSize(const Bytes& section) { return section.size() - 12; }

// The server id (AFI, type, carousel id, specifier, TS id, network id, service id and 4 bytes not read),
// compatibility descriptor length 0, then the private data.
Bytes Dsi(uint8_t adaptationLength, const Bytes& privateData, uint16_t messageId = 0x1006) {
  return InSection(messageId, adaptationLength,
                   Cat({{0x00, 0x01}, U32(0x0000ABCD), U32(0x00010203), U16(0x0421), U16(0x0422), U16(0xE760),
                        Bytes(4, 0xEE), U16(0), U16(static_cast<unsigned int>(privateData.size())), privateData}));
}

Bytes Ddb(uint16_t moduleId, uint8_t version, uint16_t block, const Bytes& data, uint8_t adaptationLength = 0) {
  return InSection(0x1003, adaptationLength, Cat({U16(moduleId), {version, 0xFF}, U16(block), data}));
}

Bytes Pattern(size_t size, uint8_t seed) {
  Bytes b(size);
  for (size_t i = 0; i < size; ++i) b[i] = static_cast<uint8_t>(seed + i * 7);
  return b;
}

struct Module {
  uint16_t id;
  uint32_t size;
  uint8_t version;
  Bytes info;  // the module info descriptors
};

// downloadId, blockSize 4066, windowSize 3, ackPeriod 4, tCDownloadWindow 5, tCDownloadScenario, the
// compatibility descriptor, the module records and the private data.
Bytes Dii(const std::vector<Module>& modules, const Bytes& privateData, uint8_t adaptationLength = 0,
          const Bytes& compatibility = Bytes()) {
  Bytes body = Cat({U32(0x80000002u), U16(4066), {0x03, 0x04}, U32(5), U32(0xFFFFFFFFu),
                    U16(static_cast<unsigned int>(compatibility.size())), compatibility,
                    U16(static_cast<unsigned int>(modules.size()))});
  for (const Module& m : modules) {
    sb::Append(body, Cat({U16(m.id), U32(m.size), {m.version, static_cast<uint8_t>(m.info.size())}, m.info}));
  }
  sb::Append(body, Cat({U16(static_cast<unsigned int>(privateData.size())), privateData}));
  return InSection(0x1002, adaptationLength, body);
}

std::vector<unsigned int> NaspFields(RavelCNASP& nasp) {
  return {nasp.GetAFI(),         nasp.GetType(),      nasp.GetCarouselId(), nasp.GetSpecifier(), nasp.GetTransportStreamId(),
          nasp.GetOriginalNetworkId(), nasp.GetServiceId()};
}

std::vector<unsigned int> DiiFields(RavelCDsmccDII& dii) {
  return {dii.GetDownloadId(),       dii.GetBlockSize(), dii.GetWindowSize(), dii.GetAckPeriod(),
          dii.GetTCDownloadWindow(), dii.GetTCDownloadScenario()};
}

Bytes BlockOf(RavelCDsmccDDB& ddb) { return Bytes(ddb.GetBlockData(), ddb.GetBlockData() + ddb.GetBlockDataLen()); }

std::string Format(const char* format, int a, int b, int c, int d) {
  char text[200];
  std::snprintf(text, sizeof(text), format, a, b, c, d);
  return text;
}

// The two lines every message's dump starts with.
TraceLines HeaderDump(int dsmccType, int messageId, unsigned int transactionId, int adaptationLength,
                      int messageLength) {
  return At(kCarouselDump,
            {Format("DSMCC Header: protocolDiscriminator=[0x11], dsmccType=[0x%02x], messageID=[0x%04x]\n", dsmccType,
                    messageId, 0, 0),
             Format("DSMCC Header: transaction_id=[0x%08x], adaptationLength=[%d], messageLength=[%d]\n",
                    static_cast<int>(transactionId), adaptationLength, messageLength, 0)});
}

// A DSI's parse: the empty server id it starts from, a foreign message id, its private data length.
TraceLines DsiTrace(bool foreign, int privateDataLength) {
  TraceLines trace = At(kCarouselWarning, {"NASP Input Data is NULL!\n"});
  if (foreign) Add(trace, At(kCarouselWarning, {"Unknown DSMCC Type! dsmccType=[0x03]\n"}));
  Add(trace, At(kCarouselWarning, {"RavelCDsmccDSI::ParseRawData... \n",
                                   "Private data length [" + std::to_string(privateDataLength) + "]\n"}));
  return trace;
}

}  // namespace

TEST(DsmccHeader, ReadsEveryMessageAndReportsUnknownIdsByTheirDsmccType) {
  struct Case {
    uint16_t messageId;
    uint8_t dsmccType;
    TraceLines trace;
  } cases[] = {
      {0x1003, 0x03, {}}, {0x1001, 0x03, {{kCarouselWarning, "Unknown DSMCC Type! dsmccType=[0x03]\n"}}},
      {0x0000, 0x7F, {{kCarouselWarning, "Unknown DSMCC Type! dsmccType=[0x7f]\n"}}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.messageId);
    sb::SectionOptions options;
    options.tableId = 0x3B;
    Bytes message = sb::LongSection(options, Header(c.messageId, 0xFEDCBA98u, 2, 0x1234, c.dsmccType));
    TraceRecorder recorder;
    RavelCDsmccBase header(MessageOf(message));
    auto fields = [&header] {
      return std::vector<unsigned int>{header.GetProtocolDiscriminator(), header.GetDsmccType(), header.GetMessageId(),
                                       header.GetTransactionId(),         header.GetAdaptationLength(),
                                       header.GetMessageLength()};
    };
    EXPECT_EQ(c.trace, recorder.Lines());
    EXPECT_EQ((std::vector<unsigned int>{0x11, c.dsmccType, c.messageId, 0xFEDCBA98u, 2, 0x1234}), fields());
    recorder.Clear();
    EXPECT_EQ(kRavelOk, header.ParseRawData(MessageOf(message)));
    EXPECT_EQ(c.trace, recorder.Lines());
    EXPECT_EQ(HeaderDump(c.dsmccType, c.messageId, 0xFEDCBA98u, 2, 4660), ShowLines(header));

    recorder.Clear();
    EXPECT_EQ(kRavelErrInvalidArgument, header.ParseRawData(nullptr));
    EXPECT_TRUE(recorder.Records().empty());
    EXPECT_EQ(std::vector<unsigned int>(6, 0), fields());
  }
}

TEST(DsmccDSI, TakesTheServerIdAfterTheAdaptationAndTracesTheEmptyNaspFirst) {
  struct Case {
    uint8_t adaptationLength;
    uint16_t messageId;
    Bytes privateData;
  } cases[] = {
      {.adaptationLength = 0, .messageId = 0x1006, .privateData = {1, 2, 3}},
      {.adaptationLength = 4, .messageId = 0x1006, .privateData = {}},  // server id from byte 16 of the message
      {.adaptationLength = 0, .messageId = 0x1001, .privateData = {9}},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(&c - cases);
    Bytes message = Dsi(c.adaptationLength, c.privateData, c.messageId);
    TraceRecorder recorder;
    RavelCDsmccDSI dsi(MessageOf(message));
    EXPECT_EQ(DsiTrace(c.messageId != 0x1006, static_cast<int>(c.privateData.size())), recorder.Lines());
    // The server id record is part of the DSI's source and reports from it.
    EXPECT_EQ("SectionParser/source/Ravel_CDsmccDSI", recorder.Records()[0].file);
    EXPECT_EQ("SectionParser/source/Ravel_CDsmccDSI", recorder.Records().back().file);
    EXPECT_EQ((std::vector<unsigned int>{0x00, 0x01, 0x0000ABCD, 0x00010203, 0x0421, 0x0422, 0xE760}),
              NaspFields(dsi.GetNASP()));
    EXPECT_EQ(static_cast<int>(c.privateData.size()), dsi.GetPrivateDataLength());
    // Points into the message itself, after serverId, compatibility descriptor and length.
    EXPECT_EQ(MessageOf(message) + 12 + c.adaptationLength + 24, dsi.GetPrivateData());

    TraceLines dump = HeaderDump(0x03, c.messageId, 0x80000002u, c.adaptationLength,
                                 static_cast<int>(MessageSize(message)) - 12);
    Add(dump, At(kCarouselDump,
                 {"\t\tNASP: AFI=[0x00], Type=[0x01], CaourselID=[0x0000abcd], iSpecifier=[0x00010203]\n",
                  "\t\tNASP(Ginga Service Location): Transport Stream Id=[0x0421], Original Network ID=[0x0422], "
                  "Service ID=[0xe760]\n"}));
    EXPECT_EQ(dump, ShowLines(dsi));
  }
  TraceRecorder recorder;
  RavelCDsmccDSI empty(nullptr);
  EXPECT_EQ(At(kCarouselWarning, {"NASP Input Data is NULL!\n", "RavelCDsmccDSI::ParseRawData... \n"}),
            recorder.Lines());
  EXPECT_EQ(std::vector<unsigned int>(7, 0), NaspFields(empty.GetNASP()));
  recorder.Clear();
  EXPECT_EQ(kRavelErrInvalidArgument, empty.ParseRawData(nullptr));
  EXPECT_EQ(At(kCarouselWarning, {"RavelCDsmccDSI::ParseRawData... \n"}), recorder.Lines());
  // A null parse clears a server id read before.
  Bytes message = Dsi(0, Bytes());
  RavelCNASP nasp(MessageOf(message) + 12);
  EXPECT_EQ(kRavelErrInvalidArgument, nasp.ParseRawData(nullptr));
  EXPECT_EQ(std::vector<unsigned int>(7, 0), NaspFields(nasp));
}

TEST(DsmccDDB, CopiesBlocksOfUpTo4096Bytes) {
  struct Case {
    size_t size;
    uint8_t adaptationLength;
    int result;
    int blockDataLen;
    TraceLines trace;
  } cases[] = {
      {.size = 0, .adaptationLength = 0, .result = kRavelOk, .blockDataLen = 0, .trace = {}},
      {.size = 100, .adaptationLength = 4, .result = kRavelOk, .blockDataLen = 100, .trace = {}},
      // The largest block a section carries.
      {.size = 4068, .adaptationLength = 0, .result = kRavelOk, .blockDataLen = 4068, .trace = {}},
      // Its section_length cannot count so many bytes: only the header is read.
      {.size = 4097, .adaptationLength = 8, .result = kRavelErrCorruptSection, .blockDataLen = 0,
       .trace = {{kCarouselError, "Invalid Block Data Length=[4097]\n"}}},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.size);
    Bytes data = Pattern(c.size, 3);
    Bytes message = Ddb(0x0102, 7, 9, data, c.adaptationLength);
    TraceRecorder recorder;
    RavelCDsmccDDB ddb(nullptr);
    EXPECT_EQ(c.result, ddb.ParseRawData(MessageOf(message)));
    EXPECT_EQ(c.trace, recorder.Lines());
    EXPECT_EQ((std::vector<int>{0x0102, 7, 9, c.blockDataLen}),
              (std::vector<int>{ddb.GetModuleId(), ddb.GetModuleVersion(), ddb.GetBlockNumber(), ddb.GetBlockDataLen()}));
    EXPECT_EQ(c.result == kRavelOk, ddb.GetBlockData() != nullptr);
    EXPECT_EQ(c.result == kRavelOk ? data : Bytes(), BlockOf(ddb));
    // The block is a copy: the message may go away.
    EXPECT_TRUE(data.empty() || ddb.GetBlockData() != MessageOf(message) + 18 + c.adaptationLength);
    TraceLines dump = ShowLines(ddb);
    ASSERT_EQ(3u, dump.size());  // the message header first
    EXPECT_EQ(std::make_pair(kCarouselDump, Format("moduleId=[0x%04x], moduleVersion=[0x%02x], blockNumber=[%d], "
                                                   "blockDataLen=[%d]\n", 0x0102, 7, 9, c.blockDataLen)),
              dump[2]);
  }
}

TEST(DsmccDDB, ParsesAgainCopiesDeeplyAndClearsOnNull) {
  Bytes first = Ddb(1, 1, 0, Pattern(50, 1));
  Bytes second = Ddb(2, 3, 4, Pattern(20, 9));
  RavelCDsmccDDB ddb(MessageOf(first));
  ASSERT_EQ(kRavelOk, ddb.ParseRawData(MessageOf(second)));
  RavelCDsmccDDB copy(ddb);
  RavelCDsmccDDB assigned(MessageOf(first));
  assigned = ddb;
  for (RavelCDsmccDDB* parsed : {&ddb, &copy, &assigned}) {
    EXPECT_EQ((std::vector<unsigned int>{2, 3, 4, 0x1003, 0xAB, 26}),
              (std::vector<unsigned int>{parsed->GetModuleId(), parsed->GetModuleVersion(), parsed->GetBlockNumber(),
                                         parsed->GetMessageId(), parsed->GetTransactionId(),
                                         parsed->GetMessageLength()}));
    EXPECT_EQ(Pattern(20, 9), BlockOf(*parsed));
  }
  EXPECT_TRUE(copy == ddb);
  EXPECT_NE(ddb.GetBlockData(), copy.GetBlockData());
  EXPECT_NE(ddb.GetBlockData(), assigned.GetBlockData());

  RavelCDsmccDDB refused(nullptr);
  assigned = refused;
  EXPECT_EQ(nullptr, assigned.GetBlockData());
  EXPECT_EQ(0, assigned.GetBlockDataLen());
  EXPECT_EQ(kRavelErrInvalidArgument, ddb.ParseRawData(nullptr));
  EXPECT_EQ(nullptr, ddb.GetBlockData());
  EXPECT_EQ(0, ddb.GetModuleId() + ddb.GetModuleVersion() + ddb.GetBlockNumber() + ddb.GetBlockDataLen() + ddb.GetMessageId());
}

TEST(DsmccDDB, OrdersBlocksOfOneModuleVersionOnly) {
  struct Case {
    Bytes a, b;  // blocks of module, version, block number
    bool eq, lt, gt, le, ge;
  } cases[] = {
      {.a = Ddb(1, 2, 3, {1}), .b = Ddb(1, 2, 5, {1}), .eq = false, .lt = true, .gt = false, .le = true, .ge = false},
      {.a = Ddb(1, 2, 5, {1}), .b = Ddb(1, 2, 3, {1}), .eq = false, .lt = false, .gt = true, .le = false, .ge = true},
      {.a = Ddb(1, 2, 3, {1}), .b = Ddb(1, 2, 3, {1}), .eq = true, .lt = false, .gt = false, .le = true, .ge = true},
      {.a = Ddb(1, 2, 3, {1}), .b = Ddb(4, 2, 5, {1}), .eq = false, .lt = false, .gt = false, .le = false, .ge = false},
      {.a = Ddb(1, 2, 3, {1}), .b = Ddb(1, 9, 3, {1}), .eq = false, .lt = false, .gt = false, .le = false, .ge = false},
  };
  for (const Case& c : cases) {
    RavelCDsmccDDB a(MessageOf(c.a));
    RavelCDsmccDDB b(MessageOf(c.b));
    TraceRecorder recorder;
    EXPECT_EQ(c.eq, (a == b) != 0);
    EXPECT_TRUE(recorder.Records().empty());  // equality never traces
    EXPECT_EQ((std::vector<bool>{c.lt, c.gt, c.le, c.ge}),
              (std::vector<bool>{(a < b) != 0, (a > b) != 0, (a <= b) != 0, (a >= b) != 0}));
    std::vector<std::string> expected;
    if (a.GetModuleId() != b.GetModuleId() || a.GetModuleVersion() != b.GetModuleVersion()) {
      expected.assign(4, Format("Two Messages are totally different! This module id, version=[%d, %d], Compared "
                                "One=[%d, %d]\n", a.GetModuleId(), a.GetModuleVersion(), b.GetModuleId(),
                                b.GetModuleVersion()));
    }
    EXPECT_EQ(expected, recorder.TextsAt(kCarouselWarning));
    EXPECT_EQ(expected.size(), recorder.Records().size());
  }
}

TEST(DsmccDII, WalksTheModulesAndReportsWhatItDoesNotKeep) {
  Bytes allKinds = sb::Cat({sb::Descriptor(0x01, sb::Text("text/xml")), sb::Descriptor(0x02, sb::Text("a.xml")),
                            sb::Descriptor(0x03, sb::Text("porGuia")), sb::Descriptor(0x04, Bytes{0, 0, 2}),
                            sb::Descriptor(0x05, Bytes{1, 2, 3, 4}), sb::Descriptor(0x06, Bytes{0x40}),
                            sb::Descriptor(0x07, sb::U32(30)), sb::Descriptor(0xC2, Bytes{1, 0, 0, 0x10, 0})});
  Bytes twoNames = sb::Cat({sb::Descriptor(0x02, sb::Text("first")), sb::Descriptor(0x02, sb::Text("second"))});
  struct Case {
    const char* what;
    std::vector<Module> modules = {};
    Bytes privateData = {}, compatibility = {};
    uint8_t adaptationLength = 0;
    TraceLines trace = {};
  } cases[] = {
      {.what = "no modules"},
      {.what = "modules without descriptors", .modules = {{1, 100, 1, {}}, {2, 200000, 2, {}}}},
      // The location descriptor is not kept by a module record.
      {.what = "every descriptor kind", .modules = {{7, 4066, 3, allKinds}},
       .trace = {{kWarning, "DSMCC DII: Module Info Parsing! Unknown Tag=[0x06]\n"}}},
      {.what = "a later name wins", .modules = {{1, 1, 0, twoNames}, {2, 2, 0, {}}}},
      {.what = "after adaptation and compatibility descriptor",
       .modules = {{3, 33, 1, sb::Descriptor(0x99, Bytes{1})}, {4, 44, 1, {}}},
       .compatibility = {0, 1, 0x42, 0x42, 0x42}, .adaptationLength = 6,
       .trace = {{kWarning, "DSMCC DII: Module Info Parsing! Unknown Tag=[0x99]\n"}}},
      {.what = "private data descriptors", .modules = {{1, 1, 0, {}}},
       .privateData = Cat({sb::Descriptor(0x0A, Bytes{1, 2}), sb::Descriptor(0x01, sb::Text("x"))}),
       .trace = At(kWarning, {"DSMCC DII: Unsupported Descriptor. Tag=[0x0a]\n",
                              "DSMCC DII: Unsupported Descriptor. Tag=[0x01]\n"})},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    Bytes message = Dii(c.modules, c.privateData, c.adaptationLength, c.compatibility);
    TraceRecorder recorder;
    RavelCDsmccDII dii(nullptr);
    EXPECT_EQ(kRavelOk, dii.ParseRawData(MessageOf(message)));
    EXPECT_EQ(c.trace, recorder.Lines());
    for (const TraceRecord& r : recorder.Records()) EXPECT_EQ("SectionParser/source/Ravel_CDsmccDII", r.file);
    EXPECT_EQ((std::vector<unsigned int>{0x80000002u, 4066, 3, 4, 5, 0xFFFFFFFFu}), DiiFields(dii));
    ASSERT_EQ(static_cast<int>(c.modules.size()), dii.GetNumberOfModules());
    for (size_t i = 0; i < c.modules.size(); ++i) {
      RavelCModuleInfo* m = dii.GetModuleInfo(static_cast<int>(i));
      ASSERT_NE(nullptr, m);
      EXPECT_EQ((std::vector<unsigned int>{c.modules[i].id, c.modules[i].size, c.modules[i].version,
                                           static_cast<unsigned int>(c.modules[i].info.size())}),
                (std::vector<unsigned int>{m->GetModuleId(), m->GetModuleSize(), m->GetModuleVersion(),
                                           m->GetModuleInfoLength()}));
      EXPECT_EQ(m, dii.GetModuleInfoByID(c.modules[i].id));
    }
  }

  RavelCDsmccDII all(MessageOf(Dii({{7, 4066, 3, allKinds}}, Bytes())));
  RavelCModuleInfo* m = all.GetModuleInfo(0);
  ASSERT_NE(nullptr, m->GetTypeDescriptor());
  EXPECT_EQ((std::vector<std::string>{"text/xml", "a.xml", "Guia"}),
            (std::vector<std::string>{m->GetTypeDescriptor()->GetType(), m->GetNameDescriptor()->GetFileName(),
                                      m->GetInfoDescriptor()->GetText()}));
  EXPECT_EQ((std::vector<unsigned int>{2, 4, 30, 0x1000}),
            (std::vector<unsigned int>{m->GetModuleLinkDescriptor()->GetModuleId(), m->GetCRC32Descriptor()->GetCRC32()[3],
                                       m->GetEstDownloadTimeDescriptor()->GetEstDownloadTime(),
                                       m->GetCompressionTypeDescriptor()->GetOriginalSize()}));
  RavelCDsmccDII names(MessageOf(Dii({{1, 1, 0, twoNames}}, Bytes())));
  EXPECT_STREQ("second", names.GetModuleInfo(0)->GetNameDescriptor()->GetFileName());
  EXPECT_EQ(nullptr, names.GetModuleInfo(0)->GetTypeDescriptor());
}

TEST(DsmccDII, GettersRefuseBadIndexesAndUnknownIds) {
  Bytes message = Dii({{1, 10, 0, Bytes()}, {2, 20, 0, Bytes()}, {2, 30, 1, Bytes()}}, Bytes());
  RavelCDsmccDII dii(MessageOf(message));
  for (int index : {-1, 3, 1000}) {
    TraceRecorder recorder;
    EXPECT_EQ(nullptr, dii.GetModuleInfo(index));
    EXPECT_EQ(At(kCarouselError, {"GetModuleInfo: Invalid Array Index=[" + std::to_string(index) +
                                      "], Module Info Len=[3]\n"}),
              recorder.Lines());
    EXPECT_EQ(0, recorder.PanicCount());
  }
  TraceRecorder recorder;
  EXPECT_EQ(nullptr, dii.GetModuleInfoByID(9));
  EXPECT_EQ(20u, dii.GetModuleInfoByID(2)->GetModuleSize());  // the first with that id
  EXPECT_TRUE(recorder.Records().empty());
}

TEST(DsmccDII, DumpsCopiesDeeplyAndParsesAgainFromScratch) {
  Bytes info = sb::Cat({sb::Descriptor(0x02, sb::Text("m.bin")), sb::Descriptor(0x07, sb::U32(9))});
  Bytes message = Dii({{0x0102, 754, 0x7D, info}}, Bytes());
  RavelCDsmccDII dii(MessageOf(message));
  TraceLines expected = HeaderDump(0x03, 0x1002, 0x80000002u, 0, static_cast<int>(MessageSize(message)) - 12);
  Add(expected, At(kCarouselDump,
                   {"downloadId=[0x80000002], blockSize=[4066], windowSize=[3], ackPeriod=[4]\n",
                    "tCDownloadWindow=[0x00000005], tCDownloadScenario=[0xffffffff], numOfMOdules=[1]\n",
                    "\tModule Info: moduleId=[0x0102], moduleSize=[754], moduleVersion=[0x7d], moduleInfoLength=[13]\n"}));
  Add(expected, Dump({Banner("Name Descriptor"), BaseLine(0x2, 5, "Name Descriptor"), "\tiFileName=[m.bin]\n",
                      Banner("EST Download Time Descriptor"),
                      BaseLine(0x7, 4, "Estimated Donwload Time Descriptor"), "\tiEstDownloadTime=[9]\n"}));
  EXPECT_EQ(expected, ShowLines(dii));

  RavelCDsmccDII copy(dii);
  EXPECT_EQ(expected, ShowLines(copy));
  EXPECT_NE(dii.GetModuleInfo(0)->GetNameDescriptor(), copy.GetModuleInfo(0)->GetNameDescriptor());
  RavelCDsmccDII assigned(MessageOf(Dii({{5, 5, 5, Bytes()}, {6, 6, 6, Bytes()}}, Bytes())));
  assigned = dii;
  EXPECT_EQ(expected, ShowLines(assigned));

  // A second parse replaces the records; a null parse leaves none.
  ASSERT_EQ(kRavelOk, dii.ParseRawData(MessageOf(Dii({{8, 1, 1, Bytes()}, {9, 2, 2, Bytes()}}, Bytes()))));
  ASSERT_EQ(2, dii.GetNumberOfModules());
  EXPECT_EQ(8, dii.GetModuleInfo(0)->GetModuleId());
  TraceRecorder recorder;
  EXPECT_EQ(kRavelErrInvalidArgument, dii.ParseRawData(nullptr));
  EXPECT_TRUE(recorder.Records().empty());
  EXPECT_EQ(0, dii.GetNumberOfModules());
  EXPECT_EQ(std::vector<unsigned int>(6, 0), DiiFields(dii));
  EXPECT_EQ(1, copy.GetNumberOfModules());  // the copy is unaffected

  RavelCModuleInfo empty(nullptr);
  EXPECT_EQ(At(kCarouselError, {"Module Info Parsing Error. Input Data is NULL!\n"}), recorder.Lines());
  EXPECT_EQ((std::vector<unsigned int>{0, 0, 0, 0}), (std::vector<unsigned int>{empty.GetModuleId(), empty.GetModuleSize(),
                                                                             empty.GetModuleVersion(),
                                                                             empty.GetModuleInfoLength()}));
  EXPECT_EQ(nullptr, empty.GetNameDescriptor());
}

// The captured object carousel (PID 0x076A): every message parses without a
// complaint but the DSI's usual ones, and the blocks fill the modules its DII lists.
TEST(DsmccCapture, MessagesParseAndTheBlocksRebuildTheListedModules) {
  Bytes stream;
  RAVEL_LOAD_CAPTURE_OR_SKIP("object-carousel.ts", stream);
  std::unique_ptr<RavelCDsmccDII> dii;
  std::map<int, std::map<int, int> > blockSizes;  // module id -> block number -> bytes
  for (Bytes& section : captures::SectionsOfPid(stream, 0x076A)) {
    unsigned char* message = MessageOf(section);
    const int messageId = (section[10] << 8) | section[11];
    TraceRecorder recorder;
    if (messageId == 0x1006) {
      RavelCDsmccDSI dsi(message);
      EXPECT_EQ(DsiTrace(false, 64), recorder.Lines());
      EXPECT_EQ(section.data() + section.size() - 4, dsi.GetPrivateData() + dsi.GetPrivateDataLength());
      recorder.Clear();
    } else if (messageId == 0x1002) {
      if (!dii) dii.reset(new RavelCDsmccDII(message));
    } else {
      RavelCDsmccDDB block(message);
      blockSizes[block.GetModuleId()][block.GetBlockNumber()] = block.GetBlockDataLen();
    }
    EXPECT_TRUE(recorder.Records().empty()) << recorder.Joined();
  }
  ASSERT_TRUE(dii);
  ASSERT_EQ(3, dii->GetNumberOfModules());
  const uint32_t carriedSizes[] = {133, 379138, 29806};  // compressed
  for (int i = 0; i < 3; ++i) {
    RavelCModuleInfo* info = dii->GetModuleInfo(i);
    EXPECT_EQ(i + 1, info->GetModuleId());
    EXPECT_EQ(carriedSizes[i], info->GetModuleSize());
    uint32_t rebuilt = 0;
    for (const auto& block : blockSizes[i + 1]) rebuilt += static_cast<uint32_t>(block.second);
    EXPECT_EQ(info->GetModuleSize(), rebuilt);
  }
}
