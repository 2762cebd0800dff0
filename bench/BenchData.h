// Data the benchmarks run over: sections cut out of the shared captures and
// sections built with the test stream builder.
#ifndef RAVEL_BENCH_BENCHDATA_H
#define RAVEL_BENCH_BENCHDATA_H

#include <benchmark/benchmark.h>

#include <string>
#include <vector>

#include "StreamBuilder.h"

namespace bench {

// Every complete section of a TS capture (all PIDs, packed sections included),
// cut by a reader of its own so that the benchmarks of the tables do not depend
// on the assembler they measure elsewhere. Stuffing ends a packet's sections.
std::vector<Bytes> TsSections(const Bytes& stream);

// The sections of the named captures (".ts" files are cut into sections,
// ".sections" files split) whose table_id is one of `tableIds`.
// `missing` lists the captures that are not there. Each section is followed by
// kSectionMargin zero bytes, as in a receiver's section buffer: some messages
// of real carousels say their descriptors run past the section's end.
const size_t kSectionMargin = 4096;
std::vector<Bytes> CaptureSections(const std::vector<std::string>& names, const std::vector<unsigned int>& tableIds,
                                   std::string& missing);
// first, first + 1, ..., last.
std::vector<unsigned int> TableIds(unsigned int first, unsigned int last);

// 3 + section_length.
inline long long SectionBytes(const Bytes& section) {
  return section.size() < 3 ? 0 : 3 + (static_cast<long long>(section[1] & 0x0F) << 8) + section[2];
}

// Parses every section once per pass with `parse` and reports sections/s and
// bytes/s (of the sections, without any margin); skips with a message when
// there is nothing to run over.
template <class Parse>
void RunOverSections(benchmark::State& state, std::vector<Bytes>& sections, const std::string& missing,
                     Parse parse) {
  if (sections.empty()) {
    state.SkipWithError(("no section to run over; absent: " + (missing.empty() ? "none" : missing)).c_str());
    return;
  }
  long long bytes = 0;
  for (const Bytes& s : sections) bytes += SectionBytes(s);
  for (auto _ : state) {
    for (Bytes& s : sections) benchmark::DoNotOptimize(parse(s.data()));
  }
  state.SetItemsProcessed(state.iterations() * static_cast<long long>(sections.size()));
  state.SetBytesProcessed(state.iterations() * bytes);
  state.counters["sections"] = static_cast<double>(sections.size());
}

}  // namespace bench

#endif
