// Descriptors of the DII module info and of DSM-CC stream descriptor sections.
#include <gtest/gtest.h>

#include <cstring>
#include <functional>
#include <memory>
#include <string>

#include "BitWalk.h"
#include "Ravel_CDescriptorCRC32.h"
#include "Ravel_CDescriptorCompressionType.h"
#include "Ravel_CDescriptorEstDownloadTime.h"
#include "Ravel_CDescriptorGeneralEvent.h"
#include "Ravel_CDescriptorInfo.h"
#include "Ravel_CDescriptorLocation.h"
#include "Ravel_CDescriptorModuleLink.h"
#include "Ravel_CDescriptorNPTReference.h"
#include "Ravel_CDescriptorName.h"
#include "Ravel_CDescriptorType.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TraceRecorder.h"

namespace {

const unsigned int kDump = 0x10000020u;
const unsigned int kWarning = 0x40000020u;

std::string Banner(const std::string& words) { return "\t=================== " + words + " ===================\n"; }

std::string BaseLine(int tag, int length, const std::string& name) {
  char line[160];
  std::snprintf(line, sizeof(line), "\tDescriptor Tag=[0x%x], Descriptor Length=[%d], Name=[%s]\n", tag, length,
                name.c_str());
  return line;
}

TraceLines ShowLines(RavelCDescriptorBase& descriptor) {
  TraceRecorder recorder;
  descriptor.Show();
  return recorder.Lines();
}

// The lines after the banner and the base line.
TraceLines BodyLines(RavelCDescriptorBase& descriptor) {
  TraceLines lines = ShowLines(descriptor);
  return TraceLines(lines.begin() + 2, lines.end());
}

// Parses `raw` into a new T, checks that a copy-constructed and an assigned
// copy dump alike, and returns the dump.
template <class T>
TraceLines ParseCopyAndShow(unsigned char* raw, int& result, int& parseTraces) {
  TraceRecorder recorder;
  T descriptor(nullptr);
  recorder.Clear();
  result = descriptor.ParseRawData(raw);
  parseTraces = static_cast<int>(recorder.Records().size());
  TraceLines lines = ShowLines(descriptor);
  T copied(descriptor);
  EXPECT_EQ(lines, ShowLines(copied));
  T assigned(nullptr);
  assigned = descriptor;
  EXPECT_EQ(lines, ShowLines(assigned));
  return lines;
}

typedef std::function<TraceLines(unsigned char*, int&, int&)> ParseFn;
typedef std::function<RavelCDescriptorBase*(unsigned char*)> MakeFn;

template <class T>
RavelCDescriptorBase* Make(unsigned char* raw) {
  return new T(raw);
}

Bytes GeneralEvent(uint8_t timeMode, const Bytes& time5, uint8_t type, uint16_t id, const Bytes& privateData) {
  Bytes body{0xAB, 0xC0, timeMode};  // group id 0xABC
  sb::Append(body, time5);
  body.push_back(type);
  sb::Append(body, sb::U16(id));
  sb::Append(body, privateData);
  return sb::Descriptor(0x40, body);
}

Bytes NptReference() {
  // postDiscontinuity 1, contentId 0x55; STC 0x1_2345_6789; NPT 0x0_89AB_CDEF; scale 3/1001.
  return sb::Descriptor(0x17, Bytes{0xD5, 0xFF, 0x23, 0x45, 0x67, 0x89, 0xFF, 0xFF, 0xFF, 0xFE, 0x89, 0xAB, 0xCD, 0xEF,
                                    0x00, 0x03, 0x03, 0xE9});
}

}  // namespace

