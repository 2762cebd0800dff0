// The descriptor pattern every class shares (refused null and foreign tags,
// re-parse, deep copies, the Show banner and base line) over one table of every
// class, and the factory and copier over their one tag table.
#include <gtest/gtest.h>

#include <cstdio>
#include <map>
#include <memory>

#include "DescriptorShow.h"

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
#define CLASS(T) .name = #T, .make = Make<T>, .copy = CopyOf<T>, .assign = Assign<T>

// What a refused parse (null or a foreign tag) leaves of a parsed object's fields.
enum Refusal { kEmptied, kKept, kOwnRule };

std::string Wrong(const std::string& words) { return "This Descriptor isn't " + words + "! Descriptor Tag=[0x99]\n"; }

// The refusal text and the banner name the class as its display name does unless a row says otherwise.
struct ClassCase {
  const char* name;
  RavelCDescriptorBase* (*make)(unsigned char*);
  RavelCDescriptorBase* (*copy)(RavelCDescriptorBase*);
  void (*assign)(RavelCDescriptorBase*, RavelCDescriptorBase*);
  std::string displayName;
  std::string wrongText = Wrong(displayName);  // for tag 0x99; "": every tag is taken silently
  unsigned int wrongMask = kWarning;
  std::string banner = Banner(displayName);  // "": Show prints the base line only
  unsigned int bannerMask = kDump;
  bool tracesNull = false;  // "Invalid Argument!\n" at the error level
  Bytes rich;
  TraceLines richBody = {};  // its own Show lines; none: pinned by the class's own tests
  Refusal refusal = kEmptied;
  std::vector<std::string> copyBody = {};  // the own Show lines of a copy that drops some of the source's
  bool pinEmptyBody = false;
  std::vector<std::string> emptyBody = {};  // the own Show lines of an empty object
};

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
      // Network, service and transmission descriptors: most refusals have rules of their own.
      {CLASS(RavelCNetworkNameDescriptor), .displayName = "Network Name Descriptor",
       .banner = Banner("Network Descriptor"), .rich = Descriptor(0x40, Text("Rede X")),
       .richBody = Dump({"\tNetwork Name=[Rede X]\n"}), .refusal = kOwnRule},
      {CLASS(RavelCServiceListDescriptor), .displayName = "Service List Descriptor",
       .rich = Descriptor(0x41, Bytes{0x00, 0x01, 0x01, 0x12, 0x34, 0xC0}),
       .richBody = Dump({"\tService List Length=[2]\n", "\t\t[0]th Service Info: Service ID=[0x0001], Service Type=[0x01]\n",
                         "\t\t[1]th Service Info: Service ID=[0x1234], Service Type=[0xc0]\n"}), .refusal = kOwnRule},
      {CLASS(RavelCServiceDescriptor), .displayName = "Service Descriptor",
       .rich = Descriptor(0x48, Bytes{0x01, 3, 'A', 'B', 'C', 2, 'T', 'V'}),
       .richBody = Dump({"\tService Type=[0x01]\n", "\tService Provider Name=[ABC]\n", "\tService Name=[TV]\n"}),
       .refusal = kOwnRule,
       // Copies keep the header and the type but lose both names.
       .copyBody = {"\tService Type=[0x01]\n", "\tService Provider Name=[(null)]\n", "\tService Name=[(null)]\n"}},
      {CLASS(RavelCLinkageDescriptor), .displayName = "Linkage Descriptor",
       .rich = Descriptor(0x4A, Cat({U16(0x7ED0), U16(0x0001), U16(0x4800), U8(0x02), U8(0xAA)})),
       .richBody = Dump({"\tTransportStreamId=[0x7ed0], OrginalNetworkId=[0x0001], ServiceId=[0x4800], LinkageType=[0x02]\n"})},
      {CLASS(RavelCStreamIdentifierDescriptor), .displayName = "Stream Id Descriptor",
       .wrongText = Wrong("Stream Identifier Descriptor"), .banner = Banner("Stream Identifier Descriptor"),
       .rich = Descriptor(0x52, Bytes{0x81}), .richBody = Dump({"\tComponent Tag = [0x81]\n"})},
      {CLASS(RavelCTSInformationDescriptor), .displayName = "TS Information Descriptor",
       .rich = Descriptor(0xCD, Cat({Bytes{0x05, (3 << 2) | 2}, Text("TVA"), Bytes{0x0F, 2}, U16(0x4800), U16(0x4801),
                                     Bytes{0xAF, 1}, U16(0x4980)})),
       .richBody = Dump({"\tRemote Control Key Id=[0x05], Ts Name=[TVA], Tx Type Count=[2]\n",
                         "\t\tTramsmission Type Info=[0x0f], Num of Service=[2]\n", "\t\t\tTS Info: Service Id=[0x4800]\n",
                         "\t\t\tTS Info: Service Id=[0x4801]\n", "\t\tTramsmission Type Info=[0xaf], Num of Service=[1]\n",
                         "\t\t\tTS Info: Service Id=[0x4980]\n"}), .refusal = kOwnRule},
      {CLASS(RavelCExtendedBroadcasterDescriptor), .displayName = "Extended Braodcaster Descriptor",
       .wrongText = Wrong("Extended Broadcaster Descriptor"), .banner = Banner("Extended Broadcaster Descriptor"),
       .rich = Descriptor(0xCE, Bytes{0x1F, 0x01, 0x23, 0x21, 0x0A, 0x0B, 0x7E, 0xD0, 0x05}),
       .richBody = Dump({"\tiBroadcasterType=[0x1], Affiliation ID Nums=[2], Broadcaster ID Nums=[1]\n",
                         "\t\t[0]th Affiliation Id=[10]\n", "\t\t[1]th Affiliation Id=[126]\n",
                         "\t\t[0]th Org Network Id=[32464], Broadcaster ID=[5]\n"}), .refusal = kOwnRule},
      {CLASS(RavelCLogoTransmissionDescriptor), .displayName = "Logo Transmission Descriptor",
       .wrongText = Wrong("LogoTransmission Descriptor"), .banner = Banner("LogoTransmission Descriptor"),
       .rich = Descriptor(0xCF, Bytes{0x01, 0xFF, 0x23, 0xF4, 0x56, 0x78, 0x9A}),
       .richBody = Dump({"\tLogoTransmission Type=[0x01]\n", "\tLogo version=[1110]\n", "\tDownload ID=[30874]\n"}),
       .refusal = kKept, .pinEmptyBody = true,
       .emptyBody = {"\tLogoTransmission Type=[0x00]\n", "\tLogo version=[0]\n", "\tDownload ID=[0]\n"}},
      {CLASS(RavelCTerrDeliverySystemDescriptor), .displayName = "Terrestrial Delivery System Descriptor",
       .banner = Banner("Terrestrial Delivery Descriptor"), .tracesNull = true,
       .rich = Descriptor(0xFA, Cat({Bytes{0x80, 0x1B}, U16(0x1234), U16(0x0D4A)})),
       .richBody = Dump({"\tArea Code=[0x0801], Guard Interval=[0x02], Tx Mode=[0x03], Num Of Freq=[2]\n",
                         "\t\tTerrDelSys: Frequency=[4660]\n", "\t\tTerrDelSys: Frequency=[3402]\n"}),
       .refusal = kOwnRule, .pinEmptyBody = true,
       .emptyBody = {"\tArea Code=[0x0000], Guard Interval=[0x00], Tx Mode=[0x00], Num Of Freq=[0]\n"}},
      {CLASS(RavelCPartialReceptionDescriptor), .displayName = "Partial Reception Descriptor",
       .banner = Banner("Partial Reception Descriptor", 21), .rich = Descriptor(0xFB, Cat({U16(0x1234), U16(0x5678)})),
       .richBody = Dump({"\tService Id [0] = 18\n", "\tService Id [1] = 86\n"}), .refusal = kOwnRule},
      {CLASS(RavelCSystemManagementDescriptor), .displayName = "System Management Descriptor", .tracesNull = true,
       .rich = Descriptor(0xFE, Bytes{0xC5, 0x02, 0xFF}),
       .richBody = Dump({"\tBroadcasting Flag=[0x01], Broadcasting Id=[0x05], Additional Ids=[0x02]\n"}),
       .refusal = kKept},
      // Event, content and rating descriptors: a refusal empties them; their Show
      // lines are pinned by their own tests.
      {CLASS(RavelCCopyrightDescriptor), .displayName = "Copyright Descriptor",
       .banner = Banner("Copyright Descriptor", 21), .rich = Descriptor(0x0D, Cat({U32(0x80000001), Text("(C) TV")})),
       // The id goes through %d.
       .richBody = Dump({"\t Copyright id: -2147483647 \n", "\t Copyright info: (C) TV \n"}), .pinEmptyBody = true,
       .emptyBody = {"\t Copyright id: 0 \n", "\t Copyright info: (null) \n"}},
      {CLASS(RavelCCountryAvailabilityDescriptor), .displayName = "Country Availabilty Descriptor",
       .wrongText = Wrong("Country Availability Descriptor"), .banner = Banner("Country Availability Descriptor", 21),
       .rich = Descriptor(0x49, Cat({U8(0x80), Text("BRAARG")})), .pinEmptyBody = true,
       .emptyBody = {"\t Ability flag = 0\n", "\t Codes: \n"}},
      {CLASS(RavelCShortEventDescriptor), .displayName = "Short Event Descriptor",
       .rich = Descriptor(0x4D, Cat({Text("por"), U8(6), Text("Jornal"), U8(4), Text("News")})), .pinEmptyBody = true,
       .emptyBody = {"\tLanguageCode=[]\n", "\tEventName=[(null)]\n", "\tEventDescription=[(null)]\n"}},
      {CLASS(RavelCExtendedEventDescriptor), .displayName = "Extended Event Descriptor",
       .rich = Descriptor(0x4E, Cat({U8(0x13), Text("por"), U8(14), U8(5), Text("Actor"), U8(3), Text("Ana"), U8(3),
                                     Text("Dir"), U8(1), Text("B"), U8(3), Text("ABC")})), .pinEmptyBody = true,
       .emptyBody = {"\tDescriptorNumber=[0]\n", "\tLastDescriptorNumber=[0]\n"}},
      {CLASS(RavelCComponentDescriptor), .displayName = "Component Descriptor",
       .rich = Descriptor(0x50, Cat({U8(0xF5), U8(0xB3), U8(0x10), Text("por"), Text("HD")})),
       .richBody = Dump({"\tiStreamContent=[0x5], iComponentType=[0xb3], iComponentTag=[0x10], ISO Language Code=[0x706f72]\n"}),
       .pinEmptyBody = true,
       .emptyBody = {"\tiStreamContent=[0x0], iComponentType=[0x0], iComponentTag=[0x0], ISO Language Code=[0x0]\n"}},
      {CLASS(RavelCAudioComponentDescriptor), .displayName = "Audio Component Descriptor",
       .wrongText = Wrong("Component Descriptor"), .banner = Banner("Component Descriptor"),
       .rich = Descriptor(0xC4, Cat({U8(0x02), U8(0x03), U8(0x11), U8(0x0F), U8(0x01), U8(0xEB), Text("porspa")})),
       .richBody = Dump({"\tiStreamContent=[0x2], iComponentType=[0x3], iComponentTag=[0x11],iStreamType=[0xf], "
                         "iSimulcastGroupTag=[0x1], iESMultiLingualFlag=[0x1], iMainComponentFlag=[0x1], "
                         "iQualityIndicator=[0x2], iSampleRate=[0x5], ISO Language Code=[0x706f72], ISO Language "
                         "Code2=[0x737061]\n"}), .pinEmptyBody = true, .emptyBody = {audioZero}},
      {CLASS(RavelCContentDescriptor), .displayName = "Content Descriptor", .banner = Banner("Content Descriptor", 21),
       .rich = Descriptor(0x54, Bytes{0x12, 0x34, 0xF0, 0x0F}), .pinEmptyBody = true},
      {CLASS(RavelCParentalRatingDescriptor), .displayName = "Parental Rating Descriptor",
       .wrongText = Wrong("ParentalRating Descriptor"), .banner = Banner("Parental Rating Descriptor", 21),
       .rich = Descriptor(0x55, Cat({Text("BRA"), U8(0x23)})), .pinEmptyBody = true},
      {CLASS(RavelCLocalTimeOffsetDescriptor), .displayName = "Time Offset Descriptor",
       .wrongText = Wrong("LocalTimeOffset Descriptor"), .banner = Banner("Local Time Offset Descriptor", 21),
       .rich = Descriptor(0x58, Cat({Text("BRA"), U8(0x06), U16(0x0300), sb::UtcTime(2013, 2, 17, 0, 0, 0), U16(0x0200)})),
       .pinEmptyBody = true},
      {CLASS(RavelCTargetRegionDescriptor), .displayName = "Region Descriptor",
       .wrongText = Wrong("Target Region Descriptor"), .banner = Banner("Target Region Descriptor", 21),
       .rich = Descriptor(0xC6, Cat({U8(1), Text("SP-RJ")})),
       .richBody = Dump({"\t Region Spec Type: 1 \n", "\t Region Spec: SP-RJ \n"}), .pinEmptyBody = true,
       .emptyBody = {"\t Region Spec Type: 0 \n", "\t Region Spec: (null) \n"}},
      {CLASS(RavelCSeriesDescriptor), .displayName = "Series Descriptor",
       .rich = Descriptor(0xD5, Cat({U16(0x0102), U8(0xA7), U16(0xC079), sb::U24(0x00A00C), Text("Novela")})),
       .pinEmptyBody = true,
       .emptyBody = {"\tSeriesId=[0]\n", "\tRepeatLabel=[0]\n", "\tProgramPattern=[0]\n", "\tExpireDateValidFlag=[0]\n",
                     "\tExpireDate=[0]\n", "\tEpisodeNumber=[0]\n", "\tLastEpisodeNumber=[0]\n", "\tSeriesName=[(null)]\n"}},
      {CLASS(RavelCDataComponentDescriptor), .displayName = "Data Component Descriptor",
       .rich = Descriptor(0xFD, Cat({U16(0x00A0), U8(0x33)})), .richBody = Dump({"\tiDataComponentId=[0x00a0]\n"}),
       .pinEmptyBody = true, .emptyBody = {"\tiDataComponentId=[0x0000]\n"}},
      // Module info and stream descriptor section descriptors.
      {CLASS(RavelCTypeDescriptor), .displayName = "Type Descriptor", .rich = Descriptor(0x01, Text("text/html")),
       .richBody = Dump({"\tiType=[text/html]\n"})},
      {CLASS(RavelCNameDescriptor), .displayName = "Name Descriptor", .rich = Descriptor(0x02, Text("index.bml")),
       .richBody = Dump({"\tiFileName=[index.bml]\n"})},
      // The one descriptor that reports a foreign tag with the utility module bit.
      {CLASS(RavelCInfoDescriptor), .displayName = "Info Descriptor", .wrongMask = kUtilWarning,
       .rich = Descriptor(0x03, Cat({Text("por"), Text("Guia")})),
       .richBody = Dump({"\tiISO639LangCode=[por], ipTextChar=[Guia]\n"})},
      // The module id is printed in decimal under its label.
      {CLASS(RavelCModuleLinkDescriptor), .displayName = "Module Link Descriptor",
       .rich = Descriptor(0x04, Bytes{0x02, 0x12, 0x34}), .richBody = Dump({"\tiPosition=[2], iModuleId=[4660]\n"})},
      {CLASS(RavelCCRC32Descriptor), .displayName = "CRC32 Descriptor",
       .rich = Descriptor(0x05, Bytes{0xDE, 0xAD, 0x0B, 0xEF}), .richBody = Dump({"\tCRC32=[0xde 0xad 0x0b 0xef]\n"}),
       .pinEmptyBody = true, .emptyBody = {"\tCRC32=[0x00 0x00 0x00 0x00]\n"}},
      {CLASS(RavelCLocationDescriptor), .displayName = "Location Descriptor", .rich = Descriptor(0x06, Bytes{0x81}),
       .richBody = Dump({"\tiLocationTag=[129]\n"})},
      // Misspelt display name; the 32-bit value goes through %d.
      {CLASS(RavelCEstDownloadTimeDescriptor), .displayName = "Estimated Donwload Time Descriptor",
       .wrongText = Wrong("Estimated Download Time Descriptor"), .banner = Banner("EST Download Time Descriptor"),
       .rich = Descriptor(0x07, U32(0x80000001u)), .richBody = Dump({"\tiEstDownloadTime=[-2147483647]\n"})},
      {CLASS(RavelCCompressionTypeDescriptor), .displayName = "Compression Type Descriptor",
       .rich = Descriptor(0xC2, Cat({U8(0x01), U32(756113)})),
       .richBody = Dump({"\tiCompressionType=[1], iOriginalSize=[756113]\n"})},
      // Two blanks after "isn't" in these two, which keep their fields when refused.
      // Reserved bits set around both references must not leak into them.
      {CLASS(RavelCNPTReferenceDescriptor), .displayName = "NPT Reference Descriptor",
       .wrongText = Wrong(" NPT Reference Descriptor"), .tracesNull = true,
       .rich = Descriptor(0x17, Bytes{0xD5, 0xFF, 0x23, 0x45, 0x67, 0x89, 0xFF, 0xFF, 0xFF, 0xFE, 0x89, 0xAB, 0xCD, 0xEF,
                                      0x00, 0x03, 0x03, 0xE9}),
       .richBody = Dump({"\t Post Discontinuity Indicator=[1], Dsm_ContentID=[85]\n",
                         "\t STC_Reference=[0x01 0x23 0x45 0x67 0x89]\n", "\t NPT_Reference=[0x00 0x89 0xab 0xcd 0xef]\n",
                         "\t Scale Numerator=[3], Scale Denominator=[1001]\n"}), .refusal = kKept,
       .pinEmptyBody = true,
       .emptyBody = {"\t Post Discontinuity Indicator=[0], Dsm_ContentID=[0]\n", "\t STC_Reference=[0x00 0x00 0x00 0x00 0x00]\n",
                     "\t NPT_Reference=[0x00 0x00 0x00 0x00 0x00]\n", "\t Scale Numerator=[0], Scale Denominator=[0]\n"}},
      {CLASS(RavelCGeneralEventDescriptor), .displayName = "General Event Descriptor",
       .wrongText = Wrong(" General Event Descriptor"),
       .rich = Descriptor(0x40, Bytes{0xAB, 0xC0, 2, 0xFE, 0x12, 0x34, 0x56, 0x78, 0x07, 0x01, 0x02, 'a', 'b'}),
       .refusal = kKept},
      // Application-loop descriptors take any tag; banner and fields at the information level.
      {CLASS(RavelCApplicationDescriptor), .displayName = "Application Descriptor", .wrongText = "",
       .bannerMask = kWarning,
       .rich = Descriptor(0x00, Cat({U8(5), U16(0x0001), Bytes{1, 2, 3}, Bytes{0xBF, 0x3C, 0x01}})),
       .richBody = At(kWarning, {"\t iApplicationProfile=1, iVersionMajor=1, iVersionMinor=2, iVersionMicro 3, "
                                 "bServiceBoundFlag=1, iVisibility=1, iAppPriority=60, iAppTransportLabel=1 \n"}),
       .refusal = kOwnRule},
      // The name descriptor takes the application descriptor's name.
      {CLASS(RavelCApplicationNameDescriptor), .displayName = "Application Descriptor", .wrongText = "",
       .banner = Banner("Application Name Descriptor"), .bannerMask = kWarning,
       .rich = Descriptor(0x01, Cat({Text("por"), U8(5), Text("Hello")})),
       .richBody = At(kWarning, {"\t iISOLanguageCode=por, iApplicationName=Hello"}), .refusal = kOwnRule},
      {CLASS(RavelCGingaAppDescriptor), .displayName = "Ginga Application Descriptor", .wrongText = "",
       .bannerMask = kWarning, .rich = Descriptor(0x06, Cat({U8(3), Text("abc")})),
       .richBody = At(kWarning, {"\t iParameter  \n"}), .refusal = kOwnRule},
      {CLASS(RavelCGingaAppLocDescriptor), .displayName = "Ginga Application Location Descriptor", .wrongText = "",
       .bannerMask = kWarning,
       .rich = Descriptor(0x07, Cat({U8(4), Text("/app"), U8(3), Text("lib"), Text("main.ncl")})), .refusal = kOwnRule},
      // Named "Unknown Descriptor" even when the tag matches, and no banner.
      {CLASS(RavelCGingaAppDataComponentDescriptor), .displayName = "Unknown Descriptor",
       .wrongText = Wrong("Ginga Application Data Component"), .banner = "",
       .rich = Descriptor(0xFD, Cat({U16(0x00A0), U8(0xB9), U32(0x10), U16(0x42), U32(0x12345678), U8(0xA0)})),
       .refusal = kOwnRule},
  };
  return classes;
}

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
    TraceLines emptyShow = ShowLines(*empty);
    TraceLines head;
    if (!c.banner.empty()) head.push_back({c.bannerMask, c.banner});
    head.push_back({kDump, BaseLine(0, 0, "")});
    ASSERT_GE(emptyShow.size(), head.size());
    EXPECT_EQ(head, TraceLines(emptyShow.begin(), emptyShow.begin() + head.size()));
    if (c.pinEmptyBody) { EXPECT_EQ(Dump(c.emptyBody), BodyOf(*empty, c)); }

    Bytes rich = FollowedByZeros(c.rich);
    std::unique_ptr<RavelCDescriptorBase> d(c.make(DescriptorIn(rich)));
    EXPECT_EQ(c.rich[0], d->GetDescriptorTag());
    EXPECT_EQ(c.rich[1], d->GetDescriptorLength());
    EXPECT_EQ(c.displayName, d->GetDescriptorName());
    const TraceLines richBody = BodyOf(*d, c);
    if (!c.richBody.empty()) { EXPECT_EQ(c.richBody, richBody); }
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
      EXPECT_EQ(0u, recorder.Records()[0].file.find("SectionParser/source/Ravel_C"));
      EXPECT_STREQ("Unknown Descriptor", built->GetDescriptorName());
      if (!constructed && c.refusal != kOwnRule) { EXPECT_EQ(afterRefusal, BodyOf(*built, c)); }
    }

    recorder.Clear();
    EXPECT_EQ(kRavelErrInvalidArgument, d->ParseRawData(nullptr));
    EXPECT_EQ(nullTrace, recorder.Lines());
    EXPECT_EQ(0, d->GetDescriptorTag());
    EXPECT_EQ(0, d->GetDescriptorLength());
    EXPECT_EQ(c.displayName, d->GetDescriptorName());  // the base parse leaves the name alone on null
    if (c.refusal != kOwnRule) { EXPECT_EQ(afterRefusal, BodyOf(*d, c)); }
  }
}

