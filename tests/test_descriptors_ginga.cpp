// Application and Ginga descriptors: the four application-loop classes, which
// take any tag, and the Ginga application data component with its records.
#include <gtest/gtest.h>

#include <cstring>
#include <functional>
#include <memory>
#include <string>

#include "BitWalk.h"
#include "Ravel_CAdditionalGingaInfo.h"
#include "Ravel_CDescriptorApplication.h"
#include "Ravel_CDescriptorApplicationName.h"
#include "Ravel_CDescriptorGingaApp.h"
#include "Ravel_CDescriptorGingaAppDataComponent.h"
#include "Ravel_CDescriptorGingaAppLoc.h"
#include "Ravel_CObjectCarouselTransmissionFormat.h"
#include "Ravel_ResultCode.h"
#include "StreamBuilder.h"
#include "TraceRecorder.h"

namespace {

const unsigned int kDump = 0x10000020u;
const unsigned int kInfo = 0x40000020u;

std::string Field(const char* field, size_t size) { return std::string(field, strnlen(field, size)); }

struct LoopClass {
  const char* label;
  std::function<RavelCDescriptorBase*(unsigned char*)> make;
  const char* displayName;
};

const LoopClass kLoopClasses[] = {
    {"application", [](unsigned char* raw) -> RavelCDescriptorBase* { return new RavelCApplicationDescriptor(raw); },
     "Application Descriptor"},
    // The name descriptor shows the application descriptor's name.
    {"application name",
     [](unsigned char* raw) -> RavelCDescriptorBase* { return new RavelCApplicationNameDescriptor(raw); },
     "Application Descriptor"},
    {"ginga application",
     [](unsigned char* raw) -> RavelCDescriptorBase* { return new RavelCGingaAppDescriptor(raw); },
     "Ginga Application Descriptor"},
    {"ginga location",
     [](unsigned char* raw) -> RavelCDescriptorBase* { return new RavelCGingaAppLocDescriptor(raw); },
     "Ginga Application Location Descriptor"},
};

}  // namespace

TEST(ApplicationLoopDescriptors, AcceptAnyTagSilentlyAndNameThemselves) {
  const unsigned char tags[] = {0x00, 0x01, 0x06, 0x07, 0x4D, 0xFD, 0xFF};
  for (const LoopClass& c : kLoopClasses) {
    for (unsigned char tag : tags) {
      Bytes raw = sb::Descriptor(tag, Bytes(12, 0x00));
      TraceRecorder recorder;
      std::unique_ptr<RavelCDescriptorBase> descriptor(c.make(raw.data()));
      EXPECT_EQ(tag, descriptor->iDescriptorTag) << c.label;
      EXPECT_EQ(12, descriptor->iDescriptorLength) << c.label;
      EXPECT_STREQ(c.displayName, descriptor->sDescriptorName.GetString()) << c.label << " tag " << int(tag);
      EXPECT_EQ(kRavelOk, descriptor->ParseRawData(raw.data())) << c.label;
      EXPECT_TRUE(recorder.Records().empty()) << c.label << " tag " << int(tag);

      // Null: -8, header zeroed, no trace, the name of the last match kept.
      EXPECT_EQ(kRavelErrInvalidArgument, descriptor->ParseRawData(nullptr)) << c.label;
      EXPECT_EQ(0, descriptor->iDescriptorTag);
      EXPECT_EQ(0, descriptor->iDescriptorLength);
      EXPECT_STREQ(c.displayName, descriptor->sDescriptorName.GetString());
      EXPECT_TRUE(recorder.Records().empty()) << c.label;
    }
    std::unique_ptr<RavelCDescriptorBase> empty(c.make(nullptr));
    EXPECT_EQ(0, empty->iDescriptorTag);
    EXPECT_STREQ("", empty->sDescriptorName.GetString()) << c.label;
  }
}

