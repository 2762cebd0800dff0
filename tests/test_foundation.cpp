// Support services, arrays and the broadcast date rules.
#include <gtest/gtest.h>

#include <cstring>

#include "RavelSectionParser.h"
#include "Ravel_ByteOrder.h"
#include "Ravel_CDateCode.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

namespace {
// year, month, day of a Modified Julian Date.
std::vector<int> Mjd(unsigned int mjd) {
  int y = 0, m = 0, d = 0;
  RavelDateCode_DecodeMJD(mjd, y, m, d);
  return {y, m, d};
}
}  // namespace

TEST(MjdDateRule, ReproducesTheReceiversDates) {
  struct Case {
    unsigned int mjd;
    int year, month, day;
  } cases[] = {
      {45218, 1982, 9, 6},    {49273, 1993, 10, 13}, {55986, 2012, 2, 29}, {56292, 2012, 12, 31},
      {56293, 2012, 12, 32},  {56294, 2013, 1, 2},   {56352, 2013, 2, 32}, {56353, 2013, 3, 2},
      {65535, 2038, 4, 22},   {0, 1859, -1, 19},
  };
  for (const Case& c : cases) {
    EXPECT_EQ((std::vector<int>{c.year, c.month, c.day}), Mjd(c.mjd)) << c.mjd;
  }
}

TEST(MjdDateRule, FirstOfEveryMonthIsTheDayAfterThePreviousMonthsLast) {
  // The day number the rule gives the 1st, counted on in the previous month.
  const int dayInPreviousMonth[] = {32, 32, 32, 32, 31, 32, 31, 32, 32, 31, 32, 31};
  for (int month = 1; month <= 12; ++month) {
    EXPECT_EQ((std::vector<int>{month == 1 ? 2012 : 2013, month == 1 ? 12 : month - 1, dayInPreviousMonth[month - 1]}),
              Mjd(sb::Mjd(2013, month, 1)));
    EXPECT_EQ((std::vector<int>{2013, month, 15}), Mjd(sb::Mjd(2013, month, 15)));
  }
}

TEST(BcdRule, TakesNibblesUnchecked) {
  struct Case {
    unsigned char byte;
    int value;
  } cases[] = {{0x00, 0}, {0x59, 59}, {0x99, 99}, {0x9A, 100}, {0xFF, 165}};
  for (const Case& c : cases) EXPECT_EQ(c.value, RavelBcd(c.byte)) << int(c.byte);
}

TEST(DateTime, OrdersInstantsTotally) {
  RavelCDateTime a, b;
  a.iYear = 2012; a.iMonth = 12; a.iDay = 32;
  b.iYear = 2013; b.iMonth = 1; b.iDay = 2;
  auto relations = [&] { return std::vector<bool>{(a < b) != 0, (a <= b) != 0, (a > b) != 0, (a >= b) != 0}; };
  EXPECT_EQ((std::vector<bool>{true, true, false, false}), relations());
  b = a;
  EXPECT_EQ((std::vector<bool>{false, true, false, true}), relations());
  b.iSecond = 1;
  EXPECT_TRUE(a < b);
}

TEST(BitInputStream, ReadsMsbFirstAndNeverPastItsBuffer) {
  const unsigned char data[] = {0xA5, 0x3C, 0xFF};
  RavelCBitInputStream reader(data, 2, 0);
  unsigned char status = 0;
  EXPECT_EQ(0u, reader.GetByteIndex());
  EXPECT_EQ(1, reader.ReadBit(status));
  EXPECT_EQ(1u, reader.GetByteIndex());  // a byte begun counts as taken
  EXPECT_EQ(0x02, reader.ReadByte(3, status));
  EXPECT_EQ(0x053Cu, reader.ReadShort(12, status));
  EXPECT_EQ(0, status);
  EXPECT_EQ(2u, reader.GetByteIndex());
  // Past the 2-byte length: zeros, status raised, byte 3 never read.
  EXPECT_EQ(0u, reader.ReadInt(32, status));
  EXPECT_EQ(1, status);
  unsigned char copy[4] = {9, 9, 9, 9};
  RavelCBitInputStream bytes(data, 2, 0);
  bytes.Skip(8);
  bytes.GetByteArray(copy, 3);
  EXPECT_EQ((Bytes{0x3C, 0, 0, 9}), Bytes(copy, copy + 4));
}

TEST(CString, OwnsAndCopiesItsText) {
  RavelCString empty(nullptr);
  EXPECT_STREQ("", empty.GetString());
  RavelCString a("PAT");
  RavelCString b(a);
  a = "NIT";
  EXPECT_STREQ("PAT", b.GetString());
  char* adopted = new char[4];
  std::memcpy(adopted, "SDT", 4);
  b.SetMemAllocedString(adopted);
  EXPECT_STREQ("SDT", b.GetString());
  a = b;
  EXPECT_STREQ("SDT", a.GetString());
  EXPECT_EQ(0, RavelPGL_StrCaseCompare("GingaAZ", "gINGAaz"));
  EXPECT_EQ(0, RavelPGL_StrCaseCompare("gINGAaz", "GingaAZ"));
  EXPECT_LT(RavelPGL_StrCaseCompare("a", "B"), 0);
}

namespace {
int gReleased = 0;
void CountRelease(void* element) {
  ++gReleased;
  delete static_cast<int*>(element);
}
}  // namespace

