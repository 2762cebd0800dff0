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
// ".sections" files split) whose table_id lies in [firstTableId, lastTableId].
// `missing` lists the captures that are not there.
std::vector<Bytes> CaptureSections(const std::vector<std::string>& names, unsigned int firstTableId,
                                   unsigned int lastTableId, std::string& missing);

// Parses every section once per pass with `parse` and reports sections/s and
// bytes/s; skips with a message when there is nothing to run over.
template <class Parse>
void RunOverSections(benchmark::State& state, std::vector<Bytes>& sections, const std::string& missing,
                     Parse parse) {
  if (sections.empty()) {
    state.SkipWithError(("no section to run over; absent: " + (missing.empty() ? "none" : missing)).c_str());
    return;
  }
  long long bytes = 0;
  for (const Bytes& s : sections) bytes += static_cast<long long>(s.size());
  for (auto _ : state) {
    for (Bytes& s : sections) benchmark::DoNotOptimize(parse(s.data()));
  }
  state.SetItemsProcessed(state.iterations() * static_cast<long long>(sections.size()));
  state.SetBytesProcessed(state.iterations() * bytes);
  state.counters["sections"] = static_cast<double>(sections.size());
}

}  // namespace bench

#endif