TEST(ApplicationDescriptor, ReadsOnlyTheFirstProfileAndStaysInsideItsLength) {
  struct Case {
    const char* label;
    Bytes body;
    int profile;
    int major, minor, micro, serviceBound, visibility, priority, label_;
  } cases[] = {
      {"one profile", sb::Cat({sb::U8(5), sb::U16(0x0001), Bytes{1, 2, 3}, Bytes{0xBF, 0x3C, 0x01}}), 1, 1, 2, 3, 1, 1,
       0x3C, 0x01},
      // The flags, priority and label come from the second profile's bytes.
      {"two profiles",
       sb::Cat({sb::U8(10), sb::U16(0x0002), Bytes{4, 5, 6}, sb::U16(0xC002), Bytes{7, 8, 9}, Bytes{0x3F, 0x10, 0x02}}),
       2, 4, 5, 6, 1, 2, 0x02, 0x07},
      // Fields past descriptor_length read as 0, not from the bytes behind it.
      {"truncated", sb::Cat({sb::U8(5), sb::U16(0x0007)}), 7, 0, 0, 0, 0, 0, 0, 0},
  };
  for (const Case& c : cases) {
    Bytes raw = sb::Descriptor(0x00, c.body);
    sb::Append(raw, Bytes(16, 0xFF));
    RavelCApplicationDescriptor d(raw.data());
    EXPECT_EQ(c.profile, d.GetApplicationProfile()) << c.label;
    EXPECT_EQ(c.major, d.iVersionMajor) << c.label;
    EXPECT_EQ(c.minor, d.iVersionMinor) << c.label;
    EXPECT_EQ(c.micro, d.iVersionMicro) << c.label;
    EXPECT_EQ(c.serviceBound, d.bServiceBoundFlag) << c.label;
    EXPECT_EQ(c.visibility, d.iVisibility) << c.label;
    EXPECT_EQ(c.priority, d.iAppPriority) << c.label;
    EXPECT_EQ(c.label_, d.iAppTransportLabel) << c.label;
  }
  // A re-parse leaves nothing of the previous one; null zeroes every field.
  Bytes first = sb::Descriptor(0x00, sb::Cat({sb::U8(5), sb::U16(0x0001), Bytes{1, 2, 3}, Bytes{0xBF, 0x3C, 0x01}}));
  RavelCApplicationDescriptor d(first.data());
  EXPECT_EQ(kRavelErrInvalidArgument, d.ParseRawData(nullptr));
  EXPECT_EQ(0, d.iApplicationProfile);
  EXPECT_EQ(0, d.iVersionMajor);
  EXPECT_EQ(0, d.bServiceBoundFlag);
  EXPECT_EQ(0, d.iVisibility);
  EXPECT_EQ(0, d.iAppPriority);
  EXPECT_EQ(0, d.iAppTransportLabel);
}

