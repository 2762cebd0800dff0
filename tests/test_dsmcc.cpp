// DSM-CC data carousel messages: the message header, DSI, DII and DDB.
#include <gtest/gtest.h>

#include <cstring>
#include <map>
#include <memory>
#include <string>

#include "Captures.h"
#include "Ravel_ByteOrder.h"
#include "Ravel_CArray.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CDsmccMsgBase.h"
#include "Ravel_CNASP.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Util.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

// dsmccMessageHeader / dsmccDownloadDataHeader with its adaptation bytes.
Bytes Header(uint16_t messageId, uint32_t transactionId, uint8_t adaptationLength, uint16_t messageLength,
             uint8_t dsmccType = 0x03) {
  Bytes h{0x11, dsmccType};
  sb::Append(h, sb::U16(messageId));
  sb::Append(h, sb::U32(transactionId));
  h.push_back(0xFF);  // reserved
  h.push_back(adaptationLength);
  sb::Append(h, sb::U16(messageLength));
  for (int i = 0; i < adaptationLength; ++i) h.push_back(static_cast<uint8_t>(0xA0 + i));
  return h;
}

// A message as a receiver hands it over: 8 bytes into its section (table_id
// 0x3C for a DDB, 0x3B otherwise), which ends with the CRC_32 after it.
Bytes InSection(const Bytes& message) {
  sb::SectionOptions options;
  options.tableId = (message[2] == 0x10 && message[3] == 0x03) ? 0x3C : 0x3B;
  return sb::LongSection(options, message);
}

unsigned char* MessageOf(const Bytes& section) { return const_cast<unsigned char*>(section.data()) + 8; }

// Bytes of the message: the section less its 8 header bytes and its CRC_32.
size_t MessageSize(const Bytes& section) { return section.size() - 12; }

Bytes ServerId(uint32_t carouselId, uint16_t tsid, uint16_t onid, uint16_t sid) {
  Bytes s{0x00, 0x01};  // AFI, type
  sb::Append(s, sb::U32(carouselId));
  sb::Append(s, sb::U32(0x00010203));
  sb::Append(s, sb::U16(tsid));
  sb::Append(s, sb::U16(onid));
  sb::Append(s, sb::U16(sid));
  sb::Append(s, Bytes{0xEE, 0xEE, 0xEE, 0xEE});  // not read
  return s;
}

Bytes Dsi(uint8_t adaptationLength, const Bytes& privateData, uint16_t messageId = 0x1006) {
  Bytes body = ServerId(0x0000ABCD, 0x0421, 0x0422, 0xE760);
  sb::Append(body, sb::U16(0));  // compatibilityDescriptorLength
  sb::Append(body, sb::U16(static_cast<unsigned int>(privateData.size())));
  sb::Append(body, privateData);
  Bytes message =
      Header(messageId, 0x80000002u, adaptationLength, static_cast<uint16_t>(adaptationLength + body.size()));
  sb::Append(message, body);
  return InSection(message);
}

