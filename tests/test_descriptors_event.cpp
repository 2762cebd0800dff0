// Event, content and component descriptors: the texts and fields of each class
// (the pattern they share is in test_descriptor_factory.cpp; the rating, time
// offset and country classes are in test_descriptors_event_rating.cpp).
#include <gtest/gtest.h>

#include "DescriptorShow.h"

using namespace th;
using sb::Cat;
using sb::Text;
using sb::U8;

TEST(ShortEventDescriptor, ReadsLanguageNameAndDescription) {
  struct Case {
    Bytes body;
    std::string language, name, description;
  } cases[] = {
      {Cat({Text("por"), U8(6), Text("Jornal"), U8(4), Text("News")}), "por", "Jornal", "News"},
      {Cat({Text("POR"), U8(0), U8(2), Text("ok")}), "POR", "", "ok"},
      // Broadcast control codes (ARIB 8-bit coding) are kept as they are.
      {Cat({Text("spa"), U8(3), Bytes{0x1B, 0x7C, 0xA4}, U8(1), Bytes{0x0E}}), "spa", "\x1B\x7C\xA4", "\x0E"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    Bytes raw = sb::Descriptor(0x4D, c.body);
    RavelCShortEventDescriptor d(raw.data());
    EXPECT_EQ(d.GetEventDescription(), d.GetText());
    EXPECT_EQ(Dump({"\tLanguageCode=[" + c.language + "]\n", "\tEventName=[" + c.name + "]\n",
                    "\tEventDescription=[" + c.description + "]\n"}),
              BodyLines(d));
  }
}

TEST(ExtendedEventDescriptor, WalksItemsAndKeepsTheTextFromItsLengthByte) {
  struct Case {
    const char* label;
    Bytes body;  // after the descriptor numbers and "por"
    std::vector<std::pair<std::string, std::string> > items;
    std::string text;
  } cases[] = {
      {"two items, text ABC",
       Cat({U8(14), U8(5), Text("Actor"), U8(3), Text("Ana"), U8(3), Text("Dir"), U8(1), Text("B"), U8(3), Text("ABC")}),
       {{"Actor", "Ana"}, {"Dir", "B"}},
       std::string("\x03" "AB")},
      {"no items, text of one letter", Cat({U8(0), U8(1), Text("Z")}), {}, "\x01"},
      {"no items, no text", Cat({U8(0), U8(0)}), {}, ""},
      {"empty description and item", Cat({U8(2), U8(0), U8(0), U8(2), Text("xy")}), {{"", ""}}, std::string("\x02" "x")},
      // length_of_items ends inside the first item: the walk finishes that item
      // and the text is read right after it.
      {"items length too short", Cat({U8(1), U8(2), Text("ab"), U8(1), Text("c"), U8(4), Text("wxyz")}), {{"ab", "c"}},
       std::string("\x04" "wxy")},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes raw = sb::Descriptor(0x4E, Cat({U8(0x13), Text("por"), c.body}));
    RavelCExtendedEventDescriptor d(raw.data());
    ASSERT_EQ(static_cast<int>(c.items.size()), d.GetNumOfItems());
    std::vector<std::string> show{"\tDescriptorNumber=[1]\n", "\tLastDescriptorNumber=[3]\n"};
    for (int i = 0; i < d.GetNumOfItems(); ++i) {
      EXPECT_EQ(c.items[i].first, d.GetItem(i)->GetItemDescription());
      EXPECT_EQ(c.items[i].second, d.GetItem(i)->GetItem());
      show.push_back("\tItemDescription=[" + c.items[i].first + "]\n");
      show.push_back("\tItem=[" + c.items[i].second + "]\n");
    }
    ASSERT_NE(nullptr, d.GetText());
    EXPECT_EQ(c.text, d.GetText());
    EXPECT_STREQ("por", d.GetLanguageCode());
    EXPECT_EQ(Dump(show), BodyLines(d));
    const int count = d.GetNumOfItems();
    for (int index : {-1, count}) ExpectBoundPanic(index, count, [&](int i) { return d.GetItem(i); });
  }
}

TEST(SeriesDescriptor, DecodesPackedFieldsAndSizesTheNameFromTheLength) {
  // series_id 0x0102, byte 4 = 1010 011 1, expire 0xC079, episode 0xABC, last 0xDEF.
  const Bytes header = Cat({sb::U16(0x0102), U8(0xA7), sb::U16(0xC079), sb::U24(0xABCDEF)});
  const std::vector<std::string> fields = {"\tSeriesId=[258]\n", "\tRepeatLabel=[10]\n", "\tProgramPattern=[3]\n",
                                           "\tExpireDateValidFlag=[1]\n", "\tExpireDate=[49273]\n",
                                           "\tEpisodeNumber=[2748]\n", "\tLastEpisodeNumber=[3567]\n"};
  struct Case {
    uint8_t length;
    Bytes name;
    const char* stored;  // null: no name
  } cases[] = {
      {8, {}, nullptr}, {9, Text("N"), "N"}, {14, Text("Novela"), "Novela"},
      {10, Text("Novela"), "No"},  // the name takes length - 8 bytes whatever follows
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.length);
    Bytes raw = RawDescriptor(0xD5, c.length, Cat({header, c.name}));
    RavelCSeriesDescriptor d(raw.data());
    std::vector<std::string> shown = fields;
    shown.push_back("\tSeriesName=[" + std::string(c.stored ? c.stored : "(null)") + "]\n");
    EXPECT_EQ(Dump(shown), BodyLines(d));
  }
}