TEST(List, KeepsOrderAndReleasesItsElements) {
  list_head head;
  list_initialize(&head);
  list_set_release(&head, CountRelease);
  for (int i = 0; i < 300; ++i) list_insert(&head, new int(i));
  EXPECT_EQ(static_cast<unsigned char>(300 & 0xFF), head.count);  // the 8-bit count wraps
  EXPECT_EQ(7, *static_cast<int*>(list_element(&head, 7)));
  EXPECT_EQ(nullptr, list_element(&head, 300));
  EXPECT_EQ(nullptr, list_element(&head, -1));
  gReleased = 0;
  list_removeAll(&head);
  EXPECT_EQ(300, gReleased);
  EXPECT_EQ(0, head.count);
}

TEST(TraceSink, FormatsOnlyForListenersAndPassesLocation) {
  TraceRecorder recorder;
  gszRavelDbgFilePath = "SectionParser/source/Ravel_CTablePAT";
  gRavelDbgLineNum = 42;
  RavelPGL_TraceOut(0x10000020u, "x=[%d] %s\n", 5, "ok");
  ASSERT_EQ(TraceLines({{0x10000020u, "x=[5] ok\n"}}), recorder.Lines());
  EXPECT_EQ("SectionParser/source/Ravel_CTablePAT", recorder.Records()[0].file);
  EXPECT_EQ(42, recorder.Records()[0].line);
  std::string longText(3000, 'a');
  RavelPGL_TraceOut(0x10000020u, "%s", longText.c_str());
  EXPECT_EQ(longText, recorder.Records()[1].text);
  std::string bufferSized(1024, 'b');  // one more than the local buffer holds with its NUL
  RavelPGL_TraceOut(0x10000020u, "%s", bufferSized.c_str());
  EXPECT_EQ(bufferSized, recorder.Records()[2].text);
}

TEST(TraceSink, WithoutAListenerOnlyEnabledLevelsReachStandardError) {
  const unsigned int levels = RavelPGL_GetTraceMask();
  RavelPGL_SetTraceMask(0x80000000u);
  gszRavelDbgFilePath = "SectionParser/source/Ravel_CTablePAT";
  gRavelDbgLineNum = 42;
  testing::internal::CaptureStderr();
  EXPECT_EQ(0, RavelPGL_TraceOut(0x10000020u, "dump\n"));
  EXPECT_EQ(6, RavelPGL_TraceOut(0x80000020u, "error\n"));
  EXPECT_EQ("[80000020] SectionParser/source/Ravel_CTablePAT:42: error\n", testing::internal::GetCapturedStderr());
  RavelPGL_SetTraceMask(levels);
}

struct Item {
  int start;
  int order;
  int operator<(const Item& other) const { return start < other.start; }
};

TEST(CArray, GrowsByEightAndChecksItsBounds) {
  TraceRecorder recorder;
  RavelCArray<int> array;
  EXPECT_EQ(8, array.iGrowSize);
  for (int i = 0; i < 17; ++i) {
    EXPECT_EQ(i < 8 ? 8 : i < 16 ? 16 : 24, (array.Append(i), array.iMaxCount)) << i;
  }
  EXPECT_EQ(0, array.Insert(99, array.iCount));
  EXPECT_EQ(0, array.Insert(-5, 0));
  EXPECT_EQ((std::vector<int>{-5, 0, 99}), (std::vector<int>{array[0], array[1], array[18]}));
  EXPECT_TRUE(recorder.Records().empty());

  for (int pos : {-1, array.iCount + 1}) {
    recorder.Clear();
    EXPECT_EQ(kRavelErrInvalidArgument, array.Insert(1, pos));
    EXPECT_EQ(19, array.iCount);
    EXPECT_EQ(th::At(th::kUtilWarning, {"Argument Invalid! aPos=[" + std::to_string(pos) + "], iCount=[19]\n"}),
              recorder.Lines());
    EXPECT_EQ(0, recorder.PanicCount());
  }
  for (int index : {-1, array.iCount}) {
    recorder.Clear();
    int value = array[index];
    EXPECT_EQ(0, value);  // the zeroed scratch slot, not memory outside the array
    EXPECT_EQ(th::BoundOverflow(index, 19), recorder.Lines());
    EXPECT_EQ("SectionParser/../CommonUtility/include/Ravel_CArray", recorder.Records()[0].file);
    EXPECT_EQ(1, recorder.PanicCount());
    // The panic reports the template's own location, as the trace before it.
    EXPECT_EQ("SectionParser/../CommonUtility/include/Ravel_CArray", recorder.LastPanicFile());
  }
}

TEST(CPointerArray, RemoveAllKeepsCapacityAndSortIsStable) {
  RavelCPointerArray<Item> items;
  const int starts[] = {5, 3, 5, 1, 3, 9, 0, 5, 2, 3};
  for (int i = 0; i < 10; ++i) items.Append(new Item{starts[i], i});
  items.Sort();
  std::vector<int> orders;
  for (int i = 0; i < items.iCount; ++i) orders.push_back(items[i]->order);
  EXPECT_EQ((std::vector<int>{6, 3, 8, 1, 4, 9, 0, 2, 7, 5}), orders);  // equal starts keep their order
  EXPECT_EQ(16, items.iMaxCount);
  EXPECT_EQ(0, items.RemoveAll());
  EXPECT_EQ(0, items.iCount);
  EXPECT_EQ(16, items.iMaxCount);
  items.Append(new Item{1, 1});
  EXPECT_EQ(1, items.iCount);
}
