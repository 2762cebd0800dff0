// The multiplex of the sample: eight rounds of 100 ms, each with a video PES
// (PCR in its first packet), an audio PES and a null packet, and the tables
// resent the way broadcasters cycle them (PAT and PMT every other round, NIT
// and SDT three times, the carousel twice).
#include "SampleStream.h"

#include <map>

#include "SampleSections.h"

namespace sample {
namespace {

const int kRounds = 8;
const int kVideoPacketsPerRound = 6;

// Deterministic filler for the elementary streams.
class Filler {
 public:
  explicit Filler(uint32_t seed) : state_(seed) {}
  Bytes Take(size_t size) {
    Bytes b(size);
    for (size_t i = 0; i < size; ++i) {
      state_ = state_ * 1664525u + 1013904223u;
      b[i] = static_cast<uint8_t>(state_ >> 24);
    }
    return b;
  }

 private:
  uint32_t state_;
};

// program_clock_reference: 33-bit base, 6 reserved bits, 9-bit extension (0).
Bytes Pcr(uint64_t base) {
  return Bytes{static_cast<uint8_t>(base >> 25), static_cast<uint8_t>(base >> 17), static_cast<uint8_t>(base >> 9),
               static_cast<uint8_t>(base >> 1), static_cast<uint8_t>(((base & 1) << 7) | 0x7E), 0x00};
}

// PES header with a PTS only ('0010' prefix, marker bits set).
Bytes PesHeader(uint8_t streamId, unsigned int packetLength, uint64_t pts) {
  return Bytes{0x00, 0x00, 0x01, streamId, static_cast<uint8_t>(packetLength >> 8), static_cast<uint8_t>(packetLength),
               0x80, 0x80, 0x05,
               static_cast<uint8_t>(0x21 | ((pts >> 29) & 0x0E)), static_cast<uint8_t>(pts >> 22),
               static_cast<uint8_t>(((pts >> 14) & 0xFE) | 1), static_cast<uint8_t>(pts >> 7),
               static_cast<uint8_t>(((pts << 1) & 0xFE) | 1)};
}

class Multiplex {
 public:
  Multiplex() : video_(0x0181), audio_(0x0183) {}

  // Each section starts a packet of its own, as the receiver's assembler wants:
  // the byte after a section that ends inside its first packet must be stuffing.
  bool Section(uint16_t pid, const Bytes& section, std::string& error) {
    if (section.size() == 183) {
      error = "a section of 183 bytes would end exactly at the end of its first packet";
      return false;
    }
    sb::PacketWriter& writer = Writer(pid);
    writer.Clear();
    writer.AddSection(section);
    for (const Bytes& packet : writer.Packets()) sb::Append(capture_, packet);
    return true;
  }

  void Packet(uint16_t pid, bool pusi, const Bytes& payload, uint8_t adaptationControl = 1,
              const Bytes& adaptation = Bytes()) {
    sb::PacketWriter& writer = Writer(pid);
    writer.Clear();
    sb::Append(capture_, writer.MakePacket(pusi, payload, adaptationControl, adaptation));
  }

  // One video access unit: PES with an unbounded length, PCR in the first
  // packet's adaptation field (flags byte 0x10: PCR_flag).
  void VideoPacket(int round, int index) {
    uint64_t pcr = kFirstPcrBase + static_cast<uint64_t>(round) * kPcrStep;
    if (index == 0) {
      Bytes adaptation{0x10};
      sb::Append(adaptation, Pcr(pcr));
      Bytes payload = PesHeader(0xE0, 0, pcr + 27000);
      sb::Append(payload, Bytes{0x00, 0x00, 0x00, 0x01, 0x09, 0xF0, 0x00, 0x00, 0x00, 0x01, 0x41});  // AUD, slice
      sb::Append(payload, video_.Take(188 - 4 - 1 - adaptation.size() - payload.size()));
      Packet(kPidVideo, true, payload, 3, adaptation);
    } else {
      Packet(kPidVideo, false, video_.Take(184));
    }
  }

