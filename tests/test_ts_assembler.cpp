// Section reassembly: packet sequences through one store, checking results,
// emitted sections, the store's members and the exact traces after each packet.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>
#include <ostream>
#include <string>

#include "AssemblerStreams.h"
#include "Ravel_CTSPktAssembler.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"

using namespace th;

namespace {

const uint16_t kPid = 0x0100;

Bytes Filler(size_t count, uint8_t first = 0x00) {
  Bytes b(count);
  for (size_t i = 0; i < count; ++i) b[i] = static_cast<uint8_t>((first + i) % 0xF0);  // never 0xFF
  return b;
}
using streams::Head;
using streams::Mid;
using streams::SectionOfSize;
using streams::Tail;

// One packet of `pid` with the given counter; the payload is padded with 0xFF.
Bytes Pkt(uint8_t counter, bool pusi, const Bytes& payload, uint8_t adaptationControl = 1,
          const Bytes& adaptation = Bytes(), uint16_t pid = kPid) {
  sb::PacketWriter writer(pid, counter);
  return writer.MakePacket(pusi, payload, adaptationControl, adaptation);
}

// The store's members after a packet: pieces held, bytes received, last
// continuity counter, section_length and PID.
struct State {
  int pieces = 0, received = 0, lastCounter = 255, sectionLen = -1;
  unsigned int pid = kPid;
  bool operator==(const State& o) const {
    return pieces == o.pieces && received == o.received && lastCounter == o.lastCounter &&
           sectionLen == o.sectionLen && pid == o.pid;
  }
};
void PrintTo(const State& s, std::ostream* os) {
  *os << "{pieces " << s.pieces << ", received " << s.received << ", lastCounter " << s.lastCounter << ", len "
      << s.sectionLen << ", pid 0x" << std::hex << s.pid << std::dec << "}";
}
const State kIdle = {.pid = 0xFFFF};
// Idle again, remembering the size of the last section for a start cut short.
State IdleAfter(int sectionLen) { return {.sectionLen = sectionLen, .pid = 0xFFFF}; }

State StateOf(const RavelCTSPktStore& store) {
  return {.pieces = store.iPacketArray.iCount, .received = store.iCurBufSize, .lastCounter = store.iLastConIndex,
          .sectionLen = store.iSectionLen, .pid = store.iPID};
}

std::vector<Bytes> SectionsOf(const RavelCSectionData& out) {
  std::vector<Bytes> sections;
  for (int i = 0; i < out.iSectionCount; ++i) {
    sections.emplace_back(out.pSection[i], out.pSection[i] + out.iSectionSize[i]);
  }
  return sections;
}

struct Step {
  Bytes packet;
  int result;
  std::vector<Bytes> sections;
  State state;
  TraceLines traces;
};

struct Scenario {
  const char* name;
  std::vector<Step> steps;
};

// Feeds each step's packet with a fresh output record and checks everything.
void RunScenario(const Scenario& scenario) {
  SCOPED_TRACE(scenario.name);
  RavelCTSPktStore store;
  for (size_t i = 0; i < scenario.steps.size(); ++i) {
    SCOPED_TRACE("packet " + std::to_string(i + 1));
    const Step& step = scenario.steps[i];
    TraceRecorder recorder;
    RavelCSectionData out;
    EXPECT_EQ(step.result, store.AddTSPacket(step.packet.data(), out));
    EXPECT_EQ(step.sections, SectionsOf(out));
    EXPECT_EQ(step.state, StateOf(store));
    EXPECT_EQ(step.traces, recorder.Lines());
  }
}

TraceLines ContinuityBreak(int pieces, unsigned int storePid, int last, unsigned int pid, int counter, int length,
                           int received) {
  char first[200];
  std::snprintf(first, sizeof(first),
                "Packet Count=[%d], Cont Index Invalid! PID=[0x%04x], iLastConIndex=[%d], PID=[0x%04x], "
                "Current Continuity Index=[%d]\n",
                pieces, storePid, last, pid, counter);
  return {{kDump, first}, {kDump,
           "Section Length=[" + std::to_string(length) + "], Cur Received Byte=[" + std::to_string(received) + "]\n"}};
}

const TraceLines kBadSync = {{kError, "Invalid TS Packet Start Byte=[0x48]\n"},
                             {kError, "TS Packet Parsing Fail! iResult=[-7]\n"}};
const TraceLines kNoPayload = {{kError, "This TS Packet hasn't payload! This will be discarded!\n"}};

Bytes BadSync(Bytes packet) {
  packet[0] = 0x48;
  return packet;
}

// A section start whose pointer field leaves only `headerBytes` of the section in the packet.
Bytes StartCutAfter(uint8_t counter, const Bytes& headerBytes) {
  const uint8_t skipped = static_cast<uint8_t>(183 - headerBytes.size());
  return Pkt(counter, true, sb::Cat({{skipped}, Filler(skipped), headerBytes}));
}

}  // namespace

