// Program map table: streams, their descriptors, stream selection, merge and dump.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "Captures.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTablePMT.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TableChecks.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

struct StreamDef {
  uint8_t type;
  uint16_t pid;
  std::vector<Bytes> descriptors;
};

Bytes StreamEntry(const StreamDef& stream) {
  // Reserved bits set, as broadcast.
  return sb::Cat({sb::U8(stream.type), sb::U16(0xE000 | stream.pid), sb::DescriptorLoop(stream.descriptors)});
}

Bytes PmtBody(uint16_t pcrPid, const std::vector<Bytes>& programInfo, const std::vector<StreamDef>& streams) {
  Bytes body = sb::Cat({sb::U16(0xE000 | pcrPid), sb::DescriptorLoop(programInfo)});
  for (const StreamDef& s : streams) sb::Append(body, StreamEntry(s));
  return body;
}

sb::SectionOptions PmtOptions(uint16_t programNumber = 0x4800, uint8_t version = 3, uint8_t tableId = 0x02,
                              bool corruptCrc = false) {
  sb::SectionOptions options;
  options.tableId = tableId;
  options.tableIdExtension = programNumber;
  options.version = version;
  options.privateIndicator = false;
  options.corruptCrc = corruptCrc;
  return options;
}

Bytes PmtSection(const std::vector<StreamDef>& streams, const std::vector<Bytes>& programInfo = {},
                 uint8_t version = 3, uint16_t programNumber = 0x4800, uint16_t pcrPid = 0x01FF) {
  return sb::LongSection(PmtOptions(programNumber, version), PmtBody(pcrPid, programInfo, streams));
}

Bytes StreamId(uint8_t componentTag) { return sb::Descriptor(0x52, {componentTag}); }
Bytes DataComponent(uint16_t id) { return sb::Descriptor(0xFD, sb::Cat({sb::U16(id), sb::U8(0x3D)})); }
Bytes CaDescriptor(uint16_t caPid) { return sb::Descriptor(0x09, sb::Cat({sb::U16(0x0005), sb::U16(0xE000 | caPid)})); }
// One Brazilian rating entry: country "BRA", content 1, age selector `age`.
Bytes ParentalRating(uint8_t ageSelector) { return sb::Descriptor(0x55, sb::Cat({sb::Text("BRA"), sb::U8(0x10 | ageSelector)})); }

typedef std::pair<unsigned int, unsigned int> TypeAndPid;

std::vector<TypeAndPid> StreamsOf(RavelCPMT& pmt) {
  std::vector<TypeAndPid> list;
  for (int i = 0; i < pmt.GetMapInfoCount(); ++i) {
    list.push_back(TypeAndPid(pmt.GetMapInfo(i)->GetStreamType(), pmt.GetMapInfo(i)->GetElementaryPID()));
  }
  return list;
}

// video, audio 0 to 2, captions, audio count.
std::vector<int> SelectionOf(RavelCPMT& pmt) {
  return {pmt.GetVideoPID(), pmt.GetAudioPID(0), pmt.GetAudioPID(1), pmt.GetAudioPID(2), pmt.GetCCPID(),
          pmt.GetAudioPIDCount()};
}

// "tag=..,dc=..,region=..,ca=.." of one stream entry, "-" for what it does not hold.
std::string Held(RavelCMapInfo& info) {
  std::string s = "tag=" + (info.GetStreamIdentifier() ? std::to_string(info.GetStreamIdentifier()->GetComponentTag()) : "-");
  s += ",dc=" + (info.GetDataComponent() ? std::to_string(info.GetDataComponent()->GetDataComponentId()) : "-");
  s += ",region=" + (info.GetTargetRegion() ? std::string(info.GetTargetRegion()->GetRegionSpec()) : "-");
  return s + ",ca=" + std::to_string(info.GetCAPID());
}

// Minimum age of the kept parental rating, -1 without one.
int RatingAge(RavelCPMT& pmt) {
  return pmt.GetParentalRating() ? pmt.GetParentalRating()->GetParentalRating(0)->GetMinimumAge() : -1;
}

}  // namespace