TEST(ApplicationLoopDescriptors, ShowBannerAndFieldsAtInformationLevelBaseLineAtDumpLevel) {
  struct Case {
    Bytes raw;
    std::function<RavelCDescriptorBase*(unsigned char*)> make;
    TraceLines expected;
  } cases[] = {
      {sb::Descriptor(0x00, sb::Cat({sb::U8(5), sb::U16(0x0001), Bytes{1, 2, 3}, Bytes{0xBF, 0x3C, 0x01}})),
       kLoopClasses[0].make,
       {{kInfo, "\t=================== Application Descriptor ===================\n"},
        {kDump, "\tDescriptor Tag=[0x0], Descriptor Length=[9], Name=[Application Descriptor]\n"},
        {kInfo,
         "\t iApplicationProfile=1, iVersionMajor=1, iVersionMinor=2, iVersionMicro 3, bServiceBoundFlag=1, "
         "iVisibility=1, iAppPriority=60, iAppTransportLabel=1 \n"}}},
      {sb::Descriptor(0x01, sb::Cat({sb::Text("por"), sb::U8(5), sb::Text("Hello")})),
       kLoopClasses[1].make,
       {{kInfo, "\t=================== Application Name Descriptor ===================\n"},
        {kDump, "\tDescriptor Tag=[0x1], Descriptor Length=[9], Name=[Application Descriptor]\n"},
        {kInfo, "\t iISOLanguageCode=por, iApplicationName=Hello"}}},
      {sb::Descriptor(0x06, sb::Cat({sb::U8(3), sb::Text("abc")})),
       kLoopClasses[2].make,
       {{kInfo, "\t=================== Ginga Application Descriptor ===================\n"},
        {kDump, "\tDescriptor Tag=[0x6], Descriptor Length=[4], Name=[Ginga Application Descriptor]\n"},
        {kInfo, "\t iParameter  \n"}}},
      {sb::Descriptor(0x07, sb::Cat({sb::U8(4), sb::Text("/app"), sb::U8(3), sb::Text("lib"), sb::Text("main.ncl")})),
       kLoopClasses[3].make,
       {{kInfo, "\t=================== Ginga Application Location Descriptor ===================\n"},
        {kDump, "\tDescriptor Tag=[0x7], Descriptor Length=[17], Name=[Ginga Application Location Descriptor]\n"},
        {kInfo, "\t  sBaseDirectory = /app, sClassPath = lib, sInicialClassName = main.ncl \n"}}},
  };
  for (Case& c : cases) {
    std::unique_ptr<RavelCDescriptorBase> d(c.make(c.raw.data()));
    TraceRecorder recorder;
    d->Show();
    EXPECT_EQ(c.expected, recorder.Lines());
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
      {"empty name", sb::Descriptor(0x01, sb::Cat({sb::Text("spa"), sb::U8(0)})), "spa", ""},
      // A count of 255 in a descriptor of 255 bytes: 251 name bytes, the rest of
      // the field zero, nothing taken from behind the descriptor.
      {"count past the length",
       sb::Cat({Bytes{0x01, 0xFF}, sb::Text("jpn"), sb::U8(255), Bytes(251, 'N'), Bytes(8, 'Z')}), "jpn",
       std::string(251, 'N')},
  };
  for (Case& c : cases) {
    RavelCApplicationNameDescriptor d(c.raw.data());
    EXPECT_EQ(c.language, d.GetISOLanguageCode()) << c.label;
    EXPECT_EQ(c.name, Field(d.szApplicationName, sizeof(d.szApplicationName))) << c.label;
    for (size_t i = c.name.size(); i < sizeof(d.szApplicationName); ++i) {
      ASSERT_EQ(0, d.szApplicationName[i]) << c.label << " byte " << i;
    }
  }
  // A longer name followed by a shorter one leaves no tail; null clears both.
  Bytes longer = sb::Descriptor(0x01, sb::Cat({sb::Text("por"), sb::U8(10), sb::Text("LongerName")}));
  Bytes shorter = sb::Descriptor(0x01, sb::Cat({sb::Text("eng"), sb::U8(2), sb::Text("Hi")}));
  RavelCApplicationNameDescriptor d(longer.data());
  d.ParseRawData(shorter.data());
  EXPECT_STREQ("Hi", d.szApplicationName);
  EXPECT_STREQ("eng", d.szISOLanguageCode);
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
      {"empty", sb::Descriptor(0x07, Bytes{0, 0}), "", "", ""},
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
    EXPECT_EQ(c.base, Field(d.sBaseDirectory, sizeof(d.sBaseDirectory))) << c.label;
    EXPECT_EQ(c.classPath, Field(d.sClassPath, sizeof(d.sClassPath))) << c.label;
    EXPECT_EQ(c.initial, Field(d.sInicialClassName, sizeof(d.sInicialClassName))) << c.label;
    TraceRecorder recorder;
    d.Show();
    ASSERT_EQ(3u, recorder.Records().size());
    EXPECT_EQ("\t  sBaseDirectory = " + c.base + ", sClassPath = " + c.classPath + ", sInicialClassName = " +
                  c.initial + " \n",
              recorder.Records()[2].text)
        << c.label;
  }
  // Every parse starts from cleared fields.
  RavelCGingaAppLocDescriptor d(cases[0].raw.data());
  d.ParseRawData(cases[1].raw.data());
  EXPECT_STREQ("", d.sBaseDirectory);
  EXPECT_STREQ("", d.sInicialClassName);
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
  TraceRecorder recorder;
  d.Show();
  ASSERT_EQ(3u, recorder.Records().size());
  EXPECT_EQ("\t iParameter " + std::string(255, 'p') + " \n", recorder.Records()[2].text);
}

