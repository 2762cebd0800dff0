// Section CRC_32 check over whole sections of 16 to 4096 bytes.
#include <benchmark/benchmark.h>

#include "BenchData.h"
#include "Ravel_Util.h"
#include "StreamBuilder.h"

namespace {

void BM_SectionCRC32(benchmark::State& state) {
  const size_t size = static_cast<size_t>(state.range(0));
  Bytes body(size - 12);
  for (size_t i = 0; i < body.size(); ++i) body[i] = static_cast<uint8_t>(i * 7 + 1);
  sb::SectionOptions options;
  options.tableId = 0x42;
  const Bytes section = sb::LongSection(options, body);
  if (section.size() != size || RavelUtil_CheckSectionCRC32(section.data()) == 0) {
    state.SkipWithError("built section is wrong");
    return;
  }
  for (auto _ : state) {
    benchmark::DoNotOptimize(RavelUtil_CheckSectionCRC32(section.data()));
  }
  state.SetBytesProcessed(state.iterations() * static_cast<long long>(size));
  state.SetItemsProcessed(state.iterations());
}
BENCHMARK(BM_SectionCRC32)->RangeMultiplier(4)->Range(16, 4096);

}  // namespace