TEST(TSPktStore, IdleStoreHandlesSectionStartsOfOnePacket) {
  const Bytes s103 = SectionOfSize(103, 1), s100 = SectionOfSize(100, 2), a20 = SectionOfSize(20, 3),
              b30 = SectionOfSize(30, 4), s183 = SectionOfSize(183, 5), s181 = SectionOfSize(181, 6),
              s300 = SectionOfSize(300, 7);
  const State oneByte = {.pieces = 1, .received = 1, .lastCounter = 3};
  const State twoBytes = {.pieces = 1, .received = 2, .lastCounter = 3};
  const TraceLines noPointerField = {{kError, "Section Pointer Field Invalid! =>[0]\n"}};
  const std::vector<Scenario> scenarios = {
      {"section_length 100 followed by stuffing", {{Pkt(3, true, sb::Cat({{0}, s103})), 1, {s103}, kIdle, {}}}},
      {"pointer field skips the tail of a missed section",
       {{Pkt(3, true, sb::Cat({{5}, Filler(5), s103})), 1, {s103}, kIdle, {}}}},
      {"a second section waits under the first one's size",
       {{Pkt(3, true, sb::Cat({{0}, a20, b30})), 1, {a20},
         {.pieces = 1, .received = 163, .lastCounter = 3, .sectionLen = 20}, {}}}},
      {"a section ending with the packet leaves an empty piece of unknown length",
       {{Pkt(3, true, sb::Cat({{0}, s183})), 1, {s183}, {.pieces = 1, .received = 0, .lastCounter = 3}, {}}}},
      {"two bytes of a next section", {{Pkt(3, true, sb::Cat({{0}, s181, {0x42, 0xF0}})), 1, {s181}, twoBytes, {}}}},
      {"section longer than the packet",
       {{Pkt(3, true, sb::Cat({{0}, Head(s300, 183)})), 0, {},
         {.pieces = 1, .received = 183, .lastCounter = 3, .sectionLen = 300}, {}}}},
      {"section_length cut after two bytes", {{StartCutAfter(3, {0x42, 0xF0}), 0, {}, twoBytes, {}}}},
      {"only the table_id in the packet", {{StartCutAfter(3, {0x42}), 0, {}, oneByte, {}}}},
      {"pointer field 183", {{Pkt(3, true, sb::Cat({{183}, Filler(183)})), 0, {}, kIdle,
         {{kError, "Section Pointer Field Invalid! =>[183]\n"}}}}},
      {"continuation without a start is dropped silently", {{Pkt(3, false, s103), 0, {}, kIdle, {}}}},
      {"section after an adaptation field",
       {{Pkt(3, true, sb::Cat({{0}, s100}), 3, Filler(10)), 1, {s100}, kIdle, {}}}},
      {"a payload of one byte: its pointer field points past it",
       {{Pkt(3, true, {7}, 3, Filler(182)), 0, {}, kIdle, {{kError, "Section Pointer Field Invalid! =>[7]\n"}}}}},
      {"adaptation field filling the packet: no pointer field",
       {{Pkt(3, true, {}, 3, Filler(183)), 0, {}, kIdle, noPointerField}}},
      {"adaptation_field_length 200 is never followed out of the packet",
       {{Pkt(3, true, {}, 3, Filler(200)), 0, {}, kIdle, noPointerField}}},
      {"adaptation field only", {{Pkt(3, true, sb::Cat({{0}, s103}), 2, Filler(4)), 0, {}, kIdle, kNoPayload}}},
      {"bad sync byte", {{BadSync(Pkt(3, true, sb::Cat({{0}, s103}))), 0, {}, kIdle, kBadSync}}},
      {"reserved adaptation field control", {{Pkt(3, true, sb::Cat({{0}, s103}), 0), 0, {}, kIdle,
         {{kError, "Invalid Adaptation Field Control! => 0x0]"}, {kError, "TS Packet Parsing Fail! iResult=[-8]\n"}}}}},
  };
  for (const Scenario& scenario : scenarios) RunScenario(scenario);

  TraceRecorder recorder;
  RavelCTSPktStore store;
  RavelCSectionData out;
  EXPECT_EQ(0, store.AddTSPacket(nullptr, out));
  EXPECT_EQ(TraceLines({{kError, "TS Packet Parsing Fail! iResult=[-8]\n"}}), recorder.Lines());
  EXPECT_EQ("SectionParser/source/Ravel_CTSPktAssembler", recorder.Records()[0].file);
}