TEST(ApplicationLoopDescriptors, CopiesCarryEveryField) {
  Bytes app = sb::Descriptor(0x00, sb::Cat({sb::U8(5), sb::U16(0x0001), Bytes{1, 2, 3}, Bytes{0xBF, 0x3C, 0x01}}));
  RavelCApplicationDescriptor a(app.data());
  RavelCApplicationDescriptor aCopy(a);
  RavelCApplicationDescriptor aAssigned(nullptr);
  aAssigned = a;
  for (RavelCApplicationDescriptor* c : {&aCopy, &aAssigned}) {
    EXPECT_EQ(0x00, c->iDescriptorTag);
    EXPECT_EQ(9, c->iDescriptorLength);
    EXPECT_STREQ("Application Descriptor", c->GetDescriptorName());
    EXPECT_EQ(1, c->iApplicationProfile);
    EXPECT_EQ(3, c->iVersionMicro);
    EXPECT_EQ(1, c->bServiceBoundFlag);
    EXPECT_EQ(1, c->iVisibility);
    EXPECT_EQ(0x3C, c->iAppPriority);
    EXPECT_EQ(0x01, c->iAppTransportLabel);
  }

  Bytes name = sb::Descriptor(0x01, sb::Cat({sb::Text("por"), sb::U8(5), sb::Text("Hello")}));
  RavelCApplicationNameDescriptor n(name.data());
  RavelCApplicationNameDescriptor nCopy(n);
  Bytes other = sb::Descriptor(0x01, sb::Cat({sb::Text("eng"), sb::U8(9), sb::Text("Something")}));
  RavelCApplicationNameDescriptor nAssigned(other.data());
  nAssigned = n;
  for (RavelCApplicationNameDescriptor* c : {&nCopy, &nAssigned}) {
    EXPECT_STREQ("por", c->szISOLanguageCode);
    EXPECT_STREQ("Hello", c->szApplicationName);
    EXPECT_EQ(9, c->iDescriptorLength);
  }

  Bytes loc = sb::Descriptor(0x07, sb::Cat({sb::U8(4), sb::Text("/app"), sb::U8(3), sb::Text("lib"), sb::Text("x")}));
  RavelCGingaAppLocDescriptor l(loc.data());
  RavelCGingaAppLocDescriptor lCopy(l);
  Bytes otherLoc = sb::Descriptor(0x07, sb::Cat({sb::U8(6), sb::Text("/other"), sb::U8(0), sb::Text("yyyyyyyy")}));
  RavelCGingaAppLocDescriptor lAssigned(otherLoc.data());
  lAssigned = l;
  for (RavelCGingaAppLocDescriptor* c : {&lCopy, &lAssigned}) {
    EXPECT_STREQ("/app", c->sBaseDirectory);
    EXPECT_STREQ("lib", c->sClassPath);
    EXPECT_STREQ("x", c->sInicialClassName);
  }
}

namespace {

Bytes DataComponent(uint8_t tag, const Bytes& info) {
  return sb::Descriptor(tag, sb::Cat({sb::U16(0x00A0), info}));
}

}  // namespace