TEST(CarouselDescriptors, DecodeDumpAndCopyEveryField) {
  struct Case {
    const char* what;
    Bytes raw;
    ParseFn parse;
    TraceLines expected;
  } cases[] = {
      {"type",
       sb::Descriptor(0x01, sb::Text("text/html")),
       ParseCopyAndShow<RavelCTypeDescriptor>,
       {{kDump, Banner("Type Descriptor")},
        {kDump, BaseLine(0x01, 9, "Type Descriptor")},
        {kDump, "\tiType=[text/html]\n"}}},
      {"name",
       sb::Descriptor(0x02, sb::Text("index.bml")),
       ParseCopyAndShow<RavelCNameDescriptor>,
       {{kDump, Banner("Name Descriptor")},
        {kDump, BaseLine(0x02, 9, "Name Descriptor")},
        {kDump, "\tiFileName=[index.bml]\n"}}},
      {"empty name",
       sb::Descriptor(0x02, Bytes()),
       ParseCopyAndShow<RavelCNameDescriptor>,
       {{kDump, Banner("Name Descriptor")},
        {kDump, BaseLine(0x02, 0, "Name Descriptor")},
        {kDump, "\tiFileName=[]\n"}}},
      {"info",
       sb::Descriptor(0x03, sb::Cat({sb::Text("por"), sb::Text("Guia")})),
       ParseCopyAndShow<RavelCInfoDescriptor>,
       {{kDump, Banner("Info Descriptor")},
        {kDump, BaseLine(0x03, 7, "Info Descriptor")},
        {kDump, "\tiISO639LangCode=[por], ipTextChar=[Guia]\n"}}},
      // The module id is printed in decimal under its label.
      {"module link",
       sb::Descriptor(0x04, Bytes{0x02, 0x12, 0x34}),
       ParseCopyAndShow<RavelCModuleLinkDescriptor>,
       {{kDump, Banner("Module Link Descriptor")},
        {kDump, BaseLine(0x04, 3, "Module Link Descriptor")},
        {kDump, "\tiPosition=[2], iModuleId=[4660]\n"}}},
      {"crc32",
       sb::Descriptor(0x05, Bytes{0xDE, 0xAD, 0x0B, 0xEF}),
       ParseCopyAndShow<RavelCCRC32Descriptor>,
       {{kDump, Banner("CRC32 Descriptor")},
        {kDump, BaseLine(0x05, 4, "CRC32 Descriptor")},
        {kDump, "\tCRC32=[0xde 0xad 0x0b 0xef]\n"}}},
      {"location",
       sb::Descriptor(0x06, Bytes{0x81}),
       ParseCopyAndShow<RavelCLocationDescriptor>,
       {{kDump, Banner("Location Descriptor")},
        {kDump, BaseLine(0x06, 1, "Location Descriptor")},
        {kDump, "\tiLocationTag=[129]\n"}}},
      // Misspelt display name; the 32-bit value goes through %d.
      {"est download time",
       sb::Descriptor(0x07, sb::U32(0x80000001u)),
       ParseCopyAndShow<RavelCEstDownloadTimeDescriptor>,
       {{kDump, Banner("EST Download Time Descriptor")},
        {kDump, BaseLine(0x07, 4, "Estimated Donwload Time Descriptor")},
        {kDump, "\tiEstDownloadTime=[-2147483647]\n"}}},
      {"compression type",
       sb::Descriptor(0xC2, sb::Cat({sb::U8(0x01), sb::U32(756113)})),
       ParseCopyAndShow<RavelCCompressionTypeDescriptor>,
       {{kDump, Banner("Compression Type Descriptor")},
        {kDump, BaseLine(0xC2, 5, "Compression Type Descriptor")},
        {kDump, "\tiCompressionType=[1], iOriginalSize=[756113]\n"}}},
      // Reserved bits set around both references must not leak into them.
      {"npt reference",
       NptReference(),
       ParseCopyAndShow<RavelCNPTReferenceDescriptor>,
       {{kDump, Banner("NPT Reference Descriptor")},
        {kDump, BaseLine(0x17, 18, "NPT Reference Descriptor")},
        {kDump, "\t Post Discontinuity Indicator=[1], Dsm_ContentID=[85]\n"},
        {kDump, "\t STC_Reference=[0x01 0x23 0x45 0x67 0x89]\n"},
        {kDump, "\t NPT_Reference=[0x00 0x89 0xab 0xcd 0xef]\n"},
        {kDump, "\t Scale Numerator=[3], Scale Denominator=[1001]\n"}}},
      {"general event",
       GeneralEvent(2, Bytes{0xFE, 0x12, 0x34, 0x56, 0x78}, 0x07, 0x0102, sb::Text("ab")),
       ParseCopyAndShow<RavelCGeneralEventDescriptor>,
       {{kDump, Banner("General Event Descriptor")},
        {kDump, BaseLine(0x40, 13, "General Event Descriptor")},
        {kDump, "\t EventMsgGroupID=[2748], TimeMode=[2]\n"},
        {kDump, "\t EventMsg_NPT=[0x00 0x12 0x34 0x56 0x78]\n"},
        {kDump, "\t EventMsgType=[7], EventMsgID=[0x0102]\n"}}},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    int result = -1, parseTraces = -1;
    TraceLines lines = c.parse(c.raw.data(), result, parseTraces);
    EXPECT_EQ(kRavelOk, result);
    EXPECT_EQ(0, parseTraces);
    EXPECT_EQ(c.expected, lines);
  }
}

