// The descriptor pattern every class shares (refused null and foreign tags,
// re-parse, deep copies, the Show banner and base line) over one table of every
// class, and the factory and copier over their one tag table.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <memory>
#include <set>
#include <string>

#include "RavelSectionParser.h"
#include "StreamBuilder.h"
#include "TestHelpers.h"
#include "TraceRecorder.h"

using namespace th;

namespace {

template <class T>
RavelCDescriptorBase* Make(unsigned char* raw) {
  return new T(raw);
}
template <class T>
RavelCDescriptorBase* CopyOf(RavelCDescriptorBase* source) {
  return new T(*static_cast<T*>(source));
}
template <class T>
void Assign(RavelCDescriptorBase* target, RavelCDescriptorBase* source) {
  *static_cast<T*>(target) = *static_cast<T*>(source);
}
#define CLASS(T) #T, &T::kKind, Make<T>, CopyOf<T>, Assign<T>

// What a refused parse (null or a foreign tag) leaves of a parsed object's fields.
enum Refusal { kEmptied, kKept, kOwnRule };

struct ClassCase {
  const char* name;
  const RavelCDescriptorKind* kind;
  RavelCDescriptorBase* (*make)(unsigned char*);
  RavelCDescriptorBase* (*copy)(RavelCDescriptorBase*);
  void (*assign)(RavelCDescriptorBase*, RavelCDescriptorBase*);
  uint8_t tag;
  std::string displayName;
  unsigned int wrongMask;
  std::string wrongText;  // for tag 0x99; "": every tag is taken silently
  unsigned int bannerMask;
  std::string banner;  // "": Show prints the base line only
  bool tracesNull;     // "Invalid Argument!\n" at the error level
  Bytes rich;
  TraceLines richBody;  // its own Show lines; none: pinned by the class's own tests
  Refusal refusal;
  bool copiesEverything;  // false: the class's own tests say what its copy drops
  bool pinEmptyBody;
  std::vector<std::string> emptyBody;  // the own Show lines of an empty object
};

std::string Wrong(const std::string& words) { return "This Descriptor isn't " + words + "! Descriptor Tag=[0x99]\n"; }

const std::vector<ClassCase>& Classes() {
  using sb::Cat;
  using sb::Descriptor;
  using sb::Text;
  using sb::U16;
  using sb::U32;
  using sb::U8;
  const std::string audioZero =
      "\tiStreamContent=[0x0], iComponentType=[0x0], iComponentTag=[0x0],iStreamType=[0x0], iSimulcastGroupTag=[0x0], "
      "iESMultiLingualFlag=[0x0], iMainComponentFlag=[0x0], iQualityIndicator=[0x0], iSampleRate=[0x0], ISO "
      "Language Code=[0x0], ISO Language Code2=[0x0]\n";
  static const std::vector<ClassCase> classes = {
      // Network, service and transmission descriptors: their refusals have rules of their own.
      {CLASS(RavelCNetworkNameDescriptor), 0x40, "Network Name Descriptor", kWarning, Wrong("Network Name Descriptor"),
       kDump, Banner("Network Descriptor"), false, Descriptor(0x40, Text("Rede X")), Dump({"\tNetwork Name=[Rede X]\n"}),
       kOwnRule, true, false, {}},
      {CLASS(RavelCServiceListDescriptor), 0x41, "Service List Descriptor", kWarning, Wrong("Service List Descriptor"),
       kDump, Banner("Service List Descriptor"), false, Descriptor(0x41, Bytes{0x00, 0x01, 0x01, 0x12, 0x34, 0xC0}),
       Dump({"\tService List Length=[2]\n", "\t\t[0]th Service Info: Service ID=[0x0001], Service Type=[0x01]\n",
             "\t\t[1]th Service Info: Service ID=[0x1234], Service Type=[0xc0]\n"}),
       kOwnRule, true, false, {}},
      {CLASS(RavelCServiceDescriptor), 0x48, "Service Descriptor", kWarning, Wrong("Service Descriptor"), kDump,
       Banner("Service Descriptor"), false, Descriptor(0x48, Bytes{0x01, 3, 'A', 'B', 'C', 2, 'T', 'V'}),
       Dump({"\tService Type=[0x01]\n", "\tService Provider Name=[ABC]\n", "\tService Name=[TV]\n"}), kOwnRule, false,
       false, {}},
      {CLASS(RavelCLinkageDescriptor), 0x4A, "Linkage Descriptor", kWarning, Wrong("Linkage Descriptor"), kDump,
       Banner("Linkage Descriptor"), false, Descriptor(0x4A, Cat({U16(0x7ED0), U16(0x0001), U16(0x4800), U8(0x02), U8(0xAA)})),
       Dump({"\tTransportStreamId=[0x7ed0], OrginalNetworkId=[0x0001], ServiceId=[0x4800], LinkageType=[0x02]\n"}),
       kOwnRule, true, false, {}},
      {CLASS(RavelCStreamIdentifierDescriptor), 0x52, "Stream Id Descriptor", kWarning,
       Wrong("Stream Identifier Descriptor"), kDump, Banner("Stream Identifier Descriptor"), false,
       Descriptor(0x52, Bytes{0x81}), Dump({"\tComponent Tag = [0x81]\n"}), kOwnRule, true, false, {}},
      {CLASS(RavelCTSInformationDescriptor), 0xCD, "TS Information Descriptor", kWarning,
       Wrong("TS Information Descriptor"), kDump, Banner("TS Information Descriptor"), false,
       Descriptor(0xCD, Cat({Bytes{0x05, (3 << 2) | 2}, Text("TVA"), Bytes{0x0F, 2}, U16(0x4800), U16(0x4801),
                             Bytes{0xAF, 1}, U16(0x4980)})),
       Dump({"\tRemote Control Key Id=[0x05], Ts Name=[TVA], Tx Type Count=[2]\n",
             "\t\tTramsmission Type Info=[0x0f], Num of Service=[2]\n", "\t\t\tTS Info: Service Id=[0x4800]\n",
             "\t\t\tTS Info: Service Id=[0x4801]\n", "\t\tTramsmission Type Info=[0xaf], Num of Service=[1]\n",
             "\t\t\tTS Info: Service Id=[0x4980]\n"}),
       kOwnRule, true, false, {}},
      {CLASS(RavelCExtendedBroadcasterDescriptor), 0xCE, "Extended Braodcaster Descriptor", kWarning,
       Wrong("Extended Broadcaster Descriptor"), kDump, Banner("Extended Broadcaster Descriptor"), false,
       Descriptor(0xCE, Bytes{0x1F, 0x01, 0x23, 0x21, 0x0A, 0x0B, 0x7E, 0xD0, 0x05}),
       Dump({"\tiBroadcasterType=[0x1], Affiliation ID Nums=[2], Broadcaster ID Nums=[1]\n",
             "\t\t[0]th Affiliation Id=[10]\n", "\t\t[1]th Affiliation Id=[126]\n",
             "\t\t[0]th Org Network Id=[32464], Broadcaster ID=[5]\n"}),
       kOwnRule, true, false, {}},
      {CLASS(RavelCLogoTransmissionDescriptor), 0xCF, "Logo Transmission Descriptor", kWarning,
       Wrong("LogoTransmission Descriptor"), kDump, Banner("LogoTransmission Descriptor"), false,
       Descriptor(0xCF, Bytes{0x01, 0xFF, 0x23, 0xF4, 0x56, 0x78, 0x9A}),
       Dump({"\tLogoTransmission Type=[0x01]\n", "\tLogo version=[1110]\n", "\tDownload ID=[30874]\n"}), kOwnRule, true,
       false, {}},
      {CLASS(RavelCTerrDeliverySystemDescriptor), 0xFA, "Terrestrial Delivery System Descriptor", kWarning,
       Wrong("Terrestrial Delivery System Descriptor"), kDump, Banner("Terrestrial Delivery Descriptor"), true,
       Descriptor(0xFA, Cat({Bytes{0x80, 0x1B}, U16(0x1234), U16(0x0D4A)})),
       Dump({"\tArea Code=[0x0801], Guard Interval=[0x02], Tx Mode=[0x03], Num Of Freq=[2]\n",
             "\t\tTerrDelSys: Frequency=[4660]\n", "\t\tTerrDelSys: Frequency=[3402]\n"}),
       kOwnRule, true, false, {}},
      {CLASS(RavelCPartialReceptionDescriptor), 0xFB, "Partial Reception Descriptor", kWarning,
       Wrong("Partial Reception Descriptor"), kDump, Banner("Partial Reception Descriptor", 21), false,
       Descriptor(0xFB, Cat({U16(0x1234), U16(0x5678)})), Dump({"\tService Id [0] = 18\n", "\tService Id [1] = 86\n"}),
       kOwnRule, true, false, {}},
      {CLASS(RavelCSystemManagementDescriptor), 0xFE, "System Management Descriptor", kWarning,
       Wrong("System Management Descriptor"), kDump, Banner("System Management Descriptor"), true,
       Descriptor(0xFE, Bytes{0xC5, 0x02, 0xFF}),
       Dump({"\tBroadcasting Flag=[0x01], Broadcasting Id=[0x05], Additional Ids=[0x02]\n"}), kOwnRule, true, false, {}},
      // Event, content and rating descriptors: a refusal empties them; their Show
      // lines are pinned by their own tests.
      {CLASS(RavelCCopyrightDescriptor), 0x0D, "Copyright Descriptor", kWarning, Wrong("Copyright Descriptor"), kDump,
       Banner("Copyright Descriptor", 21), false, Descriptor(0x0D, Cat({U32(0x12345678), Text("(C) TV")})), {}, kEmptied,
       true, true, {"\t Copyright id: 0 \n", "\t Copyright info: (null) \n"}},
      {CLASS(RavelCCountryAvailabilityDescriptor), 0x49, "Country Availabilty Descriptor", kWarning,
       Wrong("Country Availability Descriptor"), kDump, Banner("Country Availability Descriptor", 21), false,
       Descriptor(0x49, Cat({U8(0x80), Text("BRAARG")})), {}, kEmptied, true, true,
       {"\t Ability flag = 0\n", "\t Codes: \n"}},
      {CLASS(RavelCShortEventDescriptor), 0x4D, "Short Event Descriptor", kWarning, Wrong("Short Event Descriptor"),
       kDump, Banner("Short Event Descriptor"), false,
       Descriptor(0x4D, Cat({Text("por"), U8(6), Text("Jornal"), U8(4), Text("News")})), {}, kEmptied, true, true,
       {"\tLanguageCode=[]\n", "\tEventName=[(null)]\n", "\tEventDescription=[(null)]\n"}},
      {CLASS(RavelCExtendedEventDescriptor), 0x4E, "Extended Event Descriptor", kWarning,
       Wrong("Extended Event Descriptor"), kDump, Banner("Extended Event Descriptor"), false,
       Descriptor(0x4E, Cat({U8(0x13), Text("por"), U8(14), U8(5), Text("Actor"), U8(3), Text("Ana"), U8(3), Text("Dir"),
                             U8(1), Text("B"), U8(3), Text("ABC")})),
       {}, kEmptied, true, true, {"\tDescriptorNumber=[0]\n", "\tLastDescriptorNumber=[0]\n"}},
      {CLASS(RavelCComponentDescriptor), 0x50, "Component Descriptor", kWarning, Wrong("Component Descriptor"), kDump,
       Banner("Component Descriptor"), false,
       Descriptor(0x50, Cat({U8(0xF5), U8(0xB3), U8(0x10), Text("por"), Text("HD")})), {}, kEmptied, true, true,
       {"\tiStreamContent=[0x0], iComponentType=[0x0], iComponentTag=[0x0], ISO Language Code=[0x0]\n"}},
      {CLASS(RavelCAudioComponentDescriptor), 0xC4, "Audio Component Descriptor", kWarning,
       Wrong("Component Descriptor"), kDump, Banner("Component Descriptor"), false,
       Descriptor(0xC4, Cat({U8(0x02), U8(0x03), U8(0x11), U8(0x0F), U8(0x01), U8(0xEB), Text("porspa")})), {},
       kEmptied, true, true, {audioZero}},
      {CLASS(RavelCContentDescriptor), 0x54, "Content Descriptor", kWarning, Wrong("Content Descriptor"), kDump,
       Banner("Content Descriptor", 21), false, Descriptor(0x54, Bytes{0x12, 0x34, 0xF0, 0x0F}), {}, kEmptied, true,
       true, {}},
      {CLASS(RavelCParentalRatingDescriptor), 0x55, "Parental Rating Descriptor", kWarning,
       Wrong("ParentalRating Descriptor"), kDump, Banner("Parental Rating Descriptor", 21), false,
       Descriptor(0x55, Cat({Text("BRA"), U8(0x23)})), {}, kEmptied, true, true, {}},
      {CLASS(RavelCLocalTimeOffsetDescriptor), 0x58, "Time Offset Descriptor", kWarning,
       Wrong("LocalTimeOffset Descriptor"), kDump, Banner("Local Time Offset Descriptor", 21), false,
       Descriptor(0x58, Cat({Text("BRA"), U8(0x06), U16(0x0300), sb::UtcTime(2013, 2, 17, 0, 0, 0), U16(0x0200)})), {},
       kEmptied, true, true, {}},
      {CLASS(RavelCTargetRegionDescriptor), 0xC6, "Region Descriptor", kWarning, Wrong("Target Region Descriptor"),
       kDump, Banner("Target Region Descriptor", 21), false, Descriptor(0xC6, Cat({U8(1), Text("SP-RJ")})), {}, kEmptied,
       true, true, {"\t Region Spec Type: 0 \n", "\t Region Spec: (null) \n"}},
      {CLASS(RavelCSeriesDescriptor), 0xD5, "Series Descriptor", kWarning, Wrong("Series Descriptor"), kDump,
       Banner("Series Descriptor"), false,
       Descriptor(0xD5, Cat({U16(0x0102), U8(0xA7), U16(0xC079), sb::U24(0x00A00C), Text("Novela")})), {}, kEmptied,
       true, true,
       {"\tSeriesId=[0]\n", "\tRepeatLabel=[0]\n", "\tProgramPattern=[0]\n", "\tExpireDateValidFlag=[0]\n",
        "\tExpireDate=[0]\n", "\tEpisodeNumber=[0]\n", "\tLastEpisodeNumber=[0]\n", "\tSeriesName=[(null)]\n"}},
      {CLASS(RavelCDataComponentDescriptor), 0xFD, "Data Component Descriptor", kWarning,
       Wrong("Data Component Descriptor"), kDump, Banner("Data Component Descriptor"), false,
       Descriptor(0xFD, Cat({U16(0x00A0), U8(0x33)})), Dump({"\tiDataComponentId=[0x00a0]\n"}), kEmptied, true, true,
       {"\tiDataComponentId=[0x0000]\n"}},
      // Module info and stream descriptor section descriptors.
      {CLASS(RavelCTypeDescriptor), 0x01, "Type Descriptor", kWarning, Wrong("Type Descriptor"), kDump,
       Banner("Type Descriptor"), false, Descriptor(0x01, Text("text/html")), Dump({"\tiType=[text/html]\n"}), kEmptied,
       true, false, {}},
      {CLASS(RavelCNameDescriptor), 0x02, "Name Descriptor", kWarning, Wrong("Name Descriptor"), kDump,
       Banner("Name Descriptor"), false, Descriptor(0x02, Text("index.bml")), Dump({"\tiFileName=[index.bml]\n"}),
       kEmptied, true, false, {}},
      // The one descriptor that reports a foreign tag with the utility module bit.
      {CLASS(RavelCInfoDescriptor), 0x03, "Info Descriptor", kUtilWarning, Wrong("Info Descriptor"), kDump,
       Banner("Info Descriptor"), false, Descriptor(0x03, Cat({Text("por"), Text("Guia")})),
       Dump({"\tiISO639LangCode=[por], ipTextChar=[Guia]\n"}), kEmptied, true, false, {}},
      // The module id is printed in decimal under its label.
      {CLASS(RavelCModuleLinkDescriptor), 0x04, "Module Link Descriptor", kWarning, Wrong("Module Link Descriptor"),
       kDump, Banner("Module Link Descriptor"), false, Descriptor(0x04, Bytes{0x02, 0x12, 0x34}),
       Dump({"\tiPosition=[2], iModuleId=[4660]\n"}), kEmptied, true, false, {}},
      {CLASS(RavelCCRC32Descriptor), 0x05, "CRC32 Descriptor", kWarning, Wrong("CRC32 Descriptor"), kDump,
       Banner("CRC32 Descriptor"), false, Descriptor(0x05, Bytes{0xDE, 0xAD, 0x0B, 0xEF}),
       Dump({"\tCRC32=[0xde 0xad 0x0b 0xef]\n"}), kEmptied, true, false, {}},
      {CLASS(RavelCLocationDescriptor), 0x06, "Location Descriptor", kWarning, Wrong("Location Descriptor"), kDump,
       Banner("Location Descriptor"), false, Descriptor(0x06, Bytes{0x81}), Dump({"\tiLocationTag=[129]\n"}), kEmptied,
       true, false, {}},
      // Misspelt display name; the 32-bit value goes through %d.
      {CLASS(RavelCEstDownloadTimeDescriptor), 0x07, "Estimated Donwload Time Descriptor", kWarning,
       Wrong("Estimated Download Time Descriptor"), kDump, Banner("EST Download Time Descriptor"), false,
       Descriptor(0x07, U32(0x80000001u)), Dump({"\tiEstDownloadTime=[-2147483647]\n"}), kEmptied, true, false, {}},
      {CLASS(RavelCCompressionTypeDescriptor), 0xC2, "Compression Type Descriptor", kWarning,
       Wrong("Compression Type Descriptor"), kDump, Banner("Compression Type Descriptor"), false,
       Descriptor(0xC2, Cat({U8(0x01), U32(756113)})), Dump({"\tiCompressionType=[1], iOriginalSize=[756113]\n"}),
       kEmptied, true, false, {}},
      // Two blanks after "isn't" in these two, which keep their fields when refused.
      // Reserved bits set around both references must not leak into them.
      {CLASS(RavelCNPTReferenceDescriptor), 0x17, "NPT Reference Descriptor", kWarning,
       Wrong(" NPT Reference Descriptor"), kDump, Banner("NPT Reference Descriptor"), true,
       Descriptor(0x17, Bytes{0xD5, 0xFF, 0x23, 0x45, 0x67, 0x89, 0xFF, 0xFF, 0xFF, 0xFE, 0x89, 0xAB, 0xCD, 0xEF, 0x00,
                              0x03, 0x03, 0xE9}),
       Dump({"\t Post Discontinuity Indicator=[1], Dsm_ContentID=[85]\n", "\t STC_Reference=[0x01 0x23 0x45 0x67 0x89]\n",
             "\t NPT_Reference=[0x00 0x89 0xab 0xcd 0xef]\n", "\t Scale Numerator=[3], Scale Denominator=[1001]\n"}),
       kKept, true, false, {}},
      {CLASS(RavelCGeneralEventDescriptor), 0x40, "General Event Descriptor", kWarning,
       Wrong(" General Event Descriptor"), kDump, Banner("General Event Descriptor"), false,
       Descriptor(0x40, Bytes{0xAB, 0xC0, 2, 0xFE, 0x12, 0x34, 0x56, 0x78, 0x07, 0x01, 0x02, 'a', 'b'}),
       Dump({"\t EventMsgGroupID=[2748], TimeMode=[2]\n", "\t EventMsg_NPT=[0x00 0x12 0x34 0x56 0x78]\n",
             "\t EventMsgType=[7], EventMsgID=[0x0102]\n"}),
       kKept, true, false, {}},
      // Application-loop descriptors take any tag; banner and fields at the information level.
      {CLASS(RavelCApplicationDescriptor), 0x00, "Application Descriptor", 0, "", kWarning,
       Banner("Application Descriptor"), false,
       Descriptor(0x00, Cat({U8(5), U16(0x0001), Bytes{1, 2, 3}, Bytes{0xBF, 0x3C, 0x01}})),
       At(kWarning, {"\t iApplicationProfile=1, iVersionMajor=1, iVersionMinor=2, iVersionMicro 3, bServiceBoundFlag=1, "
                     "iVisibility=1, iAppPriority=60, iAppTransportLabel=1 \n"}),
       kOwnRule, true, false, {}},
      // The name descriptor takes the application descriptor's name.
      {CLASS(RavelCApplicationNameDescriptor), 0x01, "Application Descriptor", 0, "", kWarning,
       Banner("Application Name Descriptor"), false, Descriptor(0x01, Cat({Text("por"), U8(5), Text("Hello")})),
       At(kWarning, {"\t iISOLanguageCode=por, iApplicationName=Hello"}), kOwnRule, true, false, {}},
      {CLASS(RavelCGingaAppDescriptor), 0x06, "Ginga Application Descriptor", 0, "", kWarning,
       Banner("Ginga Application Descriptor"), false, Descriptor(0x06, Cat({U8(3), Text("abc")})),
       At(kWarning, {"\t iParameter  \n"}), kOwnRule, true, false, {}},
      {CLASS(RavelCGingaAppLocDescriptor), 0x07, "Ginga Application Location Descriptor", 0, "", kWarning,
       Banner("Ginga Application Location Descriptor"), false,
       Descriptor(0x07, Cat({U8(4), Text("/app"), U8(3), Text("lib"), Text("main.ncl")})),
       At(kWarning, {"\t  sBaseDirectory = /app, sClassPath = lib, sInicialClassName = main.ncl \n"}), kOwnRule, true,
       false, {}},
      // Named "Unknown Descriptor" even when the tag matches, and no banner.
      {CLASS(RavelCGingaAppDataComponentDescriptor), 0xFD, "Unknown Descriptor", kWarning,
       Wrong("Ginga Application Data Component"), 0, "", false,
       Descriptor(0xFD, Cat({U16(0x00A0), U8(0xB9), U32(0x10), U16(0x42), U32(0x12345678), U8(0xA0)})), {}, kOwnRule,
       true, false, {}},
  };
  return classes;
}

// Zeros after a descriptor in its section: what parses reading past a short length take in.
Bytes FollowedByZeros(const Bytes& descriptor) { return InSection(descriptor, Bytes(300, 0x00)); }

Bytes Empty(uint8_t tag) { return FollowedByZeros(RawDescriptor(tag, 0)); }

TraceLines BodyOf(RavelCDescriptorBase& d, const ClassCase& c) {
  TraceLines lines = ShowLines(d);
  const size_t head = c.banner.empty() ? 1 : 2;
  return TraceLines(lines.begin() + std::min(head, lines.size()), lines.end());
}

}  // namespace