Bytes Ddb(uint16_t moduleId, uint8_t version, uint16_t block, const Bytes& data, uint8_t adaptationLength = 0) {
  Bytes message =
      Header(0x1003, 0x000000AB, adaptationLength, static_cast<uint16_t>(adaptationLength + 6 + data.size()));
  sb::Append(message, sb::U16(moduleId));
  message.push_back(version);
  message.push_back(0xFF);  // reserved
  sb::Append(message, sb::U16(block));
  sb::Append(message, data);
  return InSection(message);
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

Bytes ModuleRecord(const Module& m) {
  Bytes r = sb::U16(m.id);
  sb::Append(r, sb::U32(m.size));
  r.push_back(m.version);
  r.push_back(static_cast<uint8_t>(m.info.size()));
  sb::Append(r, m.info);
  return r;
}

Bytes Dii(const std::vector<Module>& modules, const Bytes& privateData, uint8_t adaptationLength = 0,
          const Bytes& compatibility = Bytes()) {
  Bytes body = sb::U32(0x80000002u);  // downloadId
  sb::Append(body, sb::U16(4066));    // blockSize
  body.push_back(0x03);               // windowSize
  body.push_back(0x04);               // ackPeriod
  sb::Append(body, sb::U32(0x00000005));
  sb::Append(body, sb::U32(0xFFFFFFFFu));
  sb::Append(body, sb::U16(static_cast<unsigned int>(compatibility.size())));
  sb::Append(body, compatibility);
  sb::Append(body, sb::U16(static_cast<unsigned int>(modules.size())));
  for (const Module& m : modules) sb::Append(body, ModuleRecord(m));
  sb::Append(body, sb::U16(static_cast<unsigned int>(privateData.size())));
  sb::Append(body, privateData);
  Bytes message = Header(0x1002, 0x80000002u, adaptationLength, static_cast<uint16_t>(adaptationLength + body.size()));
  sb::Append(message, body);
  return InSection(message);
}

std::vector<unsigned int> NaspFields(RavelCNASP& nasp) {
  return {nasp.GetAFI(),         nasp.GetType(),      nasp.GetCarouselId(), nasp.GetSpecifier(), nasp.GetTransportStreamId(),
          nasp.GetOriginalNetworkId(), nasp.GetServiceId()};
}

std::string Format(const char* format, int a, int b, int c, int d) {
  char text[200];
  std::snprintf(text, sizeof(text), format, a, b, c, d);
  return text;
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
    Bytes message = InSection(Header(c.messageId, 0xFEDCBA98u, 2, 0x1234, c.dsmccType));
    TraceRecorder recorder;
    RavelCDsmccBase header(MessageOf(message));
    EXPECT_EQ(c.trace, recorder.Lines());
    EXPECT_EQ((std::vector<unsigned int>{0x11, c.dsmccType, c.messageId, 0xFEDCBA98u, 2, 0x1234}),
              (std::vector<unsigned int>{header.GetProtocolDiscriminator(), header.GetDsmccType(), header.GetMessageId(),
                                         header.GetTransactionId(), header.GetAdaptationLength(), header.GetMessageLength()}));
    recorder.Clear();
    EXPECT_EQ(kRavelOk, header.ParseRawData(MessageOf(message)));
    EXPECT_EQ(c.trace, recorder.Lines());

    recorder.Clear();
    header.Show();
    char first[160];
    std::snprintf(first, sizeof(first),
                  "DSMCC Header: protocolDiscriminator=[0x11], dsmccType=[0x%02x], messageID=[0x%04x]\n", c.dsmccType,
                  c.messageId);
    TraceLines dump{
        {kCarouselDump, first},
        {kCarouselDump, "DSMCC Header: transaction_id=[0xfedcba98], adaptationLength=[2], messageLength=[4660]\n"}};
    EXPECT_EQ(dump, recorder.Lines());

    recorder.Clear();
    EXPECT_EQ(kRavelErrInvalidArgument, header.ParseRawData(nullptr));
    EXPECT_TRUE(recorder.Records().empty());
    EXPECT_EQ(0, header.GetMessageId());
    EXPECT_EQ(0u, header.GetTransactionId());
    EXPECT_EQ(0, header.GetMessageLength());
  }
}