TEST(CarouselDescriptors, RefuseNullAndForeignTagsWithTheirOwnMessages) {
  struct Case {
    const char* what;
    MakeFn make;
    uint8_t tag;
    const char* displayName;
    unsigned int wrongTagMask;
    const char* wrongTagText;
    bool tracesNull;
  } cases[] = {
      {"type", Make<RavelCTypeDescriptor>, 0x01, "Type Descriptor", kWarning,
       "This Descriptor isn't Type Descriptor! Descriptor Tag=[0x99]\n", false},
      {"name", Make<RavelCNameDescriptor>, 0x02, "Name Descriptor", kWarning,
       "This Descriptor isn't Name Descriptor! Descriptor Tag=[0x99]\n", false},
      // The one descriptor that reports a foreign tag with the utility module bit.
      {"info", Make<RavelCInfoDescriptor>, 0x03, "Info Descriptor", 0x40000001u,
       "This Descriptor isn't Info Descriptor! Descriptor Tag=[0x99]\n", false},
      {"module link", Make<RavelCModuleLinkDescriptor>, 0x04, "Module Link Descriptor", kWarning,
       "This Descriptor isn't Module Link Descriptor! Descriptor Tag=[0x99]\n", false},
      {"crc32", Make<RavelCCRC32Descriptor>, 0x05, "CRC32 Descriptor", kWarning,
       "This Descriptor isn't CRC32 Descriptor! Descriptor Tag=[0x99]\n", false},
      {"location", Make<RavelCLocationDescriptor>, 0x06, "Location Descriptor", kWarning,
       "This Descriptor isn't Location Descriptor! Descriptor Tag=[0x99]\n", false},
      {"est download time", Make<RavelCEstDownloadTimeDescriptor>, 0x07, "Estimated Donwload Time Descriptor", kWarning,
       "This Descriptor isn't Estimated Download Time Descriptor! Descriptor Tag=[0x99]\n", false},
      {"compression type", Make<RavelCCompressionTypeDescriptor>, 0xC2, "Compression Type Descriptor", kWarning,
       "This Descriptor isn't Compression Type Descriptor! Descriptor Tag=[0x99]\n", false},
      // Two blanks after "isn't" in these two.
      {"npt reference", Make<RavelCNPTReferenceDescriptor>, 0x17, "NPT Reference Descriptor", kWarning,
       "This Descriptor isn't  NPT Reference Descriptor! Descriptor Tag=[0x99]\n", true},
      {"general event", Make<RavelCGeneralEventDescriptor>, 0x40, "General Event Descriptor", kWarning,
       "This Descriptor isn't  General Event Descriptor! Descriptor Tag=[0x99]\n", false},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    TraceRecorder recorder;
    std::unique_ptr<RavelCDescriptorBase> d(c.make(nullptr));
    // Constructing empty runs the class's null parse.
    TraceLines nullTrace;
    if (c.tracesNull) nullTrace.push_back({0x80000020u, "Invalid Argument!\n"});
    EXPECT_EQ(nullTrace, recorder.Lines());
    EXPECT_EQ(0, d->iDescriptorTag);
    EXPECT_STREQ("", d->GetDescriptorName());

    Bytes raw(32, 0x00);
    raw[0] = c.tag;
    raw[1] = 19;
    recorder.Clear();
    EXPECT_EQ(kRavelOk, d->ParseRawData(raw.data()));
    EXPECT_STREQ(c.displayName, d->GetDescriptorName());
    EXPECT_TRUE(recorder.Records().empty());

    raw[0] = 0x99;
    raw[1] = 7;
    EXPECT_EQ(kRavelErrInvalidArgument, d->ParseRawData(raw.data()));
    ASSERT_EQ(1u, recorder.Records().size());
    EXPECT_EQ(c.wrongTagMask, recorder.Records()[0].mask);
    EXPECT_EQ(c.wrongTagText, recorder.Records()[0].text);
    EXPECT_EQ(0x99, d->iDescriptorTag);
    EXPECT_EQ(7, d->iDescriptorLength);
    EXPECT_STREQ("Unknown Descriptor", d->GetDescriptorName());

    recorder.Clear();
    EXPECT_EQ(kRavelErrInvalidArgument, d->ParseRawData(nullptr));
    EXPECT_EQ(nullTrace, recorder.Lines());
    EXPECT_EQ(0, d->iDescriptorTag);
    EXPECT_EQ(0, d->iDescriptorLength);
  }
}