TEST(PMTStreamSelection, PicksVideoAudioAndCaptionsByStreamTypeInTheFirst256Streams) {
  // The walk's 8-bit index wraps at 256: from 256 streams on the same first 256
  // are visited again, matches keep being counted, and a walk that never finds
  // one still ends.
  struct Case {
    const char* label;
    int count;
    std::vector<std::pair<int, uint8_t> > typed;  // index and stream type; others 0x0D
    std::vector<int> expected;
    unsigned short audio5;
  } cases[] = {
      {"video, two audios, captions", 4, {{0, 0x1B}, {1, 0x0F}, {2, 0x06}, {3, 0x0F}}, {0x1000, 0x1001, 0x1003, 0, 0x1002, 2}, 0},
      {"MPEG-1 audio and MPEG-4 video are not taken", 3, {{0, 0x03}, {1, 0x10}}, {0, 0, 0, 0, 0, 0}, 0},
      {"captions first", 2, {{0, 0x06}, {1, 0x0F}}, {0, 0x1001, 0, 0, 0x1000, 1}, 0},
      {"MPEG-1 and MPEG-2 video, the first one wins", 3, {{0, 0x01}, {1, 0x02}, {2, 0x1B}}, {0x1000, 0, 0, 0, 0, 0}, 0},
      {"the three audio types are counted in list order", 5, {{0, 0x11}, {1, 0x04}, {2, 0x0F}, {3, 0x06}, {4, 0x06}},
       {0, 0x1000, 0x1001, 0x1002, 0x1003, 3}, 0},
      {"255 streams: no wrap, no second round", 255, {{0, 0x0F}, {254, 0x0F}}, {0, 0x1000, 0x10FE, 0, 0, 2}, 0},
      {"256 streams: the 256th is visited, then the walk comes round", 256, {{255, 0x0F}},
       {0, 0x10FF, 0x10FF, 0x10FF, 0, 1}, 0x10FF},
      {"300 streams: matches counted again on each round", 300, {{3, 0x11}, {10, 0x04}, {7, 0x06}},
       {0, 0x1003, 0x100A, 0x1003, 0x1007, 2}, 0x100A},
      {"300 streams: streams past the 256th are never seen", 300, {{256, 0x1B}, {280, 0x0F}, {299, 0x06}},
       {0, 0, 0, 0, 0, 0}, 0},
      {"300 streams: video and captions within the first 256", 300, {{200, 0x06}, {255, 0x02}, {257, 0x1B}},
       {0x10FF, 0, 0, 0, 0x10C8, 0}, 0},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCPMT pmt(nullptr);
    for (int i = 0; i < c.count; ++i) {
      uint8_t type = 0x0D;
      for (const auto& t : c.typed) {
        if (t.first == i) type = t.second;
      }
      Bytes entry = StreamEntry(StreamDef{type, static_cast<uint16_t>(0x1000 + i), {}});
      pmt.aMapInfoList.Append(new RavelCMapInfo(entry.data()));
    }
    TraceRecorder recorder;
    EXPECT_EQ(c.expected, SelectionOf(pmt));
    EXPECT_EQ(c.audio5, pmt.GetAudioPID(5));
    EXPECT_TRUE(recorder.Lines().empty());
  }
}

