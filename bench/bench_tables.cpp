// Sections per second of each table class, over the real sections of the shared
// captures (skipped with a message when they are absent) and over built ones.
// Dumps are off: no trace hook and the default trace mask (errors only, which
// the default sink prints to standard error). One object of each class is
// parsed again for every section, as a receiver keeps one per PID.
#include <benchmark/benchmark.h>

#include <string>
#include <vector>

#include "BenchData.h"
#include "BuiltSections.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
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
#include "Ravel_PGL.h"

namespace {

struct SectionSet {
  std::vector<Bytes> sections;
  std::string missing;
};

SectionSet Real(const std::vector<std::string>& captures, const std::vector<unsigned int>& tableIds) {
  SectionSet set;
  set.sections = bench::CaptureSections(captures, tableIds, set.missing);
  return set;
}

SectionSet Built(std::vector<Bytes> sections) {
  SectionSet set;
  set.sections = std::move(sections);
  return set;
}

// Keeps the carousel sections of one message id (DSI 0x1006, DII 0x1002, DDB 0x1003).
SectionSet OfMessage(SectionSet set, unsigned int messageId) {
  std::vector<Bytes> kept;
  for (Bytes& s : set.sections) {
    if (s.size() >= 12 && ((static_cast<unsigned int>(s[10]) << 8) | s[11]) == messageId) kept.push_back(std::move(s));
  }
  set.sections = std::move(kept);
  return set;
}

void DumpsOff() {
  RavelPGL_SetTraceHook(0, 0);
  RavelPGL_SetTraceMask(0x80000000u);
}

// Tables built over a section pointer (null gives an empty object).
template <class Table>
void ParseTable(benchmark::State& state, SectionSet& set) {
  DumpsOff();
  Table table(0);
  bench::RunOverSections(state, set.sections, set.missing, [&](unsigned char* s) { return table.ParseRawData(s); });
}

template <>
void ParseTable<RavelCAIT>(benchmark::State& state, SectionSet& set) {
  DumpsOff();
  RavelCAIT ait;
  bench::RunOverSections(state, set.sections, set.missing, [&](unsigned char* s) { return ait.ParseRawData(s); });
}

// The carousel messages start after the 8-byte section header.
template <class Message>
void ParseMessage(benchmark::State& state, SectionSet& set) {
  DumpsOff();
  Message message(0);
  bench::RunOverSections(state, set.sections, set.missing,
                         [&](unsigned char* s) { return message.ParseRawData(s + 8); });
}

const std::string kJapan = "isdbt-japan-psi.sections";
const std::string kSignalling = "isdb-signalling-mix.sections";
const std::string kLive = "dvb-live.ts";
const std::string kEpg = "dvb-epg.ts";
const std::string kAit = "ait.ts";
const std::string kCarousel = "object-carousel.ts";

// The EIT table ids the class accepts.
std::vector<unsigned int> EitTableIds() {
  std::vector<unsigned int> ids = {0x4E, 0x4F, 0x50};
  for (unsigned int id = 0x60; id <= 0x6F; ++id) ids.push_back(id);
  return ids;
}

#define RAVEL_TABLE_BENCHMARKS(Name, Class, RealSet, BuiltSet)          \
  void BM_##Name##_Real(benchmark::State& state) {                      \
    static SectionSet set = RealSet;                                    \
    ParseTable<Class>(state, set);                                      \
  }                                                                     \
  BENCHMARK(BM_##Name##_Real);                                          \
  void BM_##Name##_Built(benchmark::State& state) {                     \
    static SectionSet set = Built(BuiltSet);                            \
    ParseTable<Class>(state, set);                                      \
  }                                                                     \
  BENCHMARK(BM_##Name##_Built)

RAVEL_TABLE_BENCHMARKS(PAT, RavelCPAT, Real({kJapan, kLive, kEpg, kAit}, {0x00}), bench::BuiltPatSections());
RAVEL_TABLE_BENCHMARKS(PMT, RavelCPMT, Real({kJapan, kLive, kAit}, {0x02}), bench::BuiltPmtSections());
RAVEL_TABLE_BENCHMARKS(NIT, RavelCNIT, Real({kJapan, kEpg, kAit}, {0x40, 0x41}), bench::BuiltNitSections());
RAVEL_TABLE_BENCHMARKS(SDT, RavelCSDT, Real({kJapan, kLive, kEpg, kAit}, {0x42, 0x46}), bench::BuiltSdtSections());
RAVEL_TABLE_BENCHMARKS(EIT, RavelCEIT, Real({kJapan, kEpg}, EitTableIds()), bench::BuiltEitSections());
RAVEL_TABLE_BENCHMARKS(BIT, RavelCBIT, Real({kSignalling}, {0xC4}), bench::BuiltBitSections());
RAVEL_TABLE_BENCHMARKS(TDT, RavelCTDT, Real({kEpg, kAit}, {0x70}), bench::BuiltTdtSections());
RAVEL_TABLE_BENCHMARKS(TOT, RavelCTOT, Real({kEpg, kAit}, {0x73}), bench::BuiltTotSections());
RAVEL_TABLE_BENCHMARKS(AIT, RavelCAIT, Real({kAit}, {0x74}), bench::BuiltAitSections());
RAVEL_TABLE_BENCHMARKS(StreamEvent, RavelCDsmccStreamEvent, Real({"stream-events-1.ts", "stream-events-2.ts"}, {0x3D}),
                       bench::BuiltStreamEventSections());

#define RAVEL_MESSAGE_BENCHMARKS(Name, Class, TableId, MessageId, BuiltSet)             \
  void BM_##Name##_Real(benchmark::State& state) {                                      \
    static SectionSet set = OfMessage(Real({kCarousel}, {TableId}), MessageId);         \
    ParseMessage<Class>(state, set);                                                    \
  }                                                                                     \
  BENCHMARK(BM_##Name##_Real);                                                          \
  void BM_##Name##_Built(benchmark::State& state) {                                     \
    static SectionSet set = Built(BuiltSet);                                            \
    ParseMessage<Class>(state, set);                                                    \
  }                                                                                     \
  BENCHMARK(BM_##Name##_Built)

RAVEL_MESSAGE_BENCHMARKS(DsmccDSI, RavelCDsmccDSI, 0x3B, RAVEL_DSMCC_MSG_DSI, bench::BuiltDsiSections());
RAVEL_MESSAGE_BENCHMARKS(DsmccDII, RavelCDsmccDII, 0x3B, RAVEL_DSMCC_MSG_DII, bench::BuiltDiiSections());
RAVEL_MESSAGE_BENCHMARKS(DsmccDDB, RavelCDsmccDDB, 0x3C, RAVEL_DSMCC_MSG_DDB, bench::BuiltDdbSections());

}  // namespace