// After a good parse, a foreign tag empties the fields of most classes; the
// NPT reference and the general event keep what they had.
TEST(CarouselDescriptors, ForeignTagAfterAGoodParseEmptiesOrKeepsTheFields) {
  struct Case {
    const char* what;
    MakeFn make;
    Bytes good;
    bool keeps;
  } cases[] = {
      {"type", Make<RavelCTypeDescriptor>, sb::Descriptor(0x01, sb::Text("image/png")), false},
      {"name", Make<RavelCNameDescriptor>, sb::Descriptor(0x02, sb::Text("a.png")), false},
      {"info", Make<RavelCInfoDescriptor>, sb::Descriptor(0x03, sb::Text("porxyz")), false},
      {"module link", Make<RavelCModuleLinkDescriptor>, sb::Descriptor(0x04, Bytes{1, 2, 3}), false},
      {"crc32", Make<RavelCCRC32Descriptor>, sb::Descriptor(0x05, Bytes{1, 2, 3, 4}), false},
      {"location", Make<RavelCLocationDescriptor>, sb::Descriptor(0x06, Bytes{9}), false},
      {"est download time", Make<RavelCEstDownloadTimeDescriptor>, sb::Descriptor(0x07, sb::U32(60)), false},
      {"compression type", Make<RavelCCompressionTypeDescriptor>, sb::Descriptor(0xC2, Bytes{1, 0, 0, 1, 0}), false},
      {"npt reference", Make<RavelCNPTReferenceDescriptor>, NptReference(), true},
      {"general event", Make<RavelCGeneralEventDescriptor>,
       GeneralEvent(3, Bytes{0x01, 0x23, 0x45, 0x60, 0x00}, 1, 2, sb::Text("p")), true},
  };
  Bytes foreign = sb::Descriptor(0x33, Bytes(20, 0x00));
  foreign.resize(64, 0x00);
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    TraceRecorder recorder;
    std::unique_ptr<RavelCDescriptorBase> empty(c.make(nullptr));
    std::unique_ptr<RavelCDescriptorBase> d(c.make(nullptr));
    c.good.resize(64, 0x00);
    ASSERT_EQ(kRavelOk, d->ParseRawData(c.good.data()));
    TraceLines parsed = BodyLines(*d);
    ASSERT_NE(BodyLines(*empty), parsed);
    EXPECT_EQ(kRavelErrInvalidArgument, d->ParseRawData(foreign.data()));
    EXPECT_EQ(c.keeps ? parsed : BodyLines(*empty), BodyLines(*d));
  }
}

