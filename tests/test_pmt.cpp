// Program map table: streams, their descriptors, stream selection, merge and dump.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "Captures.h"
#include "Ravel_Cfg.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTablePMT.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TraceRecorder.h"

namespace {

const unsigned int kDump = 0x10000020u;
const unsigned int kWarning = 0x40000020u;
const unsigned int kError = 0x80000020u;

struct StreamDef {
  uint8_t type;
  uint16_t pid;
  std::vector<Bytes> descriptors;
};

Bytes StreamEntry(const StreamDef& stream) {
  Bytes entry = sb::U8(stream.type);
  sb::Append(entry, sb::U16(0xE000 | stream.pid));  // reserved bits set, as broadcast
  sb::Append(entry, sb::DescriptorLoop(stream.descriptors));
  return entry;
}

Bytes PmtBody(uint16_t pcrPid, const std::vector<Bytes>& programInfo, const std::vector<StreamDef>& streams) {
  Bytes body = sb::U16(0xE000 | pcrPid);
  sb::Append(body, sb::DescriptorLoop(programInfo));
  for (const StreamDef& s : streams) sb::Append(body, StreamEntry(s));
  return body;
}

sb::SectionOptions PmtOptions(uint16_t programNumber = 0x4800, uint8_t version = 3) {
  sb::SectionOptions options;
  options.tableId = 0x02;
  options.tableIdExtension = programNumber;
  options.version = version;
  options.privateIndicator = false;
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

// Parental rating ages below are read under the Brazilian rules.
class BrazilianRules {
 public:
  BrazilianRules() : previous_(RavelCfg_GetStandard()) { RavelCfg_SetStandard(RAVEL_STANDARD_BRAZIL); }
  ~BrazilianRules() { RavelCfg_SetStandard(previous_); }

 private:
  int previous_;
};

typedef std::pair<unsigned int, unsigned int> TypeAndPid;

std::vector<TypeAndPid> StreamsOf(RavelCPMT& pmt) {
  std::vector<TypeAndPid> list;
  for (int i = 0; i < pmt.GetMapInfoCount(); ++i) {
    RavelCMapInfo* info = pmt.GetMapInfo(i);
    list.push_back(TypeAndPid(info->GetStreamType(), info->GetElementaryPID()));
  }
  return list;
}

struct Selection {
  unsigned short video, audio0, audio1, audio2, caption;
  unsigned char audioCount;
  bool operator==(const Selection& o) const {
    return video == o.video && audio0 == o.audio0 && audio1 == o.audio1 && audio2 == o.audio2 &&
           caption == o.caption && audioCount == o.audioCount;
  }
};

std::ostream& operator<<(std::ostream& out, const Selection& s) {
  return out << "video " << s.video << " audio " << s.audio0 << "/" << s.audio1 << "/" << s.audio2 << " cc "
             << s.caption << " count " << int(s.audioCount);
}

Selection SelectionOf(RavelCPMT& pmt) {
  return Selection{pmt.GetVideoPID(), pmt.GetAudioPID(0), pmt.GetAudioPID(1), pmt.GetAudioPID(2), pmt.GetCCPID(),
                   pmt.GetAudioPIDCount()};
}

std::string HeaderLine2(const Bytes& section, const char* extension) {
  return "Section syntax indicator=[1], Section length=[" + std::to_string(section.size() - 3) +
         "], Any Identifier(?)=[" + extension + "]\n";
}

}  // namespace

TEST(PMTStreamSelection, PicksVideoAudioAndCaptionsByStreamType) {
  struct Case {
    const char* label;
    std::vector<std::pair<uint8_t, uint16_t> > streams;
    Selection expected;
  } cases[] = {
      {"video, two audios, captions",
       {{0x1B, 0x0111}, {0x0F, 0x0112}, {0x06, 0x0113}, {0x0F, 0x0114}},
       {0x0111, 0x0112, 0x0114, 0, 0x0113, 2}},
      {"MPEG-1 audio and MPEG-4 video are not taken",
       {{0x03, 0x0201}, {0x10, 0x0202}, {0x0D, 0x0203}},
       {0, 0, 0, 0, 0, 0}},
      {"MPEG-1 and MPEG-2 video, the first one wins",
       {{0x01, 0x0301}, {0x02, 0x0302}, {0x1B, 0x0303}},
       {0x0301, 0, 0, 0, 0, 0}},
      {"MPEG-2 video first", {{0x0D, 0x0300}, {0x02, 0x0302}, {0x01, 0x0301}}, {0x0302, 0, 0, 0, 0, 0}},
      {"the three audio types are counted in list order",
       {{0x11, 0x0401}, {0x04, 0x0402}, {0x0F, 0x0403}, {0x06, 0x0404}, {0x06, 0x0405}},
       {0, 0x0401, 0x0402, 0x0403, 0x0404, 3}},
      {"no streams", {}, {0, 0, 0, 0, 0, 0}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    std::vector<StreamDef> streams;
    for (const auto& s : c.streams) streams.push_back(StreamDef{s.first, s.second, {}});
    Bytes section = PmtSection(streams);
    RavelCPMT pmt(section.data());
    ASSERT_EQ(static_cast<int>(c.streams.size()), pmt.GetMapInfoCount());
    TraceRecorder recorder;
    EXPECT_EQ(c.expected, SelectionOf(pmt));
    EXPECT_TRUE(recorder.Lines().empty());
  }
}

TEST(PMTStreamSelection, WalksOnlyTheFirst256StreamsAndComesRoundAgain) {
  // The walk's 8-bit index wraps at 256: from 256 streams on the same first 256
  // are visited again, matches keep being counted, and a walk that never finds
  // one still ends.
  struct Case {
    const char* label;
    int count;
    std::vector<std::pair<int, uint8_t> > typed;  // index and stream type; others 0x0D
    Selection expected;
    unsigned short audio5;
  } cases[] = {
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
    EXPECT_EQ(c.expected, SelectionOf(pmt));
    EXPECT_EQ(c.audio5, pmt.GetAudioPID(5));
  }
}

TEST(PMTParse, KeepsTheDescriptorsAReceiverUsesAndTracesTheOthers) {
  Bytes section = PmtSection(
      {
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
  EXPECT_EQ((TraceLines{
                {kWarning, "PMT Body Parsing: Unkown Descriptor Tag=[0x09]\n"},
                {kWarning, "PMT Body Parsing: Unkown Descriptor Tag=[0xc1]\n"},
                {kWarning, "PMT MapInfo Parsing.. Unkown Descriptor Tag=[0xc8]\n"},
                {kWarning, "PMT MapInfo CA PID =[0x123]"},
                {kWarning, "PMT MapInfo Parsing.. Unkown Descriptor Tag=[0xc8]\n"},
                {kWarning, "PMT MapInfo CA PID =[0x123]"},
            }),
            recorder.Lines());
  EXPECT_STREQ("PMT", pmt.sTableName.GetString());
  EXPECT_EQ(0x4801, pmt.iTableIdExtension);
  EXPECT_EQ(5, pmt.iVersionNumber);
  EXPECT_EQ(0x0111, pmt.GetPCRPID());
  EXPECT_EQ(6 + 6 + 3, pmt.GetProgramInfoLength());
  ASSERT_NE(nullptr, pmt.GetParentalRating());
  ASSERT_EQ(1, pmt.GetParentalRating()->GetNumOfParentalRatings());
  EXPECT_STREQ("BRA", pmt.GetParentalRating()->GetParentalRating(0)->GetCountryCode());
  EXPECT_EQ((std::vector<TypeAndPid>{{0x1B, 0x0111}, {0x0F, 0x0112}, {0x06, 0x0113}, {0x0D, 0x0114}}),
            StreamsOf(pmt));

  struct Expected {
    unsigned short esInfoLength, caPid;
    int componentTag;      // -1: no stream identifier
    int dataComponentId;   // -1: none
    const char* region;    // null: no target region
  } expected[] = {
      {3 + 3 + 6, 0x0123, 0x00, -1, nullptr},
      {3, 0, 0x10, -1, nullptr},
      {3 + 5 + 6, 0, 0x30, 0x0008, "ABC"},
      {0, 0, -1, -1, nullptr},
  };
  for (int i = 0; i < 4; ++i) {
    SCOPED_TRACE(i);
    RavelCMapInfo* info = pmt.GetMapInfo(i);
    EXPECT_EQ(expected[i].esInfoLength, info->GetESInfoLength());
    EXPECT_EQ(expected[i].caPid, info->GetCAPID());
    if (expected[i].componentTag < 0) {
      EXPECT_EQ(nullptr, info->GetStreamIdentifier());
    } else {
      ASSERT_NE(nullptr, info->GetStreamIdentifier());
      EXPECT_EQ(expected[i].componentTag, info->GetStreamIdentifier()->GetComponentTag());
    }
    if (expected[i].dataComponentId < 0) {
      EXPECT_EQ(nullptr, info->GetDataComponent());
    } else {
      ASSERT_NE(nullptr, info->GetDataComponent());
      EXPECT_EQ(expected[i].dataComponentId, info->GetDataComponent()->GetDataComponentId());
    }
    if (expected[i].region == nullptr) {
      EXPECT_EQ(nullptr, info->GetTargetRegion());
    } else {
      ASSERT_NE(nullptr, info->GetTargetRegion());
      EXPECT_EQ(1, info->GetTargetRegion()->GetRegionSpecType());
      EXPECT_STREQ(expected[i].region, info->GetTargetRegion()->GetRegionSpec());
    }
  }
}

TEST(PMTParse, RefusesNullBadCrcAndForeignTableIds) {
  Bytes good = PmtSection({{0x1B, 0x0111, {}}}, {ParentalRating(3)});
  const std::vector<StreamDef> streams = {{0x0F, 0x0112, {}}};
  sb::SectionOptions badCrcOptions = PmtOptions(0x1234);
  badCrcOptions.corruptCrc = true;
  Bytes badCrc = sb::LongSection(badCrcOptions, PmtBody(0x0100, {}, streams));
  sb::SectionOptions patOptions = PmtOptions(0x1234);
  patOptions.tableId = 0x00;
  Bytes patId = sb::LongSection(patOptions, PmtBody(0x0100, {}, streams));
  sb::SectionOptions sdtOptions = PmtOptions(0x1234);
  sdtOptions.tableId = 0x42;
  Bytes sdtId = sb::LongSection(sdtOptions, PmtBody(0x0100, {}, streams));
  sb::SectionOptions bothOptions = patOptions;
  bothOptions.corruptCrc = true;
  Bytes bothBad = sb::LongSection(bothOptions, PmtBody(0x0100, {}, streams));

  struct Case {
    const char* label;
    Bytes* section;
    int result;
    TraceLines traces;
    unsigned char tableId;  // after the call
    unsigned short tableIdExtension;
  } cases[] = {
      {"null", nullptr, kRavelErrInvalidArgument, {}, 0x02, 0x4800},
      {"bad CRC", &badCrc, kRavelErrCorruptSection, {{kWarning, "PMT Section: CRC Error!\n"}}, 0x02, 0x4800},
      {"PAT table_id", &patId, kRavelErrInvalidArgument, {{kError, "Table ID isn't for PMT! Table ID=[0x00]\n"}},
       0x00, 0x1234},
      {"SDT table_id", &sdtId, kRavelErrInvalidArgument, {{kError, "Table ID isn't for PMT! Table ID=[0x42]\n"}},
       0x42, 0x1234},
      {"the CRC is checked before the table_id", &bothBad, kRavelErrCorruptSection,
       {{kWarning, "PMT Section: CRC Error!\n"}}, 0x02, 0x4800},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCPMT pmt(good.data());
    ASSERT_EQ(1, pmt.GetMapInfoCount());
    ASSERT_NE(nullptr, pmt.GetParentalRating());
    TraceRecorder recorder;
    EXPECT_EQ(c.result, pmt.ParseRawData(c.section ? c.section->data() : nullptr));
    EXPECT_EQ(c.traces, recorder.Lines());
    for (const TraceRecord& r : recorder.Records()) EXPECT_EQ("SectionParser/source/Ravel_CTablePMT", r.file);
    EXPECT_EQ(0, pmt.GetMapInfoCount());
    EXPECT_EQ(nullptr, pmt.GetParentalRating());
    EXPECT_EQ(0, pmt.GetPCRPID());
    EXPECT_EQ(0, pmt.GetProgramInfoLength());
    EXPECT_EQ(c.tableId, pmt.iTableId);
    EXPECT_EQ(c.tableIdExtension, pmt.iTableIdExtension);
    EXPECT_EQ(0, pmt.GetVideoPID());
  }
}

TEST(PMTProgramInfoLoop, FailsOnAMalformedDescriptorAndKeepsTheLastParentalRating) {
  BrazilianRules rules;
  const std::vector<StreamDef> streams = {{0x1B, 0x0111, {}}, {0x0F, 0x0112, {}}};
  struct Case {
    const char* label;
    std::vector<Bytes> programInfo;
    int result;
    TraceLines traces;
    int streamCount;
    int minimumAge;  // -1: no parental rating kept
  } cases[] = {
      {"one parental rating", {ParentalRating(4)}, kRavelOk, {}, 2, 14},
      {"two: the second wins, the duplicate traced once",
       {ParentalRating(2), sb::Descriptor(0xC1, {0x84}), ParentalRating(5)}, kRavelOk,
       {{kWarning, "PMT Body Parsing: Unkown Descriptor Tag=[0xc1]\n"},
        {kWarning, "Duplicated Parental Rating Inforamtion!\n"}},
       2, 16},
      {"three: traced twice, the last wins", {ParentalRating(2), ParentalRating(3), ParentalRating(6)}, kRavelOk,
       {{kWarning, "Duplicated Parental Rating Inforamtion!\n"}, {kWarning, "Duplicated Parental Rating Inforamtion!\n"}},
       2, 18},
      {"the CA descriptor is not read here", {CaDescriptor(0x0901)}, kRavelOk,
       {{kWarning, "PMT Body Parsing: Unkown Descriptor Tag=[0x09]\n"}}, 2, -1},
      {"length 0 fails the section, the rating read before stays",
       {ParentalRating(2), sb::Descriptor(0xC1, {}), ParentalRating(5)}, kRavelErrCorruptSection,
       {{kWarning, "Invalid Descriptor Tag & Length!! descrTag=[0xc1], descrLen=[0]\n"}}, 0, 10},
      {"tag 0 fails the section", {sb::Descriptor(0x00, {0x01, 0x02})}, kRavelErrCorruptSection,
       {{kWarning, "Invalid Descriptor Tag & Length!! descrTag=[0x00], descrLen=[2]\n"}}, 0, -1},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = PmtSection(streams, c.programInfo);
    TraceRecorder recorder;
    RavelCPMT pmt(section.data());
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ(c.result, pmt.ParseRawData(section.data()));
    EXPECT_EQ(c.streamCount, pmt.GetMapInfoCount());
    if (c.minimumAge < 0) {
      EXPECT_EQ(nullptr, pmt.GetParentalRating());
    } else {
      ASSERT_NE(nullptr, pmt.GetParentalRating());
      ASSERT_EQ(1, pmt.GetParentalRating()->GetNumOfParentalRatings());
      EXPECT_EQ(c.minimumAge, pmt.GetParentalRating()->GetParentalRating(0)->GetMinimumAge());
    }
    if (c.result != kRavelOk) {
      EXPECT_EQ(0, pmt.GetPCRPID());
      EXPECT_EQ(0, pmt.GetProgramInfoLength());
    } else {
      EXPECT_EQ(0x01FF, pmt.GetPCRPID());
    }
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
      {"no program info, no streams", sb::Cat({sb::U16(0xE100), sb::Length12(0)}), {}, 0},
      {"program info only", sb::Cat({sb::U16(0xE100), sb::Length12(3), sb::Descriptor(0xC1, {0x84})}), {}, 3},
      {"an overlong last program descriptor moves the streams on",
       sb::Cat({sb::U16(0xE100), sb::Length12(2), sb::Descriptor(0xC1, {0x84, 0x00, 0x00}),
                StreamEntry({0x1B, 0x0111, {}})}),
       {{0x1B, 0x0111}}, 2},
      {"a stream whose ES_info_length reaches past the end is the last one",
       sb::Cat({sb::U16(0xE100), sb::Length12(0), StreamEntry({0x0F, 0x0112, {}}), sb::U8(0x06), sb::U16(0xE113),
                sb::Length12(0x40), StreamId(0x30), StreamEntry({0x0F, 0x0114, {}})}),
       {{0x0F, 0x0112}, {0x06, 0x0113}}, 0},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = sb::LongSection(PmtOptions(), c.body);
    section.resize(section.size() + 0x50, 0xFF);  // what a stream may read past the section
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
    int componentTag;  // -1: none
    int dataComponentId;
    const char* region;
    unsigned short caPid;
  } cases[] = {
      {"length 0 ends the loop; what was read stays",
       {StreamId(0x07), sb::Descriptor(0x09, {}), DataComponent(0x000C)},
       {{kWarning, "Invalid Descriptor Tag & Length!! descrTag=[0x09], descrLen=[0]\n"}}, 0x07, -1, nullptr, 0},
      {"tag 0 with a length is only unknown", {sb::Descriptor(0x00, {0xAA}), StreamId(0x08)},
       {{kWarning, "PMT MapInfo Parsing.. Unkown Descriptor Tag=[0x00]\n"}}, 0x08, -1, nullptr, 0},
      {"the later descriptor of a tag wins, silently",
       {StreamId(0x01), DataComponent(0x0008), sb::Descriptor(0xC6, {0x01, 'X'}), StreamId(0x02),
        DataComponent(0x000D), sb::Descriptor(0xC6, {0x02, 'Y', 'Z'})},
       {}, 0x02, 0x000D, "YZ", 0},
      {"the last CA descriptor gives the CA PID", {CaDescriptor(0x0101), CaDescriptor(0x1FFF)},
       {{kWarning, "PMT MapInfo CA PID =[0x101]"}, {kWarning, "PMT MapInfo CA PID =[0x1fff]"}}, -1, -1, nullptr,
       0x1FFF},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes entry = StreamEntry({0x06, 0x0113, c.descriptors});
    entry.resize(entry.size() + 8, 0xFF);
    RavelCMapInfo info(nullptr);
    TraceRecorder recorder;
    EXPECT_EQ(kRavelOk, info.ParseRawData(entry.data()));
    EXPECT_EQ(c.traces, recorder.Lines());
    EXPECT_EQ(0x06, info.GetStreamType());
    EXPECT_EQ(0x0113, info.GetElementaryPID());
    EXPECT_EQ(c.caPid, info.GetCAPID());
    if (c.componentTag < 0) {
      EXPECT_EQ(nullptr, info.GetStreamIdentifier());
    } else {
      ASSERT_NE(nullptr, info.GetStreamIdentifier());
      EXPECT_EQ(c.componentTag, info.GetStreamIdentifier()->GetComponentTag());
    }
    if (c.dataComponentId < 0) {
      EXPECT_EQ(nullptr, info.GetDataComponent());
    } else {
      ASSERT_NE(nullptr, info.GetDataComponent());
      EXPECT_EQ(c.dataComponentId, info.GetDataComponent()->GetDataComponentId());
    }
    if (c.region == nullptr) {
      EXPECT_EQ(nullptr, info.GetTargetRegion());
    } else {
      ASSERT_NE(nullptr, info.GetTargetRegion());
      EXPECT_STREQ(c.region, info.GetTargetRegion()->GetRegionSpec());
    }
  }
}

TEST(MapInfo, ReparseReleasesDescriptorsButKeepsTheCaPid) {
  Bytes withCa = StreamEntry({0x06, 0x0113, {CaDescriptor(0x0456), StreamId(0x30), DataComponent(0x0008)}});
  Bytes withoutCa = StreamEntry({0x0F, 0x0112, {StreamId(0x10)}});
  struct Case {
    const char* label;
    Bytes* second;
    int result;
    unsigned char streamType;
    unsigned short pid, esInfoLength;
    bool streamIdentifier;
  } cases[] = {
      {"an entry without CA descriptor", &withoutCa, kRavelOk, 0x0F, 0x0112, 3, true},
      {"null", nullptr, kRavelErrInvalidArgument, 0, 0, 0, false},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    RavelCMapInfo info(withCa.data());
    ASSERT_EQ(0x0456, info.GetCAPID());
    ASSERT_NE(nullptr, info.GetDataComponent());
    TraceRecorder recorder;
    EXPECT_EQ(c.result, info.ParseRawData(c.second ? c.second->data() : nullptr));
    EXPECT_TRUE(recorder.Lines().empty());
    EXPECT_EQ(0x0456, info.GetCAPID());
    EXPECT_EQ(c.streamType, info.GetStreamType());
    EXPECT_EQ(c.pid, info.GetElementaryPID());
    EXPECT_EQ(c.esInfoLength, info.GetESInfoLength());
    EXPECT_EQ(nullptr, info.GetDataComponent());
    EXPECT_EQ(nullptr, info.GetTargetRegion());
    EXPECT_EQ(c.streamIdentifier, info.GetStreamIdentifier() != nullptr);
  }
}

TEST(MapInfo, CopiesAreDeep) {
  Bytes entry = StreamEntry(
      {0x06, 0x0113, {CaDescriptor(0x0456), StreamId(0x30), DataComponent(0x0008), sb::Descriptor(0xC6, {1, 'Q'})}});
  Bytes other = StreamEntry({0x1B, 0x0111, {StreamId(0x00)}});
  std::unique_ptr<RavelCMapInfo> source(new RavelCMapInfo(entry.data()));
  RavelCMapInfo constructed(*source);
  RavelCMapInfo assigned(other.data());
  assigned = *source;
  source.reset();
  for (RavelCMapInfo* copy : {&constructed, &assigned}) {
    EXPECT_EQ(0x06, copy->GetStreamType());
    EXPECT_EQ(0x0113, copy->GetElementaryPID());
    EXPECT_EQ(entry.size() - 5, copy->GetESInfoLength());
    EXPECT_EQ(0x0456, copy->GetCAPID());
    ASSERT_NE(nullptr, copy->GetStreamIdentifier());
    EXPECT_EQ(0x30, copy->GetStreamIdentifier()->GetComponentTag());
    ASSERT_NE(nullptr, copy->GetDataComponent());
    EXPECT_EQ(0x0008, copy->GetDataComponent()->GetDataComponentId());
    ASSERT_NE(nullptr, copy->GetTargetRegion());
    EXPECT_STREQ("Q", copy->GetTargetRegion()->GetRegionSpec());
  }
  // A copy of an entry without descriptors drops the target's own.
  Bytes bare = StreamEntry({0x0F, 0x0112, {}});
  RavelCMapInfo empty(bare.data());
  assigned = empty;
  EXPECT_EQ(nullptr, assigned.GetStreamIdentifier());
  EXPECT_EQ(nullptr, assigned.GetDataComponent());
  EXPECT_EQ(nullptr, assigned.GetTargetRegion());
  EXPECT_EQ(0, assigned.GetCAPID());
}

TEST(PMTMerge, AppendsCopiesOfTheOthersStreamsOnlyWhenTheVersionsMatch) {
  BrazilianRules rules;
  Bytes first = PmtSection({{0x1B, 0x0111, {StreamId(0x00)}}, {0x0F, 0x0112, {}}}, {ParentalRating(2)}, 4, 0x4800,
                           0x0111);
  Bytes sameVersion = PmtSection({{0x0F, 0x0114, {StreamId(0x11)}}, {0x06, 0x0113, {}}}, {ParentalRating(6)}, 4,
                                 0x4801, 0x0222);
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
    std::unique_ptr<RavelCPMT> other(new RavelCPMT(c.other ? c.other->data() : first.data()));
    const int otherCount = other->GetMapInfoCount();
    TraceRecorder recorder;
    RavelCPMT& result = c.other ? (target += *other) : (target += target);
    EXPECT_EQ(&target, &result);
    EXPECT_EQ(c.traces, recorder.Lines());
    for (const TraceRecord& r : recorder.Records()) EXPECT_EQ("SectionParser/source/Ravel_CTablePMT", r.file);
    EXPECT_EQ(otherCount, other->GetMapInfoCount());
    other.reset();  // the appended streams are the target's own copies
    EXPECT_EQ(c.streams, StreamsOf(target));
    // Header, name, PCR PID, program info and parental rating stay the target's.
    EXPECT_EQ(0x4800, target.iTableIdExtension);
    EXPECT_EQ(4, target.iVersionNumber);
    EXPECT_EQ(0x0111, target.GetPCRPID());
    EXPECT_EQ(6, target.GetProgramInfoLength());
    ASSERT_NE(nullptr, target.GetParentalRating());
    EXPECT_EQ(10, target.GetParentalRating()->GetParentalRating(0)->GetMinimumAge());
  }
  // After the merge, the selection also finds the appended streams.
  RavelCPMT target(first.data());
  RavelCPMT other(sameVersion.data());
  target += other;
  EXPECT_EQ(0x0112, target.GetAudioPID(0));
  EXPECT_EQ(0x0114, target.GetAudioPID(1));
  EXPECT_EQ(2, target.GetAudioPIDCount());
  EXPECT_EQ(0x0113, target.GetCCPID());
  ASSERT_NE(nullptr, target.GetMapInfo(2)->GetStreamIdentifier());
  EXPECT_EQ(0x11, target.GetMapInfo(2)->GetStreamIdentifier()->GetComponentTag());
}

TEST(PMTAssign, CopiesEverythingButTheParentalRating) {
  BrazilianRules rules;
  Bytes sourceSection = PmtSection({{0x1B, 0x0121, {StreamId(0x00)}}, {0x0F, 0x0122, {DataComponent(0x0008)}}},
                                   {ParentalRating(6)}, 7, 0x4980, 0x0121);
  Bytes withRating = PmtSection({{0x02, 0x0100, {}}}, {ParentalRating(2)}, 1, 0x4800, 0x0100);
  Bytes withoutRating = PmtSection({{0x02, 0x0100, {}}}, {}, 1, 0x4800, 0x0100);
  struct Case {
    const char* label;
    Bytes* target;
    int minimumAge;  // of the target's own rating after the copy; -1: none
  } cases[] = {
      {"the target's rating stays", &withRating, 10},
      {"a target without rating gets none", &withoutRating, -1},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    std::unique_ptr<RavelCPMT> source(new RavelCPMT(sourceSection.data()));
    source->iSession = 0x5A;
    RavelCPMT target(c.target->data());
    TraceRecorder recorder;
    target = *source;
    source.reset();
    EXPECT_TRUE(recorder.Lines().empty());
    EXPECT_EQ((std::vector<TypeAndPid>{{0x1B, 0x0121}, {0x0F, 0x0122}}), StreamsOf(target));
    ASSERT_NE(nullptr, target.GetMapInfo(1)->GetDataComponent());
    EXPECT_EQ(0x0008, target.GetMapInfo(1)->GetDataComponent()->GetDataComponentId());
    EXPECT_EQ(0x5A, target.iSession);
    EXPECT_EQ(0x4980, target.iTableIdExtension);
    EXPECT_EQ(7, target.iVersionNumber);
    EXPECT_EQ(sourceSection.size() - 3, target.iSectionLength);
    EXPECT_STREQ("PMT", target.sTableName.GetString());
    EXPECT_EQ(0x0121, target.GetPCRPID());
    EXPECT_EQ(6, target.GetProgramInfoLength());
    if (c.minimumAge < 0) {
      EXPECT_EQ(nullptr, target.GetParentalRating());
    } else {
      ASSERT_NE(nullptr, target.GetParentalRating());
      EXPECT_EQ(c.minimumAge, target.GetParentalRating()->GetParentalRating(0)->GetMinimumAge());
    }
  }
  // Assigning a table to itself clears its streams before the copy.
  RavelCPMT self(sourceSection.data());
  self = self;
  EXPECT_EQ(0, self.GetMapInfoCount());
  EXPECT_EQ(0x0121, self.GetPCRPID());
  EXPECT_NE(nullptr, self.GetParentalRating());
}

TEST(PMTParse, ReparseReplacesStreamsAndRating) {
  Bytes first = PmtSection({{0x1B, 0x0111, {}}, {0x0F, 0x0112, {}}}, {ParentalRating(2)}, 1);
  Bytes second = PmtSection({{0x02, 0x0200, {}}}, {}, 2, 0x4801, 0x0200);
  RavelCPMT pmt(first.data());
  ASSERT_NE(nullptr, pmt.GetParentalRating());
  EXPECT_EQ(kRavelOk, pmt.ParseRawData(second.data()));
  EXPECT_EQ((std::vector<TypeAndPid>{{0x02, 0x0200}}), StreamsOf(pmt));
  EXPECT_EQ(nullptr, pmt.GetParentalRating());
  EXPECT_EQ(0x0200, pmt.GetPCRPID());
  EXPECT_EQ(0, pmt.GetProgramInfoLength());
  EXPECT_EQ(2, pmt.iVersionNumber);
  EXPECT_EQ(0x0200, pmt.GetVideoPID());
}

TEST(PMTShow, DumpsHeaderBodyAndEachStreamWithItsDescriptors) {
  struct Case {
    const char* label;
    Bytes section;
    TraceLines body;  // after the base lines
  } cases[] = {
      {"streams with descriptors; the rating is not dumped",
       PmtSection({{0x1B, 0x0111, {StreamId(0x00), CaDescriptor(0x0123)}},
                   {0x06, 0x0113, {sb::Descriptor(0xC6, {0x01, 'A', 'B'}), DataComponent(0x0008), StreamId(0x30)}},
                   {0x0D, 0x1FC8, {}}},
                  {ParentalRating(2)}, 3, 0x4800, 0x0111),
       {
           {kDump, "# Body Information\n"},
           {kDump, "PCR_PID=[0x0111], Program Information Len=[6]\n"},
           {kDump, "Stream Information. Size=[3]\n"},
           {kDump, "Stream Type Id=[0x1b], Stream PID=[0x0111], Stream Info Len=[9]\n"},
           {kDump, "\t=================== Stream Identifier Descriptor ===================\n"},
           {kDump, "\tDescriptor Tag=[0x52], Descriptor Length=[1], Name=[Stream Id Descriptor]\n"},
           {kDump, "\tComponent Tag = [0x00]\n"},
           {kDump, "Stream Type Id=[0x06], Stream PID=[0x0113], Stream Info Len=[13]\n"},
           {kDump, "\t=================== Stream Identifier Descriptor ===================\n"},
           {kDump, "\tDescriptor Tag=[0x52], Descriptor Length=[1], Name=[Stream Id Descriptor]\n"},
           {kDump, "\tComponent Tag = [0x30]\n"},
           {kDump, "\t=================== Data Component Descriptor ===================\n"},
           {kDump, "\tDescriptor Tag=[0xfd], Descriptor Length=[3], Name=[Data Component Descriptor]\n"},
           {kDump, "\tiDataComponentId=[0x0008]\n"},
           {kDump, "\t=================== Target Region Descriptor =====================\n"},
           {kDump, "\tDescriptor Tag=[0xc6], Descriptor Length=[3], Name=[Region Descriptor]\n"},
           {kDump, "\t Region Spec Type: 1 \n"},
           {kDump, "\t Region Spec: AB \n"},
           {kDump, "Stream Type Id=[0x0d], Stream PID=[0x1fc8], Stream Info Len=[0]\n"},
           {kDump, "#################################################\n"},
       }},
      {"no streams", PmtSection({}, {}, 3, 0x4800, 0x1FFF),
       {
           {kDump, "# Body Information\n"},
           {kDump, "PCR_PID=[0x1fff], Program Information Len=[0]\n"},
           {kDump, "Stream Information. Size=[0]\n"},
           {kDump, "#################################################\n"},
       }},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = c.section;
    RavelCPMT pmt(section.data());
    TraceRecorder recorder;
    pmt.Show();
    TraceLines expected = {
        {kDump, "#################################################\n"},
        {kDump, "#### PMT Table Information\n"},
        {kDump, "# Header Information\n"},
        {kDump, "Session = [0x00], Talbe identifier=[0x02], Table Name=[PMT]\n"},
        {kDump, HeaderLine2(section, "0x4800")},
        {kDump, "Version number=[3], Current next indicator=[1], Section numbe=[0], Last section number=[0]\n"},
    };
    expected.insert(expected.end(), c.body.begin(), c.body.end());
    EXPECT_EQ(expected, recorder.Lines());
  }
  // A table never parsed shows an unknown name and no streams.
  RavelCPMT empty(nullptr);
  TraceRecorder recorder;
  empty.Show();
  EXPECT_EQ((TraceLines{
                {kDump, "#################################################\n"},
                {kDump, "#### PMT Table Information\n"},
                {kDump, "# Header Information\n"},
                {kDump, "Session = [0x00], Talbe identifier=[0x00], Table Name=[Unknown]\n"},
                {kDump, "Section syntax indicator=[0], Section length=[0], Any Identifier(?)=[0x0000]\n"},
                {kDump, "Version number=[0], Current next indicator=[0], Section numbe=[0], Last section number=[0]\n"},
                {kDump, "# Body Information\n"},
                {kDump, "PCR_PID=[0x0000], Program Information Len=[0]\n"},
                {kDump, "Stream Information. Size=[0]\n"},
                {kDump, "#################################################\n"},
            }),
            recorder.Lines());
}

TEST(PMTCapture, JapaneseChannelGivesEachProgramsStreamsToPlay) {
  Bytes contents;
  RAVEL_LOAD_CAPTURE_OR_SKIP("isdbt-japan-psi.sections", contents);
  std::vector<Bytes> sections = captures::SplitSections(contents);
  std::unique_ptr<RavelCPAT> pat;
  std::vector<Bytes*> pmtSections;
  for (Bytes& s : sections) {
    if (s.empty()) continue;
    if (s[0] == 0x00) pat.reset(new RavelCPAT(s.data()));
    if (s[0] == 0x02) pmtSections.push_back(&s);
  }
  ASSERT_NE(nullptr, pat);
  ASSERT_EQ(4u, pmtSections.size());

  struct Expected {
    unsigned short program, pmtPid, pcrPid, programInfoLength;
    int streamCount;
    Selection selection;
    unsigned short firstCaPid;  // of the caption stream
  } expected[] = {
      {0x4800, 0x01F0, 0x01FF, 15, 11, {0x0100, 0x0110, 0, 0, 0x0130, 1}, 0x1FFF},
      {0x4801, 0x03F0, 0x01FF, 15, 11, {0x0100, 0x0110, 0, 0, 0x0130, 1}, 0x1FFF},
      {0x4980, 0x1FC8, 0x05FF, 3, 7, {0x0581, 0x0583, 0, 0, 0x0587, 1}, 0},
      {0xFFF0, 0x1CF0, 0x1FFF, 0, 12, {0, 0, 0, 0, 0, 0}, 0},
  };
  for (size_t i = 0; i < pmtSections.size(); ++i) {
    SCOPED_TRACE(i);
    TraceRecorder recorder;
    RavelCPMT pmt(pmtSections[i]->data());
    EXPECT_EQ(kRavelOk, pmt.ParseRawData(pmtSections[i]->data()));
    EXPECT_EQ(expected[i].program, pmt.iTableIdExtension);
    EXPECT_STREQ("PMT", pmt.sTableName.GetString());
    EXPECT_EQ(expected[i].pcrPid, pmt.GetPCRPID());
    EXPECT_EQ(expected[i].programInfoLength, pmt.GetProgramInfoLength());
    EXPECT_EQ(expected[i].streamCount, pmt.GetMapInfoCount());
    EXPECT_EQ(expected[i].selection, SelectionOf(pmt));
    EXPECT_EQ(nullptr, pmt.GetParentalRating());
    // The PAT names this program's PMT PID; the one-segment program comes last.
    bool listed = false;
    for (int p = 0; p < pat->GetProgramCount(); ++p) {
      if (pat->GetPMTInfo(p)->GetProgramNumber() != expected[i].program) continue;
      listed = true;
      EXPECT_EQ(expected[i].pmtPid, pat->GetPMTInfo(p)->GetPID());
      if (expected[i].pmtPid == 0x1FC8) {
        EXPECT_EQ(pat->GetProgramCount() - 1, p);
      }
    }
    EXPECT_TRUE(listed);
    for (int s = 0; s < pmt.GetMapInfoCount(); ++s) {
      RavelCMapInfo* info = pmt.GetMapInfo(s);
      ASSERT_NE(nullptr, info->GetStreamIdentifier()) << s;
      EXPECT_EQ(info->GetElementaryPID() & 0xFF, info->GetStreamIdentifier()->GetComponentTag()) << s;
      if (info->GetElementaryPID() == expected[i].selection.caption && expected[i].selection.caption != 0) {
        EXPECT_EQ(expected[i].firstCaPid, info->GetCAPID());
      }
    }
    // Nothing of what the capture carries is malformed: only unknown tags and CA PIDs are traced.
    for (const TraceRecord& r : recorder.Records()) {
      EXPECT_EQ(kWarning, r.mask);
      EXPECT_TRUE(r.text.find("Unkown Descriptor Tag") != std::string::npos ||
                  r.text.find("PMT MapInfo CA PID =[0x1fff]") == 0)
          << r.text;
    }
  }

  // The first two programs' PMTs carry different versions and do not merge;
  // the second and the one-segment PMT share version 29 and do.
  RavelCPMT first(pmtSections[0]->data());
  RavelCPMT second(pmtSections[1]->data());
  RavelCPMT oneSeg(pmtSections[2]->data());
  TraceRecorder recorder;
  first += second;
  EXPECT_EQ((TraceLines{{kError, "Two PMT Information have different information! first one=[26], second one=[29]\n"}}),
            recorder.Lines());
  EXPECT_EQ(11, first.GetMapInfoCount());
  second += oneSeg;
  EXPECT_EQ(18, second.GetMapInfoCount());
  EXPECT_EQ(0x0100, second.GetVideoPID());
  EXPECT_EQ(0x0583, second.GetAudioPID(1));
  EXPECT_EQ(2, second.GetAudioPIDCount());
}