TEST(TSPktStore, ChecksTheContinuityCounterWhileCollecting) {
  const Bytes s400 = SectionOfSize(400, 0x11);
  sb::PacketWriter from5(kPid, 5), from14(kPid, 14);
  from5.AddSection(s400);
  from14.AddSection(s400);
  const std::vector<Bytes>& p = from5.Packets();
  const std::vector<Bytes>& q = from14.Packets();
  ASSERT_EQ(3u, p.size());
  const Bytes adaptationOnly = Pkt(6, false, {}, 2, Filler(20));
  const Bytes otherPidBreak = Pkt(9, false, Mid(s400, 183, 184), 1, {}, 0x0200);
  const Bytes otherPidContinues = Pkt(6, false, Mid(s400, 183, 184), 1, {}, 0x0200);

  const State one = {.pieces = 1, .received = 183, .lastCounter = 5, .sectionLen = 400};
  const State two = {.pieces = 2, .received = 367, .lastCounter = 6, .sectionLen = 400};

  const std::vector<Scenario> scenarios = {
      {"counters 5, 6, 7", {{p[0], 0, {}, one, {}}, {p[1], 0, {}, two, {}}, {p[2], 1, {s400}, kIdle, {}}}},
      {"counters 14, 15, 0",
       {{q[0], 0, {}, {.pieces = 1, .received = 183, .lastCounter = 14, .sectionLen = 400}, {}},
        {q[1], 0, {}, {.pieces = 2, .received = 367, .lastCounter = 15, .sectionLen = 400}, {}},
        {q[2], 1, {s400}, kIdle, {}}}},
      {"repeated counter drops the section, then the rest is dropped silently",
       {{p[0], 0, {}, one, {}}, {p[1], 0, {}, two, {}},
        {p[1], 0, {}, kIdle, ContinuityBreak(2, kPid, 6, kPid, 6, 400, 367)}, {p[2], 0, {}, kIdle, {}}}},
      {"repeated counter on a section start starts over",
       {{p[0], 0, {}, one, {}}, {p[0], 0, {}, one, ContinuityBreak(1, kPid, 5, kPid, 5, 400, 183)},
        {p[1], 0, {}, two, {}}, {p[2], 1, {s400}, kIdle, {}}}},
      {"lost packet", {{p[0], 0, {}, one, {}}, {p[2], 0, {}, kIdle, ContinuityBreak(1, kPid, 5, kPid, 7, 400, 183)}}},
      {"a packet of another PID prints both PIDs",
       {{p[0], 0, {}, one, {}}, {otherPidBreak, 0, {}, kIdle, ContinuityBreak(1, kPid, 5, 0x0200, 9, 400, 183)}}},
      {"the store does not filter by PID: a fitting counter continues",
       {{p[0], 0, {}, one, {}}, {otherPidContinues, 0, {}, two, {}}, {p[2], 1, {s400}, kIdle, {}}}},
      {"an adaptation-only packet is discarded without recording its counter",
       {{p[0], 0, {}, one, {}},
        {adaptationOnly, 0, {}, one, kNoPayload},
        {p[1], 0, {}, two, {}}, {p[2], 1, {s400}, kIdle, {}}}},
      {"a broken packet leaves the pending section as it was",
       {{p[0], 0, {}, one, {}}, {BadSync(p[1]), 0, {}, one, kBadSync}, {p[1], 0, {}, two, {}},
        {p[2], 1, {s400}, kIdle, {}}}},
  };
  for (const Scenario& scenario : scenarios) RunScenario(scenario);
}