TEST(InfoDescriptor, KeepsTheTextWithTwoZeroBytesAndCopiesItUpToTheFirstZero) {
  struct Case {
    const char* what;
    Bytes body;
    const char* language;
    Bytes text;  // what the buffer holds before its two 0 bytes
    const char* copied;
  } cases[] = {
      {"plain", sb::Text("jpnEPG guide"), "jpn", sb::Text("EPG guide"), "EPG guide"},
      {"no text", sb::Text("eng"), "eng", Bytes(), ""},
      {"embedded zero", sb::Cat({sb::Text("spa"), Bytes{'a', 0, 'b'}}), "spa", Bytes{'a', 0, 'b'}, "a"},
      // Shorter than a language code: no text at all, never a negative size.
      {"length 2", Bytes{'p', 'o'}, "po", Bytes(), ""},
      {"length 0", Bytes(), "", Bytes(), ""},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    Bytes raw = sb::Descriptor(0x03, c.body);
    raw.resize(16, 0x00);  // the language code is read from bytes 2 to 4 whatever the length
    RavelCInfoDescriptor d(raw.data());
    EXPECT_STREQ(c.language, d.GetLanguageCode());
    ASSERT_NE(nullptr, d.GetText());
    EXPECT_EQ(std::string(c.text.begin(), c.text.end()), std::string(d.GetText(), c.text.size()));
    EXPECT_EQ(0, d.GetText()[c.text.size()]);
    EXPECT_EQ(0, d.GetText()[c.text.size() + 1]);
    RavelCInfoDescriptor copy(d);
    EXPECT_STREQ(c.copied, copy.GetText());
    EXPECT_NE(d.GetText(), copy.GetText());
    EXPECT_STREQ(c.language, copy.GetLanguageCode());
  }
  // A null parse leaves no text, and the dump prints it as the C library prints null.
  RavelCInfoDescriptor d(nullptr);
  EXPECT_EQ(nullptr, d.GetText());
  TraceLines expected{{kDump, "\tiISO639LangCode=[], ipTextChar=[(null)]\n"}};
  EXPECT_EQ(expected, BodyLines(d));
}

