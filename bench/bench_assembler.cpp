// The section assembler (RavelCTSPktStore) over built packet streams of one PID:
// sections that fit one packet, sections spread over many packets, and several
// sections packed into each packet. Packets/s is the rate that matters; the
// sections completed per pass are reported as well.
#include <benchmark/benchmark.h>

#include <vector>

#include "Ravel_CTSPktAssembler.h"
#include "StreamBuilder.h"

namespace {

const uint16_t kPid = 0x0012;

Bytes SectionOfSize(size_t size, unsigned int extension) {
  Bytes body(size - 12);
  for (size_t i = 0; i < body.size(); ++i) body[i] = static_cast<uint8_t>((i + extension) % 0xF0);  // no 0xFF
  sb::SectionOptions options;
  options.tableId = 0x4E;
  options.tableIdExtension = static_cast<uint16_t>(extension);
  return sb::LongSection(options, body);
}

std::vector<Bytes> OnePacketSections() {
  sb::PacketWriter writer(kPid);
  for (unsigned int i = 0; i < 256; ++i) writer.AddSection(SectionOfSize(160, i));
  return writer.Packets();
}

std::vector<Bytes> LongSections() {
  sb::PacketWriter writer(kPid);
  // 4096-byte sections: 23 packets each.
  for (unsigned int i = 0; i < 12; ++i) writer.AddSection(SectionOfSize(4096, i));
  return writer.Packets();
}

std::vector<Bytes> PackedSections() {
  sb::PacketWriter writer(kPid);
  std::vector<Bytes> sections;
  // 40-byte sections: four or five begin in each packet.
  for (unsigned int i = 0; i < 1200; ++i) sections.push_back(SectionOfSize(40, i));
  writer.AddPackedSections(sections);
  return writer.Packets();
}

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
  static const std::vector<Bytes> packets = OnePacketSections();
  RunStore(state, packets);
}
BENCHMARK(BM_Assembler_OnePacketSections);

void BM_Assembler_SectionsOverManyPackets(benchmark::State& state) {
  static const std::vector<Bytes> packets = LongSections();
  RunStore(state, packets);
}
BENCHMARK(BM_Assembler_SectionsOverManyPackets);

void BM_Assembler_SeveralSectionsPerPacket(benchmark::State& state) {
  static const std::vector<Bytes> packets = PackedSections();
  RunStore(state, packets);
}
BENCHMARK(BM_Assembler_SeveralSectionsPerPacket);

}  // namespace
