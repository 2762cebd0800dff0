// Parental rating under both broadcast standards, local time offset entries
// and their lookups, and country availability with its code records.
#include <gtest/gtest.h>

#include "DescriptorShow.h"

using namespace th;

namespace {

Bytes Rating(const char* country, uint8_t rating) { return sb::Cat({sb::Text(country), sb::U8(rating)}); }

// One 13-byte local time offset entry.
Bytes Offset(const char* country, uint8_t regionByte, uint16_t offset, const Bytes& change, uint16_t next) {
  return sb::Cat({sb::Text(country), sb::U8(regionByte), sb::U16(offset), change, sb::U16(next)});
}

}  // namespace

TEST(ParentalRatingAge, FollowsTheStandardInForceAtParseTime) {
  const int brazil = RAVEL_STANDARD_BRAZIL, japan = RAVEL_STANDARD_JAPAN;
  struct Case {
    int standard;
    uint8_t rating;
    unsigned int content;
    unsigned int minimumAge;
    const char* trace;  // null: nothing traced
  } cases[] = {
      // Brazil: content in the upper nibble, age selector in the lower (1: "L", free for all ages).
      {brazil, 0x01, 0, 0, nullptr}, {brazil, 0x12, 1, 10, nullptr}, {brazil, 0x23, 2, 12, nullptr},
      {brazil, 0x34, 3, 14, nullptr}, {brazil, 0x45, 4, 16, nullptr}, {brazil, 0x56, 5, 18, nullptr},
      {brazil, 0x00, 0, 0, "Unknown ageSelector=[0]\n"}, {brazil, 0x67, 6, 0, "Unknown ageSelector=[7]\n"},
      // Any standard other than 1 follows the Brazilian table.
      {7, 0x23, 2, 12, nullptr},
      // Japan: rating + 3 for 1 to 15, otherwise 0; content never set.
      {japan, 0x00, 0, 0, nullptr}, {japan, 0x01, 0, 4, nullptr}, {japan, 0x05, 0, 8, nullptr},
      {japan, 0x0F, 0, 18, nullptr}, {japan, 0x10, 0, 0, nullptr}, {japan, 0xFF, 0, 0, nullptr},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(testing::Message() << "standard " << c.standard << " rating 0x" << std::hex << int(c.rating));
    StandardScope standard(c.standard);
    Bytes raw = sb::Descriptor(0x55, Rating("bra", c.rating));
    TraceRecorder recorder;
    RavelCParentalRatingDescriptor d(raw.data());
    ASSERT_EQ(1, d.GetNumOfParentalRatings());
    RavelCParentalRating* entry = d.GetParentalRating(0);
    EXPECT_EQ(c.content, entry->GetContent());
    EXPECT_EQ(c.minimumAge, entry->GetMinimumAge());
    EXPECT_EQ(c.trace ? At(kWarning, {c.trace}) : TraceLines(), recorder.Lines());
  }
}

TEST(ParentalRatingDescriptor, WalksFourByteEntriesAndShowsEachOne) {
  struct Case {
    const char* label;
    Bytes descriptor;
    std::vector<std::string> countries;
    std::vector<std::string> entryLines;
  } cases[] = {
      {"length 0", RawDescriptor(0x55, 0, {}), {}, {}},
      {"two entries", sb::Descriptor(0x55, sb::Cat({Rating("BRA", 0x23), Rating("ARG", 0x06)})), {"BRA", "ARG"},
       {"\t\tCountry Code=[BRA], Content=[0x02], Mimimum Age = [12] \n",
        "\t\tCountry Code=[ARG], Content=[0x00], Mimimum Age = [18] \n"}},
      // A length that is not a multiple of 4: the last entry starts inside the
      // body and is read whole (here from the zeros after it).
      {"length 5", RawDescriptor(0x55, 5, sb::Cat({Rating("BRA", 0x45), sb::U8(0)})), {"BRA", ""},
       {"\t\tCountry Code=[BRA], Content=[0x04], Mimimum Age = [16] \n",
        "\t\tCountry Code=[], Content=[0x00], Mimimum Age = [0] \n"}},
  };
  StandardScope standard(RAVEL_STANDARD_BRAZIL);
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes section = FollowedByZeros(c.descriptor);
    RavelCParentalRatingDescriptor d(DescriptorIn(section));
    ASSERT_EQ(static_cast<int>(c.countries.size()), d.GetNumOfParentalRatings());
    std::vector<std::string> show;
    for (int i = 0; i < d.GetNumOfParentalRatings(); ++i) {
      EXPECT_EQ(c.countries[i], d.GetParentalRating(i)->GetCountryCode());
      show.push_back("\t##################### ParentalRating [" + std::to_string(i) + "] #####################\n");
      show.push_back(c.entryLines[i]);
    }
    EXPECT_EQ(Dump(show), BodyLines(d));
  }
}