TEST(GeneralEventDescriptor, ReadsTheTimeByModeAndTheMessageFromFixedPositions) {
  Bytes mjdTime = sb::UtcTime(2013, 3, 1, 12, 34, 56);  // the 1st comes out as 2013-2-32
  struct Case {
    const char* what;
    uint8_t mode;
    Bytes time5;
    TraceLines parseTrace;
    TraceLines modeLines;  // the Show lines between the group line and the message line
  } cases[] = {
      // No time in the broadcast, but the message fields do not move.
      {"none", 0, Bytes{0x11, 0x22, 0x33, 0x44, 0x55}, {}, {{kWarning, "Unknown Time Mode =[0x0]\n"}}},
      {"MJD JST", 1, mjdTime, {}, {{kDump, "\t EventMsg_MJDJSTTime =[2013.2.32 - 12:34:56]\n"}}},
      {"NPT", 2, Bytes{0xFF, 0x01, 0x02, 0x03, 0x04}, {}, {{kDump, "\t EventMsg_NPT=[0x01 0x01 0x02 0x03 0x04]\n"}}},
      // The BCD digits are read four bits into byte 5.
      {"relative", 3, Bytes{0xF1, 0x23, 0x45, 0x6F, 0xFF}, {}, {{kDump, "\t EventMsg_RelativeTime =[12:34:56]\n"}}},
      {"mode 4",
       4,
       Bytes{0x11, 0x22, 0x33, 0x44, 0x55},
       {{kWarning, "Unknown Time Mode =[0x4]\n"}},
       {{kWarning, "Unknown Time Mode =[0x4]\n"}}},
      {"MJD JST as mode 5", 5, mjdTime, {}, {{kDump, "\t EventMsg_MJDJSTTime =[2013.2.32 - 12:34:56]\n"}}},
      {"mode 0xff",
       0xFF,
       Bytes(5, 0),
       {{kWarning, "Unknown Time Mode =[0xff]\n"}},
       {{kWarning, "Unknown Time Mode =[0xff]\n"}}},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    Bytes raw = GeneralEvent(c.mode, c.time5, 0x42, 0xBEEF, sb::Text("pd"));
    TraceRecorder recorder;
    RavelCGeneralEventDescriptor d(raw.data());
    EXPECT_EQ(c.parseTrace, recorder.Lines());
    if (!c.parseTrace.empty()) {
      EXPECT_EQ("SectionParser/source/Ravel_CDescriptorGeneralEvent", recorder.Records()[0].file);
    }
    EXPECT_EQ(0xABC, d.GetEventMsgGroupId());
    EXPECT_EQ(c.mode, d.GetTimeMode());
    EXPECT_EQ(0x42, d.GetEventMsgType());
    EXPECT_EQ(0xBEEF, d.GetEventMsgId());
    EXPECT_EQ(2, d.GetPrivateDataLength());
    EXPECT_STREQ("pd", d.GetPrivateData());
    TraceLines expected{{kDump, "\t EventMsgGroupID=[2748], TimeMode=[" + std::to_string(c.mode) + "]\n"}};
    expected.insert(expected.end(), c.modeLines.begin(), c.modeLines.end());
    expected.push_back({kDump, "\t EventMsgType=[66], EventMsgID=[0xbeef]\n"});
    EXPECT_EQ(expected, BodyLines(d));
  }
  Bytes relative = GeneralEvent(3, Bytes{0xF1, 0x23, 0x45, 0x6F, 0xFF}, 0, 0, Bytes());
  RavelCGeneralEventDescriptor r(relative.data());
  EXPECT_EQ(12, r.GetEventMsgRelativeTime().iHours);
  EXPECT_EQ(34, r.GetEventMsgRelativeTime().iMinutes);
  EXPECT_EQ(56, r.GetEventMsgRelativeTime().iSeconds);
  Bytes mjd = GeneralEvent(1, mjdTime, 0, 0, Bytes());
  RavelCGeneralEventDescriptor m(mjd.data());
  EXPECT_EQ(2013, m.GetEventMsgMJDJSTTime().iYear);
  EXPECT_EQ(2, m.GetEventMsgMJDJSTTime().iMonth);
  EXPECT_EQ(32, m.GetEventMsgMJDJSTTime().iDay);
}

TEST(GeneralEventDescriptor, PrivateDataLengthWrapsInEightBits) {
  struct Case {
    const char* what;
    uint8_t length;
    int privateLength;
  } cases[] = {
      {"no private data", 11, 0},
      {"three bytes", 14, 3},
      {"shorter than the fixed part", 10, 255},  // 10 - 11 in 8 bits
      {"length 0", 0, 245},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    Bytes raw(13 + 256, 0x00);
    raw[0] = 0x40;
    raw[1] = c.length;
    for (size_t i = 13; i < raw.size(); ++i) raw[i] = static_cast<uint8_t>('A' + i % 26);
    RavelCGeneralEventDescriptor d(raw.data());
    EXPECT_EQ(c.privateLength, d.GetPrivateDataLength());
    ASSERT_NE(nullptr, d.GetPrivateData());
    EXPECT_EQ(std::string(raw.begin() + 13, raw.begin() + 13 + c.privateLength), std::string(d.GetPrivateData()));
  }
}