TEST(DescriptorPattern, NullAndForeignTagsAreRefusedWithTheClasssOwnTrace) {
  for (const ClassCase& c : Classes()) {
    SCOPED_TRACE(c.name);
    const TraceLines nullTrace = c.tracesNull ? TraceLines{{kError, "Invalid Argument!\n"}} : TraceLines();
    TraceRecorder recorder;
    std::unique_ptr<RavelCDescriptorBase> empty(c.make(nullptr));
    EXPECT_EQ(nullTrace, recorder.Lines());
    EXPECT_EQ(0, empty->GetDescriptorTag());
    EXPECT_EQ(0, empty->GetDescriptorLength());
    EXPECT_STREQ("", empty->GetDescriptorName());
    TraceLines emptyShow = ShowLines(*empty);
    TraceLines head;
    if (!c.banner.empty()) head.push_back({c.bannerMask, c.banner});
    head.push_back({kDump, BaseLine(0, 0, "")});
    ASSERT_GE(emptyShow.size(), head.size());
    EXPECT_EQ(head, TraceLines(emptyShow.begin(), emptyShow.begin() + head.size()));
    if (c.pinEmptyBody) {
      EXPECT_EQ(Dump(c.emptyBody), BodyOf(*empty, c));
    }

    Bytes rich = FollowedByZeros(c.rich);
    std::unique_ptr<RavelCDescriptorBase> d(c.make(DescriptorIn(rich)));
    EXPECT_EQ(c.tag, d->GetDescriptorTag());
    EXPECT_EQ(c.rich[1], d->GetDescriptorLength());
    EXPECT_EQ(c.displayName, d->GetDescriptorName());
    const TraceLines richBody = BodyOf(*d, c);
    if (!c.richBody.empty()) {
      EXPECT_EQ(c.richBody, richBody);
    }
    const TraceLines& afterRefusal = c.refusal == kKept ? richBody : BodyOf(*empty, c);

    Bytes foreign = rich;
    DescriptorIn(foreign)[0] = 0x99;
    for (bool constructed : {true, false}) {
      recorder.Clear();
      std::unique_ptr<RavelCDescriptorBase> built;
      int result = kRavelOk;
      if (constructed) {
        built.reset(c.make(DescriptorIn(foreign)));
      } else {
        built.reset(c.make(DescriptorIn(rich)));
        recorder.Clear();
        result = built->ParseRawData(DescriptorIn(foreign));
      }
      EXPECT_EQ(0x99, built->GetDescriptorTag());
      EXPECT_EQ(c.rich[1], built->GetDescriptorLength());
      if (c.wrongText.empty()) {
        EXPECT_EQ(kRavelOk, result);
        EXPECT_EQ(c.displayName, built->GetDescriptorName());
        continue;
      }
      EXPECT_EQ(constructed ? kRavelOk : kRavelErrInvalidArgument, result);
      EXPECT_EQ((TraceLines{{c.wrongMask, c.wrongText}}), recorder.Lines());
      EXPECT_EQ(std::string(c.kind->szSourcePath), recorder.Records().at(0).file);
      EXPECT_EQ(0u, recorder.Records()[0].file.find("SectionParser/source/Ravel_C"));
      EXPECT_STREQ("Unknown Descriptor", built->GetDescriptorName());
      if (!constructed && c.refusal != kOwnRule) {
        EXPECT_EQ(afterRefusal, BodyOf(*built, c));
      }
    }

    recorder.Clear();
    EXPECT_EQ(kRavelErrInvalidArgument, d->ParseRawData(nullptr));
    EXPECT_EQ(nullTrace, recorder.Lines());
    EXPECT_EQ(0, d->GetDescriptorTag());
    EXPECT_EQ(0, d->GetDescriptorLength());
    EXPECT_EQ(c.displayName, d->GetDescriptorName());  // the base parse leaves the name alone on null
    if (c.refusal != kOwnRule) {
      EXPECT_EQ(afterRefusal, BodyOf(*d, c));
    }
  }
}