TEST(PMTParse, KeepsTheDescriptorsAReceiverUsesAndTracesTheOthers) {
  StandardScope brazil;
  Bytes section = PmtSection({
          {0x1B, 0x0111, {StreamId(0x00), sb::Descriptor(0xC8, {0x47}), CaDescriptor(0x0123)}},
          {0x0F, 0x0112, {StreamId(0x10)}},
          {0x06, 0x0113, {StreamId(0x30), DataComponent(0x0008), sb::Descriptor(0xC6, {0x01, 'A', 'B', 'C'})}},
          {0x0D, 0x0114, {}},
      },
      {ParentalRating(2), CaDescriptor(0x0901), sb::Descriptor(0xC1, {0x84})}, 5, 0x4801, 0x0111);
  TraceRecorder recorder;
  RavelCPMT pmt(section.data());
  // The stream entries are parsed twice (constructor, then the parse whose
  // result counts), so their traces come twice.
  EXPECT_EQ(At(kWarning, {"PMT Body Parsing: Unkown Descriptor Tag=[0x09]\n", "PMT Body Parsing: Unkown Descriptor Tag=[0xc1]\n",
                          "PMT MapInfo Parsing.. Unkown Descriptor Tag=[0xc8]\n", "PMT MapInfo CA PID =[0x123]",
                          "PMT MapInfo Parsing.. Unkown Descriptor Tag=[0xc8]\n", "PMT MapInfo CA PID =[0x123]"}),
            recorder.Lines());
  EXPECT_STREQ("PMT", pmt.sTableName.GetString());
  EXPECT_EQ(0x0111, pmt.GetPCRPID());
  EXPECT_EQ(6 + 6 + 3, pmt.GetProgramInfoLength());
  EXPECT_EQ(10, RatingAge(pmt));
  EXPECT_EQ((std::vector<TypeAndPid>{{0x1B, 0x0111}, {0x0F, 0x0112}, {0x06, 0x0113}, {0x0D, 0x0114}}), StreamsOf(pmt));
  std::vector<std::string> held;  // and each ES_info_length
  for (int i = 0; i < 4; ++i) held.push_back(Held(*pmt.GetMapInfo(i)) + " " + std::to_string(pmt.GetMapInfo(i)->GetESInfoLength()));
  EXPECT_EQ((std::vector<std::string>{"tag=0,dc=-,region=-,ca=291 12", "tag=16,dc=-,region=-,ca=0 3",
                                      "tag=48,dc=8,region=ABC,ca=0 14", "tag=-,dc=-,region=-,ca=0 0"}),
            held);
}

TEST(PMTParse, RefusesNullBadCrcAndForeignTableIds) {
  Bytes good = PmtSection({{0x1B, 0x0111, {}}}, {ParentalRating(3)});
  const Bytes body = PmtBody(0x0100, {}, {{0x0F, 0x0112, {}}});
  Bytes badCrc = sb::LongSection(PmtOptions(0x1234, 3, 0x02, true), body);
  Bytes sdtId = sb::LongSection(PmtOptions(0x1234, 3, 0x42), body);
  Bytes bothBad = sb::LongSection(PmtOptions(0x1234, 3, 0x00, true), body);
  ASSERT_NE(nullptr, RavelCPMT(good.data()).GetParentalRating());
  tc::ExpectRefusals<RavelCPMT>(good, tc::Refusals("PMT", badCrc, sdtId, "0x42", bothBad),
                                [](RavelCPMT& pmt, const tc::Refusal&, TraceRecorder&) {
                                  EXPECT_EQ(0, pmt.GetMapInfoCount());
                                  EXPECT_EQ(nullptr, pmt.GetParentalRating());
                                  EXPECT_EQ(0, pmt.GetPCRPID());
                                  EXPECT_EQ(0, pmt.GetProgramInfoLength());
                                });
}