// Copyright info and target region spec take (length - 1) mod 256 bytes into a
// buffer one byte larger, closed by a 0; the copyright copy starts at byte 6.
TEST(FixedLengthTexts, CopyLengthMinusOneBytesAndStayTerminated) {
  struct Case {
    const char* label;
    uint8_t tag, length;
    Bytes body;
    size_t storedLength;
    std::string storedPrefix;
  } cases[] = {
      // Copyright: 4 id bytes, then length - 1 bytes from byte 6, three more
      // than the descriptor holds (the section's next letters).
      {"copyright with info", 0x0D, 8, Cat({sb::U32(7), Text("ABCD")}), 7, "ABCDQQQ"},
      {"copyright length 1", 0x0D, 1, sb::U32(7), 0, ""}, {"copyright length 0", 0x0D, 0, sb::U32(7), 255, "QQQ"},
      {"region with three letters", 0xC6, 4, Cat({U8(2), Text("RJ1")}), 3, "RJ1"},
      {"region length 1", 0xC6, 1, U8(2), 0, ""}, {"region length 0", 0xC6, 0, U8(2), 255, "QQQ"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = InSection(RawDescriptor(c.tag, c.length, c.body), Bytes(300, 'Q'));
    const bool isCopyright = c.tag == 0x0D;
    TraceRecorder recorder;
    RavelCCopyrightDescriptor copyright(isCopyright ? DescriptorIn(section) : nullptr);
    RavelCTargetRegionDescriptor region(isCopyright ? nullptr : DescriptorIn(section));
    EXPECT_TRUE(recorder.Records().empty());
    const char* text = isCopyright ? copyright.GetCopyrightInfo() : region.GetRegionSpec();
    ASSERT_NE(nullptr, text);
    EXPECT_EQ(c.storedLength, std::strlen(text));
    EXPECT_EQ(c.storedPrefix, std::string(text).substr(0, c.storedPrefix.size()));
  }
}

// The second language code is read, and shown as text, only for a multi-lingual
// component; a single-language one parsed after a multi-lingual one has none.
TEST(AudioComponentDescriptor, TakesTheSecondCodeOnlyWhenMultiLingual) {
  Bytes multi = sb::Descriptor(0xC4, Cat({U8(0xF2), U8(0x03), U8(0x11), U8(0x0F), U8(0x01), U8(0xEB), Text("porspa")}));
  Bytes single = multi;
  single[7] = 0x7F;
  RavelCAudioComponentDescriptor d(multi.data());
  EXPECT_STREQ("spa", d.GetLanguageCode2());
  ASSERT_EQ(kRavelOk, d.ParseRawData(single.data()));
  EXPECT_STREQ("por", d.GetLanguageCode());
  EXPECT_STREQ("", d.GetLanguageCode2());
  EXPECT_EQ(0u, d.GetISO639LanguageCode2());
}

TEST(ContentDescriptor, SplitsGenresAndTracesEachOne) {
  struct Case {
    Bytes descriptor;
    std::vector<uint8_t> genres, userGenres;
    std::vector<std::string> parseTrace;
  } cases[] = {
      {RawDescriptor(0x54, 0), {}, {}, {"Empty Content Descriptor!\n"}},
      {RawDescriptor(0x54, 1, {0x12}), {}, {}, {"Empty Content Descriptor!\n"}},
      {sb::Descriptor(0x54, Bytes{0x12, 0x34, 0xF0, 0x0F}), {0x12, 0xF0}, {0x34, 0x0F},
       {"raw genre = 0x12!\n", "raw genre = 0xf0!\n"}},
      // An odd length drops the last byte.
      {RawDescriptor(0x54, 3, {0x00, 0x00, 0x55}), {0x00}, {0x00}, {"raw genre = 0x0!\n"}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.descriptor.size());
    Bytes raw = c.descriptor;
    TraceRecorder recorder;
    RavelCContentDescriptor d(raw.data());
    EXPECT_EQ(At(kWarning, c.parseTrace), recorder.Lines());
    ASSERT_EQ(static_cast<int>(c.genres.size()), d.GetGenreCount());
    std::vector<std::string> show;
    for (int i = 0; i < d.GetGenreCount(); ++i) {
      unsigned char level1 = 0xAA, level2 = 0xAA;
      EXPECT_EQ(1, d.GetGenre(i, level1, level2));
      EXPECT_EQ((std::vector<int>{c.genres[i] >> 4, c.genres[i] & 0x0F}), (std::vector<int>{level1, level2}));
      EXPECT_EQ(c.userGenres[i], d.GetUserGenre(i));
      char line[32];
      std::snprintf(line, sizeof(line), "\tGenre[%d]=[0x%02x]", i, c.genres[i]);
      show.push_back(line);
    }
    EXPECT_EQ(Dump(show), BodyLines(d));
    // A genre index outside the list traces twice (genre, user genre) and gives 0.
    for (int index : {-1, d.GetGenreCount()}) {
      recorder.Clear();
      unsigned char level1 = 0xAA, level2 = 0xAA;
      EXPECT_EQ(0, d.GetGenre(index, level1, level2));
      EXPECT_EQ(0, level1 | level2);
      EXPECT_EQ(0, d.GetUserGenre(index));
      const std::string message = "Invalid Array Index! aIndex=[" + std::to_string(index) + "], array len=[" +
                                  std::to_string(d.GetGenreCount()) + "]\n";
      EXPECT_EQ(At(kWarning, {message, message}), recorder.Lines());
      EXPECT_EQ(0, recorder.PanicCount());
    }
  }
}