TEST(DsmccDSI, TakesTheServerIdAfterTheAdaptationAndTracesTheEmptyNaspFirst) {
  struct Case {
    const char* what;
    uint8_t adaptationLength;
    uint16_t messageId;
    Bytes privateData;
    TraceLines trace;
  } cases[] = {
      {"plain", 0, 0x1006, Bytes{1, 2, 3}, At(kCarouselWarning,
          {"NASP Input Data is NULL!\n", "RavelCDsmccDSI::ParseRawData... \n", "Private data length [3]\n"})},
      // Server id from byte 16 of the message.
      {"adaptation 4", 4, 0x1006, Bytes(), At(kCarouselWarning,
          {"NASP Input Data is NULL!\n", "RavelCDsmccDSI::ParseRawData... \n", "Private data length [0]\n"})},
      {"foreign message id", 0, 0x1001, Bytes{9},
       At(kCarouselWarning, {"NASP Input Data is NULL!\n", "Unknown DSMCC Type! dsmccType=[0x03]\n",
                             "RavelCDsmccDSI::ParseRawData... \n", "Private data length [1]\n"})},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    Bytes message = Dsi(c.adaptationLength, c.privateData, c.messageId);
    TraceRecorder recorder;
    RavelCDsmccDSI dsi(MessageOf(message));
    EXPECT_EQ(c.trace, recorder.Lines());
    // The server id record is part of the DSI's source and reports from it.
    EXPECT_EQ("SectionParser/source/Ravel_CDsmccDSI", recorder.Records()[0].file);
    EXPECT_EQ("SectionParser/source/Ravel_CDsmccDSI", recorder.Records().back().file);
    EXPECT_EQ((std::vector<unsigned int>{0x00, 0x01, 0x0000ABCD, 0x00010203, 0x0421, 0x0422, 0xE760}),
              NaspFields(dsi.GetNASP()));
    EXPECT_EQ(static_cast<int>(c.privateData.size()), dsi.GetPrivateDataLength());
    // Points into the message itself, after serverId, compatibility descriptor and length.
    EXPECT_EQ(MessageOf(message) + 12 + c.adaptationLength + 24, dsi.GetPrivateData());

    recorder.Clear();
    dsi.Show();
    TraceLines dump{
        {kCarouselDump, Format("DSMCC Header: protocolDiscriminator=[0x%02x], dsmccType=[0x%02x], messageID=[0x%04x]\n",
                               0x11, 0x03, c.messageId, 0)},
        {kCarouselDump, Format("DSMCC Header: transaction_id=[0x%08x], adaptationLength=[%d], messageLength=[%d]\n",
                static_cast<int>(0x80000002u), c.adaptationLength, static_cast<int>(MessageSize(message)) - 12, 0)},
        {kCarouselDump, "\t\tNASP: AFI=[0x00], Type=[0x01], CaourselID=[0x0000abcd], iSpecifier=[0x00010203]\n"},
        {kCarouselDump,
         "\t\tNASP(Ginga Service Location): Transport Stream Id=[0x0421], Original Network ID=[0x0422], Service "
         "ID=[0xe760]\n"}};
    EXPECT_EQ(dump, recorder.Lines());
  }
  TraceRecorder recorder;
  RavelCDsmccDSI empty(nullptr);
  TraceLines trace{{kCarouselWarning, "NASP Input Data is NULL!\n"},
                   {kCarouselWarning, "RavelCDsmccDSI::ParseRawData... \n"}};
  EXPECT_EQ(trace, recorder.Lines());
  EXPECT_EQ(0, empty.GetMessageId());
  EXPECT_EQ(std::vector<unsigned int>(7, 0), NaspFields(empty.GetNASP()));
  recorder.Clear();
  EXPECT_EQ(kRavelErrInvalidArgument, empty.ParseRawData(nullptr));
  EXPECT_EQ(TraceLines({{kCarouselWarning, "RavelCDsmccDSI::ParseRawData... \n"}}), recorder.Lines());
  // A null parse clears a server id read before.
  Bytes message = Dsi(0, Bytes());
  RavelCNASP nasp(MessageOf(message) + 12);
  EXPECT_EQ(kRavelErrInvalidArgument, nasp.ParseRawData(nullptr));
  EXPECT_EQ(std::vector<unsigned int>(7, 0), NaspFields(nasp));
}

