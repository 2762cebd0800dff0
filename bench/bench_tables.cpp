// Sections per second of each table class, over the real sections of the shared
// captures (skipped with a message when they are absent) and over built ones.
// Dumps are off: no trace hook and the default trace mask (errors only).
#include <benchmark/benchmark.h>

#include <string>
#include <vector>

#include "BenchData.h"
#include "BuiltSections.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_CTablePAT.h"
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

}  // namespace