TEST(GingaAppDataComponentDescriptor, DecodesAndTracesEachValueAtInformationLevel) {
  struct Case {
    const char* label;
    Bytes raw;
    int result;
    bool hasInfo;
    int format, identifierFlag, resolution, independent;
    unsigned int orgId;
    int appId;
    bool hasCarousel;
    unsigned int carouselId;
    int onDemand, fileStorable, eventSection;
    TraceLines traces;
  } cases[] = {
      // 10 1 1100 1: object carousel, identifier present, resolution 0xC, independent.
      {"carousel with identifier",
       DataComponent(0xFD, sb::Cat({sb::U8(0xB9), sb::U32(0x00000010), sb::U16(0x0042), sb::U32(0x12345678),
                                    sb::U8(0xA0)})),
       kRavelOk, true, 2, 1, 0xC, 1, 0x10, 0x42, true, 0x12345678, 1, 0, 1,
       {{kInfo, "ComponentId [0x00a0]\n"},
        {kInfo, "iTransmissionFormat [0x2]\n"},
        {kInfo, "bApplicationIdentifierFlag [0x1]\n"},
        {kInfo, "iDocumentResolution [0xc]\n"},
        {kInfo, "bIndependentFlag [1]\n"},
        {kInfo, "iApplicationIdentifierOrgId [0x00000010]\n"},
        {kInfo, "iApplicationIdentifierAppId [0x0042]\n"},
        {kInfo, "CarouselId [0x12345678]\n"},
        {kInfo, "bOnDemandRetrievalFlag [1]\n"},
        {kInfo, "bFileStorableFlag [0]\n"},
        {kInfo, "bEventSectionFlag [1]\n"}}},
      // 10 0 0011 0: the carousel record follows the flags byte directly.
      {"carousel without identifier", DataComponent(0xFD, sb::Cat({sb::U8(0x86), sb::U32(0xCAFEBABE), sb::U8(0x40)})),
       kRavelOk, true, 2, 0, 3, 0, 0, 0, true, 0xCAFEBABE, 0, 1, 0,
       {{kInfo, "ComponentId [0x00a0]\n"},
        {kInfo, "iTransmissionFormat [0x2]\n"},
        {kInfo, "bApplicationIdentifierFlag [0x0]\n"},
        {kInfo, "iDocumentResolution [0x3]\n"},
        {kInfo, "bIndependentFlag [0]\n"},
        {kInfo, "CarouselId [0xcafebabe]\n"},
        {kInfo, "bOnDemandRetrievalFlag [0]\n"},
        {kInfo, "bFileStorableFlag [1]\n"},
        {kInfo, "bEventSectionFlag [0]\n"}}},
      {"data carousel format", DataComponent(0xFD, sb::U8(0x40)), kRavelOk, true, 1, 0, 0, 0, 0, 0, false, 0, 0, 0, 0,
       {{kInfo, "ComponentId [0x00a0]\n"},
        {kInfo, "iTransmissionFormat [0x1]\n"},
        {kInfo, "bApplicationIdentifierFlag [0x0]\n"},
        {kInfo, "iDocumentResolution [0x0]\n"},
        {kInfo, "bIndependentFlag [0]\n"},
        {kInfo, "Transmission format not supported!!\n"}}},
      {"format 3 with identifier", DataComponent(0xFD, sb::Cat({sb::U8(0xE0), sb::U32(7), sb::U16(8)})), kRavelOk,
       true, 3, 1, 0, 0, 7, 8, false, 0, 0, 0, 0,
       {{kInfo, "ComponentId [0x00a0]\n"},
        {kInfo, "iTransmissionFormat [0x3]\n"},
        {kInfo, "bApplicationIdentifierFlag [0x1]\n"},
        {kInfo, "iDocumentResolution [0x0]\n"},
        {kInfo, "bIndependentFlag [0]\n"},
        {kInfo, "iApplicationIdentifierOrgId [0x00000007]\n"},
        {kInfo, "iApplicationIdentifierAppId [0x0008]\n"},
        {kInfo, "Transmission format not supported!!\n"}}},
      {"foreign tag", DataComponent(0xC7, sb::U8(0xB9)), kRavelErrInvalidArgument, false, 0, 0, 0, 0, 0, 0, false, 0,
       0, 0, 0,
       {{kInfo, "This Descriptor isn't Ginga Application Data Component! Descriptor Tag=[0xc7]\n"}}},
  };
  for (Case& c : cases) {
    // Start from a parsed object so that a failing parse must release it.
    RavelCGingaAppDataComponentDescriptor d(cases[0].raw.data());
    TraceRecorder recorder;
    EXPECT_EQ(c.result, d.ParseRawData(c.raw.data())) << c.label;
    EXPECT_EQ(c.traces, recorder.Lines()) << c.label;
    EXPECT_EQ(c.raw[0], d.iDescriptorTag) << c.label;
    EXPECT_STREQ("Unknown Descriptor", d.GetDescriptorName()) << c.label;
    ASSERT_EQ(c.hasInfo, d.GetAdditionalGingaInfo() != nullptr) << c.label;
    if (!c.hasInfo) {
      EXPECT_EQ(0, d.iDataComponentId) << c.label;
      continue;
    }
    EXPECT_EQ(0x00A0, d.GetDataComponentId());
    const RavelCAdditionalGingaInfo& info = *d.pAdditionalGingaInfo;
    EXPECT_EQ(c.format, info.GetTransmissionFormat()) << c.label;
    EXPECT_EQ(c.identifierFlag, info.GetApplicationIdentifierFlag()) << c.label;
    EXPECT_EQ(c.resolution, info.GetDocumentResolution()) << c.label;
    EXPECT_EQ(c.independent, info.GetIndependentFlag()) << c.label;
    EXPECT_EQ(c.orgId, info.iApplicationIdentifierOrgId) << c.label;
    EXPECT_EQ(c.appId, info.GetApplicationIdentifierAppId()) << c.label;
    ASSERT_EQ(c.hasCarousel, info.GetData() != nullptr) << c.label;
    if (!c.hasCarousel) continue;
    EXPECT_EQ(c.carouselId, info.GetData()->iCarouselId) << c.label;
    EXPECT_EQ(c.onDemand, info.GetData()->GetOnDemandRetrievalFlag()) << c.label;
    EXPECT_EQ(c.fileStorable, info.GetData()->GetFileStorableFlag()) << c.label;
    EXPECT_EQ(c.eventSection, info.GetData()->GetEventSectionFlag()) << c.label;
  }

  TraceRecorder recorder;
  RavelCGingaAppDataComponentDescriptor d(nullptr);
  EXPECT_EQ(kRavelErrInvalidArgument, d.ParseRawData(nullptr));
  EXPECT_EQ(nullptr, d.pAdditionalGingaInfo);
  EXPECT_TRUE(recorder.Records().empty());
}