TEST(TSPktStore, FollowsThePointerFieldOfAStartInAContinuingStore) {
  const Bytes s300 = SectionOfSize(300, 0x21), s50 = SectionOfSize(50, 0x22), s400 = SectionOfSize(400, 0x23),
              other300 = SectionOfSize(300, 0x24);
  const Bytes first = Pkt(0, true, sb::Cat({{0}, Head(s300, 183)}));
  const State collecting = {.pieces = 1, .received = 183, .lastCounter = 0, .sectionLen = 300};
  const Step start = {first, 0, {}, collecting, {}};
  const Bytes after = Filler(184, 0x10);
  auto pointerInvalid = [](int length) {
    return TraceLines{{kError, "Invalid Pointer Field Length! curSectionLen=[" + std::to_string(length) + "]\n"}};
  };
  const TraceLines tooShort = {
      {kError, "Section Length Invalid!! Section Len=[300], Cur Size=[183], Remained Size=[50]\n"}};

  const std::vector<Scenario> scenarios = {
      {"pointer field ends the section, a whole one follows and keeps its size",
       {start, {Pkt(1, true, sb::Cat({{117}, Tail(s300, 183), s50})), 1, {s300, s50}, IdleAfter(50), {}},
        // The next start has fewer than 3 bytes: the size of the last section is used.
        {StartCutAfter(2, {0x42, 0xF0}), 0, {}, {.pieces = 1, .received = 2, .lastCounter = 2, .sectionLen = 50}, {}},
        {Pkt(3, false, after), 1, {sb::Cat({{0x42, 0xF0}, Head(after, 48)})}, kIdle, {}}}},
      {"pointer field ends the section, the next one spans",
       {start, {Pkt(1, true, sb::Cat({{117}, Tail(s300, 183), Head(s400, 66)})), 1, {s300},
                {.pieces = 1, .received = 66, .lastCounter = 1, .sectionLen = 400}, {}}}},
      {"pointer field too short for the pending section",
       {start, {Pkt(1, true, sb::Cat({{50}, Filler(50), s50})), 1, {s50}, IdleAfter(50), tooShort}}},
      {"pointer field too short and the next section spans",
       {start, {Pkt(1, true, sb::Cat({{50}, Filler(50), Head(other300, 133)})), 0, {},
                {.pieces = 1, .received = 133, .lastCounter = 1, .sectionLen = 300}, tooShort}}},
      {"pointer field past the payload keeps the section; the unrecorded counter then breaks it",
       {start, {Pkt(1, true, sb::Cat({{184}, Filler(183)})), 0, {}, collecting, pointerInvalid(184)},
        {Pkt(2, false, Tail(s300, 183)), 0, {}, kIdle, ContinuityBreak(1, kPid, 0, kPid, 2, 300, 183)}}},
      {"pointer field measured behind an adaptation field",
       {start, {Pkt(1, true, sb::Cat({{173}, Filler(172)}), 3, Filler(10)), 0, {}, collecting, pointerInvalid(173)}}},
      {"pointer field reaching the packet end leaves an empty piece",
       {start, {Pkt(1, true, sb::Cat({{172}, Tail(s300, 183), Filler(55)}), 3, Filler(10)), 1, {s300},
                {.pieces = 1, .received = 0, .lastCounter = 1}, {}}}},
      {"adaptation field filling a section start while collecting",
       {start, {Pkt(1, true, {}, 3, Filler(183)), 0, {}, collecting, pointerInvalid(0)}}},
      {"adaptation field filling a continuation stores an empty piece",
       {start,
        {Pkt(1, false, {}, 3, Filler(183)), 0, {}, {.pieces = 2, .received = 183, .lastCounter = 1, .sectionLen = 300}, {}},
        {Pkt(2, false, Tail(s300, 183)), 1, {s300}, kIdle, {}}}},
  };
  for (const Scenario& scenario : scenarios) RunScenario(scenario);
}