TEST(DescriptorPattern, ReparseLeavesNothingOfTheFirstParse) {
  TraceRecorder quiet;
  for (const ClassCase& c : Classes()) {
    SCOPED_TRACE(c.name);
    Bytes rich = FollowedByZeros(c.rich);
    Bytes empty = Empty(c.rich[0]);
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
    SCOPED_TRACE(c.name);
    Bytes rich = FollowedByZeros(c.rich);
    Bytes other = Empty(c.rich[0]);
    RavelCDescriptorBase* source = c.make(DescriptorIn(rich));
    TraceLines expected = ShowLines(*source);
    if (!c.copyBody.empty()) {
      expected.resize(expected.size() - BodyOf(*source, c).size());
      Add(expected, Dump(c.copyBody));
    }
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

// A tag that other sections use for another class (0x40 for the stream event's
// general event, 0xFD for the Ginga application data component) yields the
// class of this table.
TEST(DescriptorFactory, FactoryAndCopierMakeTheClassOfExactlyTheSeventeenTags) {
  const std::map<unsigned int, std::string> expected = {
      {0x01, "Type Descriptor"}, {0x02, "Name Descriptor"}, {0x03, "Info Descriptor"}, {0x04, "Module Link Descriptor"},
      {0x05, "CRC32 Descriptor"}, {0x06, "Location Descriptor"}, {0x07, "Estimated Donwload Time Descriptor"},
      {0x40, "Network Name Descriptor"}, {0x41, "Service List Descriptor"}, {0x4A, "Linkage Descriptor"},
      {0x50, "Component Descriptor"}, {0x52, "Stream Id Descriptor"}, {0xC2, "Compression Type Descriptor"},
      {0xCD, "TS Information Descriptor"}, {0xFA, "Terrestrial Delivery System Descriptor"},
      {0xFD, "Data Component Descriptor"}, {0xFE, "System Management Descriptor"}};
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
    EXPECT_EQ(expected.at(tag), d->GetDescriptorName()) << tag;
    std::unique_ptr<RavelCDescriptorBase> copy(RavelSM_CopyDescriptor(d.get()));
    ASSERT_NE(nullptr, copy.get()) << tag;
    EXPECT_EQ(tag, copy->GetDescriptorTag());
    EXPECT_EQ(expected.at(tag), copy->GetDescriptorName()) << tag;
  }
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

TEST(DescriptorCopier, FollowsTheHeaderTagOfARefusedParse) {
  TraceRecorder quiet;
  Bytes list = sb::Descriptor(0x41, Bytes{0x00, 0x10, 0x01, 0x00, 0x11, 0xC0});
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
