// Application and Ginga descriptors: the fields of the four application-loop
// classes and the Ginga application data component with its records (the pattern
// they share is in test_descriptor_factory.cpp).
#include <gtest/gtest.h>

#include <memory>

#include "DescriptorShow.h"

using namespace th;

namespace {

std::string FieldText(const char* field, size_t size) { return std::string(field, strnlen(field, size)); }

// profile, version major, minor and micro, service bound flag, visibility, priority, transport label.
std::vector<int> ApplicationFields(const RavelCApplicationDescriptor& d) {
  return {d.iApplicationProfile, d.iVersionMajor, d.iVersionMinor, d.iVersionMicro,
          d.bServiceBoundFlag,   d.iVisibility,   d.iAppPriority,  d.iAppTransportLabel};
}

Bytes DataComponent(uint8_t tag, const Bytes& info) { return sb::Descriptor(tag, sb::Cat({sb::U16(0x00A0), info})); }

}  // namespace

TEST(ApplicationDescriptor, ReadsOnlyTheFirstProfileAndStaysInsideItsLength) {
  struct Case {
    const char* label;
    Bytes body;
    std::vector<int> fields;
  } cases[] = {
      // The flags, priority and label come from the second profile's bytes.
      {.label = "two profiles",
       .body = sb::Cat({sb::U8(10), sb::U16(0x0002), Bytes{4, 5, 6}, sb::U16(0xC002), Bytes{7, 8, 9}, Bytes{0x3F, 0x10, 0x02}}),
       .fields = {2, 4, 5, 6, 1, 2, 0x02, 0x07}},
      // Fields past descriptor_length read as 0, not from the bytes behind it.
      {.label = "truncated", .body = sb::Cat({sb::U8(5), sb::U16(0x0007)}), .fields = {7, 0, 0, 0, 0, 0, 0, 0}},
  };
  for (const Case& c : cases) {
    Bytes raw = sb::Descriptor(0x00, c.body);
    sb::Append(raw, Bytes(16, 0xFF));
    RavelCApplicationDescriptor d(raw.data());
    EXPECT_EQ(c.fields, ApplicationFields(d)) << c.label;
    // Null zeroes every field.
    EXPECT_EQ(kRavelErrInvalidArgument, d.ParseRawData(nullptr));
    EXPECT_EQ(std::vector<int>(8, 0), ApplicationFields(d));
  }
}

TEST(ApplicationNameDescriptor, ReadsLanguageAndNameWithinTheFieldAndTheLength) {
  struct Case {
    const char* label;
    Bytes raw;
    std::string language;
    std::string name;
  } cases[] = {
      {"plain", sb::Descriptor(0x01, sb::Cat({sb::Text("eng"), sb::U8(4), sb::Text("Quiz")})), "eng", "Quiz"},
      // Only the first language/name pair is read.
      {"two names",
       sb::Descriptor(0x01, sb::Cat({sb::Text("por"), sb::U8(2), sb::Text("Oi"), sb::Text("eng"), sb::U8(2),
                                     sb::Text("Hi")})),
       "por", "Oi"},
      // A count of 255 in a descriptor of 255 bytes: 251 name bytes, the rest of
      // the field zero, nothing taken from behind the descriptor.
      {"count past the length",
       sb::Cat({Bytes{0x01, 0xFF}, sb::Text("jpn"), sb::U8(255), Bytes(251, 'N'), Bytes(8, 'Z')}), "jpn",
       std::string(251, 'N')},
  };
  for (Case& c : cases) {
    RavelCApplicationNameDescriptor d(c.raw.data());
    EXPECT_EQ(c.language, d.GetISOLanguageCode()) << c.label;
    EXPECT_EQ(c.name, FieldText(d.szApplicationName, sizeof(d.szApplicationName))) << c.label;
    for (size_t i = c.name.size(); i < sizeof(d.szApplicationName); ++i) {
      ASSERT_EQ(0, d.szApplicationName[i]) << c.label << " byte " << i;
    }
  }
  // Null clears both.
  RavelCApplicationNameDescriptor d(cases[0].raw.data());
  EXPECT_EQ(kRavelErrInvalidArgument, d.ParseRawData(nullptr));
  EXPECT_STREQ("", d.szApplicationName);
  EXPECT_STREQ("", d.szISOLanguageCode);
}