TEST(TSPktStore, SecondSectionOfAPacketIsCutToTheFirstOnesSize) {
  const Bytes a20 = SectionOfSize(20, 0x31), b30 = SectionOfSize(30, 0x32), b500 = SectionOfSize(500, 0x33),
              c40 = SectionOfSize(40, 0x34);
  const Bytes packed = Pkt(0, true, sb::Cat({{0}, a20, b30}));
  const State waiting = {.pieces = 1, .received = 163, .lastCounter = 0, .sectionLen = 20};

  const std::vector<Scenario> scenarios = {
      {"a continuation emits the waiting section by the first one's size",
       {{packed, 1, {a20}, waiting, {}}, {Pkt(1, false, Filler(184)), 1, {Head(b30, 20)}, kIdle, {}}}},
      {"a spanning second section loses its tail",
       {{Pkt(0, true, sb::Cat({{0}, a20, Head(b500, 163)})), 1, {a20}, waiting, {}},
        {Pkt(1, false, Mid(b500, 163, 184)), 1, {Head(b500, 20)}, kIdle, {}},
        {Pkt(2, false, Tail(b500, 347)), 0, {}, kIdle, {}}}},
      {"a next start flushes the waiting section, then its own",
       {{packed, 1, {a20}, waiting, {}},
        {Pkt(1, true, sb::Cat({{0}, c40})), 1, {Head(b30, 20), c40}, IdleAfter(40), {}}}},
  };
  for (const Scenario& scenario : scenarios) RunScenario(scenario);
}

TEST(TSPktStore, RecoversASplitSectionHeaderFromTheNewPacketsBytes) {
  const Bytes s183 = SectionOfSize(183, 0x41), s50 = SectionOfSize(50, 0x42), s181 = SectionOfSize(181, 0x43);
  const Bytes cont45 = sb::Cat({{0xB0, 0x00, 0x2A}, Filler(181)});  // bytes 1-2: length 0x02A
  const Bytes cont8 = sb::Cat({{0x1F, 0x00, 0x05}, Filler(181)});   // bytes 1-2: length 0x005
  const Bytes start264 = sb::Cat({{0}, {0x2C, 0x01, 0x05}, Filler(180)});
  const Bytes after = Filler(184, 0x20);
  const TraceLines divided = {{kWarning, "Section length field is divided in two ts packets!\n"}};
  auto with = [&](const std::string& error) { return TraceLines{divided[0], {kError, error}}; };
  auto mismatch = [](int held, int length) {
    return "Data size not matched! bufPos=[184], iCurBufSize=[" + std::to_string(held) + "], iSectionLen=[" +
           std::to_string(length) + "]\n";
  };
  const State oneByte = {.pieces = 1, .received = 1, .lastCounter = 0};
  const State twoBytes = {.pieces = 1, .received = 2, .lastCounter = 0};

  const std::vector<Scenario> scenarios = {
      {"table_id alone: the held byte is lost and the length comes from new bytes 1-2",
       {{StartCutAfter(0, {0x42}), 0, {}, oneByte, {}},
        {Pkt(1, false, cont45), 1, {Head(cont45, 45)}, kIdle, with(mismatch(185, 45))}}},
      {"two header bytes, short length",
       {{StartCutAfter(0, {0x42, 0xF0}), 0, {}, twoBytes, {}},
        {Pkt(1, false, cont8), 1, {Head(cont8, 8)}, kIdle, with(mismatch(186, 8))}}},
      {"two header bytes, then a section start: the bytes after the pointer field",
       {{StartCutAfter(0, {0x42, 0xB0}), 0, {}, twoBytes, {}},
        {Pkt(1, true, start264), 0, {}, {.pieces = 1, .received = 183, .lastCounter = 1, .sectionLen = 264},
         with("Section Length Invalid!! Section Len=[264], Cur Size=[2], Remained Size=[0]\n")}}},
      {"after a section that ended with its packet",
       {{Pkt(0, true, sb::Cat({{0}, s183})), 1, {s183}, {.pieces = 1, .received = 0, .lastCounter = 0}, {}},
        {Pkt(1, true, sb::Cat({{0}, s50})), 1, {s50}, IdleAfter(50),
         with("Section Length Invalid!! Section Len=[50], Cur Size=[0], Remained Size=[0]\n")}}},
      {"second header cut by the packet end after a whole section",
       {{Pkt(0, true, sb::Cat({{0}, s181, {0x42, 0xB0}})), 1, {s181}, twoBytes, {}},
        {Pkt(1, false, cont8), 1, {Head(cont8, 8)}, kIdle, with(mismatch(186, 8))}}},
      {"a continuation without payload bytes: the length comes from the held byte alone",
       {{StartCutAfter(0, {0x42}), 0, {}, oneByte, {}},
        {Pkt(1, false, {}, 3, Filler(183)), 0, {}, {.pieces = 2, .received = 1, .lastCounter = 1, .sectionLen = 3},
         divided},
        {Pkt(2, false, after), 1, {Head(after, 3)}, kIdle, {{kError, mismatch(185, 3)}}}}},
  };
  for (const Scenario& scenario : scenarios) RunScenario(scenario);
}

