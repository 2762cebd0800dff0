// The committed sample capture of a Brazilian one-segment service
// (samples/oneseg-brazil.ts): every section assembled by the library's store
// and parsed by the class of its table_id, its carousel modules, and a fresh
// run of its generator giving the same bytes.
#include <gtest/gtest.h>

#include <cstring>
#include <fstream>
#include <iterator>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "Ravel_ByteOrder.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
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

// Parses `data` with the library class T, as a receiver does.
template <class T, class... Args>
int ParseWith(unsigned char* data, Args... args) {
  T object(args...);
  TraceRecorder quiet;  // each class's traces are pinned with the class
  return object.ParseRawData(data);
}

// Parses one section with the library class of its table_id (for DSM-CC
// sections, of its message id, over the message after the section header).
int ParseByTableId(Bytes section) {
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
  return kRavelErrInvalidArgument;
}

// The carousel's blocks: module 1 (3000 bytes) in blocks 0 to 2, module 2
// (500 bytes) in block 0.
Bytes Ddb(uint16_t moduleId, unsigned int block) {
  for (const Bytes& s : SampleSections().sections.at(0x018A)) {
    if (s[0] == 0x3C && RavelRead16(&s[3]) == moduleId && s[6] == block) return s;
  }
  return Bytes();
}

}  // namespace

TEST(SampleCapture, EverySectionAssemblesAndParsesWithTheClassOfItsTableId) {
  th::StandardScope brazil;
  const Assembled& assembled = SampleSections();
  EXPECT_EQ(TraceLines(), assembled.trace) << "the store reported trouble";
  EXPECT_EQ(0, assembled.heldSizeMismatches);
  EXPECT_EQ(0, assembled.storesLeftCollecting);

  // Which sections come and what each parses to is pinned by the sample's dump
  // in tests/golden; here, that the receivers' store delivers every one whole
  // and that each has a class of the library that reads it.
  size_t sections = 0;
  for (const auto& pid : assembled.sections) {
    for (const Bytes& section : pid.second) {
      EXPECT_EQ(kRavelOk, ParseByTableId(section)) << "PID " << pid.first << " section " << sections;
      ++sections;
    }
  }
  EXPECT_EQ(std::size(kSectionPids), assembled.sections.size());
  EXPECT_EQ(37u, sections);
}

// Every value of these sections as the library reads it is pinned by the
// dump of the sample in tests/golden; here, what the dump does not show.

TEST(SampleCapture, CarouselModulesRebuildFromTheirBlocksAndMatchTheirCrc) {
  Bytes diiSection = SampleSections().sections.at(0x018A).at(1);
  RavelCDsmccDII dii(diiSection.data() + 8);
  ASSERT_EQ(2, dii.GetNumberOfModules());
  struct Module {
    uint16_t id;
    unsigned int blocks;
  } modules[] = {{/*id=*/0x0001, /*blocks=*/3}, {/*id=*/0x0002, /*blocks=*/1}};
  for (const Module& m : modules) {
    SCOPED_TRACE(m.id);
    RavelCModuleInfo* info = dii.GetModuleInfoByID(m.id);
    ASSERT_NE(nullptr, info);
    ASSERT_NE(nullptr, info->GetCRC32Descriptor());
    Bytes module;
    for (unsigned int n = 0; n < m.blocks; ++n) {
      Bytes section = Ddb(m.id, n);
      ASSERT_FALSE(section.empty()) << "block " << n;
      RavelCDsmccDDB ddb(section.data() + 8);
      module.insert(module.end(), ddb.GetBlockData(), ddb.GetBlockData() + ddb.GetBlockDataLen());
    }
    ASSERT_EQ(info->GetModuleSize(), module.size());
    unsigned int crc = RavelUtil_CRC32(0xFFFFFFFFu, module.data(), static_cast<unsigned int>(module.size()));
    EXPECT_EQ(crc, RavelRead32(info->GetCRC32Descriptor()->aCRC32));
  }
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