TEST(PMTProgramInfoLoop, FailsOnAMalformedDescriptorAndKeepsTheLastParentalRating) {
  StandardScope brazil;
  const std::string duplicate = "Duplicated Parental Rating Inforamtion!\n";
  struct Case {
    const char* label;
    std::vector<Bytes> programInfo;
    int result;
    TraceLines traces;
    int minimumAge;  // -1: no parental rating kept
  } cases[] = {
      {"two: the second wins, the duplicate traced once",
       {ParentalRating(2), sb::Descriptor(0xC1, {0x84}), ParentalRating(5)}, kRavelOk,
       At(kWarning, {"PMT Body Parsing: Unkown Descriptor Tag=[0xc1]\n", duplicate}), 16},
      {"three: traced twice, the last wins", {ParentalRating(2), ParentalRating(3), ParentalRating(6)}, kRavelOk,
       At(kWarning, {duplicate, duplicate}), 18},
      {"length 0 fails the section, the rating read before stays",
       {ParentalRating(2), sb::Descriptor(0xC1, {}), ParentalRating(5)}, kRavelErrCorruptSection,
       {{kWarning, Invalid(0xC1, 0)}}, 10},
      {"tag 0 fails the section", {sb::Descriptor(0x00, {0x01, 0x02})}, kRavelErrCorruptSection,
       {{kWarning, Invalid(0x00, 2)}}, -1},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = PmtSection({{0x1B, 0x0111, {}}, {0x0F, 0x0112, {}}}, c.programInfo);
    TraceRecorder recorder;
    RavelCPMT pmt(section.data());
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ(c.result, pmt.ParseRawData(section.data()));
    EXPECT_EQ(c.result == kRavelOk ? 2 : 0, pmt.GetMapInfoCount());
    EXPECT_EQ(c.minimumAge, RatingAge(pmt));
    EXPECT_EQ(c.result == kRavelOk ? 0x01FF : 0, pmt.GetPCRPID());
    if (c.result != kRavelOk) { EXPECT_EQ(0, pmt.iProgramInfoLength); }
  }
}

TEST(PMTStreamLoop, StartsAfterTheProgramInfoAndRunsToTheFirstCrcByte) {
  // Raw bodies: PCR_PID, program_info_length and what follows, so that lengths
  // that disagree with the data can be written.
  struct Case {
    const char* label;
    Bytes body;
    std::vector<TypeAndPid> streams;
    unsigned short programInfoLength;
  } cases[] = {
      {"program info only", sb::Cat({sb::U16(0xE100), sb::Length12(3), sb::Descriptor(0xC1, {0x84})}), {}, 3},
      {"an overlong last program descriptor moves the streams on",
       sb::Cat({sb::U16(0xE100), sb::Length12(2), sb::Descriptor(0xC1, {0x84, 0x00, 0x00}), StreamEntry({0x1B, 0x0111, {}})}),
       {{0x1B, 0x0111}}, 2},
      {"a stream whose ES_info_length reaches past the end is the last one",
       sb::Cat({sb::U16(0xE100), sb::Length12(0), StreamEntry({0x0F, 0x0112, {}}), sb::U8(0x06), sb::U16(0xE113),
                sb::Length12(0x40), StreamId(0x30), StreamEntry({0x0F, 0x0114, {}})}),
       {{0x0F, 0x0112}, {0x06, 0x0113}}, 0},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = sb::LongSection(PmtOptions(), c.body);
    TraceRecorder recorder;
    RavelCPMT pmt(section.data());
    EXPECT_EQ(c.streams, StreamsOf(pmt));
    EXPECT_EQ(c.programInfoLength, pmt.GetProgramInfoLength());
    EXPECT_EQ(0x0100, pmt.GetPCRPID());
  }
}

