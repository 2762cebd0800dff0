// The section assembler (RavelCTSPktStore) over built packet streams of one PID:
// sections that fit one packet, sections spread over many packets, several
// sections packed into each packet, and EIT present/following + schedule pairs.
// Packets/s is the rate that matters; the sections completed per pass are
// reported as well (on the pairs, the schedule sections come out cut).
#include <benchmark/benchmark.h>

#include <vector>

#include "AssemblerStreams.h"
#include "Ravel_CTSPktAssembler.h"

namespace {

void RunStore(benchmark::State& state, const std::vector<Bytes>& packets) {
  std::vector<const unsigned char*> data;
  for (const Bytes& p : packets) data.push_back(p.data());
  RavelCTSPktStore store;
  long long sections = 0;
  for (auto _ : state) {
    // The continuity counters do not run on from the last packet to the first.
    store.ClearPacketBuffer();
    for (const unsigned char* packet : data) {
      RavelCSectionData out;
      store.AddTSPacket(packet, out);
      sections += out.iSectionCount;
      benchmark::DoNotOptimize(out.pSection[0]);
    }
  }
  state.SetItemsProcessed(state.iterations() * static_cast<long long>(data.size()));
  state.SetBytesProcessed(state.iterations() * static_cast<long long>(data.size()) * 188);
  state.counters["sections/s"] = benchmark::Counter(static_cast<double>(sections), benchmark::Counter::kIsRate);
}

void BM_Assembler_OnePacketSections(benchmark::State& state) {
  static const std::vector<Bytes> packets = streams::OnePacketSections();
  RunStore(state, packets);
}
BENCHMARK(BM_Assembler_OnePacketSections);

void BM_Assembler_SectionsOverManyPackets(benchmark::State& state) {
  static const std::vector<Bytes> packets = streams::LongSections();
  RunStore(state, packets);
}
BENCHMARK(BM_Assembler_SectionsOverManyPackets);

void BM_Assembler_SeveralSectionsPerPacket(benchmark::State& state) {
  static const std::vector<Bytes> packets = streams::PackedSections();
  RunStore(state, packets);
}
BENCHMARK(BM_Assembler_SeveralSectionsPerPacket);

void BM_Assembler_EitPairs(benchmark::State& state) {
  static const std::vector<Bytes> packets = streams::EitPairs(5000);
  RunStore(state, packets);
}
BENCHMARK(BM_Assembler_EitPairs);

}  // namespace
