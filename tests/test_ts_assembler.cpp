// Section reassembly: packet sequences through one store, checking results,
// emitted sections, the store's members and the exact traces after each packet.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>
#include <ostream>
#include <string>

#include "AssemblerStreams.h"
#include "Captures.h"
#include "Ravel_CTSPktAssembler.h"
#include "Ravel_Util.h"
#include "StreamBuilder.h"
#include "TraceRecorder.h"

namespace {

const unsigned int kDump = 0x10000020u;
const unsigned int kWarning = 0x40000020u;
const unsigned int kError = 0x80000020u;
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

struct State {
  int pieces;
  int curBufSize;
  int lastConIndex;
  int sectionLen;
  unsigned int pid;
  bool operator==(const State& o) const {
    return pieces == o.pieces && curBufSize == o.curBufSize && lastConIndex == o.lastConIndex &&
           sectionLen == o.sectionLen && pid == o.pid;
  }
};
void PrintTo(const State& s, std::ostream* os) {
  *os << "{pieces " << s.pieces << ", cur " << s.curBufSize << ", lastCon " << s.lastConIndex << ", len "
      << s.sectionLen << ", pid 0x" << std::hex << s.pid << std::dec << "}";
}
const State kIdle = {0, 0, 255, -1, 0xFFFF};

State StateOf(const RavelCTSPktStore& store) {
  return State{store.iPacketArray.iCount, store.iCurBufSize, store.iLastConIndex, store.iSectionLen, store.iPID};
}

std::vector<Bytes> SectionsOf(const RavelCSectionData& out) {
  std::vector<Bytes> sections;
  for (int i = 0; i < out.iSectionCount; ++i) {
    sections.push_back(Bytes(out.pSection[i], out.pSection[i] + out.iSectionSize[i]));
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
    ASSERT_EQ(188u, step.packet.size());
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

Bytes BadSync(Bytes packet) {
  packet[0] = 0x48;
  return packet;
}

}  // namespace

TEST(TSPktStore, IdleStoreHandlesSectionStartsOfOnePacket) {
  const Bytes s103 = SectionOfSize(103, 1), s100 = SectionOfSize(100, 2), a20 = SectionOfSize(20, 3),
              b30 = SectionOfSize(30, 4), s183 = SectionOfSize(183, 5), s181 = SectionOfSize(181, 6),
              s300 = SectionOfSize(300, 7);
  const std::vector<Scenario> scenarios = {
      {"section_length 100 followed by stuffing", {{Pkt(3, true, sb::Cat({{0}, s103})), 1, {s103}, kIdle, {}}}},
      {"pointer field skips the tail of a missed section",
       {{Pkt(3, true, sb::Cat({{5}, Filler(5), s103})), 1, {s103}, kIdle, {}}}},
      {"a second section waits under the first one's size",
       {{Pkt(3, true, sb::Cat({{0}, a20, b30})), 1, {a20}, {1, 163, 3, 20, kPid}, {}}}},
      {"a section ending with the packet leaves an empty piece of unknown length",
       {{Pkt(3, true, sb::Cat({{0}, s183})), 1, {s183}, {1, 0, 3, -1, kPid}, {}}}},
      {"two bytes of a next section",
       {{Pkt(3, true, sb::Cat({{0}, s181, {0x42, 0xF0}})), 1, {s181}, {1, 2, 3, -1, kPid}, {}}}},
      {"section longer than the packet",
       {{Pkt(3, true, sb::Cat({{0}, Head(s300, 183)})), 0, {}, {1, 183, 3, 300, kPid}, {}}}},
      {"section_length cut after two bytes",
       {{Pkt(3, true, sb::Cat({{181}, Filler(181), {0x42, 0xF0}})), 0, {}, {1, 2, 3, -1, kPid}, {}}}},
      {"only the table_id in the packet",
       {{Pkt(3, true, sb::Cat({{182}, Filler(182), {0x42}})), 0, {}, {1, 1, 3, -1, kPid}, {}}}},
      {"pointer field 183", {{Pkt(3, true, sb::Cat({{183}, Filler(183)})), 0, {}, kIdle,
         {{kError, "Section Pointer Field Invalid! =>[183]\n"}}}}},
      {"continuation without a start is dropped silently", {{Pkt(3, false, s103), 0, {}, kIdle, {}}}},
      {"section after an adaptation field",
       {{Pkt(3, true, sb::Cat({{0}, s100}), 3, Filler(10)), 1, {s100}, kIdle, {}}}},
      {"a payload of one byte: its pointer field points past it",
       {{Pkt(3, true, {7}, 3, Filler(182)), 0, {}, kIdle, {{kError, "Section Pointer Field Invalid! =>[7]\n"}}}}},
      {"adaptation field filling the packet: no pointer field",
       {{Pkt(3, true, {}, 3, Filler(183)), 0, {}, kIdle, {{kError, "Section Pointer Field Invalid! =>[0]\n"}}}}},
      {"adaptation_field_length 200 is never followed out of the packet",
       {{Pkt(3, true, {}, 3, Filler(200)), 0, {}, kIdle, {{kError, "Section Pointer Field Invalid! =>[0]\n"}}}}},
      {"adaptation field only", {{Pkt(3, true, sb::Cat({{0}, s103}), 2, Filler(4)), 0, {}, kIdle,
         {{kError, "This TS Packet hasn't payload! This will be discarded!\n"}}}}},
      {"bad sync byte", {{BadSync(Pkt(3, true, sb::Cat({{0}, s103}))), 0, {}, kIdle,
         {{kError, "Invalid TS Packet Start Byte=[0x48]\n"}, {kError, "TS Packet Parsing Fail! iResult=[-7]\n"}}}}},
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

  const std::vector<Scenario> scenarios = {
      {"counters 5, 6, 7", {{p[0], 0, {}, {1, 183, 5, 400, kPid}, {}}, {p[1], 0, {}, {2, 367, 6, 400, kPid}, {}},
        {p[2], 1, {s400}, kIdle, {}}}},
      {"counters 14, 15, 0", {{q[0], 0, {}, {1, 183, 14, 400, kPid}, {}}, {q[1], 0, {}, {2, 367, 15, 400, kPid}, {}},
        {q[2], 1, {s400}, kIdle, {}}}},
      {"repeated counter drops the section, then the rest is dropped silently",
       {{p[0], 0, {}, {1, 183, 5, 400, kPid}, {}}, {p[1], 0, {}, {2, 367, 6, 400, kPid}, {}},
        {p[1], 0, {}, kIdle, ContinuityBreak(2, kPid, 6, kPid, 6, 400, 367)}, {p[2], 0, {}, kIdle, {}}}},
      {"repeated counter on a section start starts over", {{p[0], 0, {}, {1, 183, 5, 400, kPid}, {}},
        {p[0], 0, {}, {1, 183, 5, 400, kPid}, ContinuityBreak(1, kPid, 5, kPid, 5, 400, 183)},
        {p[1], 0, {}, {2, 367, 6, 400, kPid}, {}}, {p[2], 1, {s400}, kIdle, {}}}},
      {"lost packet", {{p[0], 0, {}, {1, 183, 5, 400, kPid}, {}},
        {p[2], 0, {}, kIdle, ContinuityBreak(1, kPid, 5, kPid, 7, 400, 183)}}},
      {"a packet of another PID prints both PIDs", {{p[0], 0, {}, {1, 183, 5, 400, kPid}, {}},
        {otherPidBreak, 0, {}, kIdle, ContinuityBreak(1, kPid, 5, 0x0200, 9, 400, 183)}}},
      {"the store does not filter by PID: a fitting counter continues", {{p[0], 0, {}, {1, 183, 5, 400, kPid}, {}},
        {otherPidContinues, 0, {}, {2, 367, 6, 400, kPid}, {}}, {p[2], 1, {s400}, kIdle, {}}}},
      {"an adaptation-only packet is discarded without recording its counter",
       {{p[0], 0, {}, {1, 183, 5, 400, kPid}, {}}, {adaptationOnly, 0, {}, {1, 183, 5, 400, kPid},
         {{kError, "This TS Packet hasn't payload! This will be discarded!\n"}}},
        {p[1], 0, {}, {2, 367, 6, 400, kPid}, {}}, {p[2], 1, {s400}, kIdle, {}}}},
      {"a broken packet leaves the pending section as it was", {{p[0], 0, {}, {1, 183, 5, 400, kPid}, {}},
        {BadSync(p[1]), 0, {}, {1, 183, 5, 400, kPid},
         {{kError, "Invalid TS Packet Start Byte=[0x48]\n"}, {kError, "TS Packet Parsing Fail! iResult=[-7]\n"}}},
        {p[1], 0, {}, {2, 367, 6, 400, kPid}, {}}, {p[2], 1, {s400}, kIdle, {}}}},
  };
  for (const Scenario& scenario : scenarios) RunScenario(scenario);
}

TEST(TSPktStore, FollowsThePointerFieldOfAStartInAContinuingStore) {
  const Bytes s300 = SectionOfSize(300, 0x21), s50 = SectionOfSize(50, 0x22), s400 = SectionOfSize(400, 0x23),
              other300 = SectionOfSize(300, 0x24);
  const Bytes first = Pkt(0, true, sb::Cat({{0}, Head(s300, 183)}));
  const State collecting = {1, 183, 0, 300, kPid};
  const Bytes after = Filler(184, 0x10);

  const std::vector<Scenario> scenarios = {
      {"pointer field ends the section, a whole one follows and keeps its size", {{first, 0, {}, collecting, {}},
        {Pkt(1, true, sb::Cat({{117}, Tail(s300, 183), s50})), 1, {s300, s50}, {0, 0, 255, 50, 0xFFFF}, {}},
        // The next start has fewer than 3 bytes: the size of the last section is used.
        {Pkt(2, true, sb::Cat({{181}, Filler(181), {0x42, 0xF0}})), 0, {}, {1, 2, 2, 50, kPid}, {}},
        {Pkt(3, false, after), 1, {sb::Cat({{0x42, 0xF0}, Head(after, 48)})}, kIdle, {}}}},
      {"pointer field ends the section, the next one spans", {{first, 0, {}, collecting, {}},
        {Pkt(1, true, sb::Cat({{117}, Tail(s300, 183), Head(s400, 66)})), 1, {s300}, {1, 66, 1, 400, kPid}, {}}}},
      {"pointer field too short for the pending section", {{first, 0, {}, collecting, {}},
        {Pkt(1, true, sb::Cat({{50}, Filler(50), s50})), 1, {s50}, {0, 0, 255, 50, 0xFFFF},
         {{kError, "Section Length Invalid!! Section Len=[300], Cur Size=[183], Remained Size=[50]\n"}}}}},
      {"pointer field too short and the next section spans", {{first, 0, {}, collecting, {}},
        {Pkt(1, true, sb::Cat({{50}, Filler(50), Head(other300, 133)})), 0, {}, {1, 133, 1, 300, kPid},
         {{kError, "Section Length Invalid!! Section Len=[300], Cur Size=[183], Remained Size=[50]\n"}}}}},
      {"pointer field past the payload keeps the section; the unrecorded counter then breaks it",
       {{first, 0, {}, collecting, {}}, {Pkt(1, true, sb::Cat({{184}, Filler(183)})), 0, {}, collecting,
         {{kError, "Invalid Pointer Field Length! curSectionLen=[184]\n"}}},
        {Pkt(2, false, Tail(s300, 183)), 0, {}, kIdle, ContinuityBreak(1, kPid, 0, kPid, 2, 300, 183)}}},
      {"pointer field measured behind an adaptation field", {{first, 0, {}, collecting, {}},
        {Pkt(1, true, sb::Cat({{173}, Filler(172)}), 3, Filler(10)), 0, {}, collecting,
         {{kError, "Invalid Pointer Field Length! curSectionLen=[173]\n"}}}}},
      {"pointer field reaching the packet end leaves an empty piece", {{first, 0, {}, collecting, {}},
        {Pkt(1, true, sb::Cat({{172}, Tail(s300, 183), Filler(55)}), 3, Filler(10)), 1, {s300}, {1, 0, 1, -1, kPid},
         {}}}},
      {"adaptation field filling a section start while collecting", {{first, 0, {}, collecting, {}},
        {Pkt(1, true, {}, 3, Filler(183)), 0, {}, collecting,
         {{kError, "Invalid Pointer Field Length! curSectionLen=[0]\n"}}}}},
      {"adaptation field filling a continuation stores an empty piece", {{first, 0, {}, collecting, {}},
        {Pkt(1, false, {}, 3, Filler(183)), 0, {}, {2, 183, 1, 300, kPid}, {}},
        {Pkt(2, false, Tail(s300, 183)), 1, {s300}, kIdle, {}}}},
  };
  for (const Scenario& scenario : scenarios) RunScenario(scenario);
}

TEST(TSPktStore, SecondSectionOfAPacketIsCutToTheFirstOnesSize) {
  const Bytes a20 = SectionOfSize(20, 0x31), b30 = SectionOfSize(30, 0x32), b500 = SectionOfSize(500, 0x33),
              c40 = SectionOfSize(40, 0x34);
  const Bytes packed = Pkt(0, true, sb::Cat({{0}, a20, b30}));
  const State waiting = {1, 163, 0, 20, kPid};

  const std::vector<Scenario> scenarios = {
      {"a continuation emits the waiting section by the first one's size",
       {{packed, 1, {a20}, waiting, {}}, {Pkt(1, false, Filler(184)), 1, {Head(b30, 20)}, kIdle, {}}}},
      {"a spanning second section loses its tail",
       {{Pkt(0, true, sb::Cat({{0}, a20, Head(b500, 163)})), 1, {a20}, waiting, {}},
        {Pkt(1, false, Mid(b500, 163, 184)), 1, {Head(b500, 20)}, kIdle, {}},
        {Pkt(2, false, Tail(b500, 347)), 0, {}, kIdle, {}}}},
      {"a next start flushes the waiting section, then its own", {{packed, 1, {a20}, waiting, {}},
        {Pkt(1, true, sb::Cat({{0}, c40})), 1, {Head(b30, 20), c40}, {0, 0, 255, 40, 0xFFFF}, {}}}},
  };
  for (const Scenario& scenario : scenarios) RunScenario(scenario);

  // The waiting piece holds everything after the first section, stuffing included.
  RavelCTSPktStore store;
  RavelCSectionData out;
  ASSERT_EQ(1, store.AddTSPacket(packed.data(), out));
  ASSERT_EQ(1, store.iPacketArray.iCount);
  EXPECT_EQ(163, store.iPacketArray.ipArray[0]->iDataLen);
  EXPECT_EQ(0, std::memcmp(store.iPacketArray.ipArray[0]->aData, packed.data() + 25, 163));
}

TEST(TSPktStore, RecoversASplitSectionHeaderFromTheNewPacketsBytes) {
  const Bytes s183 = SectionOfSize(183, 0x41), s50 = SectionOfSize(50, 0x42);
  const Bytes cont45 = sb::Cat({{0xB0, 0x00, 0x2A}, Filler(181)});  // bytes 1-2: length 0x02A
  const Bytes cont8 = sb::Cat({{0x1F, 0x00, 0x05}, Filler(181)});   // bytes 1-2: length 0x005
  const Bytes start264 = sb::Cat({{0}, {0x2C, 0x01, 0x05}, Filler(180)});
  const TraceLines divided = {{kWarning, "Section length field is divided in two ts packets!\n"}};
  auto with = [&](TraceLines more) {
    TraceLines all = divided;
    all.insert(all.end(), more.begin(), more.end());
    return all;
  };
  const Bytes after = Filler(184, 0x20);

  const std::vector<Scenario> scenarios = {
      {"table_id alone: the held byte is lost and the length comes from new bytes 1-2",
       {{Pkt(0, true, sb::Cat({{182}, Filler(182), {0x42}})), 0, {}, {1, 1, 0, -1, kPid}, {}}, {Pkt(1, false, cont45),
         1,
         {Head(cont45, 45)},
         kIdle,
         with({{kError, "Data size not matched! bufPos=[184], iCurBufSize=[185], iSectionLen=[45]\n"}})}}},
      {"two header bytes, short length",
       {{Pkt(0, true, sb::Cat({{181}, Filler(181), {0x42, 0xF0}})), 0, {}, {1, 2, 0, -1, kPid}, {}},
        {Pkt(1, false, cont8), 1, {Head(cont8, 8)}, kIdle,
         with({{kError, "Data size not matched! bufPos=[184], iCurBufSize=[186], iSectionLen=[8]\n"}})}}},
      {"two header bytes, then a section start: the bytes after the pointer field",
       {{Pkt(0, true, sb::Cat({{181}, Filler(181), {0x42, 0xB0}})), 0, {}, {1, 2, 0, -1, kPid}, {}},
        {Pkt(1, true, start264), 0, {}, {1, 183, 1, 264, kPid},
         with({{kError, "Section Length Invalid!! Section Len=[264], Cur Size=[2], Remained Size=[0]\n"}})}}},
      {"after a section that ended with its packet",
       {{Pkt(0, true, sb::Cat({{0}, s183})), 1, {s183}, {1, 0, 0, -1, kPid}, {}}, {Pkt(1, true, sb::Cat({{0}, s50})), 1,
         {s50}, {0, 0, 255, 50, 0xFFFF},
         with({{kError, "Section Length Invalid!! Section Len=[50], Cur Size=[0], Remained Size=[0]\n"}})}}},
      {"second header cut by the packet end after a whole section",
       {{Pkt(0, true, sb::Cat({{0}, SectionOfSize(181, 0x43), {0x42, 0xB0}})), 1, {SectionOfSize(181, 0x43)},
         {1, 2, 0, -1, kPid}, {}},
        {Pkt(1, false, cont8), 1, {Head(cont8, 8)}, kIdle,
         with({{kError, "Data size not matched! bufPos=[184], iCurBufSize=[186], iSectionLen=[8]\n"}})}}},
      {"a continuation without payload bytes: the length comes from the held byte alone",
       {{Pkt(0, true, sb::Cat({{182}, Filler(182), {0x42}})), 0, {}, {1, 1, 0, -1, kPid}, {}},
        {Pkt(1, false, {}, 3, Filler(183)), 0, {}, {2, 1, 1, 3, kPid}, divided},
        {Pkt(2, false, after), 1, {Head(after, 3)}, kIdle,
         {{kError, "Data size not matched! bufPos=[184], iCurBufSize=[185], iSectionLen=[3]\n"}}}}},
  };
  for (const Scenario& scenario : scenarios) RunScenario(scenario);
}

TEST(TSPktStore, UnknownLengthWithoutASingleShortPieceDropsTheSection) {
  const Bytes s400 = SectionOfSize(400, 0x51);
  sb::PacketWriter writer(kPid, 0);
  writer.AddSection(s400);
  const std::vector<Bytes>& p = writer.Packets();
  struct Case {
    const char* name;
    int packetsBefore;
  } cases[] = {{"one piece of 183 bytes", 1}, {"two pieces", 2}};
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    RavelCTSPktStore store;
    RavelCSectionData out;
    for (int i = 0; i < c.packetsBefore; ++i) store.AddTSPacket(p[i].data(), out);
    store.iSectionLen = -1;
    TraceRecorder recorder;
    EXPECT_EQ(0, store.AddTSPacket(p[c.packetsBefore].data(), out));
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
      {"header cut: length unknown", {Pkt(0, true, sb::Cat({{182}, Filler(182), {0x42}}))}, noData, {},
       {1, 1, 0, -1, kPid}},
      {"empty piece after a section ending with its packet", {Pkt(0, true, sb::Cat({{0}, SectionOfSize(183, 0x62)}))},
       noData,
       {}, {1, 0, 0, -1, kPid}},
      // Called early, the entry still carries the full section size; the part
      // not yet received reads as zeros.
      {"section in progress", {Pkt(0, true, sb::Cat({{0}, Head(s300, 183)}))}, {},
       {sb::Cat({Head(s300, 183), Bytes(117, 0)})},
       kIdle},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    RavelCTSPktStore store;
    RavelCSectionData ignored;
    for (const Bytes& packet : c.packets) store.AddTSPacket(packet.data(), ignored);
    TraceRecorder recorder;
    RavelCSectionData out;
    store.GetAssembleData(out);
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ(c.sections, SectionsOf(out));
    EXPECT_EQ(c.after, StateOf(store));
  }

  // ClearPacketBuffer drops a grown store back to the reset values and keeps its storage.
  RavelCTSPktStore store;
  RavelCSectionData out;
  sb::PacketWriter writer(kPid, 0);
  writer.AddSection(SectionOfSize(2000, 0x63));
  for (size_t i = 0; i + 1 < writer.Packets().size(); ++i) store.AddTSPacket(writer.Packets()[i].data(), out);
  EXPECT_EQ(10, store.iPacketArray.iCount);
  EXPECT_EQ(16, store.iPacketArray.iMaxCount);
  EXPECT_EQ(0, store.ClearPacketBuffer());
  EXPECT_EQ(kIdle, StateOf(store));
  EXPECT_EQ(16, store.iPacketArray.iMaxCount);
  EXPECT_EQ(0, out.iSectionCount);
}

TEST(TSPktEntry, StoresUpTo188BytesAndGivesThemOnce) {
  const Bytes data = Filler(300, 0x01);
  struct Case {
    int len;
    int stored;
    TraceLines traces;
  } cases[] = {{0, 0, {}}, {1, 1, {}}, {184, 184, {}}, {188, 188, {}},
               {189, 0, {{kError, "Too long data lenght=[189]\n"}}},
               {300, 0, {{kError, "Too long data lenght=[300]\n"}}}};
  for (const Case& c : cases) {
    SCOPED_TRACE(c.len);
    TraceRecorder recorder;
    RavelCPktEntry built(data.data(), c.len);
    RavelCPktEntry set;
    set.SetData(data.data(), c.len);
    TraceLines twice = c.traces;
    twice.insert(twice.end(), c.traces.begin(), c.traces.end());
    EXPECT_EQ(twice, recorder.Lines());
    for (RavelCPktEntry* entry : {&built, &set}) {
      EXPECT_EQ(c.stored, entry->iDataLen);
      unsigned char copy[188];
      std::memset(copy, 0xEE, sizeof(copy));
      int count = -1;
      EXPECT_EQ(c.stored, entry->GetData(copy, count));
      EXPECT_EQ(c.stored, count);
      EXPECT_EQ(0, std::memcmp(copy, data.data(), static_cast<size_t>(c.stored)));
      if (c.stored < 188) {
        EXPECT_EQ(0xEE, copy[c.stored]);
      }
      EXPECT_EQ(0, entry->iDataLen);
      EXPECT_EQ(0, entry->GetData(copy, count));
      EXPECT_EQ(0, count);
    }
  }
}

TEST(TSSectionData, CopiesDeeplyAndNeverExceedsFiveSections) {
  const Bytes s20 = SectionOfSize(20, 0x71), s30 = SectionOfSize(30, 0x72), s40 = SectionOfSize(40, 0x73);
  RavelCTSPktStore store;
  RavelCSectionData source;
  ASSERT_EQ(1, store.AddTSPacket(Pkt(0, true, sb::Cat({{0}, s20})).data(), source));
  ASSERT_EQ(1, store.AddTSPacket(Pkt(1, true, sb::Cat({{0}, s30})).data(), source));
  ASSERT_EQ(2, source.iSectionCount);

  RavelCSectionData copied(source);
  EXPECT_EQ(SectionsOf(source), SectionsOf(copied));
  EXPECT_NE(source.pSection[0], copied.pSection[0]);
  EXPECT_EQ(nullptr, copied.pSection[2]);

  RavelCSectionData assigned;
  ASSERT_EQ(1, store.AddTSPacket(Pkt(2, true, sb::Cat({{0}, s40})).data(), assigned));
  assigned = source;  // the earlier section of `assigned` is released, not leaked
  EXPECT_EQ(std::vector<Bytes>({s20, s30}), SectionsOf(assigned));
  EXPECT_NE(source.pSection[1], assigned.pSection[1]);
  assigned = assigned;
  EXPECT_EQ(std::vector<Bytes>({s20, s30}), SectionsOf(assigned));

  // A record that is never emptied holds five sections; later ones are dropped.
  RavelCSectionData full;
  for (uint8_t i = 0; i < 7; ++i) {
    EXPECT_EQ(1, store.AddTSPacket(Pkt(i, true, sb::Cat({{0}, SectionOfSize(20 + i, i)})).data(), full));
  }
  EXPECT_EQ(5, full.iSectionCount);
  for (int i = 0; i < 5; ++i) EXPECT_EQ(SectionOfSize(20 + i, static_cast<uint16_t>(i)), SectionsOf(full)[i]);
}

TEST(TSPktStore, CopiesAreDeepAndGoOnIndependently) {
  const Bytes s400 = SectionOfSize(400, 0x81);
  sb::PacketWriter writer(kPid, 9);
  writer.AddSection(s400);
  const std::vector<Bytes>& p = writer.Packets();
  RavelCTSPktStore original;
  RavelCSectionData out;
  original.AddTSPacket(p[0].data(), out);
  original.AddTSPacket(p[1].data(), out);

  RavelCTSPktStore copied(original);
  RavelCTSPktStore assigned;
  assigned.AddTSPacket(Pkt(4, true, sb::Cat({{0}, Head(SectionOfSize(300, 0x82), 183)})).data(), out);
  assigned = original;
  for (RavelCTSPktStore* store : {&copied, &assigned}) {
    EXPECT_EQ(StateOf(original), StateOf(*store));
    for (int i = 0; i < 2; ++i) {
      EXPECT_NE(original.iPacketArray.ipArray[i], store->iPacketArray.ipArray[i]);
      EXPECT_EQ(original.iPacketArray.ipArray[i]->iDataLen, store->iPacketArray.ipArray[i]->iDataLen);
      EXPECT_EQ(0, std::memcmp(original.iPacketArray.ipArray[i]->aData, store->iPacketArray.ipArray[i]->aData, 188));
    }
  }
  for (RavelCTSPktStore* store : {&original, &copied, &assigned}) {
    RavelCSectionData done;
    EXPECT_EQ(1, store->AddTSPacket(p[2].data(), done));
    EXPECT_EQ(std::vector<Bytes>({s400}), SectionsOf(done));
  }
}

TEST(TSPktStore, ReassemblesCaptureSectionsWithValidCrc) {
  struct Case {
    const char* file;
    unsigned int pid;
    size_t minimumSections;
  } cases[] = {{"object-carousel.ts", 0x076A, 490}, {"ait.ts", 0x0000, 1}};
  for (const Case& c : cases) {
    SCOPED_TRACE(c.file);
    Bytes stream;
    RAVEL_LOAD_CAPTURE_OR_SKIP(c.file, stream);
    std::vector<Bytes> packets = captures::PacketsOfPid(stream, c.pid);
    RavelCTSPktStore store;
    size_t sections = 0;
    TraceRecorder recorder;
    for (const Bytes& packet : packets) {
      RavelCSectionData out;
      int result = store.AddTSPacket(packet.data(), out);
      EXPECT_EQ(result, out.iSectionCount > 0 ? 1 : 0);
      for (int i = 0; i < out.iSectionCount; ++i) {
        ++sections;
        EXPECT_NE(0, RavelUtil_CheckSectionCRC32(out.pSection[i])) << "section " << sections;
        EXPECT_EQ(((out.pSection[i][1] & 0x0F) << 8 | out.pSection[i][2]) + 3, out.iSectionSize[i]);
      }
    }
    EXPECT_GE(sections, c.minimumSections);
    EXPECT_TRUE(recorder.TextsAt(kError).empty()) << recorder.Joined();
  }
}