TEST(ParentalRatingEntry, NullParseIsRefusedAndKeepsTheEntryAndANullEntryIsEmpty) {
  StandardScope standard(RAVEL_STANDARD_BRAZIL);
  Bytes raw = Rating("BRA", 0x23);
  RavelCParentalRating entry(raw.data());
  EXPECT_EQ(kRavelErrInvalidArgument, entry.ParseRawData(nullptr));
  EXPECT_STREQ("BRA", entry.GetCountryCode());
  EXPECT_EQ((std::vector<int>{2, 12}), (std::vector<int>{entry.GetContent(), entry.GetMinimumAge()}));
  // An entry built from nothing holds nothing.
  RavelCParentalRating empty(nullptr);
  EXPECT_EQ((std::vector<int>{0, 0}), (std::vector<int>{empty.GetContent(), empty.GetMinimumAge()}));
  EXPECT_STREQ("", empty.GetCountryCode());
}

TEST(LocalTimeOffsetEntry, DecodesOffsetsAndTheTimeOfChangeByTheReceiversRules) {
  struct Case {
    const char* label;
    Bytes entry;
    std::string country;
    unsigned int regionId, polarity;
    std::vector<int> offset, change, next;  // hour, minute (and the date of change first)
  } cases[] = {
      // region 5 (000101), reserved 1, polarity 1.
      {"mid-month change", Offset("BRA", 0x17, 0x0300, sb::UtcTime(2013, 2, 17, 2, 30, 15), 0x0200), "BRA", 5, 1, {3, 0},
       {2013, 2, 17, 2, 30, 15}, {2, 0}},
      // The first of a month comes out as the day after the previous month's last.
      {"first of January", Offset("bra", 0x00, 0x0130, sb::UtcTime(2013, 1, 1, 0, 0, 0), 0x0000), "bra", 0, 0, {1, 30},
       {2012, 12, 32, 0, 0, 0}, {0, 0}},
      {"second of January", Offset("bra", 0xFC, 0x0000, Bytes{0xDB, 0xE6, 0x23, 0x59, 0x59}, 0x1200), "bra", 63, 0,
       {0, 0}, {2013, 1, 2, 23, 59, 59}, {12, 0}},
      // BCD nibbles are not checked.
      {"unchecked BCD", Offset("JPN", 0x01, 0x9AFF, Bytes{0x00, 0x00, 0xFF, 0x9A, 0x00}, 0xFF9A), "JPN", 0, 1,
       {100, 165}, {1859, -1, 19, 165, 100, 0}, {165, 100}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes raw = sb::Descriptor(0x58, c.entry);
    RavelCLocalTimeOffsetDescriptor d(raw.data());
    ASSERT_EQ(1, d.GetNumOfLocalTimeOffsets());
    RavelCLocalTimeOffset* e = d.GetLocalTimeOffset(0);
    const RavelCDateTime& t = e->GetTimeOfChange();
    EXPECT_EQ((std::vector<int>{0, 0, 0, 0, 0}), (std::vector<int>{t.iMilliSecond, t.iDayOfWeek, t.iTimeZone,
                                                                  e->GetLocalTimeOffsetSecond(), e->GetNextTimeOffsetSecond()}));
    char line[4][160];
    std::snprintf(line[0], sizeof(line[0]),
                  "\tCountry Code=[%s], Country Region ID = [%u] Local Time Offset Polarity = [%u]\n", c.country.c_str(),
                  c.regionId, c.polarity);
    std::snprintf(line[1], sizeof(line[1]), "\tLocal Time Offset=[%d:%d:0]\n", c.offset[0], c.offset[1]);
    std::snprintf(line[2], sizeof(line[2]), "\tTime of Change=[%d.%d.%d - %d:%d:%d]\n", c.change[0], c.change[1],
                  c.change[2], c.change[3], c.change[4], c.change[5]);
    std::snprintf(line[3], sizeof(line[3]), "\tNext Time Offset=[%d:%d:0]\n", c.next[0], c.next[1]);
    EXPECT_EQ(Dump({"\t##################### LocalTimeOffset [0] #####################\n", line[0], line[1], line[2],
                    line[3]}),
              BodyLines(d));
  }
}

TEST(LocalTimeOffsetEntry, NullParseClearsEveryField) {
  Bytes entryBytes = Offset("BRA", 0x17, 0x0300, sb::UtcTime(2013, 2, 17, 2, 30, 15), 0x0200);
  RavelCLocalTimeOffset entry(entryBytes.data());
  EXPECT_EQ(kRavelErrInvalidArgument, entry.ParseRawData(nullptr));
  EXPECT_STREQ("", entry.GetCountryCode());
  EXPECT_EQ(std::vector<int>(6, 0), DateOf(entry.GetTimeOfChange()));
  EXPECT_EQ(std::vector<int>(8, 0),
            (std::vector<int>{entry.GetCountryRegionId(), entry.GetLocalTimeOffsetPolarity(),
                              entry.GetLocalTimeOffsetHour(), entry.GetLocalTimeOffsetMinute(),
                              entry.GetLocalTimeOffsetSecond(), entry.GetNextTimeOffsetHour(),
                              entry.GetNextTimeOffsetMinute(), entry.GetNextTimeOffsetSecond()}));
}

// One byte past the whole entries starts one more, read from what follows.
TEST(LocalTimeOffsetDescriptor, WalksThirteenByteEntries) {
  const Bytes change = sb::UtcTime(2013, 2, 17, 0, 0, 0);
  Bytes raw = RawDescriptor(
      0x58, 14, sb::Cat({Offset("BRA", 0x04, 0x0300, change, 0x0200), Offset("ARG", 0x08, 0x0300, change, 0x0200)}));
  TraceRecorder recorder;
  RavelCLocalTimeOffsetDescriptor d(raw.data());
  EXPECT_TRUE(recorder.Records().empty());
  ASSERT_EQ(2, d.GetNumOfLocalTimeOffsets());
  EXPECT_STREQ("ARG", d.GetLocalTimeOffset(1)->GetCountryCode());
}

TEST(LocalTimeOffsetDescriptor, LookupsMatchCountryIgnoringCaseThenRegion) {
  const Bytes change = sb::UtcTime(2013, 2, 17, 0, 0, 0);
  Bytes raw = sb::Descriptor(
      0x58, sb::Cat({Offset("BRA", 1 << 2, 0x0300, change, 0x0200), Offset("JPN", 0, 0x0900, change, 0x0900),
                     Offset("bra", 2 << 2, 0x0400, change, 0x0300)}));
  RavelCLocalTimeOffsetDescriptor d(raw.data());
  ASSERT_EQ(3, d.GetNumOfLocalTimeOffsets());
  RavelCLocalTimeOffset* first = d.GetLocalTimeOffset(0);
  RavelCLocalTimeOffset* japan = d.GetLocalTimeOffset(1);
  RavelCLocalTimeOffset* third = d.GetLocalTimeOffset(2);

  struct Case {
    const char* country;
    int regionId;  // -1: looked up by country only
    RavelCLocalTimeOffset* expected;
  } cases[] = {
      {"BRA", -1, first},  {"bra", -1, first}, {"Jpn", -1, japan},  {"ARG", -1, nullptr}, {"BR", -1, nullptr},
      {"BRAZ", -1, nullptr}, {nullptr, -1, nullptr}, {"bra", 1, first}, {"BRA", 2, third}, {"BRA", 3, nullptr},
      {"JPN", 0, japan},   {"JPN", 1, nullptr}, {nullptr, 0, nullptr},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(testing::Message() << (c.country ? c.country : "(null)") << " region " << c.regionId);
    EXPECT_EQ(c.expected, c.regionId < 0 ? d.GetLocalTimeOffset(c.country)
                                         : d.GetLocalTimeOffset(c.country, static_cast<unsigned char>(c.regionId)));
  }

  Bytes emptyRaw = RawDescriptor(0x58, 0, {});
  RavelCLocalTimeOffsetDescriptor empty(emptyRaw.data());
  EXPECT_EQ(nullptr, empty.GetLocalTimeOffset("BRA"));
  EXPECT_EQ(nullptr, empty.GetLocalTimeOffset("BRA", 0));
  ExpectBoundPanic(3, 3, [&](int i) { return d.GetLocalTimeOffset(i); });
}

TEST(CountryCodeRecord, KeepsOnlyCodesOfExactlyThreeLetters) {
  struct Case {
    const char* code;
    const char* kept;
  } cases[] = {{"BRA", "BRA"}, {"bra", "bra"}, {"BR", ""}, {"BRAZ", ""}, {"", ""}, {nullptr, ""}};
  for (const Case& c : cases) {
    SCOPED_TRACE(c.code ? c.code : "(null)");
    RavelCCountryCode record(c.code);
    EXPECT_STREQ(c.kept, record.toString());
    EXPECT_STREQ(c.kept, record.GetCountryCode());
  }
}

TEST(CountryAvailabilityDescriptor, ReadsTheFlagAndThreeByteCodesAndPanicsOutsideThem) {
  struct Case {
    const char* label;
    Bytes descriptor;
    unsigned int flag;
    std::vector<std::string> codes;
  } cases[] = {
      {"two codes", sb::Descriptor(0x49, sb::Cat({sb::U8(0x80), sb::Text("BRAARG")})), 1, {"BRA", "ARG"}},
      {"flag clear, reserved bits set", sb::Descriptor(0x49, sb::Cat({sb::U8(0x7F), sb::Text("JPN")})), 0, {"JPN"}},
      {"flag only", sb::Descriptor(0x49, sb::U8(0xFF)), 1, {}},
      // A code holding a 0 byte is shorter than 3 letters: its record stays empty.
      {"code with a 0 byte", sb::Descriptor(0x49, sb::Cat({sb::U8(0x80), Bytes{'B', 0, 'A'}, sb::Text("URY")})), 1,
       {"", "URY"}},
      // A code that starts inside the body is read whole.
      {"length 3", RawDescriptor(0x49, 3, sb::Cat({sb::U8(0x80), sb::Text("PRY")})), 1, {"PRY"}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.label);
    Bytes raw = c.descriptor;
    RavelCCountryAvailabilityDescriptor d(raw.data());
    EXPECT_EQ(c.flag, d.GetCountryAvailabilityFlag());
    ASSERT_EQ(static_cast<int>(c.codes.size()), d.GetNumOfCountryCodes());
    std::vector<std::string> show{"\t Ability flag = " + std::to_string(c.flag) + "\n", "\t Codes: \n"};
    for (int i = 0; i < d.GetNumOfCountryCodes(); ++i) {
      EXPECT_EQ(c.codes[i], d.GetCountryCode(i)->toString());
      show.push_back("\t    " + c.codes[i] + "\n");
    }
    EXPECT_EQ(Dump(show), BodyLines(d));
    const int count = d.GetNumOfCountryCodes();
    for (int index : {-1, count}) ExpectBoundPanic(index, count, [&](int i) { return d.GetCountryCode(i); });
  }
}
