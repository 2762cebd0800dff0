// RavelCSectionAssembler over the same streams as bench_assembler.cpp, each
// section handed to a handler that only looks at it. Packets/s compares with
// the BM_Assembler_ lines; sections/s counts sections delivered whole.
#include <benchmark/benchmark.h>

#include <vector>

#include "AssemblerStreams.h"
#include "Ravel_CSectionAssembler.h"

namespace {

void CountSection(void* context, unsigned char* section, int size) {
  benchmark::DoNotOptimize(section[size - 1]);
  ++*static_cast<long long*>(context);
}

void RunAssembler(benchmark::State& state, const std::vector<Bytes>& packets) {
  std::vector<const unsigned char*> data;
  for (const Bytes& p : packets) data.push_back(p.data());
  long long sections = 0;
  RavelCSectionAssembler assembler(CountSection, &sections);
  for (auto _ : state) {
    // The continuity counters do not run on from the last packet to the first.
    assembler.ClearPacketBuffer();
    for (const unsigned char* packet : data) assembler.AddTSPacket(packet);
  }
  state.SetItemsProcessed(state.iterations() * static_cast<long long>(data.size()));
  state.SetBytesProcessed(state.iterations() * static_cast<long long>(data.size()) * 188);
  state.counters["sections/s"] = benchmark::Counter(static_cast<double>(sections), benchmark::Counter::kIsRate);
}

void BM_SectionAssembler_OnePacketSections(benchmark::State& state) {
  static const std::vector<Bytes> packets = streams::OnePacketSections();
  RunAssembler(state, packets);
}
BENCHMARK(BM_SectionAssembler_OnePacketSections);

void BM_SectionAssembler_SectionsOverManyPackets(benchmark::State& state) {
  static const std::vector<Bytes> packets = streams::LongSections();
  RunAssembler(state, packets);
}
BENCHMARK(BM_SectionAssembler_SectionsOverManyPackets);

void BM_SectionAssembler_SeveralSectionsPerPacket(benchmark::State& state) {
  static const std::vector<Bytes> packets = streams::PackedSections();
  RunAssembler(state, packets);
}
BENCHMARK(BM_SectionAssembler_SeveralSectionsPerPacket);

void BM_SectionAssembler_EitPairs(benchmark::State& state) {
  static const std::vector<Bytes> packets = streams::EitPairs(5000);
  RunAssembler(state, packets);
}
BENCHMARK(BM_SectionAssembler_EitPairs);

}  // namespace