TEST(TSPktStore, UnknownLengthWithoutASingleShortPieceDropsTheSection) {
  sb::PacketWriter writer(kPid, 0);
  writer.AddSection(SectionOfSize(400, 0x51));
  for (int packetsBefore : {1, 2}) {
    SCOPED_TRACE(packetsBefore);
    RavelCTSPktStore store;
    RavelCSectionData out;
    for (int i = 0; i < packetsBefore; ++i) store.AddTSPacket(writer.Packets()[i].data(), out);
    store.iSectionLen = -1;
    TraceRecorder recorder;
    EXPECT_EQ(0, store.AddTSPacket(writer.Packets()[packetsBefore].data(), out));
    EXPECT_EQ(0, out.iSectionCount);
    EXPECT_EQ(kIdle, StateOf(store));
    EXPECT_EQ(TraceLines({{kWarning, "Section length field is divided in two ts packets!\n"},
                          {kError, "Section length should be set before this time!\n"}}),
              recorder.Lines());
  }
}

TEST(TSPktStore, GetAssembleDataAndClearPacketBuffer) {
  const Bytes s300 = SectionOfSize(300, 0x61);
  const TraceLines noData = {{kError, "GetAssembleData Called! But no data is in the buffer!\n"}};
  struct Case {
    const char* name;
    std::vector<Bytes> packets;
    TraceLines traces;
    std::vector<Bytes> sections;
    State after;
  } cases[] = {
      {"idle store", {}, noData, {}, kIdle},
      {"header cut: length unknown", {StartCutAfter(0, {0x42})}, noData, {},
       {.pieces = 1, .received = 1, .lastCounter = 0}},
      {"empty piece after a section ending with its packet", {Pkt(0, true, sb::Cat({{0}, SectionOfSize(183, 0x62)}))},
       noData, {}, {.pieces = 1, .received = 0, .lastCounter = 0}},
      // Called early, the entry still carries the full section size; the part
      // not yet received reads as zeros.
      {"section in progress", {Pkt(0, true, sb::Cat({{0}, Head(s300, 183)}))}, {},
       {sb::Cat({Head(s300, 183), Bytes(117, 0)})}, kIdle},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    RavelCTSPktStore store;
    RavelCSectionData out;
    for (const Bytes& packet : c.packets) store.AddTSPacket(packet.data(), out);
    TraceRecorder recorder;
    RavelCSectionData assembled;
    store.GetAssembleData(assembled);
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ(c.sections, SectionsOf(assembled));
    EXPECT_EQ(c.after, StateOf(store));
  }

  // ClearPacketBuffer drops a grown store back to the reset values and keeps its storage.
  RavelCTSPktStore store;
  RavelCSectionData out;
  sb::PacketWriter writer(kPid, 0);
  writer.AddSection(SectionOfSize(2000, 0x63));
  for (size_t i = 0; i + 1 < writer.Packets().size(); ++i) store.AddTSPacket(writer.Packets()[i].data(), out);
  EXPECT_EQ(10, store.iPacketArray.iCount);
  EXPECT_EQ(0, store.ClearPacketBuffer());
  EXPECT_EQ(kIdle, StateOf(store));
  EXPECT_EQ(16, store.iPacketArray.iMaxCount);
}