TEST(DescriptorPattern, ReparseLeavesNothingOfTheFirstParse) {
  TraceRecorder quiet;
  for (const ClassCase& c : Classes()) {
    SCOPED_TRACE(c.name);
    Bytes rich = FollowedByZeros(c.rich);
    Bytes empty = Empty(c.tag);
    std::unique_ptr<RavelCDescriptorBase> freshRich(c.make(DescriptorIn(rich)));
    std::unique_ptr<RavelCDescriptorBase> freshEmpty(c.make(DescriptorIn(empty)));
    std::unique_ptr<RavelCDescriptorBase> d(c.make(DescriptorIn(rich)));
    // The same bytes twice: lists are rebuilt, not extended.
    EXPECT_EQ(kRavelOk, d->ParseRawData(DescriptorIn(rich)));
    EXPECT_EQ(ShowLines(*freshRich), ShowLines(*d));
    // Length 0 after a full descriptor: nothing of the first one is left.
    EXPECT_EQ(kRavelOk, d->ParseRawData(DescriptorIn(empty)));
    EXPECT_EQ(ShowLines(*freshEmpty), ShowLines(*d));
  }
}

TEST(DescriptorPattern, CopiesOwnTheirDataAndOutliveTheSource) {
  TraceRecorder quiet;
  for (const ClassCase& c : Classes()) {
    if (!c.copiesEverything) continue;
    SCOPED_TRACE(c.name);
    Bytes rich = FollowedByZeros(c.rich);
    Bytes other = Empty(c.tag);
    RavelCDescriptorBase* source = c.make(DescriptorIn(rich));
    const TraceLines expected = ShowLines(*source);
    std::unique_ptr<RavelCDescriptorBase> copied(c.copy(source));
    std::unique_ptr<RavelCDescriptorBase> assigned(c.make(DescriptorIn(other)));
    c.assign(assigned.get(), source);
    c.assign(assigned.get(), assigned.get());  // self-assignment keeps the data
    std::unique_ptr<RavelCDescriptorBase> empty(c.make(nullptr));
    std::unique_ptr<RavelCDescriptorBase> fromEmpty(c.make(DescriptorIn(rich)));
    c.assign(fromEmpty.get(), empty.get());
    // Re-parsing and then destroying the source must not reach the copies.
    source->ParseRawData(DescriptorIn(other));
    delete source;
    EXPECT_EQ(expected, ShowLines(*copied));
    EXPECT_EQ(expected, ShowLines(*assigned));
    EXPECT_EQ(ShowLines(*empty), ShowLines(*fromEmpty));
  }
}