TEST(GeneralEventDescriptor, PrivateDataIsReplacedOnlyByAMatchingTagAndCopiedAsText) {
  Bytes first = GeneralEvent(0, Bytes(5, 0), 1, 1, sb::Text("first"));
  Bytes second = GeneralEvent(0, Bytes(5, 0), 2, 2, sb::Cat({sb::Text("se"), Bytes{0}, sb::Text("cond")}));
  Bytes foreign = sb::Descriptor(0x41, Bytes(16, 0));
  RavelCGeneralEventDescriptor d(first.data());
  EXPECT_EQ(kRavelErrInvalidArgument, d.ParseRawData(foreign.data()));
  EXPECT_STREQ("first", d.GetPrivateData());
  EXPECT_EQ(5, d.GetPrivateDataLength());
  EXPECT_EQ(kRavelErrInvalidArgument, d.ParseRawData(nullptr));
  EXPECT_STREQ("first", d.GetPrivateData());
  ASSERT_EQ(kRavelOk, d.ParseRawData(second.data()));
  EXPECT_EQ(7, d.GetPrivateDataLength());
  EXPECT_EQ(0, std::memcmp("se\0cond", d.GetPrivateData(), 8));
  // The copy duplicates the text up to its first 0 byte but keeps the length.
  RavelCGeneralEventDescriptor copy(d);
  EXPECT_STREQ("se", copy.GetPrivateData());
  EXPECT_EQ(7, copy.GetPrivateDataLength());
  EXPECT_NE(d.GetPrivateData(), copy.GetPrivateData());
  RavelCGeneralEventDescriptor empty(nullptr);
  copy = empty;
  EXPECT_EQ(nullptr, copy.GetPrivateData());
}

// ---------------------------------------------------------------------------
// Every wire bit of the fixed fields, one at a time

namespace {

using Values = std::vector<int64_t>;

Values GeneralEventFields(unsigned char* raw) {
  RavelCGeneralEventDescriptor d(raw);
  const RavelCDateTime& time = d.GetEventMsgMJDJSTTime();
  const unsigned char* npt = d.GetEventMsgNPT();
  const RavelCEventRelativeTime& relative = d.GetEventMsgRelativeTime();
  return {d.GetEventMsgGroupId(), time.iHour,        time.iMinute,        time.iSecond, npt[0],
          npt[1],                 npt[2],            npt[3],              npt[4],       relative.iHours,
          relative.iMinutes,      relative.iSeconds, d.GetEventMsgType(), d.GetEventMsgId()};
}

// The time field (bytes 5 to 9) is read by time mode: the MJD/JST time's BCD
// hour, minute and second in bytes 7 to 9 (modes 1 and 5), the 33-bit NPT
// (mode 2), or BCD digits four bits into the field (mode 3). The MJD itself is
// no sum of its bits and stays 0 here.
std::vector<bitwalk::Field> GeneralEventLayout(int mode) {
  const bool jst = mode == 1 || mode == 5;
  const bool npt = mode == 2;
  const bool relative = mode == 3;
  auto bcd = [](bool read, int at) {
    return std::vector<bitwalk::Segment>{{at, read ? 4 : 0, 10}, {at + 4, read ? 4 : 0}};
  };
  auto bits = [](bool read, int at, int width) { return std::vector<bitwalk::Segment>{{at, read ? width : 0}}; };
  return {{"event message group id", {{16, 12}}},
          {"MJD/JST hour", bcd(jst, 56)},
          {"MJD/JST minute", bcd(jst, 64)},
          {"MJD/JST second", bcd(jst, 72)},
          {"NPT bit 32", bits(npt, 47, 1)},
          {"NPT byte 1", bits(npt, 48, 8)},
          {"NPT byte 2", bits(npt, 56, 8)},
          {"NPT byte 3", bits(npt, 64, 8)},
          {"NPT byte 4", bits(npt, 72, 8)},
          {"relative hours", bcd(relative, 44)},
          {"relative minutes", bcd(relative, 52)},
          {"relative seconds", bcd(relative, 60)},
          {"event message type", {{80, 8}}},
          {"event message id", {{88, 16}}}};
}

Bytes GeneralEventBase(uint8_t mode) { return bitwalk::Base({0x40, 11, 0x00, 0x00, mode}, 16); }

}  // namespace