TEST(TSPktEntry, StoresUpTo188BytesAndGivesThemOnce) {
  const Bytes data = Filler(300, 0x01);
  for (int len : {0, 1, 184, 188, 189, 300}) {
    SCOPED_TRACE(len);
    const int stored = len <= 188 ? len : 0;
    // Both the constructor and SetData refuse what does not fit.
    const TraceLines trace =
        stored == len ? TraceLines() : TraceLines(2, {kError, "Too long data lenght=[" + std::to_string(len) + "]\n"});
    TraceRecorder recorder;
    RavelCPktEntry built(data.data(), len);
    RavelCPktEntry set;
    set.SetData(data.data(), len);
    EXPECT_EQ(trace, recorder.Lines());
    for (RavelCPktEntry* entry : {&built, &set}) {
      unsigned char copy[188];
      std::memset(copy, 0xEE, sizeof(copy));
      int count = -1;
      EXPECT_EQ(stored, entry->GetData(copy, count));
      EXPECT_EQ(stored, count);
      EXPECT_EQ(Bytes(data.begin(), data.begin() + stored), Bytes(copy, copy + stored));
      EXPECT_TRUE(stored == 188 || copy[stored] == 0xEE);  // nothing written past the data
      EXPECT_EQ(0, entry->GetData(copy, count));
      EXPECT_EQ(0, count);
    }
  }
}

TEST(TSSectionData, CopiesDeeplyAndNeverExceedsFiveSections) {
  const Bytes s20 = SectionOfSize(20, 0x71), s30 = SectionOfSize(30, 0x72);
  RavelCTSPktStore store;
  RavelCSectionData source;
  ASSERT_EQ(1, store.AddTSPacket(Pkt(0, true, sb::Cat({{0}, s20})).data(), source));
  ASSERT_EQ(1, store.AddTSPacket(Pkt(1, true, sb::Cat({{0}, s30})).data(), source));
  RavelCSectionData copied(source);
  RavelCSectionData assigned;
  ASSERT_EQ(1, store.AddTSPacket(Pkt(2, true, sb::Cat({{0}, SectionOfSize(40, 0x73)})).data(), assigned));
  assigned = source;  // the earlier section of `assigned` is released, not leaked
  assigned = assigned;
  for (RavelCSectionData* copy : {&copied, &assigned}) {
    EXPECT_EQ(std::vector<Bytes>({s20, s30}), SectionsOf(*copy));
    EXPECT_NE(source.pSection[1], copy->pSection[1]);
    EXPECT_EQ(nullptr, copy->pSection[2]);
  }

  // A record that is never emptied holds five sections; later ones are dropped.
  RavelCSectionData full;
  for (uint8_t i = 0; i < 7; ++i) {
    EXPECT_EQ(1, store.AddTSPacket(Pkt(i, true, sb::Cat({{0}, SectionOfSize(20 + i, i)})).data(), full));
  }
  ASSERT_EQ(5, full.iSectionCount);
  EXPECT_EQ(SectionOfSize(24, 4), SectionsOf(full)[4]);
}

TEST(TSPktStore, CopiesAreDeepAndGoOnIndependently) {
  sb::PacketWriter writer(kPid, 9);
  writer.AddSection(SectionOfSize(400, 0x81));
  const std::vector<Bytes>& p = writer.Packets();
  RavelCTSPktStore original;
  RavelCSectionData out;
  original.AddTSPacket(p[0].data(), out);
  original.AddTSPacket(p[1].data(), out);
  RavelCTSPktStore copied(original);
  RavelCTSPktStore assigned;
  assigned.AddTSPacket(Pkt(4, true, sb::Cat({{0}, Head(SectionOfSize(300, 0x82), 183)})).data(), out);
  assigned = original;
  const State collecting = StateOf(original);
  for (RavelCTSPktStore* copy : {&copied, &assigned}) EXPECT_NE(nullptr, copy->iPacketArray.ipArray[1]);
  // The original finishes first: the copies hold pieces of their own.
  for (RavelCTSPktStore* store : {&original, &copied, &assigned}) {
    EXPECT_EQ(collecting, StateOf(*store));
    RavelCSectionData done;
    EXPECT_EQ(1, store->AddTSPacket(p[2].data(), done));
    EXPECT_EQ(std::vector<Bytes>({SectionOfSize(400, 0x81)}), SectionsOf(done));
  }
}