  // One audio frame in LATM/LOAS over two packets, PES length set.
  void AudioPacket(int round, int index) {
    const unsigned int pesSize = 2 * 184;
    if (index == 0) {
      uint64_t pts = kFirstPcrBase + static_cast<uint64_t>(round) * kPcrStep + 27000;
      Bytes payload = PesHeader(0xC0, pesSize - 6, pts);
      const unsigned int muxLength = pesSize - static_cast<unsigned int>(payload.size()) - 3;
      sb::Append(payload, Bytes{0x56, static_cast<uint8_t>(0xE0 | (muxLength >> 8)), static_cast<uint8_t>(muxLength)});
      sb::Append(payload, audio_.Take(184 - payload.size()));
      Packet(kPidAudio, true, payload);
    } else {
      Packet(kPidAudio, false, audio_.Take(184));
    }
  }

  void NullPacket() {
    Bytes packet(188, 0xFF);
    packet[0] = 0x47;
    packet[1] = 0x1F;
    packet[2] = 0xFF;
    packet[3] = 0x10;
    sb::Append(capture_, packet);
  }

  const Bytes& Capture() const { return capture_; }

 private:
  sb::PacketWriter& Writer(uint16_t pid) {
    std::map<uint16_t, sb::PacketWriter>::iterator found = writers_.find(pid);
    if (found == writers_.end()) found = writers_.emplace(pid, sb::PacketWriter(pid)).first;
    return found->second;
  }

  std::map<uint16_t, sb::PacketWriter> writers_;
  Filler video_;
  Filler audio_;
  Bytes capture_;
};

struct Carried {
  uint16_t pid;
  Bytes section;
};

// The tables of each round.
std::vector<Carried> TablesOfRound(int round, const std::vector<Bytes>& ddbFirstHalf,
                                   const std::vector<Bytes>& ddbSecondHalf) {
  std::vector<Carried> tables;
  if (round % 2 == 0) {
    tables.push_back({kPidPat, PatSection()});
    tables.push_back({kPidOneSegPmt, OneSegPmtSection()});
  }
  if (round == 0 || round == 3 || round == 6) tables.push_back({kPidNit, NitSection()});
  if (round == 1 || round == 4 || round == 6) tables.push_back({kPidSdt, SdtSection()});
  if (round == 1 || round == 5) {
    tables.push_back({kPidOneSegEit, OneSegEitSection(0)});
    tables.push_back({kPidOneSegEit, OneSegEitSection(1)});
    tables.push_back({kPidAit, AitSection()});
  }
  if (round == 0) tables.push_back({kPidTime, TdtSection()});
  if (round == 2) tables.push_back({kPidTime, TotSection()});
  if (round == 3) tables.push_back({kPidBit, BitSection()});
  if (round == 0 || round == 4) {
    tables.push_back({kPidCarousel, DsiSection()});
    tables.push_back({kPidCarousel, DiiSection(CarouselModules())});
  }
  const std::vector<Bytes>* blocks = nullptr;
  if (round == 2 || round == 6) blocks = &ddbFirstHalf;
  if (round == 3 || round == 7) blocks = &ddbSecondHalf;
  if (blocks != nullptr) {
    for (const Bytes& ddb : *blocks) tables.push_back({kPidCarousel, ddb});
  }
  if (round == 3 || round == 7) tables.push_back({kPidStreamEvents, StreamDescriptorSection()});
  return tables;
}

}  // namespace

bool BuildOneSegCapture(Bytes& capture, std::string& error) {
  // The blocks of the carousel in two halves, each sent in one round.
  std::vector<Bytes> ddbs;
  for (const CarouselModule& module : CarouselModules()) {
    for (const Bytes& ddb : DdbSections(module)) ddbs.push_back(ddb);
  }
  size_t half = (ddbs.size() + 1) / 2;
  std::vector<Bytes> firstHalf(ddbs.begin(), ddbs.begin() + half);
  std::vector<Bytes> secondHalf(ddbs.begin() + half, ddbs.end());

  Multiplex mux;
  for (int round = 0; round < kRounds; ++round) {
    for (const Carried& table : TablesOfRound(round, firstHalf, secondHalf)) {
      if (!mux.Section(table.pid, table.section, error)) return false;
    }
    // Video and audio interleaved as an encoder's multiplexer puts them out.
    mux.VideoPacket(round, 0);
    mux.AudioPacket(round, 0);
    mux.VideoPacket(round, 1);
    mux.VideoPacket(round, 2);
    mux.AudioPacket(round, 1);
    for (int v = 3; v < kVideoPacketsPerRound; ++v) mux.VideoPacket(round, v);
    mux.NullPacket();
  }
  capture = mux.Capture();
  return true;
}

}  // namespace sample
