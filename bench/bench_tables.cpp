// Sections per second of each table class, over the real sections of the shared
// captures (skipped with a message when they are absent) and over built ones.
// Dumps are off: no trace hook and the default trace mask (errors only).
#include <benchmark/benchmark.h>

#include <string>
#include <vector>

#include "BenchData.h"
#include "BuiltSections.h"
#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTableStreamEventDescriptor.h"
#include "Ravel_PGL.h"

namespace {

struct SectionSet {
  std::vector<Bytes> sections;
  std::string missing;
};

SectionSet Real(const std::vector<std::string>& captures, unsigned int first, unsigned int last) {
  SectionSet set;
  set.sections = bench::CaptureSections(captures, first, last, set.missing);
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

// One table object parsed again for every section, as a caller keeps one per PID.
void ParsePAT(benchmark::State& state, SectionSet& set) {
  DumpsOff();
  RavelCPAT pat(0);
  bench::RunOverSections(state, set.sections, set.missing, [&](unsigned char* s) { return pat.ParseRawData(s); });
}

void ParseAIT(benchmark::State& state, SectionSet& set) {
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

void ParseStreamEvents(benchmark::State& state, SectionSet& set) {
  DumpsOff();
  RavelCDsmccStreamEvent table(0);
  bench::RunOverSections(state, set.sections, set.missing, [&](unsigned char* s) { return table.ParseRawData(s); });
}

const std::vector<std::string> kPatCaptures = {"isdbt-japan-psi.sections", "dvb-live.ts", "dvb-epg.ts", "ait.ts"};

void BM_PAT_Real(benchmark::State& state) {
  static SectionSet set = Real(kPatCaptures, 0x00, 0x00);
  ParsePAT(state, set);
}
BENCHMARK(BM_PAT_Real);

void BM_PAT_Built(benchmark::State& state) {
  static SectionSet set = Built(bench::BuiltPatSections());
  ParsePAT(state, set);
}
BENCHMARK(BM_PAT_Built);

void BM_AIT_Real(benchmark::State& state) {
  static SectionSet set = Real({"ait.ts"}, 0x74, 0x74);
  ParseAIT(state, set);
}
BENCHMARK(BM_AIT_Real);

void BM_AIT_Built(benchmark::State& state) {
  static SectionSet set = Built(bench::BuiltAitSections());
  ParseAIT(state, set);
}
BENCHMARK(BM_AIT_Built);

void BM_DsmccDSI_Real(benchmark::State& state) {
  static SectionSet set = OfMessage(Real({"object-carousel.ts"}, 0x3B, 0x3B), RAVEL_DSMCC_MSG_DSI);
  ParseMessage<RavelCDsmccDSI>(state, set);
}
BENCHMARK(BM_DsmccDSI_Real);

void BM_DsmccDSI_Built(benchmark::State& state) {
  static SectionSet set = Built(bench::BuiltDsiSections());
  ParseMessage<RavelCDsmccDSI>(state, set);
}
BENCHMARK(BM_DsmccDSI_Built);

void BM_DsmccDII_Real(benchmark::State& state) {
  static SectionSet set = OfMessage(Real({"object-carousel.ts"}, 0x3B, 0x3B), RAVEL_DSMCC_MSG_DII);
  ParseMessage<RavelCDsmccDII>(state, set);
}
BENCHMARK(BM_DsmccDII_Real);

void BM_DsmccDII_Built(benchmark::State& state) {
  static SectionSet set = Built(bench::BuiltDiiSections());
  ParseMessage<RavelCDsmccDII>(state, set);
}
BENCHMARK(BM_DsmccDII_Built);

void BM_DsmccDDB_Real(benchmark::State& state) {
  static SectionSet set = OfMessage(Real({"object-carousel.ts"}, 0x3C, 0x3C), RAVEL_DSMCC_MSG_DDB);
  ParseMessage<RavelCDsmccDDB>(state, set);
}
BENCHMARK(BM_DsmccDDB_Real);

void BM_DsmccDDB_Built(benchmark::State& state) {
  static SectionSet set = Built(bench::BuiltDdbSections());
  ParseMessage<RavelCDsmccDDB>(state, set);
}
BENCHMARK(BM_DsmccDDB_Built);

void BM_StreamEvent_Real(benchmark::State& state) {
  static SectionSet set = Real({"stream-events-1.ts", "stream-events-2.ts"}, 0x3D, 0x3D);
  ParseStreamEvents(state, set);
}
BENCHMARK(BM_StreamEvent_Real);

void BM_StreamEvent_Built(benchmark::State& state) {
  static SectionSet set = Built(bench::BuiltStreamEventSections());
  ParseStreamEvents(state, set);
}
BENCHMARK(BM_StreamEvent_Built);

}  // namespace