TEST(GingaAppLocDescriptor, SplitsThreeTextsNeverOverrunsAndShowsThemTerminated) {
  struct Case {
    const char* label;
    Bytes raw;
    std::string base, classPath, initial;
  } cases[] = {
      {"plain",
       sb::Descriptor(0x07, sb::Cat({sb::U8(4), sb::Text("/app"), sb::U8(3), sb::Text("lib"), sb::Text("main.ncl")})),
       "/app", "lib", "main.ncl"},
      // (4 - 1 - 3 - 2) mod 256 = 254 bytes of initial class name.
      {"wrapping remainder", sb::Cat({Bytes{0x07, 4, 1, 'a', 3, 'b', 'c', 'd'}, Bytes(254, 'w'), Bytes(4, 'Z')}), "a",
       "bcd", std::string(254, 'w')},
      // Every field full to its last byte: (255 - 255 - 255 - 2) mod 256 = 255.
      {"all fields full",
       sb::Cat({Bytes{0x07, 0xFF, 0xFF}, Bytes(255, 'B'), Bytes{0xFF}, Bytes(255, 'C'), Bytes(255, 'I'), Bytes(4, 'Z')}),
       std::string(255, 'B'), std::string(255, 'C'), std::string(255, 'I')},
  };
  for (Case& c : cases) {
    RavelCGingaAppLocDescriptor d(c.raw.data());
    EXPECT_EQ(c.base, FieldText(d.sBaseDirectory, sizeof(d.sBaseDirectory))) << c.label;
    EXPECT_EQ(c.classPath, FieldText(d.sClassPath, sizeof(d.sClassPath))) << c.label;
    EXPECT_EQ(c.initial, FieldText(d.sInicialClassName, sizeof(d.sInicialClassName))) << c.label;
    EXPECT_EQ(At(kWarning, {"\t  sBaseDirectory = " + c.base + ", sClassPath = " + c.classPath +
                                ", sInicialClassName = " + c.initial + " \n"}),
              BodyLines(d)) << c.label;
  }
}

TEST(GingaAppDescriptor, NeverFillsItsParameterButClearsItOnNull) {
  Bytes raw = sb::Descriptor(0x06, sb::Cat({sb::U8(3), sb::Text("abc")}));
  RavelCGingaAppDescriptor d(raw.data());
  EXPECT_STREQ("", d.GetParameter());
  std::strcpy(d.szParameter, "kept");
  EXPECT_EQ(kRavelOk, d.ParseRawData(raw.data()));
  EXPECT_STREQ("kept", d.szParameter);
  RavelCGingaAppDescriptor copy(d);
  EXPECT_STREQ("kept", copy.szParameter);
  EXPECT_EQ(kRavelErrInvalidArgument, d.ParseRawData(nullptr));
  EXPECT_STREQ("", d.szParameter);
  // A parameter that fills the field prints as its 255 bytes only.
  std::memset(d.szParameter, 'p', sizeof(d.szParameter));
  EXPECT_EQ(At(kWarning, {"\t iParameter " + std::string(255, 'p') + " \n"}), BodyLines(d));
}