TEST(MapInfo, DescriptorLoopStopsAtLengthZeroAndLaterDescriptorsReplaceEarlierOnes) {
  struct Case {
    const char* label;
    std::vector<Bytes> descriptors;
    TraceLines traces;
    const char* held;
  } cases[] = {
      {"length 0 ends the loop; what was read stays", {StreamId(0x07), sb::Descriptor(0x09, {}), DataComponent(0x000C)},
       {{kWarning, Invalid(0x09, 0)}}, "tag=7,dc=-,region=-,ca=0"},
      {"tag 0 with a length is only unknown", {sb::Descriptor(0x00, {0xAA}), StreamId(0x08)},
       {{kWarning, "PMT MapInfo Parsing.. Unkown Descriptor Tag=[0x00]\n"}}, "tag=8,dc=-,region=-,ca=0"},
      {"the later descriptor of a tag wins, silently",
       {StreamId(0x01), DataComponent(0x0008), sb::Descriptor(0xC6, {0x01, 'X'}), StreamId(0x02), DataComponent(0x000D),
        sb::Descriptor(0xC6, {0x02, 'Y', 'Z'})},
       {}, "tag=2,dc=13,region=YZ,ca=0"},
      {"the last CA descriptor gives the CA PID", {CaDescriptor(0x0101), CaDescriptor(0x1FFF)},
       At(kWarning, {"PMT MapInfo CA PID =[0x101]", "PMT MapInfo CA PID =[0x1fff]"}), "tag=-,dc=-,region=-,ca=8191"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes entry = StreamEntry({0x06, 0x0113, c.descriptors});
    RavelCMapInfo info(nullptr);
    TraceRecorder recorder;
    EXPECT_EQ(kRavelOk, info.ParseRawData(entry.data()));
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ(0x06, info.GetStreamType());
    EXPECT_EQ(0x0113, info.GetElementaryPID());
    EXPECT_EQ(c.held, Held(info));
  }
}

TEST(MapInfo, ReparseReleasesDescriptorsButKeepsTheCaPid) {
  Bytes withCa = StreamEntry({0x06, 0x0113, {CaDescriptor(0x0456), StreamId(0x30), DataComponent(0x0008)}});
  Bytes withoutCa = StreamEntry({0x0F, 0x0112, {StreamId(0x10)}});
  for (Bytes* second : {&withoutCa, static_cast<Bytes*>(nullptr)}) {
    SCOPED_TRACE(second ? "an entry without CA descriptor" : "null");
    RavelCMapInfo info(withCa.data());
    TraceRecorder recorder;
    EXPECT_EQ(second ? kRavelOk : kRavelErrInvalidArgument, info.ParseRawData(second ? second->data() : nullptr));
    EXPECT_TRUE(recorder.Lines().empty());
    EXPECT_EQ(second ? "tag=16,dc=-,region=-,ca=1110" : "tag=-,dc=-,region=-,ca=1110", Held(info));
    EXPECT_EQ(second ? 0x0F : 0, info.GetStreamType());
    EXPECT_EQ(second ? 0x0112 : 0, info.GetElementaryPID());
    EXPECT_EQ(second ? 3 : 0, info.GetESInfoLength());
  }
}

TEST(MapInfo, CopiesAreDeep) {
  Bytes entry = StreamEntry(
      {0x06, 0x0113, {CaDescriptor(0x0456), StreamId(0x30), DataComponent(0x0008), sb::Descriptor(0xC6, {1, 'Q'})}});
  Bytes other = StreamEntry({0x1B, 0x0111, {StreamId(0x00)}});
  RavelCMapInfo assigned(other.data());
  tc::ExpectDeepCopies(new RavelCMapInfo(entry.data()), assigned,
                       [](RavelCMapInfo& info) { return std::make_pair(Held(info), ShowLines(info)); });
  EXPECT_EQ("tag=48,dc=8,region=Q,ca=1110", Held(assigned));
  EXPECT_EQ(entry.size() - 5, assigned.GetESInfoLength());
  // A copy of an entry without descriptors drops the target's own.
  Bytes bare = StreamEntry({0x0F, 0x0112, {}});
  RavelCMapInfo empty(bare.data());
  assigned = empty;
  EXPECT_EQ("tag=-,dc=-,region=-,ca=0", Held(assigned));
}

TEST(PMTMerge, AppendsCopiesOfTheOthersStreamsOnlyWhenTheVersionsMatch) {
  StandardScope brazil;
  Bytes first = PmtSection({{0x1B, 0x0111, {StreamId(0x00)}}, {0x0F, 0x0112, {}}}, {ParentalRating(2)}, 4, 0x4800, 0x0111);
  Bytes sameVersion =
      PmtSection({{0x0F, 0x0114, {StreamId(0x11)}}, {0x06, 0x0113, {}}}, {ParentalRating(6)}, 4, 0x4801, 0x0222);
  Bytes otherVersion = PmtSection({{0x0F, 0x0115, {}}}, {}, 9, 0x4800);
  struct Case {
    const char* label;
    Bytes* other;  // null: the target itself
    TraceLines traces;
    std::vector<TypeAndPid> streams;
  } cases[] = {
      {"same version: appended in order", &sameVersion, {},
       {{0x1B, 0x0111}, {0x0F, 0x0112}, {0x0F, 0x0114}, {0x06, 0x0113}}},
      {"other version: unchanged", &otherVersion,
       {{kError, "Two PMT Information have different information! first one=[4], second one=[9]\n"}},
       {{0x1B, 0x0111}, {0x0F, 0x0112}}},
      {"with itself: doubled once", nullptr, {}, {{0x1B, 0x0111}, {0x0F, 0x0112}, {0x1B, 0x0111}, {0x0F, 0x0112}}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCPMT target(first.data());
    EXPECT_EQ(c.traces, tc::MergeInto(target, c.other ? c.other->data() : nullptr, StreamsOf));
    EXPECT_EQ(c.streams, StreamsOf(target));
    // Header, PCR PID, program info and parental rating stay the target's.
    EXPECT_EQ((std::vector<int>{0x4800, 4, 0x0111, 6, 10}),
              (std::vector<int>{target.iTableIdExtension, target.iVersionNumber, target.GetPCRPID(),
                                target.GetProgramInfoLength(), RatingAge(target)}));
    if (c.other != &sameVersion) continue;
    // The selection also finds the appended streams.
    EXPECT_EQ((std::vector<int>{0x0111, 0x0112, 0x0114, 0, 0x0113, 2}), SelectionOf(target));
    EXPECT_EQ("tag=17,dc=-,region=-,ca=0", Held(*target.GetMapInfo(2)));
  }
}

TEST(PMTAssign, CopiesEverythingButTheParentalRating) {
  StandardScope brazil;
  Bytes sourceSection = PmtSection({{0x1B, 0x0121, {StreamId(0x00)}}, {0x0F, 0x0122, {DataComponent(0x0008)}}},
                                   {ParentalRating(6)}, 7, 0x4980, 0x0121);
  Bytes withRating = PmtSection({{0x02, 0x0100, {}}}, {ParentalRating(2)}, 1, 0x4800, 0x0100);
  Bytes withoutRating = PmtSection({{0x02, 0x0100, {}}}, {}, 1, 0x4800, 0x0100);
  // The target's own rating stays; a target without one gets none.
  for (Bytes* target : {&withRating, &withoutRating}) {
    std::unique_ptr<RavelCPMT> source(new RavelCPMT(sourceSection.data()));
    source->iSession = 0x5A;
    const TraceLines shown = ShowLines(*source);  // all but the rating
    RavelCPMT copy(target->data());
    TraceRecorder recorder;
    copy = *source;
    source.reset();
    EXPECT_TRUE(recorder.Lines().empty());
    EXPECT_EQ(shown, ShowLines(copy));
    EXPECT_EQ(target == &withRating ? 10 : -1, RatingAge(copy));
  }
  // Assigning a table to itself clears its streams before the copy.
  RavelCPMT self(sourceSection.data());
  tc::SelfAssign(self);
  EXPECT_EQ(0, self.GetMapInfoCount());
  EXPECT_EQ(0x0121, self.GetPCRPID());
  EXPECT_NE(nullptr, self.GetParentalRating());
}

TEST(PMTShow, DumpsHeaderBodyAndEachStreamWithItsDescriptors) {
  Bytes section = PmtSection({{0x1B, 0x0111, {StreamId(0x00), CaDescriptor(0x0123)}},
                              {0x06, 0x0113, {sb::Descriptor(0xC6, {0x01, 'A', 'B'}), DataComponent(0x0008), StreamId(0x30)}},
                              {0x0D, 0x1FC8, {}}},
                             {ParentalRating(2)}, 3, 0x4800, 0x0111);
  RavelCPMT pmt(section.data());
  // The rating is not dumped; each stream's descriptors in their own order.
  EXPECT_EQ(tc::ShortDump("PMT", HeaderLines(0x02, "PMT", 1, section.size() - 3, 0x4800, 3, 1, 0, 0),
                          {"# Body Information\n", "PCR_PID=[0x0111], Program Information Len=[6]\n",
                           "Stream Information. Size=[3]\n",
                           "Stream Type Id=[0x1b], Stream PID=[0x0111], Stream Info Len=[9]\n",
                           Banner("Stream Identifier Descriptor"), BaseLine(0x52, 1, "Stream Id Descriptor"),
                           "\tComponent Tag = [0x00]\n",
                           "Stream Type Id=[0x06], Stream PID=[0x0113], Stream Info Len=[13]\n",
                           Banner("Stream Identifier Descriptor"), BaseLine(0x52, 1, "Stream Id Descriptor"),
                           "\tComponent Tag = [0x30]\n", Banner("Data Component Descriptor"),
                           BaseLine(0xFD, 3, "Data Component Descriptor"), "\tiDataComponentId=[0x0008]\n",
                           Banner("Target Region Descriptor", 21), BaseLine(0xC6, 3, "Region Descriptor"),
                           "\t Region Spec Type: 1 \n", "\t Region Spec: AB \n",
                           "Stream Type Id=[0x0d], Stream PID=[0x1fc8], Stream Info Len=[0]\n"}),
            ShowLines(pmt));
}

TEST(PMTCapture, JapaneseChannelGivesEachProgramsStreamsToPlay) {
  Bytes contents;
  RAVEL_LOAD_CAPTURE_OR_SKIP("isdbt-japan-psi.sections", contents);
  // Per program: program_number, PCR PID, program info length, stream count,
  // the caption stream's CA PID, then the selection.
  std::vector<std::vector<int> > programs;
  for (Bytes& s : captures::SplitSections(contents)) {
    if (s[0] == 0x00) {  // the PAT lists the PMT PIDs, the one-segment program last
      RavelCPAT pat(s.data());
      std::vector<int> listed{pat.GetNetworkPID()};
      for (int p = 0; p < pat.GetProgramCount(); ++p) {
        listed.insert(listed.end(), {pat.GetPMTInfo(p)->GetProgramNumber(), pat.GetPMTInfo(p)->GetPID()});
      }
      EXPECT_EQ((std::vector<int>{0x0010, 0x4800, 0x01F0, 0x4801, 0x03F0, 0xFFF0, 0x1CF0, 0x4980, 0x1FC8}), listed);
    }
    if (s[0] != 0x02) continue;
    TraceRecorder recorder;
    RavelCPMT pmt(s.data());
    std::vector<int> seen{pmt.iTableIdExtension, pmt.GetPCRPID(), pmt.GetProgramInfoLength(), pmt.GetMapInfoCount(), 0};
    const std::vector<int> selection = SelectionOf(pmt);
    for (int i = 0; i < pmt.GetMapInfoCount(); ++i) {
      RavelCMapInfo* info = pmt.GetMapInfo(i);
      ASSERT_NE(nullptr, info->GetStreamIdentifier()) << i;
      EXPECT_EQ(info->GetElementaryPID() & 0xFF, info->GetStreamIdentifier()->GetComponentTag()) << i;
      if (selection[4] != 0 && info->GetElementaryPID() == selection[4]) seen[4] = info->GetCAPID();
    }
    seen.insert(seen.end(), selection.begin(), selection.end());
    programs.push_back(seen);
    for (const TraceRecord& r : recorder.Records()) {  // only unknown tags and CA PIDs: nothing malformed
      EXPECT_TRUE(r.text.find("Unkown Descriptor Tag") != std::string::npos ||
                  r.text.find("PMT MapInfo CA PID =[0x1fff]") == 0) << r.text;
    }
  }
  EXPECT_EQ((std::vector<std::vector<int> >{{0x4800, 0x01FF, 15, 11, 0x1FFF, 0x0100, 0x0110, 0, 0, 0x0130, 1},
                                             {0x4801, 0x01FF, 15, 11, 0x1FFF, 0x0100, 0x0110, 0, 0, 0x0130, 1},
                                             {0x4980, 0x05FF, 3, 7, 0, 0x0581, 0x0583, 0, 0, 0x0587, 1},
                                             {0xFFF0, 0x1FFF, 0, 12, 0, 0, 0, 0, 0, 0, 0}}),
            programs);
}
