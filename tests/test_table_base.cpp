// The common long section header of every table.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "Ravel_CTableBase.h"
#include "Ravel_ResultCode.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

namespace {

// The header members as numbers, in member order.
std::vector<unsigned int> HeaderOf(const RavelCTableBase& table) {
  return {table.iSession,       table.iTableId,       table.bSectionSyntaxIndicator,
          table.iSectionLength, table.iTableIdExtension, table.iVersionNumber,
          table.bCurrentNextIndicator, table.iSectionNumber, table.iLastSectionNumber};
}

}  // namespace

// One wire bit at a time: each lands in exactly one member, at the weight of its
// place in that field, and the skipped bits land nowhere.
TEST(TableBaseHeader, EveryWireBitLandsInItsOwnField) {
  // In wire order, most significant bit first: the member's index in HeaderOf
  // (-1 for skipped bits) and the field's width.
  const std::pair<int, int> layout[] = {{1, 8}, {2, 1}, {-1, 3}, {3, 12}, {4, 16}, {-1, 2}, {5, 5}, {6, 1}, {7, 8}, {8, 8}};
  int bit = 0;
  for (const auto& field : layout) {
    for (int place = field.second - 1; place >= 0; --place, ++bit) {
      SCOPED_TRACE("wire bit " + std::to_string(bit));
      // section_length 5: the 8 header bytes are the whole section.
      unsigned char section[8] = {0x00, 0x00, 0x05};
      section[bit / 8] ^= static_cast<unsigned char>(0x80 >> (bit % 8));
      RavelCTableBase table(nullptr);
      TraceRecorder recorder;
      EXPECT_EQ(kRavelOk, table.ParseRawData(section));
      std::vector<unsigned int> expected(9, 0);
      expected[3] = 5;
      if (field.first >= 0) expected[field.first] ^= 1u << place;
      EXPECT_EQ(expected, HeaderOf(table));
      EXPECT_TRUE(recorder.Records().empty());
    }
  }
  EXPECT_EQ(64, bit);
}

TEST(TableBaseHeader, NullClearsTheHeaderButNotTheName) {
  unsigned char section[8] = {0x42, 0xB0, 0x05, 0x12, 0x34, 0xCF, 0x02, 0x03};
  RavelCTableBase table(section);
  table.iSession = 0x5A;
  EXPECT_EQ(1, table.SetTableName("SDT Actual"));
  TraceRecorder recorder;
  EXPECT_EQ(kRavelOk, table.ParseRawData(section));
  EXPECT_EQ(0x5A, table.iSession);  // the caller's tag, which a parse never writes
  EXPECT_EQ(kRavelErrNullSection, table.ParseRawData(nullptr));
  EXPECT_EQ(std::vector<unsigned int>(9, 0), HeaderOf(table));
  EXPECT_STREQ("SDT Actual", table.sTableName.GetString());
  EXPECT_TRUE(recorder.Records().empty());
  EXPECT_EQ(1, table.SetTableName(RavelCString("SDT Other")));
  EXPECT_STREQ("SDT Other", table.sTableName.GetString());
}

// An empty name shows as a table never named.
TEST(TableBaseShow, PrintsTheHeaderAndUnknownForAnEmptyName) {
  unsigned char section[8] = {0xC4, 0xB0, 0x2A, 0xAB, 0xCD, 0xD5, 0x03, 0x04};
  RavelCTableBase table(section);
  table.iSession = 0x7F;
  table.SetTableName("");
  TraceRecorder recorder;
  table.Show();
  EXPECT_EQ(th::HeaderLines(0xC4, "Unknown", 1, 42, 0xABCD, 10, 1, 3, 4, 0x7F), recorder.Lines());
  for (const TraceRecord& r : recorder.Records()) EXPECT_EQ("SectionParser/source/Ravel_CTableBase", r.file);
}