// Which records exist, the information trace of each value and the Show dump;
// every bit of the flags byte is set in one case and clear in another.
TEST(GingaAppDataComponentDescriptor, DecodesAndTracesEachValueAtInformationLevel) {
  struct Case {
    const char* label;
    Bytes raw;
    int result;
    bool hasInfo, hasCarousel;
    std::vector<std::string> traces;
  } cases[] = {
      // 10 1 1100 1: object carousel, identifier present, resolution 0xC, independent.
      {"carousel with identifier",
       DataComponent(0xFD, sb::Cat({sb::U8(0xB9), sb::U32(0x10), sb::U16(0x0042), sb::U32(0x12345678), sb::U8(0xA0)})),
       kRavelOk, true, true,
       {"ComponentId [0x00a0]\n", "iTransmissionFormat [0x2]\n", "bApplicationIdentifierFlag [0x1]\n",
        "iDocumentResolution [0xc]\n", "bIndependentFlag [1]\n", "iApplicationIdentifierOrgId [0x00000010]\n",
        "iApplicationIdentifierAppId [0x0042]\n", "CarouselId [0x12345678]\n", "bOnDemandRetrievalFlag [1]\n",
        "bFileStorableFlag [0]\n", "bEventSectionFlag [1]\n"}},
      // 10 0 0011 0: the carousel record follows the flags byte directly.
      {"carousel without identifier", DataComponent(0xFD, sb::Cat({sb::U8(0x86), sb::U32(0xCAFEBABE), sb::U8(0x40)})),
       kRavelOk, true, true,
       {"ComponentId [0x00a0]\n", "iTransmissionFormat [0x2]\n", "bApplicationIdentifierFlag [0x0]\n",
        "iDocumentResolution [0x3]\n", "bIndependentFlag [0]\n", "CarouselId [0xcafebabe]\n",
        "bOnDemandRetrievalFlag [0]\n", "bFileStorableFlag [1]\n", "bEventSectionFlag [0]\n"}},
      {"data carousel format", DataComponent(0xFD, sb::U8(0x40)), kRavelOk, true, false,
       {"ComponentId [0x00a0]\n", "iTransmissionFormat [0x1]\n", "bApplicationIdentifierFlag [0x0]\n",
        "iDocumentResolution [0x0]\n", "bIndependentFlag [0]\n", "Transmission format not supported!!\n"}},
      {"format 3 with identifier", DataComponent(0xFD, sb::Cat({sb::U8(0xE0), sb::U32(7), sb::U16(8)})), kRavelOk, true,
       false,
       {"ComponentId [0x00a0]\n", "iTransmissionFormat [0x3]\n", "bApplicationIdentifierFlag [0x1]\n",
        "iDocumentResolution [0x0]\n", "bIndependentFlag [0]\n", "iApplicationIdentifierOrgId [0x00000007]\n",
        "iApplicationIdentifierAppId [0x0008]\n", "Transmission format not supported!!\n"}},
      {"foreign tag", DataComponent(0xC7, sb::U8(0xB9)), kRavelErrInvalidArgument, false, false,
       {"This Descriptor isn't Ginga Application Data Component! Descriptor Tag=[0xc7]\n"}},
  };
  for (Case& c : cases) {
    SCOPED_TRACE(c.label);
    // Start from a parsed object so that a failing parse must release it.
    RavelCGingaAppDataComponentDescriptor d(cases[0].raw.data());
    TraceRecorder recorder;
    EXPECT_EQ(c.result, d.ParseRawData(c.raw.data()));
    EXPECT_EQ(At(kWarning, c.traces), recorder.Lines());
    EXPECT_EQ(c.hasInfo ? 0x00A0 : 0, d.iDataComponentId);
    ASSERT_EQ(c.hasInfo, d.GetAdditionalGingaInfo() != nullptr);
    // Show prints the base line only, none of the records.
    EXPECT_EQ(Dump({BaseLine(c.raw[0], c.raw[1], "Unknown Descriptor")}), ShowLines(d));
    if (!c.hasInfo) continue;
    EXPECT_EQ(c.hasCarousel, d.GetAdditionalGingaInfo()->GetData() != nullptr);
  }
  // A record not parsed yet holds nothing.
  const RavelCAdditionalGingaInfo fresh;
  EXPECT_EQ(std::vector<unsigned int>(6, 0),
            (std::vector<unsigned int>{fresh.GetTransmissionFormat(), fresh.GetApplicationIdentifierFlag(),
                                       fresh.GetDocumentResolution(), fresh.GetIndependentFlag(),
                                       fresh.iApplicationIdentifierOrgId, fresh.GetApplicationIdentifierAppId()}));
}

TEST(GingaAppDataComponentDescriptor, CopiesOwnTheirRecords) {
  Bytes carousel =
      DataComponent(0xFD, sb::Cat({sb::U8(0xB9), sb::U32(0x10), sb::U16(0x42), sb::U32(0x12345678), sb::U8(0xA0)}));
  Bytes plain = DataComponent(0xFD, sb::U8(0x40));
  RavelCGingaAppDataComponentDescriptor source(carousel.data());
  RavelCGingaAppDataComponentDescriptor copy(source);
  RavelCGingaAppDataComponentDescriptor assigned(plain.data());
  assigned = source;
  for (RavelCGingaAppDataComponentDescriptor* c : {&copy, &assigned}) {
    ASSERT_NE(nullptr, c->pAdditionalGingaInfo);
    ASSERT_NE(nullptr, c->pAdditionalGingaInfo->pData);
    EXPECT_EQ(0x00A0, c->iDataComponentId);
    EXPECT_EQ(0x42, c->pAdditionalGingaInfo->iApplicationIdentifierAppId);
    EXPECT_EQ(0x12345678u, c->pAdditionalGingaInfo->pData->iCarouselId);
  }
  // Re-parsing the source releases its records and leaves the copies intact.
  source.ParseRawData(plain.data());
  EXPECT_EQ(nullptr, source.pAdditionalGingaInfo->pData);
  EXPECT_EQ(0x12345678u, copy.pAdditionalGingaInfo->pData->iCarouselId);
  // Assigning an empty descriptor releases the target's records.
  RavelCGingaAppDataComponentDescriptor empty(nullptr);
  assigned = empty;
  EXPECT_EQ(nullptr, assigned.pAdditionalGingaInfo);
  EXPECT_EQ(0, assigned.iDataComponentId);
}