TEST(GingaAppDataComponentDescriptor, ShowsTheBaseLineOnly) {
  Bytes raw = DataComponent(0xFD, sb::Cat({sb::U8(0x86), sb::U32(1), sb::U8(0)}));
  RavelCGingaAppDataComponentDescriptor d(raw.data());
  TraceRecorder recorder;
  d.Show();
  EXPECT_EQ((TraceLines{{kDump, "\tDescriptor Tag=[0xfd], Descriptor Length=[8], Name=[Unknown Descriptor]\n"}}),
            recorder.Lines());
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
    EXPECT_NE(source.pAdditionalGingaInfo, c->pAdditionalGingaInfo);
    ASSERT_NE(nullptr, c->pAdditionalGingaInfo->pData);
    EXPECT_NE(source.pAdditionalGingaInfo->pData, c->pAdditionalGingaInfo->pData);
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
  EXPECT_EQ(0, assigned.iDescriptorTag);
}

// ---------------------------------------------------------------------------
// Every wire bit of the fixed fields, one at a time

namespace {

using Values = std::vector<int64_t>;

// The data component id, the additional Ginga information from byte 4 and,
// for transmission format 2, its object carousel record (zeros without one).
Values GingaDataComponentFields(unsigned char* raw) {
  RavelCGingaAppDataComponentDescriptor d(raw);
  const RavelCAdditionalGingaInfo* info = d.GetAdditionalGingaInfo();
  const RavelCObjectCarouselTransmissionFormat* carousel = info->GetData();
  return {d.GetDataComponentId(),
          info->GetTransmissionFormat(),
          info->GetApplicationIdentifierFlag(),
          info->GetDocumentResolution(),
          info->GetIndependentFlag(),
          info->iApplicationIdentifierOrgId,
          info->GetApplicationIdentifierAppId(),
          carousel ? carousel->iCarouselId : 0,
          carousel ? carousel->GetOnDemandRetrievalFlag() : 0,
          carousel ? carousel->GetFileStorableFlag() : 0,
          carousel ? carousel->GetEventSectionFlag() : 0};
}

// The application identifier follows the flags byte when its flag is set, and
// the carousel record follows them.
std::vector<bitwalk::Field> GingaDataComponentLayout(bool identified, bool carousel) {
  const int at = identified ? 88 : 40;
  return {{"data component id", {{16, 16}}},
          {"transmission format", {{32, 2}}},
          {"application identifier flag", {{34, 1}}},
          {"document resolution", {{35, 4}}},
          {"independent flag", {{39, 1}}},
          {"organization id", {{40, identified ? 32 : 0}}},
          {"application id", {{72, identified ? 16 : 0}}},
          {"carousel id", {{at, carousel ? 32 : 0}}},
          {"on demand retrieval flag", {{at + 32, carousel ? 1 : 0}}},
          {"file storable flag", {{at + 33, carousel ? 1 : 0}}},
          {"event section flag", {{at + 34, carousel ? 1 : 0}}}};
}

}  // namespace