// ---------------------------------------------------------------------------
// Factory and copier

TEST(DescriptorFactory, FactoryAndCopierAcceptExactlyTheSameSeventeenTags) {
  const std::set<unsigned int> expected = {0x01, 0x02, 0x03, 0x04, 0x05, 0x06, 0x07, 0x40, 0x41,
                                           0x4A, 0x50, 0x52, 0xC2, 0xCD, 0xFA, 0xFD, 0xFE};
  for (unsigned int tag = 0; tag < 256; ++tag) {
    Bytes raw = Empty(static_cast<uint8_t>(tag));
    TraceRecorder recorder;
    std::unique_ptr<RavelCDescriptorBase> d(RavelSM_GetDescriptor(DescriptorIn(raw)));
    if (expected.count(tag) == 0) {
      EXPECT_EQ(nullptr, d.get()) << tag;
      char text[64];
      std::snprintf(text, sizeof(text), "Unsupoorted descriptor. Tag=[0x%x]\n", tag);
      EXPECT_EQ((TraceLines{{kDump, text}}), recorder.Lines());
      EXPECT_EQ("SectionParser/source/Ravel_CDescriptors", recorder.Records().at(0).file);
      continue;
    }
    ASSERT_NE(nullptr, d.get()) << tag;
    EXPECT_EQ(tag, d->GetDescriptorTag());
    EXPECT_STRNE("Unknown Descriptor", d->GetDescriptorName()) << tag;
    std::unique_ptr<RavelCDescriptorBase> copy(RavelSM_CopyDescriptor(d.get()));
    ASSERT_NE(nullptr, copy.get()) << tag;
    EXPECT_EQ(tag, copy->GetDescriptorTag());
    EXPECT_STREQ(d->GetDescriptorName(), copy->GetDescriptorName());
  }
}

