// RavelCSectionAssembler: packet sequences of one PID, the sections handed
// out whole and the counters of what was dropped and why.
#include <gtest/gtest.h>

#include <functional>
#include <ostream>
#include <string>

#include "AssemblerStreams.h"
#include "Ravel_CSectionAssembler.h"
#include "StreamBuilder.h"

namespace {

using streams::Head;
using streams::Mid;
using streams::SectionOfSize;
using streams::Tail;

// One packet with the given counter; the payload is padded with 0xFF.
Bytes Pkt(uint8_t counter, bool pusi, const Bytes& payload, uint8_t adaptationControl = 1,
          const Bytes& adaptation = Bytes()) {
  sb::PacketWriter writer(streams::kAssemblerPid, counter);
  return writer.MakePacket(pusi, payload, adaptationControl, adaptation);
}
// An adaptation field of `size` bytes: no flags, then stuffing.
Bytes Stuffing(size_t size) { return sb::Cat({sb::U8(0), Bytes(size - 1, 0xFF)}); }
Bytes WithTransportError(Bytes packet) {
  packet[1] |= 0x80;
  return packet;
}

// Counters a case leaves out are expected to stay zero.
struct Counters {
  unsigned int delivered = 0, cut = 0, transportError = 0, repeated = 0, invalid = 0, breaks = 0, withoutStart = 0;
  bool operator==(const Counters& o) const {
    return delivered == o.delivered && cut == o.cut && transportError == o.transportError && repeated == o.repeated &&
           invalid == o.invalid && breaks == o.breaks && withoutStart == o.withoutStart;
  }
};
void PrintTo(const Counters& c, std::ostream* os) {
  *os << "{delivered " << c.delivered << ", cut " << c.cut << ", transportError " << c.transportError
      << ", repeated " << c.repeated << ", invalid " << c.invalid << ", breaks " << c.breaks << ", withoutStart "
      << c.withoutStart << "}";
}
Counters CountersOf(const RavelCSectionAssembler& a) {
  return Counters{.delivered = a.iSectionsDelivered,
                  .cut = a.iSectionsCut,
                  .transportError = a.iPacketsTransportError,
                  .repeated = a.iPacketsRepeated,
                  .invalid = a.iPacketsInvalid,
                  .breaks = a.iContinuityBreaks,
                  .withoutStart = a.iBytesWithoutStart};
}

// The handler a receiver would write: keeps a copy of each section.
void Keep(void* context, unsigned char* section, int size) {
  static_cast<std::vector<Bytes>*>(context)->push_back(Bytes(section, section + size));
}

const Bytes kA = SectionOfSize(40, 1);
const Bytes kB = SectionOfSize(30, 2);
const Bytes kC = SectionOfSize(20, 3);
const Bytes kLong = SectionOfSize(500, 4);  // three packets: 183 + 184 + 133 bytes
const Bytes kTdt = sb::ShortSection(0x70, sb::UtcTime(2026, 11, 24, 5, 0, 0), false);  // 8 bytes

std::vector<Bytes> Packed(const std::vector<Bytes>& sections, uint8_t firstCounter = 0) {
  sb::PacketWriter writer(streams::kAssemblerPid, firstCounter);
  writer.AddPackedSections(sections);
  return writer.Packets();
}
// kLong then kA, with packet `index` sent `times` times (0: lost).
std::vector<Bytes> LongThenA(size_t index = 0, int times = 1) {
  std::vector<Bytes> p = Packed({kLong, kA});
  if (times == 0) {
    p.erase(p.begin() + index);
  } else {
    p.insert(p.begin() + index, times - 1, Bytes(p[index]));
  }
  return p;
}
// kLong then kA, with `extra` sent after the first packet.
std::vector<Bytes> LongThenAWith(const Bytes& extra) {
  std::vector<Bytes> p = LongThenA();
  p.insert(p.begin() + 1, extra);
  return p;
}
std::vector<Bytes> Packets(const std::vector<Bytes>& packets) { return packets; }

struct Case {
  const char* name;
  std::function<std::vector<Bytes>()> packets;
  bool endOfInput = false;  // the input ends after the packets
  std::vector<Bytes> sections;
  Counters counters;
};

const Case kCases[] = {
    {.name = "several sections in one packet, each with its own size, then stuffing",
     .packets = [] { return Packed({kA, kB, kC}); },
     .sections = {kA, kB, kC},
     .counters = {.delivered = 3}},
    {.name = "more sections in one packet than a RavelCSectionData holds",
     .packets = [] { return Packed(std::vector<Bytes>(12, kTdt)); },
     .sections = std::vector<Bytes>(12, kTdt),
     .counters = {.delivered = 12}},
    {.name = "a section over three packets, the next starting where it ends",
     .packets = [] { return LongThenA(); },
     .sections = {kLong, kA},
     .counters = {.delivered = 2}},
    {.name = "a long section starting in the packet where a short one ends",
     .packets = [] { return Packed({kA, kLong}); },
     .sections = {kA, kLong},
     .counters = {.delivered = 2}},
    {.name = "section header split over two packets",  // the 182-byte section leaves one byte of the first packet
     .packets = [] {
       return Packets({Pkt(0, true, sb::Cat({sb::U8(0), SectionOfSize(182, 5), Head(kA, 1)})),
                       Pkt(1, false, Tail(kA, 1))});
     },
     .sections = {SectionOfSize(182, 5), kA},
     .counters = {.delivered = 2}},
    {.name = "a repeated packet is dropped once",
     .packets = [] { return LongThenA(1, 2); },
     .sections = {kLong, kA},
     .counters = {.delivered = 2, .repeated = 1}},
    {.name = "a packet sent three times breaks continuity and cuts the section",
     .packets = [] { return LongThenA(1, 3); },
     .sections = {kA},
     .counters = {.delivered = 1, .cut = 1, .repeated = 1, .breaks = 1, .withoutStart = 184 + 133}},
    {.name = "a lost packet cuts the section; the next one is whole",
     .packets = [] { return LongThenA(1, 0); },
     .sections = {kA},
     .counters = {.delivered = 1, .cut = 1, .breaks = 1, .withoutStart = 133}},
    {.name = "an announced discontinuity is no break, but the section in progress is lost",
     .packets = [] {
       return Packets({Pkt(0, true, sb::Cat({sb::U8(0), kLong})), Pkt(9, false, Mid(kLong, 183, 183), 3, Bytes{0x80}),
                       Pkt(10, true, sb::Cat({sb::U8(0), kA}))});
     },
     .sections = {kA},
     .counters = {.delivered = 1, .cut = 1, .withoutStart = 182}},
    {.name = "a packet with transport_error_indicator is ignored",
     .packets = [] { return LongThenAWith(WithTransportError(Pkt(7, true, Bytes{0x00, 0x42}))); },
     .sections = {kLong, kA},
     .counters = {.delivered = 2, .transportError = 1}},
    {.name = "adaptation-only packets neither carry bytes nor step the counter",
     .packets = [] { return LongThenAWith(Pkt(1, false, Bytes(), 2, Stuffing(183))); },
     .sections = {kLong, kA},
     .counters = {.delivered = 2}},
    {.name = "a payload after an adaptation field",
     .packets = [] { return Packets({Pkt(0, true, sb::Cat({sb::U8(0), kA}), 3, Stuffing(20))}); },
     .sections = {kA},
     .counters = {.delivered = 1}},
    {.name = "a section still short when the next one starts is cut",
     .packets = [] {
       return Packets({Pkt(0, true, sb::Cat({sb::U8(0), Head(kLong, 183)})),
                       Pkt(1, true, sb::Cat({sb::U8(10), Mid(kLong, 183, 10), kA}))});
     },
     .sections = {kA},
     .counters = {.delivered = 1, .cut = 1}},
    {.name = "joining a stream in the middle of a section",
     .packets = [] { return LongThenA(0, 0); },
     .sections = {kA},
     .counters = {.delivered = 1, .withoutStart = 184 + 133}},
    {.name = "a pointer_field past the packet end makes it invalid",
     .packets = [] {
       return Packets({Pkt(0, true, sb::Cat({sb::U8(0), Head(kLong, 183)})), Pkt(1, true, Bytes{0xB8}),
                       Pkt(2, true, sb::Cat({sb::U8(0), kA}))});
     },
     .sections = {kA},
     .counters = {.delivered = 1, .cut = 1, .invalid = 1}},
    {.name = "a section cut by the end of the input is counted",
     .packets = [] { return LongThenA(2, 0); },
     .endOfInput = true,
     .sections = {},
     .counters = {.cut = 1}},
};

TEST(SectionAssembler, DeliversWholeSectionsAndCountsWhatItDrops) {
  for (const Case& c : kCases) {
    SCOPED_TRACE(c.name);
    std::vector<Bytes> sections;
    RavelCSectionAssembler assembler(Keep, &sections);
    unsigned int reported = 0;  // the sum of what AddTSPacket returned
    for (const Bytes& packet : c.packets()) reported += static_cast<unsigned>(assembler.AddTSPacket(packet.data()));
    if (c.endOfInput) assembler.ClearPacketBuffer();
    EXPECT_EQ(c.sections, sections);
    EXPECT_EQ(c.counters, CountersOf(assembler));
    EXPECT_EQ(sections.size(), reported);  // a dropped packet completes nothing
  }
}

}  // namespace