TEST(GingaDescriptorBits, OneSetBitChangesOnlyTheFieldsItBelongsTo) {
  using bitwalk::Base;
  const bitwalk::Walk walks[] = {
      // The profiles length is read and dropped; one profile is read whatever it says.
      {"application", Base({0x00, 9}, 12), 16, 88,
       {{"application profile", {{24, 16}}},
        {"version major", {{40, 8}}},
        {"version minor", {{48, 8}}},
        {"version micro", {{56, 8}}},
        {"service bound flag", {{64, 1}}},
        {"visibility", {{65, 2}}},
        {"application priority", {{72, 8}}},
        {"transport protocol label", {{80, 8}}}},
       [](unsigned char* raw) -> Values {
         RavelCApplicationDescriptor d(raw);
         return {d.GetApplicationProfile(), d.GetVersionMajor(),     d.GetVersionMinor(),    d.GetVersionMicro(),
                 d.GetServiceBoundFlag(),   d.GetVisibility(),       d.GetAppPriority(),     d.GetAppTransportLabel()};
       }},
      // The flags byte; the identifier and the carousel record then come from zeros.
      {"ginga data component", Base({0xFD, 0x20}, 40), 16, 40, GingaDataComponentLayout(false, false),
       GingaDataComponentFields},
      {"application identifier", Base({0xFD, 0x20, 0, 0, 0x20}, 40), 40, 88, GingaDataComponentLayout(true, false),
       GingaDataComponentFields},
      {"object carousel", Base({0xFD, 0x20, 0, 0, 0x80}, 40), 40, 80, GingaDataComponentLayout(false, true),
       GingaDataComponentFields},
      {"object carousel after the identifier", Base({0xFD, 0x20, 0, 0, 0xA0}, 40), 88, 128,
       GingaDataComponentLayout(true, true), GingaDataComponentFields},
  };
  TraceRecorder recorder;  // the Ginga data component traces every value it reads
  for (const bitwalk::Walk& walk : walks) bitwalk::Run(walk);
}