TEST(DescriptorFactory, SharedTagNumbersYieldTheFactoryClass) {
  TraceRecorder quiet;
  // A stream event descriptor (tag 0x40 in stream descriptor sections) becomes a network name.
  Bytes event = sb::Descriptor(0x40, Bytes{0x00, 0x01, 0x00, 0x00, 0x00, 0x00, 0x00, 0x05});
  std::unique_ptr<RavelCDescriptorBase> name(RavelSM_GetDescriptor(event.data()));
  EXPECT_STREQ("Network Name Descriptor", name->GetDescriptorName());
  // A Ginga application data component becomes a plain data component.
  Bytes ginga = sb::Descriptor(0xFD, Bytes{0x00, 0xA0, 0x01});
  std::unique_ptr<RavelCDescriptorBase> dc(RavelSM_GetDescriptor(ginga.data()));
  EXPECT_STREQ("Data Component Descriptor", dc->GetDescriptorName());
  EXPECT_EQ(0x00A0, static_cast<RavelCDataComponentDescriptor*>(dc.get())->GetDataComponentId());
}

TEST(DescriptorFactory, NullInputAndTagsOutsideTheTableAreRefused) {
  TraceRecorder recorder;
  EXPECT_EQ(nullptr, RavelSM_GetDescriptor(nullptr));
  Bytes service = sb::Descriptor(0x48, Bytes{0x01, 0x00, 0x00});
  RavelCServiceDescriptor source(service.data());
  EXPECT_EQ(nullptr, RavelSM_CopyDescriptor(&source));
  EXPECT_EQ((TraceLines{{kError, "RavelSM_GetDescriptor: apRawData is NULL!\n"},
                        {kError, "Unknown Descriptor Tag. Tag=[72]\n"}}),
            recorder.Lines());
}