TEST(CarouselDescriptorBits, OneSetBitChangesOnlyTheFieldsItBelongsTo) {
  using bitwalk::Base;
  const bitwalk::Walk walks[] = {
      {"module link", Base({0x04, 3}, 5), 16, 40, {{"position", {{16, 8}}}, {"module id", {{24, 16}}}},
       [](unsigned char* raw) -> Values {
         RavelCModuleLinkDescriptor d(raw);
         return {d.GetPosition(), d.GetModuleId()};
       }},
      {"CRC32", Base({0x05, 4}, 6), 16, 48,
       {{"CRC byte 0", {{16, 8}}}, {"CRC byte 1", {{24, 8}}}, {"CRC byte 2", {{32, 8}}}, {"CRC byte 3", {{40, 8}}}},
       [](unsigned char* raw) -> Values {
         RavelCCRC32Descriptor d(raw);
         return {d.GetCRC32()[0], d.GetCRC32()[1], d.GetCRC32()[2], d.GetCRC32()[3]};
       }},
      {"location", Base({0x06, 1}, 3), 16, 24, {{"location tag", {{16, 8}}}},
       [](unsigned char* raw) -> Values {
         RavelCLocationDescriptor d(raw);
         return {d.GetLocationTag()};
       }},
      {"estimated download time", Base({0x07, 4}, 6), 16, 48, {{"estimated download time", {{16, 32}}}},
       [](unsigned char* raw) -> Values {
         RavelCEstDownloadTimeDescriptor d(raw);
         return {d.GetEstDownloadTime()};
       }},
      {"compression type", Base({0xC2, 5}, 7), 16, 56,
       {{"compression type", {{16, 8}}}, {"original size", {{24, 32}}}},
       [](unsigned char* raw) -> Values {
         RavelCCompressionTypeDescriptor d(raw);
         return {d.GetCompressionType(), d.GetOriginalSize()};
       }},
      // Bytes 8 to 10 and the top seven bits of bytes 3 and 11 are read by nobody.
      {"NPT reference", Base({0x17, 18}, 20), 16, 160,
       {{"post discontinuity indicator", {{16, 1}}},
        {"content id", {{17, 7}}},
        {"STC reference bit 32", {{31, 1}}},
        {"STC reference byte 1", {{32, 8}}},
        {"STC reference byte 2", {{40, 8}}},
        {"STC reference byte 3", {{48, 8}}},
        {"STC reference byte 4", {{56, 8}}},
        {"NPT reference bit 32", {{95, 1}}},
        {"NPT reference byte 1", {{96, 8}}},
        {"NPT reference byte 2", {{104, 8}}},
        {"NPT reference byte 3", {{112, 8}}},
        {"NPT reference byte 4", {{120, 8}}},
        {"scale numerator", {{128, 16}}},
        {"scale denominator", {{144, 16}}}},
       [](unsigned char* raw) -> Values {
         RavelCNPTReferenceDescriptor d(raw);
         const unsigned char* stc = d.GetSTCReference();
         const unsigned char* npt = d.GetNPTReference();
         return {d.GetPostDiscontinuityIndicator(), d.GetContentId(), stc[0], stc[1], stc[2], stc[3], stc[4],
                 npt[0], npt[1], npt[2], npt[3], npt[4], d.GetScaleNumerator(), d.GetScaleDenominator()};
       }},
      // Time mode 0 reads no time: bytes 5 to 9 change nothing.
      {"general event, group id", GeneralEventBase(0), 16, 32, GeneralEventLayout(0), GeneralEventFields},
      {"general event mode 0", GeneralEventBase(0), 40, 104, GeneralEventLayout(0), GeneralEventFields},
      {"general event mode 1", GeneralEventBase(1), 56, 104, GeneralEventLayout(1), GeneralEventFields},
      {"general event mode 2", GeneralEventBase(2), 40, 104, GeneralEventLayout(2), GeneralEventFields},
      {"general event mode 3", GeneralEventBase(3), 40, 104, GeneralEventLayout(3), GeneralEventFields},
      {"general event mode 5", GeneralEventBase(5), 56, 104, GeneralEventLayout(5), GeneralEventFields},
  };
  TraceRecorder recorder;
  for (const bitwalk::Walk& walk : walks) bitwalk::Run(walk);
}
