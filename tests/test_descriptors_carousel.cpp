// Descriptors of the DII module info and of DSM-CC stream descriptor sections: the
// rules of each class (the pattern they share is in test_descriptor_factory.cpp).
#include <gtest/gtest.h>

#include "DescriptorShow.h"

using namespace th;

namespace {

Bytes GeneralEvent(uint8_t timeMode, const Bytes& time5, uint8_t type, uint16_t id, const Bytes& privateData) {
  return sb::Descriptor(0x40, sb::Cat({Bytes{0xAB, 0xC0, timeMode}, time5, sb::U8(type), sb::U16(id), privateData}));
}

}  // namespace

TEST(NameDescriptor, AnEmptyNameIsAnEmptyText) {
  Bytes raw = sb::Descriptor(0x02, Bytes());
  RavelCNameDescriptor d(raw.data());
  EXPECT_EQ(Dump({"\tiFileName=[]\n"}), BodyLines(d));
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
      {"embedded zero", sb::Cat({sb::Text("spa"), Bytes{'a', 0, 'b'}}), "spa", Bytes{'a', 0, 'b'}, "a"},
      // Shorter than a language code: no text at all, never a negative size.
      {"length 2", Bytes{'p', 'o'}, "po", Bytes(), ""}, {"length 0", Bytes(), "", Bytes(), ""},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.what);
    // The language code is read from bytes 2 to 4 whatever the length, and no
    // text byte from past a short descriptor: a zero, then letters, follow it.
    Bytes section = InSection(sb::Descriptor(0x03, c.body), sb::Cat({Bytes{0x00}, Bytes(15, 'Z')}));
    RavelCInfoDescriptor d(DescriptorIn(section));
    EXPECT_STREQ(c.language, d.GetLanguageCode());
    ASSERT_NE(nullptr, d.GetText());
    EXPECT_EQ(std::string(c.text.begin(), c.text.end()), std::string(d.GetText(), c.text.size()));
    EXPECT_EQ(0, d.GetText()[c.text.size()]);
    EXPECT_EQ(0, d.GetText()[c.text.size() + 1]);
    RavelCInfoDescriptor copy(d);
    EXPECT_STREQ(c.copied, copy.GetText());
  }
  // A null parse leaves no text, and the dump prints it as the C library prints null.
  RavelCInfoDescriptor d(nullptr);
  EXPECT_EQ(nullptr, d.GetText());
  EXPECT_EQ(Dump({"\tiISO639LangCode=[], ipTextChar=[(null)]\n"}), BodyLines(d));
}

TEST(GeneralEventDescriptor, ReadsTheTimeByModeAndTheMessageFromFixedPositions) {
  Bytes mjdTime = sb::UtcTime(2013, 3, 1, 12, 34, 56);  // the 1st comes out as 2013-2-32
  const std::string jst = "\t EventMsg_MJDJSTTime =[2013.2.32 - 12:34:56]\n";
  struct Case {
    uint8_t mode;
    Bytes time5;
    bool parseTraces;   // the unknown mode is traced at parse time too
    TraceLines modeLines;  // the Show lines between the group line and the message line
  } cases[] = {
      // No time in the broadcast, but the message fields do not move.
      {0, Bytes{0x11, 0x22, 0x33, 0x44, 0x55}, false, {{kWarning, "Unknown Time Mode =[0x0]\n"}}},
      {1, mjdTime, false, Dump({jst})},
      {2, Bytes{0xFF, 0x01, 0x02, 0x03, 0x04}, false, Dump({"\t EventMsg_NPT=[0x01 0x01 0x02 0x03 0x04]\n"})},
      // The BCD digits are read four bits into byte 5.
      {3, Bytes{0xF1, 0x23, 0x45, 0x6F, 0xFF}, false, Dump({"\t EventMsg_RelativeTime =[12:34:56]\n"})},
      {4, Bytes{0x11, 0x22, 0x33, 0x44, 0x55}, true, {{kWarning, "Unknown Time Mode =[0x4]\n"}}},
      {5, mjdTime, false, Dump({jst})}, {0xFF, Bytes(5, 0), true, {{kWarning, "Unknown Time Mode =[0xff]\n"}}},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(int(c.mode));
    Bytes raw = GeneralEvent(c.mode, c.time5, 0x42, 0xBEEF, sb::Text("pd"));
    TraceRecorder recorder;
    RavelCGeneralEventDescriptor d(raw.data());
    EXPECT_EQ(c.parseTraces ? c.modeLines : TraceLines(), recorder.Lines());
    if (c.parseTraces) { EXPECT_EQ("SectionParser/source/Ravel_CDescriptorGeneralEvent", recorder.Records()[0].file); }
    EXPECT_EQ(2, d.GetPrivateDataLength());
    EXPECT_STREQ("pd", d.GetPrivateData());
    TraceLines expected = Dump({"\t EventMsgGroupID=[2748], TimeMode=[" + std::to_string(c.mode) + "]\n"});
    Add(expected, c.modeLines);
    Add(expected, Dump({"\t EventMsgType=[66], EventMsgID=[0xbeef]\n"}));
    EXPECT_EQ(expected, BodyLines(d));
  }
  // Built over nothing, it shows every field as zero.
  RavelCGeneralEventDescriptor empty(nullptr);
  EXPECT_EQ((TraceLines{{kDump, "\t EventMsgGroupID=[0], TimeMode=[0]\n"}, {kWarning, "Unknown Time Mode =[0x0]\n"},
                        {kDump, "\t EventMsgType=[0], EventMsgID=[0x0000]\n"}}),
            BodyLines(empty));
  const RavelCEventRelativeTime& relative = empty.GetEventMsgRelativeTime();  // not shown in mode 0
  EXPECT_EQ(0, relative.iHours | relative.iMinutes | relative.iSeconds);
}

TEST(GeneralEventDescriptor, PrivateDataLengthWrapsInEightBits) {
  struct Case {
    uint8_t length;
    int privateLength;
  } cases[] = {{11, 0}, {14, 3}, {10, 255} /* 10 - 11 in 8 bits */, {0, 245}};
  for (Case& c : cases) {
    SCOPED_TRACE(int(c.length));
    Bytes raw = RawDescriptor(0x40, c.length, Bytes(11, 0x00));
    for (int i = 0; i < 256; ++i) raw.push_back(static_cast<uint8_t>('A' + i % 26));
    RavelCGeneralEventDescriptor d(raw.data());
    EXPECT_EQ(c.privateLength, d.GetPrivateDataLength());
    ASSERT_NE(nullptr, d.GetPrivateData());
    EXPECT_EQ(std::string(raw.begin() + 13, raw.begin() + 13 + c.privateLength), d.GetPrivateData());
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
  RavelCGeneralEventDescriptor empty(nullptr);
  copy = empty;
  EXPECT_EQ(nullptr, copy.GetPrivateData());
}