TEST(DescriptorCopier, CopiesOwnTheirDataAndFollowTheHeaderTag) {
  TraceRecorder recorder;
  Bytes list = sb::Descriptor(0x41, Bytes{0x00, 0x10, 0x01, 0x00, 0x11, 0xC0});
  std::unique_ptr<RavelCDescriptorBase> source(RavelSM_GetDescriptor(list.data()));
  std::unique_ptr<RavelCDescriptorBase> copy(RavelSM_CopyDescriptor(source.get()));
  source.reset();
  RavelCServiceListDescriptor* copied = static_cast<RavelCServiceListDescriptor*>(copy.get());
  ASSERT_EQ(2, copied->GetServiceCount());
  unsigned short id = 0, type = 0;
  EXPECT_EQ(1, copied->GetServiceInfo(1, id, type));
  EXPECT_EQ(0x0011, id);
  EXPECT_EQ(0xC0, type);

  // A network name object whose parse refused a service list tag is copied as
  // a service list: the header it holds decides, and it has no entries to give.
  RavelCNetworkNameDescriptor refused(list.data());
  std::unique_ptr<RavelCDescriptorBase> foreign(RavelSM_CopyDescriptor(&refused));
  ASSERT_NE(nullptr, foreign.get());
  EXPECT_EQ(0x41, foreign->GetDescriptorTag());
  EXPECT_EQ(6, foreign->GetDescriptorLength());
  EXPECT_STREQ("Unknown Descriptor", foreign->GetDescriptorName());
  EXPECT_EQ(0, static_cast<RavelCServiceListDescriptor*>(foreign.get())->GetServiceCount());
}