TEST(DsmccDDB, CopiesBlocksOfUpTo4096Bytes) {
  struct Case {
    const char* what;
    size_t size;
    uint8_t adaptationLength;
    int result;
    int blockDataLen;
    TraceLines trace;
  } cases[] = {
      {"empty block", 0, 0, kRavelOk, 0, {}}, {"after an adaptation header", 100, 4, kRavelOk, 100, {}},
      {"the largest block a section carries", 4068, 0, kRavelOk, 4068, {}},
      // Its section_length cannot count so many bytes: only the header is read.
      {"one over the limit", 4097, 8, kRavelErrCorruptSection, 0, {{kCarouselError, "Invalid Block Data Length=[4097]\n"}}},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    Bytes data = Pattern(c.size, 3);
    Bytes message = Ddb(0x0102, 7, 9, data, c.adaptationLength);
    TraceRecorder recorder;
    RavelCDsmccDDB ddb(nullptr);
    EXPECT_EQ(c.result, ddb.ParseRawData(MessageOf(message)));
    EXPECT_EQ(c.trace, recorder.Lines());
    EXPECT_EQ(0x0102, ddb.GetModuleId());
    EXPECT_EQ(7, ddb.GetModuleVersion());
    EXPECT_EQ(9, ddb.GetBlockNumber());
    EXPECT_EQ(c.blockDataLen, ddb.GetBlockDataLen());
    if (c.result == kRavelOk) {
      ASSERT_NE(nullptr, ddb.GetBlockData());
      EXPECT_EQ(data, Bytes(ddb.GetBlockData(), ddb.GetBlockData() + ddb.GetBlockDataLen()));
      // The block is a copy: the message may go away.
      EXPECT_TRUE(data.empty() || ddb.GetBlockData() != MessageOf(message) + 18 + c.adaptationLength);
    } else {
      EXPECT_EQ(nullptr, ddb.GetBlockData());
    }
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
  EXPECT_EQ(2, ddb.GetModuleId());
  EXPECT_EQ(20, ddb.GetBlockDataLen());
  EXPECT_EQ(0, std::memcmp(MessageOf(second) + 18, ddb.GetBlockData(), 20));

  RavelCDsmccDDB copy(ddb);
  EXPECT_EQ(0x1003, copy.GetMessageId());
  EXPECT_EQ(0xABu, copy.GetTransactionId());
  EXPECT_EQ(26, copy.GetMessageLength());
  EXPECT_TRUE(copy == ddb);
  EXPECT_EQ(20, copy.GetBlockDataLen());
  EXPECT_NE(ddb.GetBlockData(), copy.GetBlockData());
  EXPECT_EQ(0, std::memcmp(ddb.GetBlockData(), copy.GetBlockData(), 20));

  RavelCDsmccDDB assigned(MessageOf(first));
  assigned = ddb;
  EXPECT_EQ(4, assigned.GetBlockNumber());
  EXPECT_EQ(0, std::memcmp(MessageOf(second) + 18, assigned.GetBlockData(), 20));
  RavelCDsmccDDB refused(nullptr);
  assigned = refused;
  EXPECT_EQ(nullptr, assigned.GetBlockData());
  EXPECT_EQ(0, assigned.GetBlockDataLen());

  EXPECT_EQ(kRavelErrInvalidArgument, ddb.ParseRawData(nullptr));
  EXPECT_EQ(nullptr, ddb.GetBlockData());
  EXPECT_EQ(0, ddb.GetModuleId() + ddb.GetModuleVersion() + ddb.GetBlockNumber() + ddb.GetBlockDataLen() + ddb.GetMessageId());
}

TEST(DsmccDDB, OrdersBlocksOfOneModuleVersionOnly) {
  struct Key {
    uint16_t module;
    uint8_t version;
    uint16_t block;
  };
  struct Case {
    const char* what;
    Key a, b;
    bool eq, lt, gt, le, ge;
  } cases[] = {
      {"3 before 5", {1, 2, 3}, {1, 2, 5}, false, true, false, true, false},
      {"5 after 3", {1, 2, 5}, {1, 2, 3}, false, false, true, false, true},
      {"same block", {1, 2, 3}, {1, 2, 3}, true, false, false, true, true},
      {"other module", {1, 2, 3}, {4, 2, 5}, false, false, false, false, false},
      {"other version", {1, 2, 3}, {1, 9, 3}, false, false, false, false, false},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.what);
    Bytes ma = Ddb(c.a.module, c.a.version, c.a.block, Bytes{1});
    Bytes mb = Ddb(c.b.module, c.b.version, c.b.block, Bytes{1});
    RavelCDsmccDDB a(MessageOf(ma));
    RavelCDsmccDDB b(MessageOf(mb));
    TraceRecorder recorder;
    EXPECT_EQ(c.eq, (a == b) != 0);
    EXPECT_TRUE(recorder.Records().empty());  // equality never traces
    EXPECT_EQ(c.lt, (a < b) != 0);
    EXPECT_EQ(c.gt, (a > b) != 0);
    EXPECT_EQ(c.le, (a <= b) != 0);
    EXPECT_EQ(c.ge, (a >= b) != 0);
    bool sameModule = c.a.module == c.b.module && c.a.version == c.b.version;
    std::vector<std::string> expected;
    if (!sameModule) {
      expected.assign(4, Format("Two Messages are totally different! This module id, version=[%d, %d], Compared "
                                "One=[%d, %d]\n",
                                c.a.module, c.a.version, c.b.module, c.b.version));
    }
    EXPECT_EQ(expected, recorder.TextsAt(kCarouselWarning));
    EXPECT_EQ(expected.size(), recorder.Records().size());
  }
}

TEST(DsmccDII, WalksTheModulesAndReportsWhatItDoesNotKeep) {
  const unsigned int kParserWarning = kWarning;
  Bytes allKinds = sb::Cat({sb::Descriptor(0x01, sb::Text("text/xml")), sb::Descriptor(0x02, sb::Text("a.xml")),
                            sb::Descriptor(0x03, sb::Text("porGuia")), sb::Descriptor(0x04, Bytes{0, 0, 2}),
                            sb::Descriptor(0x05, Bytes{1, 2, 3, 4}), sb::Descriptor(0x06, Bytes{0x40}),
                            sb::Descriptor(0x07, sb::U32(30)), sb::Descriptor(0xC2, Bytes{1, 0, 0, 0x10, 0})});
  Bytes twoNames = sb::Cat({sb::Descriptor(0x02, sb::Text("first")), sb::Descriptor(0x02, sb::Text("second"))});
  struct Case {
    const char* what;
    std::vector<Module> modules;
    Bytes privateData;
    uint8_t adaptationLength;
    Bytes compatibility;
    TraceLines trace;
  } cases[] = {
      {"no modules", {}, Bytes(), 0, Bytes(), {}},
      {"modules without descriptors", {{1, 100, 1, Bytes()}, {2, 200000, 2, Bytes()}}, Bytes(), 0, Bytes(), {}},
      // The location descriptor is not kept by a module record.
      {"every descriptor kind", {{7, 4066, 3, allKinds}}, Bytes(), 0, Bytes(),
       {{kParserWarning, "DSMCC DII: Module Info Parsing! Unknown Tag=[0x06]\n"}}},
      {"a later name wins", {{1, 1, 0, twoNames}, {2, 2, 0, Bytes()}}, Bytes(), 0, Bytes(), {}},
      {"after adaptation and compatibility descriptor", {{3, 33, 1, sb::Descriptor(0x99, Bytes{1})}, {4, 44, 1, Bytes()}},
       Bytes(), 6, Bytes{0, 1, 0x42, 0x42, 0x42},
       {{kParserWarning, "DSMCC DII: Module Info Parsing! Unknown Tag=[0x99]\n"}}},
      {"private data descriptors", {{1, 1, 0, Bytes()}},
       sb::Cat({sb::Descriptor(0x0A, Bytes{1, 2}), sb::Descriptor(0x01, sb::Text("x"))}), 0, Bytes(),
       At(kParserWarning, {"DSMCC DII: Unsupported Descriptor. Tag=[0x0a]\n", "DSMCC DII: Unsupported Descriptor. Tag=[0x01]\n"})},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    Bytes message = Dii(c.modules, c.privateData, c.adaptationLength, c.compatibility);
    TraceRecorder recorder;
    RavelCDsmccDII dii(nullptr);
    EXPECT_EQ(kRavelOk, dii.ParseRawData(MessageOf(message)));
    EXPECT_EQ(c.trace, recorder.Lines());
    for (const TraceRecord& r : recorder.Records()) EXPECT_EQ("SectionParser/source/Ravel_CDsmccDII", r.file);
    EXPECT_EQ((std::vector<unsigned int>{0x80000002u, 4066, 3, 4, 5, 0xFFFFFFFFu}),
              (std::vector<unsigned int>{dii.GetDownloadId(), dii.GetBlockSize(), dii.GetWindowSize(), dii.GetAckPeriod(),
                                         dii.GetTCDownloadWindow(), dii.GetTCDownloadScenario()}));
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
  EXPECT_STREQ("text/xml", m->GetTypeDescriptor()->GetType());
  EXPECT_STREQ("a.xml", m->GetNameDescriptor()->GetFileName());
  EXPECT_STREQ("Guia", m->GetInfoDescriptor()->GetText());
  EXPECT_EQ(2, m->GetModuleLinkDescriptor()->GetModuleId());
  EXPECT_EQ(4, m->GetCRC32Descriptor()->GetCRC32()[3]);
  EXPECT_EQ(30u, m->GetEstDownloadTimeDescriptor()->GetEstDownloadTime());
  EXPECT_EQ(0x1000u, m->GetCompressionTypeDescriptor()->GetOriginalSize());
  RavelCDsmccDII names(MessageOf(Dii({{1, 1, 0, twoNames}}, Bytes())));
  EXPECT_STREQ("second", names.GetModuleInfo(0)->GetNameDescriptor()->GetFileName());
  EXPECT_EQ(nullptr, names.GetModuleInfo(0)->GetTypeDescriptor());
}

TEST(DsmccDII, GettersRefuseBadIndexesAndUnknownIds) {
  Bytes message = Dii({{1, 10, 0, Bytes()}, {2, 20, 0, Bytes()}, {2, 30, 1, Bytes()}}, Bytes());
  RavelCDsmccDII dii(MessageOf(message));
  TraceRecorder recorder;
  for (int index : {-1, 3, 1000}) {
    recorder.Clear();
    EXPECT_EQ(nullptr, dii.GetModuleInfo(index));
    TraceLines expected{
        {kCarouselError, "GetModuleInfo: Invalid Array Index=[" + std::to_string(index) + "], Module Info Len=[3]\n"}};
    EXPECT_EQ(expected, recorder.Lines());
    EXPECT_EQ(0, recorder.PanicCount());
  }
  recorder.Clear();
  EXPECT_EQ(nullptr, dii.GetModuleInfoByID(9));
  EXPECT_EQ(20u, dii.GetModuleInfoByID(2)->GetModuleSize());  // the first with that id
  EXPECT_TRUE(recorder.Records().empty());
}

TEST(DsmccDII, DumpsCopiesDeeplyAndParsesAgainFromScratch) {
  Bytes info = sb::Cat({sb::Descriptor(0x02, sb::Text("m.bin")), sb::Descriptor(0x07, sb::U32(9))});
  Bytes message = Dii({{0x0102, 754, 0x7D, info}}, Bytes());
  RavelCDsmccDII dii(MessageOf(message));
  TraceLines expected{
      {kCarouselDump, "DSMCC Header: protocolDiscriminator=[0x11], dsmccType=[0x03], messageID=[0x1002]\n"},
      {kCarouselDump, "DSMCC Header: transaction_id=[0x80000002], adaptationLength=[0], messageLength=[" +
                          std::to_string(MessageSize(message) - 12) + "]\n"},
      {kCarouselDump, "downloadId=[0x80000002], blockSize=[4066], windowSize=[3], ackPeriod=[4]\n"},
      {kCarouselDump, "tCDownloadWindow=[0x00000005], tCDownloadScenario=[0xffffffff], numOfMOdules=[1]\n"},
      {kCarouselDump,
       "\tModule Info: moduleId=[0x0102], moduleSize=[754], moduleVersion=[0x7d], moduleInfoLength=[13]\n"},
      {0x10000020u, "\t=================== Name Descriptor ===================\n"},
      {0x10000020u, "\tDescriptor Tag=[0x2], Descriptor Length=[5], Name=[Name Descriptor]\n"},
      {0x10000020u, "\tiFileName=[m.bin]\n"},
      {0x10000020u, "\t=================== EST Download Time Descriptor ===================\n"},
      {0x10000020u, "\tDescriptor Tag=[0x7], Descriptor Length=[4], Name=[Estimated Donwload Time Descriptor]\n"},
      {0x10000020u, "\tiEstDownloadTime=[9]\n"}};
  EXPECT_EQ(expected, ShowLines(dii));

  RavelCDsmccDII copy(dii);
  EXPECT_EQ(expected, ShowLines(copy));
  ASSERT_EQ(1, copy.GetNumberOfModules());
  EXPECT_NE(dii.GetModuleInfo(0), copy.GetModuleInfo(0));
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
  EXPECT_EQ((std::vector<unsigned int>(6, 0)),
            (std::vector<unsigned int>{dii.GetDownloadId(), dii.GetBlockSize(), dii.GetWindowSize(), dii.GetAckPeriod(),
                                       dii.GetTCDownloadWindow(), dii.GetTCDownloadScenario()}));
  EXPECT_EQ(1, copy.GetNumberOfModules());  // the copy is unaffected

  RavelCModuleInfo empty(nullptr);
  TraceLines nullTrace{{kCarouselError, "Module Info Parsing Error. Input Data is NULL!\n"}};
  EXPECT_EQ(nullTrace, recorder.Lines());
  EXPECT_EQ(0, empty.GetModuleId());
  EXPECT_EQ(nullptr, empty.GetNameDescriptor());
}

// The captured object carousel (PID 0x076A): every message parses and the
// blocks rebuild the modules its DII lists.
TEST(DsmccCapture, MessagesParseAndTheBlocksRebuildTheListedModules) {
  Bytes stream;
  RAVEL_LOAD_CAPTURE_OR_SKIP("object-carousel.ts", stream);
  std::unique_ptr<RavelCDsmccDII> dii;
  int dsiCount = 0;
  std::map<int, RavelCPointerArray<RavelCDsmccDDB> > modules;
  for (Bytes& section : captures::SectionsOfPid(stream, 0x076A)) {
    ASSERT_NE(0, RavelUtil_CheckSectionCRC32(section.data()));
    unsigned char* message = MessageOf(section);
    const unsigned char* crc = section.data() + section.size() - 4;
    const int messageId = (section[10] << 8) | section[11];
    TraceRecorder recorder;
    if (section[0] == 0x3B && messageId == 0x1006) {
      RavelCDsmccDSI dsi(message);
      ++dsiCount;
      EXPECT_EQ(At(kCarouselWarning, {"NASP Input Data is NULL!\n", "RavelCDsmccDSI::ParseRawData... \n",
                                      "Private data length [64]\n"}),
                recorder.Lines());
      EXPECT_EQ(0xFFFFFFFFu, dsi.GetNASP().GetCarouselId());  // a DVB carousel fills the server id with 0xFF
      EXPECT_EQ(dsi.GetMessageLength(), 24 + dsi.GetPrivateDataLength());
      EXPECT_EQ(crc, dsi.GetPrivateData() + dsi.GetPrivateDataLength());
    } else if (section[0] == 0x3B && messageId == 0x1002) {
      std::unique_ptr<RavelCDsmccDII> parsed(new RavelCDsmccDII(nullptr));
      ASSERT_EQ(kRavelOk, parsed->ParseRawData(message));
      EXPECT_TRUE(recorder.Records().empty()) << recorder.Joined();
      if (!dii) dii.reset(new RavelCDsmccDII(*parsed));
    } else if (section[0] == 0x3C) {
      RavelCDsmccDDB block(nullptr);
      ASSERT_EQ(kRavelOk, block.ParseRawData(message));
      EXPECT_TRUE(recorder.Records().empty());
      EXPECT_EQ(crc, message + 18 + block.GetBlockDataLen());
      RavelCPointerArray<RavelCDsmccDDB>& blocks = modules[block.GetModuleId()];
      bool known = false;
      for (int i = 0; i < blocks.iCount && !known; ++i) known = (*blocks[i] == block) != 0;
      if (!known) blocks.Append(new RavelCDsmccDDB(block));
    }
  }
  EXPECT_GT(dsiCount, 0);
  ASSERT_TRUE(dii);
  EXPECT_EQ(4066, dii->GetBlockSize());
  ASSERT_EQ(3, dii->GetNumberOfModules());
  const uint32_t carriedSizes[] = {133, 379138, 29806};  // compressed
  for (int i = 0; i < 3; ++i) {
    SCOPED_TRACE(i);
    RavelCModuleInfo* info = dii->GetModuleInfo(i);
    ASSERT_NE(nullptr, info);
    EXPECT_EQ(i + 1, info->GetModuleId());
    EXPECT_EQ(carriedSizes[i], info->GetModuleSize());
    EXPECT_EQ(125, info->GetModuleVersion());
    EXPECT_EQ(28, info->GetModuleInfoLength());
    RavelCPointerArray<RavelCDsmccDDB>& blocks = modules[info->GetModuleId()];
    TraceRecorder recorder;
    blocks.Sort();
    EXPECT_TRUE(recorder.Records().empty());
    Bytes module;
    for (int b = 0; b < blocks.iCount; ++b) {
      EXPECT_EQ(b, blocks[b]->GetBlockNumber());
      EXPECT_EQ(info->GetModuleVersion(), blocks[b]->GetModuleVersion());
      module.insert(module.end(), blocks[b]->GetBlockData(), blocks[b]->GetBlockData() + blocks[b]->GetBlockDataLen());
    }
    EXPECT_EQ(info->GetModuleSize(), module.size());
    EXPECT_EQ(0x78, module[0]);  // a zlib stream
  }
}
